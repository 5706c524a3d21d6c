// CountsJson: counts of situations of the arithmetic as JSON.
#include "CountsJson.h"

#include "rules/Algorithms.h"

namespace morvik {

nlohmann::ordered_json countsJson(const coverage::Counts& counts)
{
    using Json = nlohmann::ordered_json;
    Json cores = Json::array();
    for (const coverage::CoreCounts& each : counts.cores()) {
        cores.push_back({{"num_pu", each.core.units},
                         {"algorithm", rules::algorithmNames.at(each.core.algorithm)},
                         {"blocks", each.blocks}});
    }
    Json situations = Json::array();
    for (unsigned number = 0; number < coverage::situations().size(); ++number) {
        const coverage::Situation& each = coverage::situations()[number];
        const auto why = counts.whyImpossible(number);
        situations.push_back(
            {{"name", each.name}, {"rule", each.rule}, {"text", each.text}, {"count", counts.met(number)}});
        situations.back()["impossible"] = why ? Json(*why) : Json();
    }
    return {{"cores", cores}, {"missing", counts.missing().size()}, {"situations", situations}};
}

}  // namespace morvik
