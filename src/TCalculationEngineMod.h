// TCalculationEngineMod: the engine "MOD", max-log-MAP without correction.
#ifndef MORVIK_SRC_TCALCULATIONENGINEMOD_H
#define MORVIK_SRC_TCALCULATIONENGINEMOD_H

#include <string>

#include "TCalculationEngineModBase.h"

/// The engine that decides for the greater candidate and corrects nothing.
class MORVIK_API TCalculationEngineMod : public TCalculationEngineModBase {
public:
    /// Makes the engine; the properties must be empty, else null after one line on the standard
    /// error stream. The caller deletes it.
    static TCalculationEngine* create(const std::string& p);

    std::string getProperties() const override;

    /// Sets the three algorithm types to "MOD" and clears the table anchors.
    bool initialise() override;

private:
    TCalculationEngineMod() = default;
};

#endif
