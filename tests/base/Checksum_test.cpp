// Checksum: digests of the standard's examples, and of messages at the borders of a block.
#include "base/Checksum.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <map>
#include <string>

#include "base/Error.h"
#include "support/TemporaryFolder.h"

namespace {

using morvik::base::sha256;

TEST(Checksum, IsThatOfTheStandard)
{
    const morvik::support::TemporaryFolder folder;
    folder.write("abc", "abc");
    EXPECT_EQ(sha256(folder.path("abc")), "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad");
    EXPECT_THROW(sha256(folder.path("missing")), morvik::base::Error);
}

TEST(Checksum, PadsMessagesOfAnyLength)
{
    const morvik::support::TemporaryFolder folder;
    const std::map<std::size_t, std::string> digests = {
        {0, "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855"},
        {55, "9f4390f8d30c2dd92ec9f095b65e2b9ae9b0a925a5258e241c9f1e910f734318"},
        {56, "b35439a4ac6f0948b6d6f9e3c6af0f5f590ce20f1bde7090ef7970686ec6738a"},
        {63, "7d3e74a05d7db15bce4ad9ec0658ea98e3f06eeecf16b4c6fff2da457ddc2f34"},
        {64, "ffe054fe7ae0cb6dc65c3af9b61d5209f439851db43d0ba5997337df154668eb"},
        {119, "31eba51c313a5c08226adf18d4a359cfdfd8d2e816b13f4af952f7ea6584dcfb"},
        {120, "2f3d335432c70b580af0e8e1b3674a7c020d683aa5f73aaaedfdc55af904c21c"},
        {100000, "6d1cf22d7cc09b085dfc25ee1a1f3ae0265804c607bc2074ad253bcc82fd81ee"}};
    for (const auto& [length, digest] : digests) {
        folder.write("text", std::string(length, 'a'));
        EXPECT_EQ(sha256(folder.path("text")), digest) << length;
    }
}

}  // namespace
