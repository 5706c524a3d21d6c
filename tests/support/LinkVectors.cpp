// LinkVectors: transport blocks with their coded bits by another encoder, tests/data/link.
#include "LinkVectors.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>

namespace morvik::blocks {

namespace {

/// The first `count` bits of hexadecimal digits, the highest of a digit first.
std::vector<std::uint8_t> bitsOf(const std::string& digits, unsigned count)
{
    std::vector<std::uint8_t> bits;
    for (const char digit : digits) {
        const int value = std::stoi(std::string(1, digit), nullptr, 16);
        for (int i = 3; i >= 0; --i) {
            bits.push_back(static_cast<std::uint8_t>(value >> i & 1));
        }
    }
    if (bits.size() < count) {
        throw std::runtime_error("too few hexadecimal digits");
    }
    bits.resize(count);
    return bits;
}

LinkVector vectorOf(const std::string& line)
{
    std::istringstream cells(line);
    const auto number = [&cells] {
        std::string cell;
        std::getline(cells, cell, ',');
        return static_cast<unsigned>(std::stoul(cell));
    };
    LinkVector vector{number(), number(), number(), number(), {}, {}, {}};
    for (unsigned& each : vector.segmentation) {
        each = number();
    }
    std::string digits;
    std::getline(cells, digits, ',');
    vector.bits = bitsOf(digits, vector.A);
    std::getline(cells, digits);
    vector.coded = bitsOf(digits, vector.G);
    return vector;
}

}  // namespace

std::vector<LinkVector> linkVectors()
{
    std::vector<LinkVector> vectors;
    for (const auto& file : std::filesystem::directory_iterator(MORVIK_TEST_DATA "/link")) {
        if (file.path().extension() != ".csv") {
            continue;
        }
        std::ifstream lines(file.path());
        for (std::string line; std::getline(lines, line);) {
            if (line.front() != '#') {
                vectors.push_back(vectorOf(line));
            }
        }
    }
    return vectors;
}

}  // namespace morvik::blocks
