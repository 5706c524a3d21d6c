// Corrections: the correction table of test benches is that of the model.
#include "hardware/testbench/Corrections.h"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "src/TCalculationEngineModBase.h"
#include "src/TNumberFormat.h"

namespace {

TEST(Corrections, AreThoseOfTheModel)
{
    const std::unique_ptr<TNumberFormat> format(TNumberFormat::create("Fix_12_3"));
    const std::vector<unsigned char> expected =
        TCalculationEngineModBase::createLUT(1U << morvik::log2CorrectionPoints, *format);
    const unsigned char* const first = morvik::corrections() - morvik::rules::correctionEntries / 2;
    EXPECT_EQ(std::vector<unsigned char>(first, first + morvik::rules::correctionEntries), expected);
}

}  // namespace
