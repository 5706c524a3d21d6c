// What `morvik selftest` checks, as a program of its own: it is built in a fraction of the time of the command, and so
// can be on every machine.
#include <cstdio>

#include "app/selftest/SelfCheck.h"

int main()
{
    const morvik::selftest::Findings findings = morvik::selftest::check();
    std::printf("digest %s of %llu blocks of all sizes, decoded in %zu configurations\n%s\n",
                morvik::selftest::hexadecimal(findings.blockDigest).c_str(),
                static_cast<unsigned long long>(findings.blocks),
                findings.configurations(),
                findings.right() ? "Passed: this machine gives the promised bits." : "FAILED");
    return findings.right() ? 0 : 1;
}
