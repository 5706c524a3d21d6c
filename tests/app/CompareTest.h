// CompareTest: what the tests of morvik compare share.
#ifndef MORVIK_TESTS_APP_COMPARETEST_H
#define MORVIK_TESTS_APP_COMPARETEST_H

#include <sstream>
#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/CommandTest.h"

namespace morvik::support {

inline std::string softText(const blocks::Block& block)
{
    std::string text = header + '\n';
    for (std::size_t i = 0; i < block.sys.size(); ++i) {
        text += "0," + std::to_string(block.sys[i]) + ',' + std::to_string(block.par1[i]) + ',' +
                std::to_string(block.par2[i]) + '\n';
    }
    return text;
}

inline blocks::Block noisyBlock(unsigned K, int amplitude = 16)
{
    blocks::Random random(1);
    blocks::Block block = blocks::encode(blocks::randomBits(random, K), amplitude);
    blocks::addNoise(random, 14, block);
    return block;
}

inline bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

class Compare : public CommandTest {
protected:
    void writeBlock(unsigned K, int amplitude = 16) const
    {
        morvik.write("block.csv", softText(noisyBlock(K, amplitude)));
    }

    /// Has a core with the fault write rtl.csv.
    void writeDump(const std::string& fault, int units, int algorithm) const
    {
        const CommandRunner core(MORVIK_FAULT_CORE);
        const CommandResult result = core.run({fault, std::to_string(units), std::to_string(algorithm), "4"},
                                              morvik.directory() + "/block.csv",
                                              morvik.directory() + "/rtl.csv");
        ASSERT_EQ(result.status, 0) << result.err;
    }

    /// Leaves the log-likelihood ratios alone in rtl.csv, each as `written` writes it.
    template <class Written>
    void keepRatios(Written written) const
    {
        std::string ratios = "half_iteration,step,signal,value\n";
        std::istringstream all(morvik.read("rtl.csv"));
        for (std::string line; std::getline(all, line);) {
            if (has(line, ",llr,")) {
                const std::size_t value = line.rfind(',') + 1;
                ratios += line.substr(0, value) + written(line.substr(value)) + '\n';
            }
        }
        morvik.write("rtl.csv", ratios);
    }

    /// Leaves out all signals of rtl.csv whose names begin so.
    void leaveOut(const std::string& signal) const
    {
        std::string kept;
        std::istringstream all(morvik.read("rtl.csv"));
        for (std::string line; std::getline(all, line);) {
            const std::size_t name = line.find(',', line.find(',') + 1) + 1;
            kept += line.compare(name, signal.size(), signal) == 0 ? "" : line + '\n';
        }
        morvik.write("rtl.csv", kept);
    }

    CommandResult compare(const std::vector<std::string>& options = {}) const
    {
        std::vector<std::string> arguments = {
            "compare", "--block", "block.csv", "--dump", "rtl.csv", "--iterations", "4"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments);
    }

    /// Writes rtl.csv with other numbers of half-iterations and steps, as far as there are such in four iterations over
    /// 512 bits.
    void writeLater(const std::string& dump, unsigned passes, unsigned steps) const
    {
        std::istringstream all(dump);
        std::string line;
        std::getline(all, line);
        std::string later = line + '\n';
        for (unsigned pass = 0, step = 0; all >> pass && all.ignore() && all >> step && std::getline(all, line);) {
            if (pass + passes < 8 && step + steps < 515) {
                later += std::to_string(pass + passes) + ',' + std::to_string(step + steps) + line + '\n';
            }
        }
        morvik.write("rtl.csv", later);
    }

    void expectRefused(const CommandResult& result, const std::string& message) const
    {
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik compare: " + message + '\n');
    }
};

}  // namespace morvik::support

#endif
