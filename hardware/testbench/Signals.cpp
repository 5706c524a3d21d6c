// Signals: the values of a trellis step, and the operations that compute them.
#include "Signals.h"

#include <numeric>

#include "base/Text.h"

namespace morvik {

std::string nameOf(Stage stage)
{
    const std::string name = passSignals[signalsOf(stage).first].name;
    return name.substr(0, name.find_last_not_of("0123456789") + 1);
}

std::vector<unsigned> allSignals()
{
    std::vector<unsigned> signals(signalCount);
    std::iota(signals.begin(), signals.end(), 0U);
    return signals;
}

std::string signalNames(const std::vector<unsigned>& signals)
{
    const auto name = [](unsigned signal) {
        return std::string(passSignals[signal].name);
    };
    const auto continuesRange = [](unsigned signal) {
        return signalsOf(stageOf(signal)).first != signal;
    };
    return base::listed(signals, name, continuesRange);
}

}  // namespace morvik
