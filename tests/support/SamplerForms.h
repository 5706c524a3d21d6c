// SamplerForms: for tests that run with every sampler form of this machine.
#ifndef MORVIK_TESTS_SUPPORT_SAMPLERFORMS_H
#define MORVIK_TESTS_SUPPORT_SAMPLERFORMS_H

#include <gtest/gtest.h>

#include <ostream>
#include <string>

#include "link/SamplerForm.h"

namespace morvik::link {

/// What the test library prints of a form.
inline void PrintTo(const SamplerForm& form, std::ostream* out)
{
    *out << form.name;
}

}  // namespace morvik::link

inline auto everySamplerForm()
{
    return testing::ValuesIn(morvik::link::samplerForms());
}

inline std::string samplerFormName(const testing::TestParamInfo<morvik::link::SamplerForm>& form)
{
    return form.param.name;
}

#endif
