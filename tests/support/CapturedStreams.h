// CapturedStreams: captures the library's output during its lifetime.
#ifndef MORVIK_TESTS_SUPPORT_CAPTUREDSTREAMS_H
#define MORVIK_TESTS_SUPPORT_CAPTUREDSTREAMS_H

#include <iostream>
#include <sstream>
#include <string>

/// Replaces the buffers of standard output and standard error, and restores them on destruction.
class CapturedStreams {
public:
    CapturedStreams() : itsCout(std::cout.rdbuf(itsOut.rdbuf())), itsCerr(std::cerr.rdbuf(itsErr.rdbuf())) {}

    ~CapturedStreams()
    {
        std::cout.rdbuf(itsCout);
        std::cerr.rdbuf(itsCerr);
    }

    CapturedStreams(const CapturedStreams&) = delete;
    CapturedStreams& operator=(const CapturedStreams&) = delete;

    std::string out() const
    {
        return itsOut.str();
    }

    std::string err() const
    {
        return itsErr.str();
    }

private:
    std::ostringstream itsOut;
    std::ostringstream itsErr;
    std::streambuf* itsCout;
    std::streambuf* itsCerr;
};

#endif
