// TDecoder3G: the turbo decoder over the whole trellis with one engine.
#ifndef MORVIK_SRC_TDECODER3G_H
#define MORVIK_SRC_TDECODER3G_H

#include <array>
#include <string>
#include <vector>

#include "TDecoder.h"
#include "rules/Schedule.h"

/// Separates the input streams, runs the half-iterations of the two constituent decoders in turn
/// and makes the hard decisions. Constituent decoder 0 works in natural order, 1 in interleaved
/// order. Even half-iterations belong to decoder 1, odd ones to decoder 0, so every decode ends in
/// natural order.
///
/// Input layouts: LTE, 3 K + 12 values, one parity stream for each decoder; and 3GPP2, 5 K + 18
/// values, two parity streams for each. Values are aligned words of the state format.
class MORVIK_API TDecoder3G : public TDecoder {
public:
    std::array<std::vector<short>, 2> itsSys;   ///< systematic values of each constituent decoder, K + 3
    std::array<std::vector<short>, 2> itsPar0;  ///< first parity values, K + 3
    std::array<std::vector<short>, 2> itsPar1;  ///< second parity values, K + 3; zeros in the LTE layout
    const bool is3GPP2;                         ///< the input layout

    /// Creates the decoder. Returns null, after one line on standard error, unless the properties are
    /// empty. The caller deletes it.
    static TDecoder* create(bool layout3GPP2, const std::string& properties);

    bool allocate(unsigned int blockSize) override;

    /// "3GPP2" or "3GPP".
    std::string getProperties() const override;

    /// Adds the errors left after iteration t to entry t of bitErrors and blockErrors.
    bool decode(const std::vector<short>& soft,
                const std::vector<unsigned char>& reference,
                std::vector<unsigned long long>& bitErrors,
                std::vector<unsigned long long>& blockErrors) override;

    bool decode(const std::vector<short>& soft, std::vector<unsigned char>& hard, unsigned int iterations) override;

    void dump(std::ostream& out) override;

    /// Writes a table with one row for each trellis step: intrinsic value, forward and backward
    /// metrics, elements 4 to 7 of the branch metric column (which no kernel uses), log-likelihood
    /// ratio and extrinsic value, as real numbers.
    void dumpFull(std::ostream& out, unsigned int halfIteration) override;

    /// The steps of a decode, in order of use; h is the half-iteration. Each returns false if the
    /// decode must end.
    virtual bool extract(const std::vector<short>& soft);
    virtual bool calcIntrinsic(unsigned int h);
    virtual bool calcGamma(unsigned int h);
    virtual bool calcAlpha(unsigned int h);
    virtual bool calcBeta(unsigned int h);
    virtual bool calcLLR(unsigned int h);
    virtual bool calcExtrinsic(unsigned int h);
    virtual bool calcSISO(unsigned int h);

protected:
    explicit TDecoder3G(bool layout3GPP2);

    /// The constituent decoder of half-iteration h.
    static unsigned constituent(unsigned int h)
    {
        return morvik::rules::constituentOf(h);
    }

    /// Runs one kernel over the trellis steps j to k, the backward recursion from j down to k. The
    /// start column of a recursion, at step j, must be set.
    bool calcGamma(unsigned int h, unsigned int j, unsigned int k);
    bool calcAlpha(unsigned int h, unsigned int j, unsigned int k);
    bool calcBeta(unsigned int h, unsigned int j, unsigned int k);
    bool calcLLR(unsigned int h, unsigned int j, unsigned int k);

    /// Sets the column of an encoder known to be in state 0: 0 for state 0, half the most negative
    /// metric for the others (rule 10).
    void setInitialState(T8* column) const;

    /// Sets the column of an unknown state: zeros (rule 10).
    static void setUnknownState(T8* column);

private:
    using InputPosition = std::vector<short>::const_iterator;

    /// Reads the parity values of one trellis step of constituent decoder d from the input.
    void appendParity(unsigned d, InputPosition& next);
    bool interleaveSystematic(unsigned K);
    /// Computes the table by which constituent decoder d reads extrinsic values, unless it has K entries.
    bool preparePermutation(unsigned d, unsigned K) const;
    std::vector<unsigned>& permutation(unsigned d) const;
    /// Sets the extrinsic values that a decode starts from: the preset ones, or zeros.
    bool startExtrinsic();
    std::vector<unsigned char> hardDecisions() const;
    void dumpInput() const;
};

#endif
