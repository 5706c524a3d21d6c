// MorvikDecoding: decoding by the library, through its C interfaces.
#include "MorvikDecoding.h"

#include <cstddef>
#include <stdexcept>

#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"

namespace morvik::bench {

namespace {

struct DestroyState {
    void operator()(veltra_ip_morvik_v1_0_state* state) const
    {
        veltra_ip_morvik_v1_0_destroy_state(state);
    }
};

class MorvikDecoding : public Decoding {
public:
    explicit MorvikDecoding(const Work& work) : Decoding(work)
    {
        veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
        generics.C_NUM_PU = work.units;
        generics.C_ALGORITHM_TYPE = work.algorithm;
        itsState.reset(veltra_ip_morvik_v1_0_create_state(generics));
        if (itsState == nullptr ||
            veltra_ip_morvik_v1_0_set_instruction_set(itsState.get(), work.instructionSet.c_str()) != 0) {
            throw std::runtime_error(work.name() + ": no such decoder");
        }
    }

    void run() override
    {
        if (itsWork.call == Work::Call::batch) {
            runBatch();
            return;
        }
        std::size_t before = 0;  // bits of the blocks before
        for (unsigned block = 0; block < itsWork.blocks; ++block) {
            runSingle(block, before);
            before += itsSizes[block];
        }
    }

    /// Bits, and for batches ratios, must be those of the components, which define them.
    void check() override
    {
        Work definition = itsWork;
        definition.instructionSet = "component";
        MorvikDecoding components(definition);
        const bool givesRatios = itsWork.call == Work::Call::batch;
        const Ratios expected = givesRatios ? components.runWithRatios() : Ratios{};
        if (!givesRatios) {
            components.run();
        }
        run();
        expect(itsDecisions == components.itsDecisions, "bits");
        if (givesRatios) {
            expect(runWithRatios() == expected, "ratios");
        }
    }

private:
    using Ratios = std::vector<std::int16_t>;

    void expect(bool same, const char* what) const
    {
        if (!same) {
            throw std::runtime_error(itsWork.name() + ": decodes to other " + what + " than the components");
        }
    }

    std::int32_t positions(unsigned block) const
    {
        return static_cast<std::int32_t>(itsSizes[block] + rules::tailPositions);
    }

    /// Decodes a block that `before` bits of other blocks come before.
    void runSingle(unsigned block, std::size_t before)
    {
        const std::size_t first = before + std::size_t{block} * rules::tailPositions;
        const auto& streams = itsBlocks.streams;
        veltra_ip_morvik_v1_0_outputs outputs = {itsDecisions.data() + before, itsSizes[block], 0, 0};
        expectSuccess(veltra_ip_morvik_v1_0_bitacc_simulate(itsState.get(),
                                                            streams[0].data() + first,
                                                            streams[1].data() + first,
                                                            streams[2].data() + first,
                                                            positions(block),
                                                            iterations,
                                                            0,
                                                            &outputs));
    }

    Ratios runWithRatios()
    {
        Ratios ratios(itsDecisions.size());
        veltra_ip_morvik_v1_0_batch_outputs outputs = {};
        outputs.ratios = ratios.data();
        outputs.ratios_alloc = ratios.size();
        runBatch(outputs);
        return ratios;
    }

    void runBatch(veltra_ip_morvik_v1_0_batch_outputs outputs = {})
    {
        outputs.dout = itsDecisions.data();
        outputs.dout_alloc = itsDecisions.size();
        expectSuccess(veltra_ip_morvik_v1_0_batch_simulate_i32(itsState.get(),
                                                               itsBlocks.streams[0].data(),
                                                               itsBlocks.streams[1].data(),
                                                               itsBlocks.streams[2].data(),
                                                               positions(0),
                                                               itsWork.blocks,
                                                               iterations,
                                                               nullptr,
                                                               &outputs));
    }

    void expectSuccess(std::int32_t status) const
    {
        if (status != 0) {
            throw std::runtime_error(itsWork.name() + ": status " + std::to_string(status));
        }
    }

    std::unique_ptr<veltra_ip_morvik_v1_0_state, DestroyState> itsState;
};

}  // namespace

std::unique_ptr<Decoding> makeMorvikDecoding(const Work& work)
{
    return std::make_unique<MorvikDecoding>(work);
}

}  // namespace morvik::bench
