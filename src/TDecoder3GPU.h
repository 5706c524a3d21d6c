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

/// Splits the block into segments, which the processing units' threads work on at the same time,
/// and each segment into windows for the backward recursion. A recursion starts from the border
/// column that its neighbour reached: in the last pass of the same constituent decoder, or, where
/// the hardware's order makes it available, in this one. The threads are pipeline contexts of the
/// hardware; here they are computed one after the other.
class MORVIK_API TDecoder3GPU : public TDecoder3G {
public:
    /// Trellis steps: of a segment the first and the one after the last; of a window the last and
    /// the one before the first, where the backward recursion ends. The block's first window ends at
    /// its own first step, 0.
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

    /// Makes the decoder from "", "P" or "P,T": P processing units with T threads each, 4 when left
    /// out, both 1 or more. Null after one line on the standard error stream when the text is
    /// another. The caller deletes it.
    static TDecoder* create(bool layout3GPP2, const std::string& properties);

    /// "3GPPPU:P" or "3GPP2PU:P", with ",T" behind it when T is not 4.
    std::string getProperties() const override;

    /// Cuts the block into segments and windows and clears the border columns. False, after one
    /// line on the standard error stream, when K does not divide into the segments.
    bool allocate(unsigned int blockSize) override;

    /// The passes, split. The tail enters through the last window's start column alone.
    bool calcGamma(unsigned int h) override;
    bool calcAlpha(unsigned int h) override;
    bool calcBeta(unsigned int h) override;

protected:
    TDecoder3GPU(bool layout3GPP2, std::uint32_t numPU, std::uint32_t threadsPerPU);

    using TDecoder3G::calcAlpha;
    using TDecoder3G::calcBeta;
    using TDecoder3G::calcGamma;

    /// The start column of segment or window i when nothing is known of it: all states alike.
    static bool preCalcAlpha(unsigned int h, unsigned int i, T8* column);
    static bool preCalcBeta(unsigned int h, unsigned int i, T8* column);

    /// The backward metrics at step K, in closed form from the three tail steps (rule 12).
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
