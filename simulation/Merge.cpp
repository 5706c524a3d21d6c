// Merge: joins the results of several runs.
#include "Merge.h"

#include <algorithm>
#include <map>
#include <optional>
#include <utility>

#include "LinkWords.h"
#include "Possible.h"
#include "base/Error.h"

namespace morvik::simulation {

namespace {

/// A joined row, and the file in which its parameters first appeared.
struct JoinedRow {
    ResultRow row;
    const std::string* file = nullptr;
};

std::string descriptionOf(const Point& point)
{
    return curveText(point) + ", " + placeText(point);
}

/// What all rows of a run share.
class Origin {
public:
    /// Throws Error if the row is not of the same run as those before.
    void check(const std::string& fileName, const ResultRow& row)
    {
        if (itsFile == nullptr) {
            itsFile = &fileName;
            itsSeed = row.seed;
            itsVersion = row.version;
        }
        if (row.seed != itsSeed) {
            refuse(fileName, "seed", std::to_string(row.seed), std::to_string(itsSeed));
        }
        if (row.version != itsVersion) {
            refuse(fileName, "version", row.version, itsVersion);
        }
    }

    const std::string& version() const
    {
        return itsVersion;
    }

private:
    [[noreturn]] void refuse(const std::string& fileName,
                             const std::string& what,
                             const std::string& here,
                             const std::string& there) const
    {
        throw base::Error(fileName + ": has " + what + ' ' + here + ", but " + *itsFile + " has " + there +
                          "; only results of the same " + what + " are joined");
    }

    const std::string* itsFile = nullptr;
    std::uint64_t itsSeed = 0;
    std::string itsVersion;
};

void join(const Part& part, const ResultRow& row, JoinedRow& joined)
{
    if (!joined.row.frames.join(row.frames)) {
        throw base::Error(part.fileName + ": has frames that " + *joined.file +
                          " has, too: " + descriptionOf(row.point) + ", frames " + row.frames.text());
    }
    ErrorCounts& errors = joined.row.errors;
    const bool isTooMuch = row.errors.bitErrorSquares > UINT64_MAX - errors.bitErrorSquares;
    errors.add(row.errors);
    joined.row.clipped += row.clipped;
    joined.row.seconds += row.seconds;
    if (isTooMuch || joined.row.frames.size() > mostBlocks) {
        throw base::Error(part.fileName + ": has more errors or blocks, together with " + *joined.file +
                          ", than can be counted: " + descriptionOf(row.point));
    }
}

/// The point of a row without its iterations: rows for different iterations share the point's number.
Point withoutIterations(Point point)
{
    point.iterations = 0;
    return point;
}

/// Whether points and numbers correspond one to one.
bool areNumbersGood(const std::vector<Part>& parts)
{
    std::map<Point, std::size_t> numbers;
    std::map<std::size_t, Point> points;
    for (const Part& part : parts) {
        for (const ResultRow& row : part.results.rows) {
            const bool named = numbers.emplace(row.point, row.pointNumber).first->second == row.pointNumber;
            const Point point = withoutIterations(row.point);
            if (!named || !(points.emplace(row.pointNumber, point).first->second == point)) {
                return false;
            }
        }
    }
    return true;
}

void numberAnew(std::vector<ResultRow>& rows)
{
    std::size_t number = 0;
    for (ResultRow& row : rows) {
        row.pointNumber = number++;
    }
}

}  // namespace

Results merge(const std::vector<Part>& parts)
{
    Origin origin;
    std::map<Point, JoinedRow> joined;
    for (const Part& part : parts) {
        for (const ResultRow& row : part.results.rows) {
            origin.check(part.fileName, row);
            const auto [place, isNew] = joined.try_emplace(row.point, JoinedRow{row, &part.fileName});
            if (!isNew) {
                join(part, row, place->second);
            }
        }
    }
    Results results;
    results.version = origin.version();
    results.command = "morvik merge";
    for (const Part& part : parts) {
        results.command += ' ' + part.fileName;
    }
    for (const auto& [point, each] : joined) {
        results.rows.push_back(each.row);
    }
    if (!areNumbersGood(parts)) {
        numberAnew(results.rows);
    }
    return results;
}

}  // namespace morvik::simulation
