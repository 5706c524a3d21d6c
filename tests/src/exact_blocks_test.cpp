// Blocks with exact results: every decision, tag, message and trace line of each, byte for byte.
#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"
#include "support/CapturedStreams.h"
#include "support/ExpectText.h"

namespace {

const std::string folder = MORVIK_TEST_DATA "/vectors/exact/";

/// A case of the file: its name, whether it goes on with the state of the case before it, and its
/// named lists of numbers.
struct Case {
    std::string name;
    bool keepsState = false;
    std::map<std::string, std::vector<std::int32_t>> numbers;

    std::int32_t number(const std::string& key) const
    {
        return numbers.at(key).at(0);
    }
};

std::vector<Case> readCases()
{
    std::ifstream file(folder + "cases.txt");
    std::vector<Case> cases;
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        std::string key;
        words >> key;
        if (key == "case") {
            std::string keep;
            cases.emplace_back();
            words >> cases.back().name >> keep;
            cases.back().keepsState = keep == "keep";
        } else if (key != "end") {
            for (long long value = 0; words >> value;) {
                cases.back().numbers[key].push_back(static_cast<std::int32_t>(static_cast<std::uint32_t>(value)));
            }
        }
    }
    return cases;
}

std::string readFile(const std::string& name)
{
    std::ifstream file(folder + "expected/" + name, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

struct Destroy {
    void operator()(veltra_ip_morvik_v1_0_state* state) const
    {
        veltra_ip_morvik_v1_0_destroy_state(state);
    }
};
using StatePointer = std::unique_ptr<veltra_ip_morvik_v1_0_state, Destroy>;

StatePointer createState(const Case& c)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = c.number("num_pu");
    generics.C_ALGORITHM_TYPE = c.number("algo");
    generics.C_TAG_WIDTH = c.number("tag_width");
    return StatePointer(veltra_ip_morvik_v1_0_create_state(generics));
}

std::string describe(int status, const veltra_ip_morvik_v1_0_outputs& outputs)
{
    std::ostringstream text;
    text << "status " << status;
    if (status != 0) {
        text << " size - tag - bits -\n";
        return text.str();
    }
    text << " size " << outputs.dout_size << " tag " << outputs.tag << " bits ";
    for (std::uint32_t i = 0; i < outputs.dout_size; ++i) {
        text << int{outputs.dout[i]};
    }
    text << '\n';
    return text.str();
}

std::string run(const Case& c, StatePointer& state)
{
    if (!c.keepsState) {
        state = createState(c);
    }
    if (state == nullptr) {
        return describe(-1, {});
    }
    if (c.numbers.count("dump") != 0) {
        veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), static_cast<std::uint32_t>(c.number("dump")));
    }
    const std::int32_t room = c.number("dout_alloc") < 0 ? 0 : c.number("dout_alloc");
    std::vector<std::uint8_t> bits(static_cast<std::size_t>(room) + 1, 0xEE);  // the last is a guard
    veltra_ip_morvik_v1_0_outputs outputs{bits.data(), static_cast<std::uint32_t>(room), 0, 0};
    const int status = veltra_ip_morvik_v1_0_bitacc_simulate(state.get(),
                                                             c.numbers.at("sys").data(),
                                                             c.numbers.at("par1").data(),
                                                             c.numbers.at("par2").data(),
                                                             c.number("din_size"),
                                                             static_cast<std::uint32_t>(c.number("iterations")),
                                                             static_cast<std::uint32_t>(c.number("tag")),
                                                             &outputs);
    EXPECT_EQ(bits.back(), 0xEE) << c.name << ": written beyond the array";
    return describe(status, outputs);
}

}  // namespace

TEST(ExactBlocks, GiveExactlyTheExpectedResultsMessagesAndTraces)
{
    const std::vector<Case> cases = readCases();
    ASSERT_EQ(cases.size(), 38U);
    StatePointer state;
    for (const Case& c : cases) {
        CapturedStreams streams;
        const std::string result = run(c, state);
        expectText(c.name + ".res", readFile(c.name + ".res"), result);
        expectText(c.name + ".out", readFile(c.name + ".out"), streams.out());
        expectText(c.name + ".err", readFile(c.name + ".err"), streams.err());
    }
}
