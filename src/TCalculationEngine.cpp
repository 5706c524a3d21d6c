// TCalculationEngine: the family of trellis calculation engines and its factory.
#include "TCalculationEngine.h"

#include "Messages.h"
#include "Misc.h"
#include "TCalculationEngineMod.h"
#include "TCalculationEngineModHash.h"

TCalculationEngine::~TCalculationEngine() = default;

bool TCalculationEngine::initialise()
{
    const int mask = itsStateFormat->itsMask;
    if (mask == mask / 2) {
        morvik::messages::writeWarning(
            "WARNING:The state number format is set to maximum bit width. "
            "Note that this will cause a 1-bit truncation during intrinsic calculations");
    }
    return true;
}

TCalculationEngine* TCalculationEngine::create(const std::string& s)
{
    const auto [type, properties] = splitString(s, ":");
    if (type == "MOD") {
        return TCalculationEngineMod::create(properties);
    }
    if (type == "MOD#") {
        return TCalculationEngineModHash::create(properties);
    }
    morvik::messages::writeError("ERROR:TCalculationEngine:Unrecognised type:", type);
    return nullptr;
}

std::vector<std::string> TCalculationEngine::getNames()
{
    return {"MOD"};
}
