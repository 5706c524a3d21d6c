// TDecoder3G: the turbo decoder over the whole trellis with one engine.
#include "TDecoder3G.h"

#include <algorithm>
#include <cstddef>

#include "Messages.h"
#include "TraceTable.h"
#include "rules/SoftValues.h"
#include "rules/Starts.h"

namespace rules = morvik::rules;

namespace {

constexpr const char* tableHeader =
    "n    int           a0          a1          a2          a3          a4          a5          a6          a7"
    "            b0          b1          b2          b3          b4          b5          b6          b7"
    "            g4          g5          g6          g7            llr         ext";

/// One line of the input dump: "label[d]=[" and the values with single blanks between them.
void dumpStream(std::ostream& out, const char* label, unsigned d, const std::vector<short>& values)
{
    morvik::messages::writePart(out, label);
    morvik::messages::writePart(out, '[');
    morvik::messages::writePart(out, d);
    morvik::messages::writePart(out, "]=[");
    const char* separator = "";
    for (const short value : values) {
        morvik::messages::writePart(out, separator);
        morvik::messages::writePart(out, value);
        separator = " ";
    }
    morvik::messages::writeLine(out, ']');
}

}  // namespace

TDecoder3G::TDecoder3G(bool layout3GPP2) : is3GPP2(layout3GPP2) {}

TDecoder* TDecoder3G::create(bool layout3GPP2, const std::string& properties)
{
    if (!properties.empty()) {
        morvik::messages::writeError("ERROR:TDecoder3G:Unexpected properties ", properties);
        return nullptr;
    }
    return new TDecoder3G(layout3GPP2);
}

bool TDecoder3G::allocate(unsigned int blockSize)
{
    const bool allocated = TDecoder::allocate(blockSize);
    for (auto* streams : {&itsSys, &itsPar0, &itsPar1}) {
        for (std::vector<short>& stream : *streams) {
            stream.clear();
            stream.reserve(blockSize);
        }
    }
    return allocated;
}

std::string TDecoder3G::getProperties() const
{
    return is3GPP2 ? "3GPP2" : "3GPP";
}

bool TDecoder3G::decode(const std::vector<short>& soft,
                        const std::vector<unsigned char>& reference,
                        std::vector<unsigned long long>& bitErrors,
                        std::vector<unsigned long long>& blockErrors)
{
    if (!extract(soft)) {
        return false;
    }
    blockErrors.resize(std::max(blockErrors.size(), bitErrors.size()));
    for (std::size_t iteration = 0; iteration < bitErrors.size(); ++iteration) {
        const unsigned h = rules::halfIterations(static_cast<unsigned>(iteration));
        if (!calcSISO(h) || !calcSISO(h + 1)) {
            return false;
        }
        const unsigned long long errors = countBitErrors(reference, hardDecisions());
        std::fill(itsLLR.end() - tailSteps, itsLLR.end(), short{0});  // the tail's ratios give no decision
        bitErrors[iteration] += errors;
        blockErrors[iteration] += errors != 0 ? 1U : 0U;
    }
    itsHalfIterationCount += 2 * static_cast<std::uint64_t>(bitErrors.size());
    ++itsDecodeCount;
    return true;
}

bool TDecoder3G::decode(const std::vector<short>& soft, std::vector<unsigned char>& hard, unsigned int iterations)
{
    if (!extract(soft)) {
        return false;
    }
    for (unsigned iteration = 0; iteration < iterations; ++iteration) {
        const unsigned h = rules::halfIterations(iteration);
        if (!calcSISO(h) || !calcSISO(h + 1)) {
            return false;
        }
    }
    itsHalfIterationCount += 2 * std::uint64_t{iterations};
    ++itsDecodeCount;
    hard = hardDecisions();
    return true;
}

bool TDecoder3G::extract(const std::vector<short>& soft)
{
    const std::size_t streamsPerDecoder = is3GPP2 ? 3 : 2;
    const std::size_t valuesPerBit = is3GPP2 ? 5 : 3;
    const std::size_t tailValues = std::size_t{2} * tailSteps * streamsPerDecoder;
    if (soft.size() < tailValues || (soft.size() - tailValues) % valuesPerBit != 0) {
        morvik::messages::writeError(
            "ERROR:TDecoder3G:Number of soft inputs does not match rate and number of tail bits");
        return false;
    }
    const auto K = static_cast<unsigned>((soft.size() - tailValues) / valuesPerBit);
    if (!allocate(K + tailSteps)) {
        return false;
    }
    InputPosition next = soft.begin();
    for (unsigned k = 0; k < K; ++k) {
        itsSys[0].push_back(*next++);
        appendParity(0, next);
        appendParity(1, next);
    }
    if (!interleaveSystematic(K)) {
        return false;
    }
    for (const unsigned d : {0U, 1U}) {
        for (unsigned step = 0; step < tailSteps; ++step) {
            itsSys[d].push_back(*next++);
            appendParity(d, next);
        }
    }
    if (itsDumpCount != 0) {
        dumpInput();
    }
    return true;
}

void TDecoder3G::appendParity(unsigned d, InputPosition& next)
{
    itsPar0[d].push_back(*next++);
    itsPar1[d].push_back(is3GPP2 ? *next++ : short{0});
}

bool TDecoder3G::interleaveSystematic(unsigned K)
{
    if (!preparePermutation(1, K)) {
        morvik::messages::writeError("ERROR:TDecoder3G:Block size not supported");
        return false;
    }
    for (unsigned i = 0; i < K; ++i) {
        itsSys[1].push_back(itsSys[0][itsInterleaver->itsPi[i]]);
    }
    return true;
}

bool TDecoder3G::preparePermutation(unsigned d, unsigned K) const
{
    if (K == 0) {
        return true;  // an empty block needs no table
    }
    std::vector<unsigned>& table = permutation(d);
    if (table.size() != K && d == 1) {
        itsInterleaver->calcInterleaver(table, K);
    } else if (table.size() != K) {
        itsInterleaver->calcDeinterleaver(table, K);
    }
    return table.size() == K;
}

std::vector<unsigned>& TDecoder3G::permutation(unsigned d) const
{
    return d == 1 ? itsInterleaver->itsPi : itsInterleaver->itsPiInv;
}

bool TDecoder3G::calcSISO(unsigned int h)
{
    if (h == 0 && !startExtrinsic()) {
        return false;
    }
    return calcIntrinsic(h) && calcGamma(h) && calcAlpha(h) && calcBeta(h) && calcLLR(h) && calcExtrinsic(h) &&
           checkDump(h);
}

bool TDecoder3G::startExtrinsic()
{
    if (itsExtrinsicIn.empty()) {
        std::fill(itsExtrinsic.begin(), itsExtrinsic.end(), short{0});
        return true;
    }
    if (itsExtrinsicIn.size() != itsBlockSize) {
        morvik::messages::writeError("ERROR:TDecoder3G:Number of soft extrinsic inputs does not match block size");
        return false;
    }
    const short mask = itsEngine->itsStateFormat->itsMask;
    std::transform(itsExtrinsicIn.begin(), itsExtrinsicIn.end(), itsExtrinsic.begin(), [mask](short value) {
        return rules::maskBits(value, mask);
    });
    itsExtrinsicIn.clear();
    return true;
}

bool TDecoder3G::calcIntrinsic(unsigned int h)
{
    const unsigned d = constituent(h);
    const unsigned K = itsBlockSize - tailSteps;
    if (!preparePermutation(d, K)) {
        return false;
    }
    const std::vector<unsigned>& from = permutation(d);
    const int mask = itsEngine->itsStateFormat->itsMask;
    for (unsigned j = 0; j < itsBlockSize; ++j) {
        const int apriori = j < K ? itsExtrinsic[from[j]] : 0;  // tail bits have no a-priori value
        itsIntrinsic[j] = rules::intrinsicValue(apriori, itsSys[d][j], mask);
    }
    return true;
}

bool TDecoder3G::calcGamma(unsigned int h)
{
    return calcGamma(h, 0, itsBlockSize - 1);
}

bool TDecoder3G::calcAlpha(unsigned int h)
{
    setInitialState(itsAlpha);
    return calcAlpha(h, 0, itsBlockSize - 1);
}

bool TDecoder3G::calcBeta(unsigned int h)
{
    setInitialState(itsBeta + itsBlockSize - 1);  // the tail terminates the trellis in state 0
    return calcBeta(h, itsBlockSize - 1, 0);
}

bool TDecoder3G::calcLLR(unsigned int h)
{
    return calcLLR(h, 0, itsBlockSize - 1);
}

bool TDecoder3G::calcExtrinsic(unsigned int)
{
    const TNumberFormat& state = *itsEngine->itsStateFormat;
    const TNumberFormat& branch = *itsEngine->itsBranchFormat;
    const std::uint32_t spareBits = state.itsNBits - branch.itsNBits;
    const int lo = rules::shiftRight(branch.itsMin, spareBits);
    const int hi = rules::shiftRight(branch.itsMax, spareBits);
    const short mask = rules::extrinsicMask(itsExtrinsicScale, state.itsMask);
    for (unsigned j = 0; j < itsBlockSize; ++j) {
        const short extrinsic = rules::extrinsicValue(itsLLR[j], itsIntrinsic[j], itsExtrinsicScale, lo, hi);
        itsExtrinsic[j] = rules::maskBits(extrinsic, mask);
    }
    return true;
}

bool TDecoder3G::calcGamma(unsigned int h, unsigned int j, unsigned int k)
{
    const unsigned d = constituent(h);
    return itsEngine->gamma(
               k - j + 1, itsIntrinsic.data() + j, itsPar0[d].data() + j, itsPar1[d].data() + j, itsGamma + j) !=
           nullptr;
}

bool TDecoder3G::calcAlpha(unsigned int, unsigned int j, unsigned int k)
{
    return itsEngine->alpha(k - j + 1, itsGamma + j, itsAlpha + j) != nullptr;
}

bool TDecoder3G::calcBeta(unsigned int, unsigned int j, unsigned int k)
{
    return itsEngine->beta(j - k + 1, itsGamma + j, itsBeta + j) != nullptr;
}

bool TDecoder3G::calcLLR(unsigned int, unsigned int j, unsigned int k)
{
    return itsEngine->llr(k - j + 1, itsAlpha + j, itsBeta + j, itsGamma + j, itsLLR.data() + j) != nullptr;
}

void TDecoder3G::setInitialState(T8* column) const
{
    for (unsigned state = 0; state < 8; ++state) {
        (*column)[state] = rules::knownMetric(state, itsEngine->itsStateFormat->itsMin);
    }
}

void TDecoder3G::setUnknownState(T8* column)
{
    std::fill_n(column->metric, 8, rules::unknownMetric);
}

std::vector<unsigned char> TDecoder3G::hardDecisions() const
{
    std::vector<unsigned char> hard(itsBlockSize - tailSteps);
    for (std::size_t k = 0; k < hard.size(); ++k) {
        hard[k] = rules::decision(itsLLR[k]) ? 1 : 0;
    }
    return hard;
}

void TDecoder3G::dump(std::ostream&) {}

void TDecoder3G::dumpInput() const
{
    std::ostream& out = morvik::messages::output();
    morvik::messages::writeLine(out, std::string(120, '-'));
    for (const unsigned d : {0U, 1U}) {
        dumpStream(out, "itsSys ", d, itsSys[d]);
        dumpStream(out, "itsPar0", d, itsPar0[d]);
        dumpStream(out, "itsPar1", d, itsPar1[d]);
    }
}

void TDecoder3G::dumpFull(std::ostream& out, unsigned int halfIteration)
{
    morvik::messages::writeLine(out, std::string(289, '-'));
    morvik::messages::writeLine(out, "decode=", itsDecodeCount, " siso=", halfIteration);
    morvik::messages::writeLine(out, tableHeader);
    TraceRow row(*itsEngine->itsStateFormat);
    for (unsigned n = 0; n < itsBlockSize; ++n) {
        row.begin(n);
        row.value(itsIntrinsic[n]);
        row.gap();
        row.values(itsAlpha[n], 0, 7);
        row.gap();
        row.values(itsBeta[n], 0, 7);
        row.gap();
        row.values(itsGamma[n], 4, 7);
        row.gap();
        row.value(itsLLR[n]);
        row.value(itsExtrinsic[n]);
        row.end(out);
    }
    out.flush();
}
