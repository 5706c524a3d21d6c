// TCalculationEngineModHash: the engine "MOD#", max-log-MAP with a correction one stage late.
#include "TCalculationEngineModHash.h"

#include <locale>
#include <sstream>
#include <utility>

#include "Messages.h"

TCalculationEngineModHash::TCalculationEngineModHash(unsigned numPoints) : itsNumPoints(numPoints) {}

TCalculationEngine* TCalculationEngineModHash::create(const std::string& p)
{
    unsigned points = 0;
    if (!p.empty()) {
        std::istringstream text(p);
        text.imbue(std::locale::classic());
        text >> points;
        if (text.fail()) {
            morvik::messages::writeError("ERROR:TCalculationEngineModHash:Illegal number of points");
            return nullptr;
        }
    }
    return new TCalculationEngineModHash(points);
}

std::string TCalculationEngineModHash::getProperties() const
{
    return "MOD#:" + std::to_string(itsNumPoints);
}

bool TCalculationEngineModHash::initialise()
{
    std::vector<unsigned char> lut = createLUT(itsNumPoints, *itsStateFormat);
    if (lut.empty()) {
        return false;
    }
    itsLUT = std::move(lut);
    itsAlphaAlgorithmType = itsBetaAlgorithmType = itsLLRAlgorithmType = MOD_HASH;
    itsAlphaLUT = itsBetaLUT = itsLLRLUT = itsLUT.data() + itsLUT.size() / 2;
    return true;
}
