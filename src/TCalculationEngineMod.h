// TCalculationEngineMod: the engine "MOD", max-log-MAP without correction.
#ifndef MORVIK_SRC_TCALCULATIONENGINEMOD_H
#define MORVIK_SRC_TCALCULATIONENGINEMOD_H

#include <string>

#include "TCalculationEngineModBase.h"

/// Decides for the greater candidate, without correction.
class MORVIK_API TCalculationEngineMod : public TCalculationEngineModBase {
public:
    /// Creates the engine. Returns null, after one line on standard error, unless the properties are
    /// empty. The caller deletes it.
    static TCalculationEngine* create(const std::string& p);

    std::string getProperties() const override;

    /// Sets the three algorithm types to "MOD" and clears the table anchors.
    bool initialise() override;

private:
    TCalculationEngineMod() = default;
};

#endif
