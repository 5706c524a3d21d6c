// FailingAllocation: makes one allocation fail, in programs whose malloc and free are wrapped by the linker.
#ifndef MORVIK_TESTS_SUPPORT_FAILINGALLOCATION_H
#define MORVIK_TESTS_SUPPORT_FAILINGALLOCATION_H

#include <iostream>
#include <streambuf>
#include <string_view>

/// The number of memory blocks in use.
long blocksInUse();

/// A stream buffer that allocates nothing: it keeps the first characters and drops the rest.
class FixedBuffer : public std::streambuf {
public:
    FixedBuffer()
    {
        setp(itsText, itsText + sizeof itsText);
    }

    std::string_view text() const
    {
        return {itsText, static_cast<std::size_t>(pptr() - pbase())};
    }

private:
    int overflow(int c) override
    {
        return c;
    }

    char itsText[4096];
};

/// Captures the library's lines and makes an allocation fail, during its lifetime.
class FailingAllocation {
public:
    /// `which`: the allocation to fail, counted from 1; 0 for none.
    explicit FailingAllocation(unsigned which);
    ~FailingAllocation();

    FailingAllocation(const FailingAllocation&) = delete;
    FailingAllocation& operator=(const FailingAllocation&) = delete;

    /// Whether the call made enough allocations for the failure to happen.
    static bool happened();

    std::string_view errors() const
    {
        return itsErr.text();
    }

    /// Whether a trace has begun.
    bool traced() const
    {
        return !itsOut.text().empty();
    }

    long leaked() const;

private:
    FixedBuffer itsOut;
    FixedBuffer itsErr;
    std::streambuf* itsCout;
    std::streambuf* itsCerr;
    long itsLiveBlocks;
};

#endif
