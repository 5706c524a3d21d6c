// TDecoder: the base class of turbo decoders, their common data and their factory.
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

/// Decodes one code block at a time. The trellis of a block of K bits has N = K + 3 steps, the last
/// three being the termination tail. A half-iteration is one soft-in/soft-out pass of one constituent
/// decoder over the trellis; two make an iteration.
///
/// Order of use: create, set itsInterleaver and itsEngine (neither is owned), then decode any number
/// of times. The data members are public so that a test bench can watch or preset values.
class MORVIK_API TDecoder {
public:
    TInterleaver* itsInterleaver = nullptr;
    TCalculationEngine* itsEngine = nullptr;
    std::uint32_t itsBlockSize = 0;                    ///< N of the current block
    std::unique_ptr<unsigned char[]> itsMetricBuffer;  ///< storage of the three metric arrays
    std::uint32_t itsMetricBufferSize = 0;             ///< in bytes; only grows
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

    /// Sizes the storage for a trellis of `blockSize` steps. Zeroes the metric columns only when
    /// newly allocated, the soft values always. Throws std::bad_alloc.
    virtual bool allocate(unsigned int blockSize);

    virtual ~TDecoder();

    /// The type name and properties in property-string form.
    virtual std::string getProperties() const = 0;

    /// Decodes and counts errors against the reference bits, with one iteration for each entry of
    /// bitErrors; the derived class defines what each entry counts. Extends blockErrors with zeros if
    /// it is shorter than bitErrors. Returns false if the decode fails.
    virtual bool decode(const std::vector<short>& soft,
                        const std::vector<unsigned char>& reference,
                        std::vector<unsigned long long>& bitErrors,
                        std::vector<unsigned long long>& blockErrors);

    /// Decodes a block of aligned soft values into K hard bits. Returns false, after one line on
    /// standard error, if the block is refused.
    virtual bool decode(const std::vector<short>& soft, std::vector<unsigned char>& hard, unsigned int iterations) = 0;

    /// Writes a summary of the decoder; the base writes nothing.
    virtual void dump(std::ostream& out);

    /// Writes the trace of a half-iteration; the base writes nothing.
    virtual void dumpFull(std::ostream& out, unsigned int halfIteration);

    /// Creates a decoder from a property string, "3GPPPU" with optional properties after ":". Returns
    /// null, after one line on standard error, for any other text. The caller deletes it.
    static TDecoder* create(const std::string& properties);

    /// The type names that create knows.
    static std::vector<std::string> getNames();

protected:
    /// Steps of the termination tail: one for each delay element of the encoder.
    static constexpr unsigned tailSteps = morvik::rules::tailSteps;

    TDecoder() = default;
    TDecoder(const TDecoder&) = delete;
    TDecoder& operator=(const TDecoder&) = delete;

    /// Counts the positions in which two blocks differ, including those that only one of them has.
    static unsigned long long countBitErrors(const std::vector<unsigned char>& reference,
                                             const std::vector<unsigned char>& hard);

    /// Dumps a half-iteration while the dump count lasts. Returns false if the decode must end here.
    bool checkDump(unsigned int halfIteration);
};

#endif
