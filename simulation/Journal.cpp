// Journal: what a run has counted, kept in memory and on the disk.
#include "Journal.h"

#include <filesystem>
#include <system_error>
#include <utility>

#include "CompleteResults.h"
#include "Error.h"
#include "ResultFiles.h"
#include "TextFile.h"
#include "base/OutputFile.h"

namespace simulation {

namespace {

bool hasContent(const std::string& fileName)
{
    std::error_code none;  // if there is no such file
    return std::filesystem::file_size(fileName, none) > 0 && !none;
}

}  // namespace

Journal::Journal(const Plan& plan, std::string output, Earlier earlier)
    : itsPlan(plan), itsOutput(std::move(output)), itsCheckpoint{plan.version, plan.command, {}, {}}
{
    if (itsOutput.empty()) {
        return;
    }
    formatOf(itsOutput);
    const std::string checkpointFile = checkpointName();
    itsFile.emplace(checkpointFile);
    if (itsFile->isTaken()) {
        throw Error(itsOutput + ": another run is writing it; wait for that to end, or choose another name");
    }
    base::checkWritable(itsOutput);
    const bool isUnfinished = !itsFile->isNew();
    const bool hasResults = hasContent(itsOutput);
    if (earlier == Earlier::refuse) {
        refuseIf(isUnfinished, hasResults);
    } else if (earlier == Earlier::resume && isUnfinished) {
        resume(checkpointFile);
    } else if (earlier == Earlier::resume && hasResults) {
        takeComplete();
    }
}

void Journal::begin()
{
    save(itsCheckpoint.running);
}

bool Journal::isEmpty() const
{
    return itsCheckpoint.ended.empty() && !itsCheckpoint.running;
}

const std::vector<PointResult>& Journal::ended() const
{
    return itsCheckpoint.ended;
}

PointResult Journal::resultSoFar(std::size_t point) const
{
    if (itsCheckpoint.running && itsCheckpoint.running->number == point) {
        return *itsCheckpoint.running;
    }
    return {point, Tally(itsPlan.countsOf(itsPlan.points[point])), 0};
}

void Journal::end(const PointResult& point)
{
    itsCheckpoint.ended.push_back(point);
    itsCheckpoint.running.reset();
}

void Journal::save(const std::optional<PointResult>& running)
{
    itsCheckpoint.running = running;
    if (!itsFile) {
        return;
    }
    itsFile->write(checkpointText(itsCheckpoint));
    if (itsResultsSaved < itsCheckpoint.ended.size()) {
        writeResults(itsOutput, resultsOf(itsPlan, itsCheckpoint.ended));
        itsResultsSaved = itsCheckpoint.ended.size();
    }
}

void Journal::complete()
{
    save(std::nullopt);
    if (itsFile) {
        itsFile->remove();
    }
}

std::string Journal::checkpointName() const
{
    return itsOutput + ".checkpoint";
}

void Journal::refuseIf(bool isUnfinished, bool hasResults) const
{
    if (isUnfinished) {
        throw Error(checkpointName() + ": holds an unfinished run; --resume goes on with it, --overwrite starts anew");
    }
    if (hasResults) {
        throw Error(itsOutput + ": is there already; --overwrite replaces it, --resume goes on with the same run");
    }
}

void Journal::resume(const std::string& checkpointFile)
{
    const auto checkpoint = parseCheckpoint(readText(checkpointFile));
    if (!checkpoint) {
        throw Error(checkpointFile + ": is damaged and cannot be resumed; --overwrite starts anew");
    }
    if (checkpoint->version != itsPlan.version) {
        throw Error(checkpointFile + ": holds a run of version " + checkpoint->version + ", this is " +
                    itsPlan.version);
    }
    if (checkpoint->command != itsPlan.command) {
        throw Error(checkpointFile +
                    ": holds a run with other parameters: " + differenceOf(checkpoint->command, itsPlan.command));
    }
    itsCheckpoint = *checkpoint;
}

void Journal::takeComplete()
{
    const Results results = readResults(itsOutput);
    const auto points = pointsOfComplete(itsPlan, results);
    if (!points) {
        const std::string difference =
            results.command.empty() ? "" : differenceOf(results.command, itsPlan.command);  // CSV does not tell
        throw Error(itsOutput + ": holds other results" + (difference.empty() ? "" : " (" + difference + ')') +
                    ", and there is no checkpoint to resume; --overwrite starts anew");
    }
    itsCheckpoint.ended = *points;
}

}  // namespace simulation
