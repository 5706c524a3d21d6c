// TCalculationEngineMod: the engine "MOD", max-log-MAP without correction.
#include "TCalculationEngineMod.h"

#include "Messages.h"

TCalculationEngine* TCalculationEngineMod::create(const std::string& p)
{
    if (!p.empty()) {
        morvik::messages::writeError("ERROR:TCalculationEngineMod:Unexpected properties:", p);
        return nullptr;
    }
    return new TCalculationEngineMod();
}

std::string TCalculationEngineMod::getProperties() const
{
    return "MOD";
}

bool TCalculationEngineMod::initialise()
{
    itsAlphaAlgorithmType = itsBetaAlgorithmType = itsLLRAlgorithmType = MOD;
    itsAlphaLUT = itsBetaLUT = itsLLRLUT = nullptr;
    return true;
}
