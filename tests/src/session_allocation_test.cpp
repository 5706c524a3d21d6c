// Allocation failure in a simulator's session: every single allocation of decoding a block fails in turn. Nothing of
// the block is left, so that the next one decodes.
#include <gtest/gtest.h>

#include <cstdint>
#include <new>
#include <vector>

#include "bindings/simulator/Session.h"
#include "support/FailingAllocation.h"
#include "support/FailureBlock.h"

namespace {

using morvik::simulator::Session;

void put(Session& session, const Block& block)
{
    for (const std::int32_t value : block.stream) {
        session.put(value, value, value);
    }
}

/// Decodes a block with a failing allocation, then without. Whether there are further allocations to fail.
bool sessionWithFailure(unsigned which, const Block& block)
{
    Session session(2, 1, 8);
    put(session, block);
    bool happened = false;
    {
        const FailingAllocation failing(which);
        int status = 99;
        try {
            status = session.decode(2, 0x101);
        } catch (const std::bad_alloc&) {
            status = 99;
        }
        happened = FailingAllocation::happened();
        if (status != 0) {
            EXPECT_EQ(status, 99) << which;
            EXPECT_TRUE(happened) << which;
            EXPECT_TRUE(session.bits().empty()) << which;
            EXPECT_EQ(session.tag(), 0U) << which;
        }
    }
    put(session, block);
    EXPECT_EQ(session.decode(2, 1), 0) << which;
    EXPECT_EQ(session.bits(), block.bits) << which;
    EXPECT_EQ(session.tag(), 1U) << which;
    return happened;
}

}  // namespace

TEST(SessionAllocationFailure, LeavesNothingOfItsBlock)
{
    Block block(128);
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(genericsOf(1));
    EXPECT_EQ(block.decode(state), 0);
    veltra_ip_morvik_v1_0_destroy_state(state);
    unsigned which = 1;
    while (which < manyAllocations && sessionWithFailure(which, block)) {
        ++which;
    }
    EXPECT_GE(which, 3U);
    EXPECT_LT(which, manyAllocations);
}
