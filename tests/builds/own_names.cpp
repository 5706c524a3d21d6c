// A program with classes and functions of the library's names: it decodes right, and none of its own are called.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace {

[[noreturn]] void calledByTheLibrary(const char* name)
{
    std::fprintf(stderr, "The library calls the program's %s\n", name);
    std::abort();
}

}  // namespace

class MORVIK_API TDecoder {
public:
    static TDecoder* create(const std::string& properties);
    virtual bool allocate(unsigned int blockSize);
};

class MORVIK_API TDecoder3G : public TDecoder {
public:
    bool allocate(unsigned int blockSize) override;
    virtual bool extract(const std::vector<short>& soft);
    virtual bool calcSISO(unsigned int h);
};

class MORVIK_API TInterleaver {
public:
    static TInterleaver* create(const std::string& properties);
};

TDecoder* TDecoder::create(const std::string&)
{
    calledByTheLibrary("TDecoder::create");
}

bool TDecoder::allocate(unsigned int)
{
    calledByTheLibrary("TDecoder::allocate");
}

bool TDecoder3G::allocate(unsigned int)
{
    calledByTheLibrary("TDecoder3G::allocate");
}

bool TDecoder3G::extract(const std::vector<short>&)
{
    calledByTheLibrary("TDecoder3G::extract");
}

bool TDecoder3G::calcSISO(unsigned int)
{
    calledByTheLibrary("TDecoder3G::calcSISO");
}

TInterleaver* TInterleaver::create(const std::string&)
{
    calledByTheLibrary("TInterleaver::create");
}

int main()
{
    constexpr unsigned K = 40;
    // All bits 0, so that every coded bit is 0, too.
    const std::vector<std::int32_t> stream(K + 4, -16);
    std::vector<std::uint8_t> bits(K, 1);
    veltra_ip_morvik_v1_0_outputs outputs{bits.data(), K, 0, 0};
    veltra_ip_morvik_v1_0_state* const state =
        veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_get_default_generics());
    if (state == nullptr) {
        return 1;
    }
    for (const unsigned traced : {0U, 1U}) {  // by lanes, then by components
        veltra_ip_morvik_v1_0_bitacc_dump_config(state, traced);
        if (veltra_ip_morvik_v1_0_bitacc_simulate(
                state, stream.data(), stream.data(), stream.data(), K + 4, 2, 0, &outputs) != 0 ||
            bits != std::vector<std::uint8_t>(K, 0)) {
            return 1;
        }
    }
    veltra_ip_morvik_v1_0_destroy_state(state);
    return 0;
}
