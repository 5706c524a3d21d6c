// StimulusFile: soft values from any file that has them.
#include "StimulusFile.h"

#include <filesystem>
#include <system_error>
#include <utility>

#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/Path.h"
#include "hardware/vectors/Manifest.h"
#include "hardware/vectors/SetFolder.h"

namespace morvik {

namespace {

namespace fs = std::filesystem;

/// The rows of a set's blocks. Their labels are the numbers of the blocks.
class StimulusRows : public std::streambuf {
public:
    explicit StimulusRows(vectors::BlockReader reader)
        : itsReader(std::move(reader)), itsText(std::string(softValueHeader) + '\n')
    {
        show();
    }

protected:
    int_type underflow() override
    {
        vectors::Stimulus stimulus;
        vectors::Expected expected;
        if (!itsReader.next(stimulus, expected)) {
            return traits_type::eof();
        }
        itsText.clear();
        const std::string label = std::to_string(itsBlock++);
        for (std::size_t i = 0; i < stimulus.streams[0].size(); ++i) {
            itsText += label;
            for (const auto& stream : stimulus.streams) {
                itsText += ',' + std::to_string(stream[i]);
            }
            itsText += '\n';
        }
        show();
        return traits_type::to_int_type(itsText.front());
    }

private:
    void show()
    {
        setg(itsText.data(), itsText.data(), itsText.data() + itsText.size());
    }

    vectors::BlockReader itsReader;
    std::string itsText;  // of the block
    std::uint32_t itsBlock = 0;
};

/// The set that a name means, and one of its formats; no format for a file to read as it is.
struct SetName {
    std::string folder;
    std::optional<std::string> format;
};

SetName setNameOf(const std::string& name)
{
    std::error_code ignored;
    if (fs::is_directory(base::pathOf(name), ignored) &&
        fs::exists(base::pathOf(name) / vectors::manifestName, ignored)) {
        return {name, ""};
    }
    const std::string ending = base::pathOf(name).extension().u8string();
    const std::string format = ending.empty() ? "" : ending.substr(1);
    const std::string folder = base::pathOf(name).parent_path().u8string();
    const SetName set = {folder.empty() ? "." : folder, format};
    const bool isOther = format != "csv" && tables::findFormat(format) != nullptr;
    return isOther && fs::exists(base::pathOf(set.folder) / vectors::manifestName, ignored)
               ? set
               : SetName{folder, std::nullopt};
}

/// Reads the format, or the first one of the set if it is empty.
std::unique_ptr<std::streambuf> rowsOf(const std::string& name, const SetName& set)
{
    vectors::expectPlaced(set.folder);
    const vectors::Manifest manifest = vectors::readManifest(set.folder + '/' + vectors::manifestName);
    for (const vectors::ManifestFormat& format : manifest.formats) {
        if (set.format->empty() || format.name == *set.format) {
            return std::make_unique<StimulusRows>(
                vectors::BlockReader(set.folder, *tables::findFormat(format.name), vectors::blocksAlone(manifest)));
        }
    }
    throw base::Error(name + ": is no file of the set of vectors in its folder");
}

}  // namespace

StimulusFile::StimulusFile(const std::string& name) : itsName(name), itsRowStream(nullptr)
{
    const SetName set = setNameOf(name);
    if (!set.format) {
        itsFile.emplace(name);
        itsName = itsFile->name();
        return;
    }
    itsRows = rowsOf(name, set);
    itsRowStream.rdbuf(itsRows.get());
    itsRowStream.exceptions(std::ios::badbit);  // the reason passes through the stream
}

}  // namespace morvik
