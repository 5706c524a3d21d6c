// CompareOptions: what morvik compare is told.
#ifndef MORVIK_APP_COMPARE_COMPAREOPTIONS_H
#define MORVIK_APP_COMPARE_COMPAREOPTIONS_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "DecoderOptions.h"
#include "hardware/comparison/NameMap.h"

namespace morvik {

struct CompareOptions {
    std::string block;
    std::vector<std::string> sets;
    std::optional<std::uint32_t> number;  ///< of a block
    std::string dump;
    std::string map;
    std::string form;
    std::string json;
    std::string junit;
    std::string coverage;
    std::uint32_t threads = 0;  ///< 0: as many as cores
    bool ignoreUnknown = false;
    bool partial = false;
    bool suggestMap = false;

    /// Whether the situations of the arithmetic are counted.
    bool countsSituations() const
    {
        return !coverage.empty() || !json.empty();
    }

    /// The files of the results.
    std::vector<std::string> outputs() const
    {
        return {json, junit, coverage};
    }

    DecoderOptions decoder;
};

}  // namespace morvik

#endif
