// TCalculationEngineModHash: the engine "MOD#", max-log-MAP with a correction one stage late.
#ifndef MORVIK_SRC_TCALCULATIONENGINEMODHASH_H
#define MORVIK_SRC_TCALCULATIONENGINEMODHASH_H

#include <string>
#include <vector>

#include "TCalculationEngineModBase.h"

/// Owns a correction table and uses it for alpha, beta and llr.
class MORVIK_API TCalculationEngineModHash : public TCalculationEngineModBase {
public:
    unsigned itsNumPoints;              ///< points of the table; 0 means 65536
    std::vector<unsigned char> itsLUT;  ///< the table, empty before initialise

    /// Creates the engine from its number of points in decimal; an empty text means 0. Returns null,
    /// after one line on standard error, if the text does not begin with a number. The caller deletes
    /// the engine.
    static TCalculationEngine* create(const std::string& p);

    std::string getProperties() const override;

    /// Builds the table from the state format, sets the three algorithm types to "MOD#" and their
    /// anchors to the table. Returns false, with nothing changed, if the table cannot be built.
    bool initialise() override;

private:
    explicit TCalculationEngineModHash(unsigned numPoints);
};

#endif
