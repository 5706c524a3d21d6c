// BlockCase: a block that a hardware simulation has decoded, and how its dump compares with the model.
#include "BlockCase.h"

#include <array>
#include <sstream>

#include "base/Error.h"
#include "base/Text.h"
#include "hardware/comparison/Coverage.h"
#include "hardware/comparison/Model.h"
#include "hardware/comparison/Report.h"
#include "rules/Cut.h"

namespace morvik {

namespace {

/// "3 differences, 1 fault; the first is alpha0 of half-iteration 2, step 64".
std::string blockSummary(const comparison::Comparison& found, const comparison::Coverage& coverage, Verdict verdict)
{
    if (verdict == Verdict::equal) {
        return std::to_string(found.compared()) + " values, all equal to the model";
    }
    if (verdict == Verdict::incomplete) {
        const std::vector<std::string> lacks = comparison::lacksOf(coverage);
        return "values are missing: " + lacks.front();
    }
    return base::counted(found.different(), "difference") + ", " + base::counted(found.allFaults(), "fault") +
           "; the first is " + passSignals[found.first->signal].name + " of half-iteration " +
           std::to_string(found.first->pass) + ", step " + std::to_string(found.first->step);
}

/// Other runs of the model that give the dump. A few values may match one by chance.
std::vector<std::string> otherRunsOf(const BlockCase& block,
                                     const comparison::Comparison& found,
                                     const comparison::Values& values)
{
    constexpr std::uint64_t telling = 64;
    return found.knownDifferent() > 0 && found.knownCompared() >= telling ? findOtherRuns(block.run, values)
                                                                          : std::vector<std::string>();
}

coverage::CoreCounts situationsOfBlock(const comparison::Model& model, const comparison::Values& values)
{
    return coverage::countsAt(
        model, [&](const comparison::Place& place) { return values.at(place) == model.values.at(place); });
}

}  // namespace

std::uint32_t BlockCase::K() const
{
    return static_cast<std::uint32_t>(run.block.size() - rules::tailPositions);
}

std::string BlockCase::title() const
{
    return "block " + std::to_string(run.number) + " (" + (name.empty() ? "" : name + ", ") +
           "K = " + std::to_string(K()) + ')';
}

const char* nameOf(Verdict verdict)
{
    constexpr std::array<const char*, 4> names = {"equal", "different", "incomplete", "unreadable"};
    return names.at(static_cast<std::size_t>(verdict));
}

comparison::Dump emptyDump(const BlockCase& block)
{
    const rules::Cut cut(block.K(), static_cast<std::uint32_t>(block.run.generics.C_NUM_PU));
    return {rules::halfIterations(block.iterations),
            block.K() + rules::tailSteps,
            {cut.segmentLength(), cut.segmentsOfUnit() * cut.segmentLength()}};
}

CaseResult compareCase(const BlockCase& block,
                       const std::string& dumpName,
                       const comparison::Dump& dump,
                       const CompareOptions& options)
{
    std::ostringstream warnings;
    const comparison::Model model =
        comparison::computeModel(block.run.block, block.run.generics, block.iterations, warnings);
    using comparison::Unknown;
    CaseResult result;
    result.dump = dumpName;
    result.warnings = warnings.str();
    result.comparison =
        comparison::compare(model, dump.values, options.ignoreUnknown ? Unknown::isIgnored : Unknown::differs);
    const comparison::Comparison& found = result.comparison;
    if (found.compared() == 0) {
        throw base::Error(dumpName +
                          (found.unknown() > 0 ? ": has no known value" : ": has no value that the core computes"));
    }
    const comparison::Coverage coverage = comparison::coverageOf(model, dump);
    const bool isWhole = coverage.isComplete() || options.partial;
    result.verdict = found.first ? Verdict::different : isWhole ? Verdict::equal : Verdict::incomplete;
    result.summary = blockSummary(found, coverage, result.verdict);
    comparison::Report report = comparison::reportOf(
        {found, coverage, model, dump, dumpName, options.partial, otherRunsOf(block, found, dump.values)});
    result.report = std::move(report.text);
    result.findings = std::move(report.findings);
    if (options.countsSituations()) {
        result.situations = situationsOfBlock(model, dump.values);
    }
    return result;
}

}  // namespace morvik
