// SelfTest: the check of `morvik selftest` on what WebAssembly has: its lanes and the components.
#include <cstdint>
#include <cstdio>
#include <string>

#include "Export.h"
#include "app/selftest/SelfCheck.h"

using namespace morvik;

/// Decodes the blocks of `morvik selftest` in every configuration. Writes the digest of the blocks, sixteen digits.
/// Returns how many configurations give the promised bits; 0 if the blocks are not the promised ones.
MORVIK_EXPORT unsigned morvikSelfTest(char* digest)
{
    const auto decodeHere = [](int units, int algorithm, const std::string& set) {
        const bool isHere = set == "generic" || set == "component";
        return isHere ? selftest::libraryDecode(units, algorithm, set) : selftest::Decode();
    };
    const selftest::Findings findings = selftest::check(selftest::promise, decodeHere);
    std::snprintf(digest, 17, "%s", selftest::hexadecimal(findings.blockDigest).c_str());
    std::size_t right = 0;
    for (const selftest::Outcome& outcome : findings.outcomes) {
        right += outcome.configurations - outcome.differences.size();
    }
    return findings.blocksRight ? static_cast<unsigned>(right) : 0;
}
