// TDecoder3GPU: the turbo decoder split over parallel processing units.
#include "TDecoder3GPU.h"

#include <locale>
#include <ostream>
#include <sstream>
#include <utility>

#include "Messages.h"
#include "rules/Arithmetic.h"
#include "rules/Cut.h"
#include "rules/Schedule.h"
#include "rules/Starts.h"
#include "rules/Trellis.h"

namespace rules = morvik::rules;

namespace {

constexpr std::uint32_t defaultUnits = 4;
constexpr std::uint32_t traceSegments = 1;  ///< above this level, the segmentation is traced
constexpr std::uint32_t traceColumns = 8;   ///< above this level, every border column is traced

/// Returns a column as stored at a border between segments or windows (rule 11).
T8 border(const T8& column)
{
    T8 kept{};
    for (unsigned state = 0; state < 8; ++state) {
        kept[state] = rules::maskBits(column[state], rules::borderMask);
    }
    return kept;
}

/// Reads one of the decoder's numbers. Returns false, after an error line, if it is missing or 0.
bool readNumber(std::istream& text, const char* what, std::uint32_t& number)
{
    text >> number;
    if (text.fail() || number == 0) {
        morvik::messages::writeError("ERROR:TDecoder3GPU:Illegal number of ", what, ":", number);
        return false;
    }
    return true;
}

/// "[m0 m1 ... m7]"
std::string text(const T8& column)
{
    std::string metrics;
    for (const short metric : column.metric) {
        metrics += (metrics.empty() ? "[" : " ") + std::to_string(metric);
    }
    return metrics + "]";
}

std::string text(const std::vector<TDecoder3GPU::ABSegment>& segments)
{
    std::ostringstream list;
    list.imbue(std::locale::classic());
    list.exceptions(std::ios::badbit);  // exhausted memory throws instead of losing a segment silently
    const char* separator = "";
    for (const TDecoder3GPU::ABSegment& segment : segments) {
        list << separator << segment;
        separator = " ";
    }
    return list.str();
}

void traceStarts(const char* label, const std::vector<T8>& starts)
{
    for (std::size_t i = 0; i < starts.size(); ++i) {
        morvik::messages::writeLine(morvik::messages::output(), label, i, "]=", text(starts[i]));
    }
}

}  // namespace

TDecoder3GPU::TDecoder3GPU(bool layout3GPP2, std::uint32_t numPU, std::uint32_t threadsPerPU)
    : TDecoder3G(layout3GPP2), itsNumPU(numPU), itsThreadsPerPU(threadsPerPU)
{
}

TDecoder* TDecoder3GPU::create(bool layout3GPP2, const std::string& properties)
{
    std::uint32_t units = defaultUnits;
    std::uint32_t threads = rules::threadsOfUnit;
    if (!properties.empty()) {
        std::istringstream numbers(properties);
        numbers.imbue(std::locale::classic());
        if (!readNumber(numbers, "processing units", units)) {
            return nullptr;
        }
        if (numbers.peek() == ',') {
            numbers.get();
            if (!readNumber(numbers, "threads per processing unit", threads)) {
                return nullptr;
            }
        }
    }
    return new TDecoder3GPU(layout3GPP2, units, threads);
}

std::string TDecoder3GPU::getProperties() const
{
    const std::string units = (is3GPP2 ? "3GPP2PU:" : "3GPPPU:") + std::to_string(itsNumPU);
    return itsThreadsPerPU == rules::threadsOfUnit ? units : units + "," + std::to_string(itsThreadsPerPU);
}

bool TDecoder3GPU::allocate(unsigned int blockSize)
{
    if (!TDecoder3G::allocate(blockSize)) {
        return false;
    }
    // The last segment's end is the K of the cut; a refused size leaves no segments.
    const std::uint32_t K = blockSize - tailSteps;
    if ((itsAlphaSegment.empty() || itsAlphaSegment.back().to != K) && !buildSegments(K)) {
        return false;
    }
    for (const unsigned d : {0U, 1U}) {
        itsAlphaInit[d].assign(itsAlphaSegment.size(), T8{});
        itsBetaInit[d].assign(itsBetaSegment.size(), T8{});
    }
    return true;
}

bool TDecoder3GPU::buildSegments(std::uint32_t K)
{
    itsAlphaSegment.clear();
    itsBetaSegment.clear();
    const rules::Cut cut(K, itsNumPU, itsThreadsPerPU);
    itsNT = cut.segments();
    if (itsTraceLevel > 0) {
        morvik::messages::writeLine(morvik::messages::output(), "itsNT=", itsNT);
    }
    if (!cut.dividesEvenly()) {
        morvik::messages::writeError("ERROR:TDecoder3GPU:Block size not supported");
        return false;
    }
    std::vector<ABSegment> segments;
    for (std::uint32_t u = 0; u < itsNT; ++u) {
        segments.push_back({u * cut.segmentLength(), (u + 1) * cut.segmentLength()});
    }
    std::vector<ABSegment> windows;
    for (std::uint32_t i = 0; i < cut.windows(); ++i) {
        const rules::Window window = cut.window(i);
        windows.push_back({window.last, window.first == 0 ? 0 : window.first - 1});
    }
    itsAlphaSegment = std::move(segments);
    itsBetaSegment = std::move(windows);
    if (itsTraceLevel > traceSegments) {
        morvik::messages::writeLine(morvik::messages::output(), "itsAlphaSegment=", text(itsAlphaSegment));
        morvik::messages::writeLine(morvik::messages::output(), "itsBetaSegment =", text(itsBetaSegment));
    }
    return true;
}

bool TDecoder3GPU::calcGamma(unsigned int h)
{
    // Without the tail steps. For an empty block the range is empty: 0 to -1, modulo 2^32.
    return calcGamma(h, 0, itsBlockSize - tailSteps - 1);
}

bool TDecoder3GPU::calcAlpha(unsigned int h)
{
    std::vector<T8>& starts = itsAlphaInit[constituent(h)];
    const bool traced = itsTraceLevel > traceColumns;
    if (traced) {
        morvik::messages::writeLine(morvik::messages::output(), "TDecoder3GPU::calcAlpha(", h, ")");
    }
    if (rules::isFirstPass(h)) {
        initialiseAlpha(h);
    }
    T8 reached = starts[0];
    for (std::size_t u = 0; u < starts.size(); ++u) {
        const auto [from, to] = itsAlphaSegment[u];
        const T8 start = starts[u];
        itsAlpha[from] = start;
        starts[u] = border(reached);
        if (traced) {
            morvik::messages::writeLine(morvik::messages::output(),
                                        "from=",
                                        from,
                                        " to=",
                                        to,
                                        " init=",
                                        text(start),
                                        " newinit=",
                                        text(starts[u]));
        }
        if (!calcAlpha(h, from, to)) {
            return false;
        }
        reached = itsAlpha[to];
    }
    if (traced) {
        traceStarts("itsAlphaInit[", starts);
    }
    return true;
}

void TDecoder3GPU::initialiseAlpha(unsigned int h)
{
    std::vector<T8>& starts = itsAlphaInit[constituent(h)];
    setInitialState(starts.data());
    for (unsigned u = 1; u < starts.size(); ++u) {
        preCalcAlpha(h, u, &starts[u]);
    }
}

bool TDecoder3GPU::calcBeta(unsigned int h)
{
    std::vector<T8>& starts = itsBetaInit[constituent(h)];
    const bool traced = itsTraceLevel > traceColumns;
    if (traced) {
        morvik::messages::writeLine(morvik::messages::output(), "TDecoder3GPU::calcBeta(", h, ")");
    }
    if (rules::isFirstPass(h)) {
        initialiseBeta(h);
    }
    // The units hold one start column for each segment, and fetch the next row's before they run the
    // recursion of this row's window, not after.
    std::vector<T8> row = starts;
    row.resize(itsNT);
    for (std::size_t i = 0; i < starts.size(); ++i) {
        T8& held = row[i % itsNT];
        const T8 start = rules::isFirstPass(h) && i + 1 < starts.size() ? T8{} : held;
        if (i + itsNT < starts.size()) {
            held = starts[i + itsNT];
        }
        if (!runWindow(h, i, start)) {
            return false;
        }
    }
    if (traced) {
        traceStarts("itsBetaInit[", starts);
    }
    return true;
}

void TDecoder3GPU::initialiseBeta(unsigned int h)
{
    std::vector<T8>& starts = itsBetaInit[constituent(h)];
    for (unsigned i = 0; i + 1 < starts.size(); ++i) {
        preCalcBeta(h, i, &starts[i]);
    }
    if (!starts.empty()) {
        preCalcBetaTail(h, &starts.back());
    }
}

bool TDecoder3GPU::runWindow(unsigned int h, std::size_t i, const T8& start)
{
    const auto [from, to] = itsBetaSegment[i];
    const T8 neighbours = itsBeta[to];
    itsBeta[from] = start;
    if (!calcBeta(h, from, to)) {
        return false;
    }
    const T8 reached = itsBeta[to];
    if (itsTraceLevel > traceColumns) {
        morvik::messages::writeLine(morvik::messages::output(),
                                    "from=",
                                    from,
                                    " to=",
                                    to,
                                    " beta[from]=",
                                    text(start),
                                    " beta[to]=",
                                    text(reached));
    }
    if (i == 0) {
        return true;  // no window starts where the block's first one ends
    }
    const std::size_t entry = windowStartingWhereEnds(i);
    T8& stored = itsBetaInit[constituent(h)][entry];
    stored = border(reached);
    itsBeta[to] = neighbours;
    if (itsTraceLevel > traceColumns) {
        morvik::messages::writeLine(morvik::messages::output(), " init[", entry, "]=", text(stored));
    }
    return true;
}

std::size_t TDecoder3GPU::windowStartingWhereEnds(std::size_t i) const
{
    return rules::windowBefore<std::size_t>(i, itsNT, itsBetaSegment.size());
}

bool TDecoder3GPU::preCalcAlpha(unsigned int, unsigned int, T8* column)
{
    setUnknownState(column);
    return true;
}

bool TDecoder3GPU::preCalcBeta(unsigned int, unsigned int, T8* column)
{
    setUnknownState(column);
    return true;
}

bool TDecoder3GPU::preCalcBetaTail(unsigned int h, T8* column) const
{
    const unsigned d = constituent(h);
    const std::size_t K = itsBlockSize - tailSteps;
    rules::Tail<int> tail{};
    for (unsigned step = 0; step < tailSteps; ++step) {
        tail.x[step] = itsSys[d][K + step];
        tail.p[step] = itsPar0[d][K + step];
        tail.q[step] = itsPar1[d][K + step];
    }
    const auto metrics = rules::tailColumn(tail);
    for (unsigned state = 0; state < 8; ++state) {
        (*column)[state] = rules::wrap16(metrics[state]);
    }
    *column = border(*column);
    return true;
}

std::ostream& operator<<(std::ostream& os, const TDecoder3GPU::ABSegment& segment)
{
    return os << '[' << segment.from << ',' << segment.to << ')';
}
