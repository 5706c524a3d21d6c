// results_fuzz: the readers of result files and checkpoints take any text.
#include "FuzzInput.h"
#include "simulation/Checkpoint.h"
#include "simulation/Error.h"
#include "simulation/Merge.h"
#include "simulation/ResultFiles.h"

namespace {

void readResults(const std::string& text, const std::string& name)
{
    using namespace simulation;
    try {
        const Results results = parseResults(text, name);
        const std::string csv = csvText(results);
        require(csvText(parseResults(csv, "in.csv")) == csv, "what was read is written, and read again as CSV");
        const std::string json = jsonText(results);
        require(jsonText(parseResults(json, "in.json")) == json, "what was read is written, and read again as JSON");
        require(merge({{"in.csv", results}}).rows.size() <= results.rows.size(), "merging adds no rows");
    } catch (const Error& error) {
        requireOneLine(error, "in.");
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    readResults(text, "in.csv");
    readResults(text, "in.json");
    require(!simulation::parseCheckpoint(text, "in.checkpoint"), "a checksum of 64 bits is not met by chance");
    return 0;
}
