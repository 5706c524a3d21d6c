// JsonFile: the figures of all repetitions, for other programs.
#ifndef MORVIK_BENCH_JSONFILE_H
#define MORVIK_BENCH_JSONFILE_H

#include <string>
#include <vector>

#include "Measure.h"
#include "base/OutputFile.h"

namespace morvik::bench {

/// {"benchmarks": [{"name": ..., "repetition": ..., figures}, ...]}
class JsonFile {
public:
    /// Throws base::Error when the file cannot be written.
    explicit JsonFile(const std::string& name);

    void add(const Work& work, const std::vector<Figures>& repetitions);

    void finish();

private:
    base::OutputFile itsFile;
    bool itsBegun = false;
};

}  // namespace morvik::bench

#endif
