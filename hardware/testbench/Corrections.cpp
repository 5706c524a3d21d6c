// Corrections: the correction table of algorithm type 2.
#include "Corrections.h"

#include <memory>
#include <vector>

#include "src/TCalculationEngineModBase.h"
#include "src/TNumberFormat.h"

namespace morvik {

const unsigned char* corrections()
{
    static const std::vector<unsigned char> table = [] {
        const std::unique_ptr<TNumberFormat> format(TNumberFormat::create("Fix_12_3"));
        return TCalculationEngineModBase::createLUT(16, *format);
    }();
    return table.data() + table.size() / 2;
}

}  // namespace morvik
