// Curves: error rates against Eb/N0 and against iterations, for plots and tables.
#include "Curves.h"

#include <algorithm>
#include <cmath>
#include <map>
#include <utility>

#include "Wording.h"
#include "base/Text.h"

namespace morvik::report {

namespace {

std::string titleOf(const Setting& setting)
{
    std::string title;
    const auto append = [&title](bool known, const std::string& text) {
        if (known) {
            title += (title.empty() ? "" : ", ") + text;
        }
    };
    append(setting.blockSize != 0 && setting.sent.empty(), "K = " + std::to_string(setting.blockSize));
    append(!setting.sent.empty(), setting.sent);
    title += setting.received;
    append(setting.numPu != 0, base::counted(setting.numPu, "unit"));
    append(!setting.algorithm.empty(), setting.algorithm);
    append(setting.iterations != 0, base::counted(setting.iterations, "iteration"));
    append(!setting.scale.empty() && setting.scale != "auto", "scale " + setting.scale);
    return title;
}

}  // namespace

double Sample::place() const
{
    return std::isfinite(esn0) ? esn0 : ebn0;
}

std::vector<Curve> curvesOf(const std::vector<Row>& rows)
{
    const bool hasIterations = std::any_of(rows.begin(), rows.end(), [&rows](const Row& row) {
        return row.setting.iterations != rows.front().setting.iterations;
    });
    std::vector<Curve> curves;
    for (const Row& row : rows) {
        const std::string title = titleOf(row.setting);
        auto curve =
            std::find_if(curves.begin(), curves.end(), [&title](const Curve& other) { return other.title == title; });
        if (curve == curves.end()) {
            Setting others = row.setting;
            others.iterations = 0;
            if (!hasIterations && !others.sent.empty()) {
                others.sent.clear();
                others.blockSize = 0;
            }
            curve = curves.insert(curves.end(), Curve{title, false, {}, titleOf(others)});
        }
        curve->samples.push_back(row.sample);
        curve->samples.back().iterations = row.setting.iterations;
    }
    for (Curve& curve : curves) {
        std::stable_sort(curve.samples.begin(), curve.samples.end(), [](const Sample& a, const Sample& b) {
            return a.place() < b.place();
        });
    }
    return curves;
}

std::vector<Curve> againstIterations(const std::vector<Curve>& curves)
{
    std::map<std::pair<std::size_t, double>, Curve> found;  // keyed by the first curve of the family, and Eb/N0
    for (const Curve& curve : curves) {
        const auto first = std::find_if(curves.begin(), curves.end(), [&curve](const Curve& other) {
            return other.family == curve.family && other.reference == curve.reference;
        });
        for (const Sample& sample : curve.samples) {
            if (sample.iterations != 0) {
                Curve& across = found[{static_cast<std::size_t>(first - curves.begin()), sample.place()}];
                const std::string separator = curve.family.empty() ? "" : ", ";
                across.title = curve.family + separator + decibels(sample.place()) + " dB";
                across.family = curve.family;
                across.reference = curve.reference;
                across.samples.push_back(sample);
            }
        }
    }
    std::vector<Curve> result;
    for (auto& [place, curve] : found) {
        std::stable_sort(curve.samples.begin(), curve.samples.end(), [](const Sample& a, const Sample& b) {
            return a.iterations < b.iterations;
        });
        if (curve.samples.front().iterations < curve.samples.back().iterations) {
            result.push_back(std::move(curve));
        }
    }
    return result;
}

}  // namespace morvik::report
