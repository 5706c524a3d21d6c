// TInterleaver3GPPLTE: the quadratic permutation polynomial interleaver of LTE.
#include "TInterleaver3GPPLTE.h"

#include "Messages.h"
#include "rules/Interleaver.h"

namespace rules = morvik::rules;

TInterleaver* TInterleaver3GPPLTE::create(const std::string& props)
{
    if (!props.empty()) {
        morvik::messages::writeError("ERROR:TInterleaver3GPPLTE:Unexpected properties:", props);
        return nullptr;
    }
    return new TInterleaver3GPPLTE();
}

bool TInterleaver3GPPLTE::calcInterleaver(std::vector<unsigned>& out, unsigned K) const
{
    out.clear();
    out.reserve(K);
    const rules::BlockSize* const params = rules::findBlockSize(K);
    if (params == nullptr) {
        return false;
    }
    rules::InterleaverAddress address(*params);
    for (unsigned i = 0; i < K; ++i) {
        out.push_back(address.next());
    }
    return true;
}

std::string TInterleaver3GPPLTE::getProperties() const
{
    return "3GPPLTE";
}

bool TInterleaver3GPPLTE::valid(unsigned K) const
{
    return rules::findBlockSize(K) != nullptr;
}
