// Manifest: manifest.json, the description of a set of vectors.
#ifndef MORVIK_HARDWARE_VECTORS_MANIFEST_H
#define MORVIK_HARDWARE_VECTORS_MANIFEST_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "BlockFiles.h"
#include "Settings.h"

namespace morvik::vectors {

struct ManifestBlock {
    std::string name;
    std::uint32_t K = 0;
    std::uint32_t tag = 0;
    std::uint32_t expectedTag = 0;
    std::optional<Origin> origin;  ///< if it comes out of rate recovery,
    bool crcFits = false;          ///< and whether the expected decisions fit its CRC
};

struct ManifestFile {
    std::string name;  ///< without the folder
    std::string sha256;
};

/// The tables and files of a format.
struct ManifestFormat {
    std::string name;
    std::vector<KeptTable> tables;
    std::vector<ManifestFile> files;
};

struct Manifest {
    std::string version;  ///< of morvik
    std::string command;  ///< which reproduces the set
    Settings settings;
    std::vector<ManifestBlock> blocks;
    std::vector<ManifestFormat> formats;
};

/// Settings by which a BlockReader reads the blocks alone, without ratios and internal values.
Settings blocksAlone(const Manifest& manifest);

constexpr char manifestName[] = "manifest.json";

std::string manifestText(const Manifest& manifest);

/// Parses a manifest. Throws base::Error, prefixed with the file's name, if the text is no manifest, has impossible
/// settings, or names no block, no format, one twice, or other tables than the settings make.
Manifest parseManifest(const std::string& text, const std::string& fileName);

/// Parses a manifest file.
Manifest readManifest(const std::string& fileName);

/// All files of a set, with their folder; the manifest is the first.
std::vector<std::string> filesOf(const std::string& folder, const Manifest& manifest);

}  // namespace morvik::vectors

#endif
