// Work: the decoding jobs to measure.
#include "Work.h"

#include <algorithm>
#include <cstddef>
#include <utility>

#include "ItppDecoding.h"
#include "MorvikDecoding.h"
#include "lanes/InstructionSets.h"
#include "rules/BlockSizes.h"
#include "support/Blocks.h"

namespace morvik::bench {

namespace {

using Call = Work::Call;

/// Every number of units and algorithm type for the longest block, then short blocks.
void addBest(std::vector<Work>& all, const std::string& best)
{
    for (const Call call : {Call::single, Call::batch}) {
        for (const int algorithm : {0, 1, 2}) {
            for (const int units : {2, 4, 8}) {
                all.push_back({6144, units, algorithm, call, best, call == Call::single ? 1U : 16U});
            }
        }
    }
    all.push_back({512, 4, 1, Call::batch, best, 64});
    all.push_back({40, 4, 1, Call::batch, best, 256});
    all.push_back({40, 4, 1, Call::single, best, 1});
    for (const Work::Sizes sizes : {Work::Sizes::sorted, Work::Sizes::drawn}) {
        all.push_back({0, 4, 1, Call::single, best, 512, Work::Decoder::morvik, false, sizes});
    }
}

void addComparison(std::vector<Work>& all, const std::string& best)
{
    for (const auto& [K, blocks] : {std::pair{6144U, 16U}, std::pair{512U, 64U}}) {
        all.push_back({K, 4, 0, Call::batch, best, blocks, Work::Decoder::morvik, true});
        all.push_back({K, 4, 0, Call::single, best, blocks, Work::Decoder::morvik, true});
        if (itppAvailable()) {
            all.push_back({K, 0, 0, Call::single, "", blocks, Work::Decoder::itpp, true});
        }
    }
}

}  // namespace

std::string Work::sizeText() const
{
    return sizes == Sizes::equal ? std::to_string(blockSize) : sizes == Sizes::drawn ? "drawn" : "sorted";
}

std::vector<unsigned> Work::blockSizes() const
{
    std::vector<unsigned> each(blocks, blockSize);
    if (sizes != Sizes::equal) {
        blocks::Random random;
        for (unsigned& K : each) {
            K = rules::blockSizes[blocks::below(random, static_cast<unsigned>(rules::blockSizes.size()))].K;
        }
    }
    if (sizes == Sizes::sorted) {
        std::sort(each.begin(), each.end());
    }
    return each;
}

std::string Work::name() const
{
    const std::string size = "K=" + sizeText();
    const std::string calls = call == Call::single ? "/single" : "/batch";
    if (decoder == Decoder::itpp) {
        return "compare/" + size + calls + "/itpp";
    }
    return (compared ? "compare/" + size : size) + calls + "/units=" + std::to_string(units) +
           "/type=" + std::to_string(algorithm) + "/" + instructionSet;
}

std::vector<Work> allWork()
{
    const std::vector<const lanes::InstructionSet*> sets = lanes::availableInstructionSets();
    std::vector<Work> all;
    addBest(all, sets.front()->name);
    for (std::size_t lesser = 1; lesser < sets.size(); ++lesser) {
        for (const int units : {4, 8}) {
            all.push_back({6144, units, 1, Call::single, sets[lesser]->name, 1});
        }
        all.push_back({6144, 4, 2, Call::single, sets[lesser]->name, 1});
    }
    for (const int algorithm : {0, 1, 2}) {
        all.push_back({6144, 4, algorithm, Call::single, "component", 1});
    }
    addComparison(all, sets.front()->name);
    return all;
}

Decoding::Decoding(const Work& work)
    : itsWork(work), itsSizes(work.blockSizes()), itsBlocks(noisyBlocks(itsSizes)), itsDecisions(itsBlocks.sent.size())
{
}

double Decoding::bitErrorRate() const
{
    std::size_t errors = 0;
    for (std::size_t i = 0; i < itsDecisions.size(); ++i) {
        errors += itsDecisions[i] != itsBlocks.sent[i] ? 1U : 0U;
    }
    return static_cast<double>(errors) / static_cast<double>(itsDecisions.size());
}

std::unique_ptr<Decoding> makeDecoding(const Work& work)
{
    return work.decoder == Work::Decoder::itpp ? makeItppDecoding(work) : makeMorvikDecoding(work);
}

}  // namespace morvik::bench
