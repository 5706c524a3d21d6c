// The version of the library that is loaded.
#include "morvik_v1_0_version.h"

#include <gtest/gtest.h>

TEST(Version, IsThatOfTheProject)
{
    EXPECT_STREQ(PROJECT_VERSION, veltra_ip_morvik_v1_0_version());
}
