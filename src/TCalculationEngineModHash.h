// TCalculationEngineModHash: the engine "MOD#", max-log-MAP with a correction one stage late.
#ifndef MORVIK_SRC_TCALCULATIONENGINEMODHASH_H
#define MORVIK_SRC_TCALCULATIONENGINEMODHASH_H

#include <string>
#include <vector>

#include "TCalculationEngineModBase.h"

/// The engine that owns a correction table and uses it for alpha, beta and llr alike.
class MORVIK_API TCalculationEngineModHash : public TCalculationEngineModBase {
public:
    unsigned itsNumPoints;              ///< points of the table; 0 means 65536
    std::vector<unsigned char> itsLUT;  ///< the table, empty before initialise

    /// Makes the engine from its number of points in decimal, or from an empty text for 0. Null
    /// after one line on the standard error stream when the text does not begin with a number. The
    /// caller deletes the engine.
    static TCalculationEngine* create(const std::string& p);

    std::string getProperties() const override;

    /// Builds the table from the state format, sets the three algorithm types to "MOD#" and their
    /// anchors to the table. False, with nothing changed, when the table cannot be built.
    bool initialise() override;

private:
    explicit TCalculationEngineModHash(unsigned numPoints);
};

#endif
