// VectorSet: what the tests of a set of vectors share.
#ifndef MORVIK_TESTS_HARDWARE_VECTORS_VECTORSET_H
#define MORVIK_TESTS_HARDWARE_VECTORS_VECTORSET_H

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <optional>
#include <regex>
#include <string>
#include <vector>

#include "base/Checksum.h"
#include "base/Error.h"
#include "hardware/vectors/Set.h"
#include "simulation/Plan.h"
#include "support/TemporaryFolder.h"

namespace morvik::support {

using morvik::base::sha256;
using morvik::vectors::checkSet;
using morvik::vectors::makeSet;
using morvik::vectors::Manifest;
using morvik::vectors::Settings;

/// Transport blocks in this format, at an Es/N0 in thousandths of a decibel.
inline simulation::Point transportPoint(const simulation::LinkFormat& format, int milliEsn0)
{
    simulation::Sweep sweep;
    sweep.formats = {format};
    sweep.numPus = {2};
    sweep.algorithms = {1};
    sweep.scaleOptions = {std::nullopt};
    sweep.iterations = {2};
    sweep.axis = simulation::Axis::esn0;
    sweep.milliDecibels = {milliEsn0};
    return pointsOf(sweep).front();
}

/// Has a small set at hand, in a folder of its own.
class VectorSet : public testing::Test {
protected:
    VectorSet()
    {
        settings.blockSizes = {40};
        settings.blocks = 2;
        settings.directed = false;
        settings.iterations = 2;
        settings.formats = {"c", "csv", "memh", "npy"};
        settings.ratios = true;
        settings.internal = true;
    }

    std::string path() const
    {
        return folder.path("set");
    }

    std::string read(const std::string& file) const
    {
        return folder.read("set/" + file);
    }

    Manifest make() const
    {
        Manifest manifest;
        manifest.version = "1.2.3";
        manifest.command = "make";
        manifest.settings = settings;
        return makeSet(path(), manifest);
    }

    /// Replaces the first match in a file, and its sha256 in the manifest, as if it had been written so.
    void change(const std::string& file, const std::string& match, const std::string& replacement) const
    {
        const std::string before = sha256(path() + '/' + file);
        const std::string text =
            std::regex_replace(read(file), std::regex(match), replacement, std::regex_constants::format_first_only);
        ASSERT_NE(text, read(file));
        folder.write("set/" + file, text);
        const std::string manifest =
            std::regex_replace(read("manifest.json"), std::regex(before), sha256(path() + '/' + file));
        folder.write("set/manifest.json", manifest);
    }

    /// The text without the line that a number, from 1, tells.
    void removeLine(const std::string& file, std::size_t number) const
    {
        change(file, "((?:[^\\n]*\\n){" + std::to_string(number - 1) + "})[^\\n]*\\n", "$1");
    }

    void expectRefused(const std::string& message) const
    {
        try {
            checkSet(path());
            FAIL() << "accepted";
        } catch (const base::Error& error) {
            EXPECT_EQ(error.what(), message);
        }
    }

    std::string difference() const
    {
        return checkSet(path()).difference.value_or("none");
    }

    /// All that is in the folder, hidden or not.
    std::vector<std::string> names() const
    {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(path())) {
            names.push_back(entry.path().filename());
        }
        std::sort(names.begin(), names.end());
        return names;
    }

    const std::vector<std::string> ofCsv = {"blocks.csv", "expected.csv", "manifest.json", "stimulus.csv"};
    TemporaryFolder folder;
    Settings settings;
};

}  // namespace morvik::support

#endif
