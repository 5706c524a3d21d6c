// FailingAllocation: makes one allocation fail, in programs whose malloc and free are wrapped by the linker.
#include "FailingAllocation.h"

#include <cstddef>
#include <new>

// NOLINTBEGIN(bugprone-reserved-identifier): the linker chooses these names.
extern "C" {
void* __real_malloc(std::size_t size);
void __real_free(void* memory);
void* __wrap_malloc(std::size_t size);
void __wrap_free(void* memory);
}
// NOLINTEND(bugprone-reserved-identifier)

namespace {

unsigned untilFailure = 0;  // 0: none
long liveBlocks = 0;

void* take(std::size_t size)
{
    if (untilFailure > 0 && --untilFailure == 0) {
        return nullptr;
    }
    void* const memory = __real_malloc(size > 0 ? size : 1);
    liveBlocks += memory != nullptr ? 1 : 0;
    return memory;
}

void give(void* memory)
{
    liveBlocks -= memory != nullptr ? 1 : 0;
    __real_free(memory);
}

}  // namespace

void* __wrap_malloc(std::size_t size)
{
    return take(size);
}

void __wrap_free(void* memory)
{
    give(memory);
}

void* operator new(std::size_t size)
{
    void* const memory = take(size);
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    return memory;
}

void operator delete(void* memory) noexcept
{
    give(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    give(memory);
}

long blocksInUse()
{
    return liveBlocks;
}

FailingAllocation::FailingAllocation(unsigned which)
    : itsCout(std::cout.rdbuf(&itsOut)), itsCerr(std::cerr.rdbuf(&itsErr)), itsLiveBlocks(liveBlocks)
{
    untilFailure = which;
}

FailingAllocation::~FailingAllocation()
{
    untilFailure = 0;
    std::cout.rdbuf(itsCout);
    std::cerr.rdbuf(itsCerr);
}

bool FailingAllocation::happened()
{
    return untilFailure == 0;
}

long FailingAllocation::leaked() const
{
    return liveBlocks - itsLiveBlocks;
}
