// TDecoder3GPU: the turbo decoder split over parallel processing units.
#ifndef MORVIK_SRC_TDECODER3GPU_H
#define MORVIK_SRC_TDECODER3GPU_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <string>
#include <vector>

#include "TDecoder3G.h"

/// Splits the block into segments, which the processing units' threads compute in parallel, and each
/// segment into windows for the backward recursion. A recursion starts from the border column that
/// its neighbour reached: in the last pass of the same constituent decoder, or in this one if the
/// hardware's order makes it available. The threads are pipeline contexts of the hardware; the model
/// computes them one after the other.
class MORVIK_API TDecoder3GPU : public TDecoder3G {
public:
    /// A range of trellis steps. Segment: its first step, and the one after its last. Window: its last
    /// step, and the one before its first, where the backward recursion ends; the block's first window
    /// ends at its own first step, 0.
    struct ABSegment {
        std::uint32_t from;
        std::uint32_t to;
    };

    const std::uint32_t itsNumPU;                 ///< processing units
    const std::uint32_t itsThreadsPerPU;          ///< threads of each
    std::uint32_t itsNT = 0;                      ///< segments of the current block
    std::array<std::vector<T8>, 2> itsAlphaInit;  ///< forward start columns, one for each segment
    std::vector<ABSegment> itsAlphaSegment;       ///< the segments
    std::array<std::vector<T8>, 2> itsBetaInit;   ///< backward start columns, one for each window
    std::vector<ABSegment> itsBetaSegment;        ///< the windows, row by row: one window of each segment

    /// Creates the decoder from "", "P" or "P,T": P processing units with T threads each, both 1 or
    /// more, 4 by default. Returns null, after one line on standard error, for any other text. The
    /// caller deletes it.
    static TDecoder* create(bool layout3GPP2, const std::string& properties);

    /// "3GPPPU:P" or "3GPP2PU:P", followed by ",T" if T is not 4.
    std::string getProperties() const override;

    /// Cuts the block into segments and windows and clears the border columns. Returns false, after
    /// one line on standard error, if K is not divisible by the number of segments.
    bool allocate(unsigned int blockSize) override;

    /// The kernels, split into segments or windows. The tail enters only through the last window's start column.
    bool calcGamma(unsigned int h) override;
    bool calcAlpha(unsigned int h) override;
    bool calcBeta(unsigned int h) override;

protected:
    TDecoder3GPU(bool layout3GPP2, std::uint32_t numPU, std::uint32_t threadsPerPU);

    using TDecoder3G::calcAlpha;
    using TDecoder3G::calcBeta;
    using TDecoder3G::calcGamma;

    /// Sets the start column of segment or window i to the unknown state: all states alike.
    static bool preCalcAlpha(unsigned int h, unsigned int i, T8* column);
    static bool preCalcBeta(unsigned int h, unsigned int i, T8* column);

    /// Computes the backward metrics at step K in closed form from the three tail steps (rule 12).
    bool preCalcBetaTail(unsigned int h, T8* column) const;

private:
    bool buildSegments(std::uint32_t K);
    /// The window that starts at the step where window i, other than 0, ends.
    std::size_t windowStartingWhereEnds(std::size_t i) const;
    void initialiseAlpha(unsigned int h);
    void initialiseBeta(unsigned int h);
    bool runWindow(unsigned int h, std::size_t i, const T8& start);
};

/// Writes "[from,to)".
MORVIK_API std::ostream& operator<<(std::ostream& os, const TDecoder3GPU::ABSegment& segment);

#endif
