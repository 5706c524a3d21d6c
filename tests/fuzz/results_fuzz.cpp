// results_fuzz: the readers of result files and checkpoints take any text.
#include "FuzzInput.h"
#include "base/Error.h"
#include "simulation/Checkpoint.h"
#include "simulation/Merge.h"
#include "simulation/ResultFiles.h"

namespace {

void readResults(const std::string& text, const std::string& name)
{
    using namespace morvik::simulation;
    try {
        const Results results = parseResults(text, name);
        const std::string csv = csvText(results);
        require(csvText(parseResults(csv, "in.csv")) == csv, "what was read is written, and read again as CSV");
        const std::string json = jsonText(results);
        require(jsonText(parseResults(json, "in.json")) == json, "what was read is written, and read again as JSON");
        require(merge({{"in.csv", results}}).rows.size() <= results.rows.size(), "merging adds no rows");
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in.");
    }
}

/// Reads the text, and what it would be with the right checksum.
void readCheckpoint(const std::string& text)
{
    using namespace morvik::simulation;
    const std::string body = text.substr(text.find('\n') + 1);
    for (const std::string& whole : {text, checkpointOpening(body) + body}) {
        try {
            const auto checkpoint = parseCheckpoint(whole, "in.checkpoint");
            require(checkpoint || whole == text, "a checkpoint with the right checksum is read");
            const std::string written = checkpoint ? checkpointText(*checkpoint) : "";
            require(!checkpoint || checkpointText(parseCheckpoint(written, "in.checkpoint").value()) == written,
                    "what was read is written, and read again");
        } catch (const morvik::base::Error& error) {
            requireOneLine(error, "in.checkpoint");
        }
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    readResults(text, "in.csv");
    readResults(text, "in.json");
    readCheckpoint(text);
    return 0;
}
