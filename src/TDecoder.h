// TDecoder: the family of turbo decoders, what they all store, and their factory.
#ifndef MORVIK_SRC_TDECODER_H
#define MORVIK_SRC_TDECODER_H

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

#include "T8.h"
#include "TCalculationEngine.h"
#include "TInterleaver.h"
#include "morvik_v1_0_bitacc_cmodel.h"
#include "rules/Tail.h"

/// A turbo decoder works on one code block at a time. The trellis of a block of K bits has
/// N = K + 3 steps, the last three being the termination tail. A half-iteration is one
/// soft-in/soft-out pass of one constituent decoder over the trellis; two make an iteration.
///
/// Order of use: create, set itsInterleaver and itsEngine (neither is owned), then decode, as often
/// as wanted. The data members are open to a test bench that watches or presets values.
class MORVIK_API TDecoder {
public:
    TInterleaver* itsInterleaver = nullptr;
    TCalculationEngine* itsEngine = nullptr;
    std::uint32_t itsBlockSize = 0;                    ///< N of the current block
    std::unique_ptr<unsigned char[]> itsMetricBuffer;  ///< storage of the three metric arrays
    std::uint32_t itsMetricBufferSize = 0;             ///< in bytes; it only grows
    T8* itsAlpha = nullptr;                            ///< forward metrics, a column for each step
    T8* itsBeta = nullptr;                             ///< backward metrics
    T8* itsGamma = nullptr;                            ///< branch metrics, elements 0 to 3
    std::vector<short> itsIntrinsic;                   ///< systematic plus a-priori values, N
    std::vector<short> itsLLR;                         ///< log-likelihood ratios of the last half-iteration, N
    std::vector<short> itsExtrinsic;                   ///< what a half-iteration hands to the next, N
    std::vector<short> itsExtrinsicIn;                 ///< preset a-priori values of the next decode, N or none
    double itsExtrinsicScale = 1.0;                    ///< factor applied to extrinsic values
    std::uint64_t itsDecodeCount = 0;                  ///< decodes completed
    std::uint64_t itsHalfIterationCount = 0;           ///< half-iterations of completed decodes
    std::uint32_t itsTraceLevel = 0;                   ///< of the units: 1 segment count, 2 windows, 9 border columns
    std::uint32_t itsDumpCount = 0;                    ///< half-iterations still to be dumped
    bool itsStopAfterDump = false;                     ///< whether a decode ends when the dump count runs out

    /// Sizes the storage for a trellis of `blockSize` steps. The metric columns are zeroed when
    /// they are newly allocated and left alone when they are reused; the soft values are zeroed
    /// always. Exhausted memory throws std::bad_alloc.
    virtual bool allocate(unsigned int blockSize);

    virtual ~TDecoder();

    /// The type name and properties in property-string form.
    virtual std::string getProperties() const = 0;

    /// Decodes and counts errors against the reference bits, with as many iterations as bitErrors
    /// has entries; what each entry counts is told by the concrete class. A blockErrors that is
    /// shorter than bitErrors is extended with zeros. False when the decode fails.
    virtual bool decode(const std::vector<short>& soft,
                        const std::vector<unsigned char>& reference,
                        std::vector<unsigned long long>& bitErrors,
                        std::vector<unsigned long long>& blockErrors);

    /// Decodes a block of aligned soft values into K hard bits. False, after one line on the
    /// standard error stream, when the block is refused.
    virtual bool decode(const std::vector<short>& soft, std::vector<unsigned char>& hard, unsigned int iterations) = 0;

    /// Writes a summary of the decoder: nothing here.
    virtual void dump(std::ostream& out);

    /// Writes the trace of a half-iteration: nothing here.
    virtual void dumpFull(std::ostream& out, unsigned int halfIteration);

    /// Makes a decoder from a property string, "3GPPPU" with optional properties behind ":"; null
    /// after one line on the standard error stream when the text is another. The caller deletes it.
    static TDecoder* create(const std::string& properties);

    /// The type names that create knows.
    static std::vector<std::string> getNames();

protected:
    /// Steps of the termination tail: one for each delay element of the encoder.
    static constexpr unsigned tailSteps = morvik::rules::tailSteps;

    TDecoder() = default;
    TDecoder(const TDecoder&) = delete;
    TDecoder& operator=(const TDecoder&) = delete;

    /// The positions in which two blocks differ, a position that one of them lacks included.
    static unsigned long long countBitErrors(const std::vector<unsigned char>& reference,
                                             const std::vector<unsigned char>& hard);

    /// Dumps a half-iteration while the dump count lasts; false when the decode is to end here.
    bool checkDump(unsigned int halfIteration);
};

#endif
