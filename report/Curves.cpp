// Curves: error rates against Eb/N0, as they are drawn and tabulated.
#include "Curves.h"

#include <algorithm>

namespace report {

namespace {

std::string counted(unsigned count, const std::string& noun)
{
    return std::to_string(count) + ' ' + noun + (count == 1 ? "" : "s");
}

std::string titleOf(const Setting& setting)
{
    std::string title;
    const auto append = [&title](bool known, const std::string& text) {
        if (known) {
            title += (title.empty() ? "" : ", ") + text;
        }
    };
    append(setting.blockSize != 0, "K = " + std::to_string(setting.blockSize));
    append(setting.numPu != 0, counted(setting.numPu, "unit"));
    append(!setting.algorithm.empty(), setting.algorithm);
    append(setting.iterations != 0, counted(setting.iterations, "iteration"));
    append(!setting.scale.empty() && setting.scale != "auto", "scale " + setting.scale);
    return title;
}

}  // namespace

std::vector<Curve> curvesOf(const std::vector<Row>& rows)
{
    std::vector<Curve> curves;
    for (const Row& row : rows) {
        const std::string title = titleOf(row.setting);
        auto curve =
            std::find_if(curves.begin(), curves.end(), [&title](const Curve& other) { return other.title == title; });
        if (curve == curves.end()) {
            curve = curves.insert(curves.end(), Curve{title, false, {}});
        }
        curve->samples.push_back(row.sample);
    }
    for (Curve& curve : curves) {
        std::stable_sort(curve.samples.begin(), curve.samples.end(), [](const Sample& a, const Sample& b) {
            return a.ebn0 < b.ebn0;
        });
    }
    return curves;
}

}  // namespace report
