// Journal: the counts of a run, in memory and on disk.
#include "Journal.h"

#include <algorithm>
#include <filesystem>
#include <system_error>
#include <utility>

#include "ResultFiles.h"
#include "Resumption.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Shown.h"
#include "base/TextFile.h"

namespace morvik::simulation {

namespace {

bool hasContent(const std::string& fileName)
{
    std::error_code none;  // if there is no such file
    return std::filesystem::file_size(base::pathOf(fileName), none) > 0 && !none;
}

}  // namespace

Journal::Journal(const Plan& plan, std::string output, Earlier earlier)
    : itsPlan(plan), itsOutput(std::move(output)), itsCheckpoint{plan.version, base::asUtf8(plan.command), {}, {}, {}}
{
    if (itsOutput.empty()) {
        return;
    }
    formatOf(itsOutput);
    const std::string checkpointFile = checkpointName();
    itsFile.emplace(checkpointFile);
    if (itsFile->isTaken()) {
        throw base::Error(itsOutput + ": another run is writing it; wait for that to end, or choose another name");
    }
    base::checkWritable(itsOutput);
    const bool isUnfinished = !itsFile->isNew();
    const bool hasResults = hasContent(itsOutput);
    if (earlier == Earlier::refuse) {
        refuseIf(isUnfinished, hasResults);
    } else if (earlier == Earlier::resume && (isUnfinished || hasResults)) {
        Standing standing = isUnfinished ? standingOf(plan, resumable(checkpointFile), checkpointFile)
                                         : standingOf(plan, readResults(itsOutput), itsOutput);
        itsCheckpoint.ended = std::move(standing.ended);
        itsCheckpoint.begun = std::move(standing.begun);
    }
}

void Journal::begin()
{
    save(itsCheckpoint.running);
}

bool Journal::isEmpty() const
{
    return itsCheckpoint.ended.empty() && !itsCheckpoint.running && itsCheckpoint.begun.empty();
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
    const auto& begun = itsCheckpoint.begun;
    const auto found =
        std::find_if(begun.begin(), begun.end(), [point](const PointResult& each) { return each.number == point; });
    if (found != begun.end()) {
        return *found;
    }
    return {point, Tally(itsPlan.countsOf(itsPlan.points[point])), 0};
}

void Journal::end(const PointResult& point)
{
    itsCheckpoint.ended.push_back(point);
    itsCheckpoint.running.reset();
    forgetBegun(point.number);
}

void Journal::save(const std::optional<PointResult>& running)
{
    itsCheckpoint.running = running;
    if (running) {
        forgetBegun(running->number);
    }
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
        throw base::Error(checkpointName() +
                          ": holds an unfinished run; --resume goes on with it, --overwrite starts anew");
    }
    if (hasResults) {
        throw base::Error(itsOutput +
                          ": is there already; --overwrite replaces it, --resume goes on with the same run");
    }
}

Checkpoint Journal::resumable(const std::string& checkpointFile) const
{
    const auto checkpoint = parseCheckpoint(base::readText(checkpointFile), checkpointFile);
    if (!checkpoint) {
        throw base::Error(checkpointFile + ": is damaged and cannot be resumed; --overwrite starts anew");
    }
    if (checkpoint->version != itsPlan.version) {
        throw base::Error(checkpointFile + ": holds a run of version " + base::shown(checkpoint->version) +
                          ", this is " + itsPlan.version + "; --overwrite starts anew");
    }
    const std::string obstacles = obstaclesBetween(checkpoint->command, itsCheckpoint.command);
    if (!obstacles.empty()) {
        throw base::Error(checkpointFile + ": holds a run with other parameters: " + obstacles +
                          "; nothing but limits may change, which may grow; --overwrite starts anew");
    }
    return *checkpoint;
}

/// Drops an earlier run's counts of the points up to `last`.
void Journal::forgetBegun(std::size_t last)
{
    auto& begun = itsCheckpoint.begun;
    begun.erase(begun.begin(), std::find_if(begun.begin(), begun.end(), [last](const PointResult& each) {
                    return each.number > last;
                }));
}

}  // namespace morvik::simulation
