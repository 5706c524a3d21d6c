// SentBlocks: the blocks of tests/data/vectors, made by another encoder, with the bits sent.
#include "SentBlocks.h"

#include <fstream>
#include <sstream>

namespace morvik::blocks {

const std::vector<std::string>& sentBlockNames()
{
    static const std::vector<std::string> names{"k40", "k104", "k512", "k1024", "k2048", "k6144"};
    return names;
}

std::vector<SentBlock> readSentBlocks(const std::string& name)
{
    const std::string path = MORVIK_TEST_DATA "/vectors/" + name;
    std::vector<SentBlock> blocks;
    std::ifstream bits(path + ".bits");
    for (std::string line; std::getline(bits, line);) {
        blocks.push_back({{}, line});
    }
    std::ifstream rows(path + ".csv");
    std::string row;
    std::getline(rows, row);
    while (std::getline(rows, row)) {
        std::istringstream fields(row);
        std::size_t block = 0;
        std::int32_t sys = 0;
        std::int32_t par1 = 0;
        std::int32_t par2 = 0;
        char comma = 0;
        fields >> block >> comma >> sys >> comma >> par1 >> comma >> par2;
        blocks.at(block).soft.sys.push_back(sys);
        blocks.at(block).soft.par1.push_back(par1);
        blocks.at(block).soft.par2.push_back(par2);
    }
    return blocks;
}

}  // namespace morvik::blocks
