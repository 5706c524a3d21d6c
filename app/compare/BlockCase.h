// BlockCase: a block that a hardware simulation has decoded, and how its dump compares with the model.
#ifndef MORVIK_APP_COMPARE_BLOCKCASE_H
#define MORVIK_APP_COMPARE_BLOCKCASE_H

#include <optional>
#include <string>
#include <vector>

#include "CompareOptions.h"
#include "OtherRuns.h"
#include "hardware/comparison/Comparison.h"
#include "hardware/comparison/Dump.h"
#include "hardware/coverage/Counts.h"

namespace morvik {

struct BlockCase {
    std::string set;   ///< folder; empty for a block of a file
    std::string name;  ///< of the block in its set: "random"
    ComparedRun run;
    std::uint32_t iterations = 0;

    std::uint32_t K() const;

    /// "block 3 (random, K = 40)".
    std::string title() const;
};

enum class Verdict : std::uint8_t { equal, different, incomplete, unreadable };

/// Words for a verdict, and for the type of a failure: "different".
const char* nameOf(Verdict verdict);

struct CaseResult {
    std::string dump;  ///< its name
    Verdict verdict = Verdict::unreadable;
    comparison::Comparison comparison;
    std::string summary;  ///< in a line
    std::string report;   ///< in many; the reason if the dump is unreadable
    std::vector<std::string> findings;
    std::string warnings;  ///< of the model

    /// The situations of the arithmetic at values of the dump that are right, if they are counted.
    std::optional<coverage::CoreCounts> situations;
};

/// A dump without values for the block.
comparison::Dump emptyDump(const BlockCase& block);

/// Compares a dump of the block. Throws base::Error.
CaseResult compareCase(const BlockCase& block,
                       const std::string& dumpName,
                       const comparison::Dump& dump,
                       const CompareOptions& options);

}  // namespace morvik

#endif
