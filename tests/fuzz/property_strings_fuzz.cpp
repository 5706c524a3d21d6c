// property_strings_fuzz: the factories of the four families take any text.
#include <memory>
#include <sstream>

#include "FuzzInput.h"
#include "TCalculationEngine.h"
#include "TCalculationEngineModBase.h"
#include "TDecoder.h"
#include "TDecoder3GPU.h"
#include "TInterleaver.h"
#include "TNumberFormat.h"

namespace {

void createFormat(const std::string& text)
{
    const std::unique_ptr<TNumberFormat> format(TNumberFormat::create(text));
    if (format != nullptr) {
        const std::unique_ptr<TNumberFormat> again(TNumberFormat::create(format->getProperties()));
        require(again != nullptr, "a format's properties make a format");
        std::ostringstream first;
        std::ostringstream second;
        first << *format;
        second << *again;
        require(first.str() == second.str(), "a format's properties make an equal format");
    }
}

void createInterleaver(const std::string& text)
{
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create(text));
    require(interleaver == nullptr || interleaver->getProperties() == "3GPPLTE", "an interleaver tells its name");
}

void createEngine(const std::string& text)
{
    const std::unique_ptr<TCalculationEngine> engine(TCalculationEngine::create(text));
    if (engine != nullptr) {
        const TNumberFormat state(12, 3);
        const TNumberFormat branch(8, 3);
        engine->itsStateFormat = &state;
        engine->itsInputFormat = engine->itsBranchFormat = &branch;
        engine->initialise();
    }
    std::istringstream words(text);
    TCalculationEngineModBase::AlgorithmType type = TCalculationEngineModBase::MOD;
    words >> type;
    require(type >= TCalculationEngineModBase::UNKNOWN && type <= TCalculationEngineModBase::MOD_HASH,
            "an algorithm type is one of four");
}

void createDecoder(const std::string& text)
{
    const std::unique_ptr<TDecoder> decoder(TDecoder::create(text));
    if (decoder != nullptr) {
        for (const unsigned N : {43U, 131U, 643U}) {
            decoder->allocate(N);
        }
    }
    const std::unique_ptr<TDecoder> other(TDecoder3GPU::create(true, text));
    require(other == nullptr || other->getProperties().rfind("3GPP2PU:", 0) == 0, "a decoder tells its layout");
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const SilencedStreams silenced;
    FuzzInput input(data, size);
    const unsigned family = input.below(4);
    const std::string text = input.text();
    constexpr void (*create[])(const std::string&) = {createFormat, createInterleaver, createEngine, createDecoder};
    create[family](text);
    return 0;
}
