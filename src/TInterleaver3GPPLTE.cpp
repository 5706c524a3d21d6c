// TInterleaver3GPPLTE: the quadratic permutation polynomial interleaver of LTE.
#include "TInterleaver3GPPLTE.h"

#include <cstdint>

#include "Messages.h"
#include "rules/BlockSizes.h"

TInterleaver* TInterleaver3GPPLTE::create(const std::string& props)
{
    if (!props.empty()) {
        messages::writeError("ERROR:TInterleaver3GPPLTE:Unexpected properties:", props);
        return nullptr;
    }
    return new TInterleaver3GPPLTE();
}

bool TInterleaver3GPPLTE::calcInterleaver(std::vector<unsigned>& out, unsigned K) const
{
    out.clear();
    out.reserve(K);
    const standard::BlockSize* const params = standard::findBlockSize(K);
    if (params == nullptr) {
        return false;
    }
    // Pi(i + 1) = Pi(i) + step(i) and step(i + 1) = step(i) + 2 f2, both modulo K: an address
    // generator of two adders. Every sum is below 2 K.
    const std::uint32_t increment = (2 * params->f2) % K;
    std::uint32_t step = (params->f1 + params->f2) % K;
    std::uint32_t position = 0;
    for (unsigned i = 0; i < K; ++i) {
        out.push_back(position);
        position += step;
        position -= position >= K ? K : 0;
        step += increment;
        step -= step >= K ? K : 0;
    }
    return true;
}

std::string TInterleaver3GPPLTE::getProperties() const
{
    return "3GPPLTE";
}

bool TInterleaver3GPPLTE::valid(unsigned K) const
{
    return standard::findBlockSize(K) != nullptr;
}
