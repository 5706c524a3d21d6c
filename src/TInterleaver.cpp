// TInterleaver: the base class of interleavers, its permutation tables and its factory.
#include "TInterleaver.h"

#include <cstddef>

#include "Messages.h"
#include "Misc.h"
#include "TInterleaver3GPPLTE.h"

TInterleaver::~TInterleaver() = default;

bool TInterleaver::calcDeinterleaver(std::vector<unsigned>& out, unsigned K) const
{
    if (itsPi.size() != K) {
        calcInterleaver(itsPi, K);
    }
    out.resize(itsPi.size());
    for (std::size_t i = 0; i < itsPi.size(); ++i) {
        out[itsPi[i]] = static_cast<unsigned>(i);
    }
    return true;
}

bool TInterleaver::valid(unsigned K) const
{
    return K != 0;
}

TInterleaver* TInterleaver::create(const std::string& properties)
{
    const auto [type, props] = splitString(properties, ":");
    if (type == "3GPPLTE") {
        return TInterleaver3GPPLTE::create(props);
    }
    morvik::messages::writeError("ERROR:TInterleaver:Unrecognised type:", type);
    return nullptr;
}

std::vector<std::string> TInterleaver::getNames()
{
    return {"3GPPLTE"};
}

void TInterleaver::dumpAll(unsigned first, unsigned last, bool showSize)
{
    std::ostream& os = morvik::messages::output();
    if (first > last) {
        return;
    }
    for (unsigned K = first;; ++K) {
        if (valid(K)) {
            if (showSize) {
                morvik::messages::writePart(os, K);
                morvik::messages::writePart(os, ": ");
            }
            if (itsPi.size() != K) {
                calcInterleaver(itsPi, K);
            }
            const char* separator = "";
            for (const unsigned position : itsPi) {
                morvik::messages::writePart(os, separator);
                morvik::messages::writePart(os, position);
                separator = " ";
            }
            os.put('\n');
        }
        if (K == last) {  // tested here so that the loop ends for a `last` of 2^32 - 1
            return;
        }
    }
}
