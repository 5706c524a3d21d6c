// SamplerForms: the sampler forms of this machine, for tests that run with each.
#ifndef MORVIK_TESTS_SUPPORT_SAMPLERFORMS_H
#define MORVIK_TESTS_SUPPORT_SAMPLERFORMS_H

#include <gtest/gtest.h>

#include <ostream>
#include <string>

#include "link/random/SamplerForm.h"

namespace morvik::link {

/// Prints a form in the test library's messages.
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
