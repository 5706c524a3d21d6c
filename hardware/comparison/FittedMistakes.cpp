// FittedMistakes: mistakes in which a size is fitted: factors, and addresses of memories.
#include <string>
#include <utility>
#include <vector>

#include "KnownMistakes.h"
#include "rules/Algorithms.h"
#include "rules/Cut.h"

namespace morvik::comparison {

namespace {

/// A memory that may be read at a wrong address.
struct Memory {
    Mistake::Kind misread;
    const char* values;
    const char* rule;
};

constexpr Memory aprioriMemory = {Mistake::aprioriMisread, "extrinsic values", " (rule 15)"};
constexpr Memory naturalMemory = {Mistake::aprioriMisreadByBit, "extrinsic values in natural order", " (rule 15)"};
constexpr Memory systematicMemory = {Mistake::systematicMisread, "systematic values", " (rule 15)"};
constexpr Memory parityMemory = {Mistake::parityMisread, "parity values", " (rule 5)"};
constexpr Memory branchMemory = {Mistake::branchMisread, "branch metrics", " (rules 6 and 8)"};
constexpr Memory forwardMemory = {Mistake::forwardMisread, "forward metrics", " (rule 8)"};
constexpr Memory backwardMemory = {Mistake::backwardMisread, "backward metrics", " (rule 8)"};

std::vector<Memory> memoriesOf(Stage stage)
{
    switch (stage) {
    case Stage::intrinsic:
        return {aprioriMemory, naturalMemory, systematicMemory};
    case Stage::branch:
        return {parityMemory};
    case Stage::forward:
    case Stage::backward:
        return {branchMemory};
    case Stage::ratio:
        return {branchMemory, forwardMemory, backwardMemory};
    case Stage::extrinsic:
        break;
    }
    return {};
}

constexpr bool isPowerOfTwo(unsigned number)
{
    return (number & (number - 1)) == 0;
}

class FittedList {
public:
    FittedList(const Model& model, Stage stage) : itsModel(model), itsStage(stage) {}

    std::vector<KnownMistake> all()
    {
        for (const Memory& memory : memoriesOf(itsStage)) {
            addStuckBits(memory, AddressError::block, itsModel.cut.K());
            if (!isPowerOfTwo(itsModel.cut.segmentLength())) {
                addStuckBits(memory, AddressError::segment, itsModel.cut.segmentLength());
            }
            if (itsModel.cut.segmentLength() % rules::longestWindow != 0) {
                addStuckBits(memory, AddressError::window, rules::longestWindow);
            }
            if (itsStage == Stage::intrinsic || itsStage == Stage::branch) {
                addHeld(memory);
            }
        }
        if (itsStage == Stage::extrinsic) {
            addFactors();
        }
        return std::move(itsMistakes);
    }

private:
    void add(Mistake mistake, std::string text, unsigned family, unsigned detail)
    {
        itsMistakes.push_back({mistake, std::move(text), Candidate::operation, Candidate::telling, family, detail});
    }

    /// The same for both orders of extrinsic values.
    static unsigned addressesOf(const Memory& memory)
    {
        return addresses + static_cast<unsigned>(isNatural(memory) ? aprioriMemory.misread : memory.misread);
    }

    static bool isNatural(const Memory& memory)
    {
        return memory.misread == naturalMemory.misread;
    }

    void addStuckBits(const Memory& memory, AddressError::Range range, unsigned end)
    {
        const char* const within = range == AddressError::block     ? ""
                                   : range == AddressError::segment ? " within a segment"
                                                                    : " within a window";
        constexpr unsigned ranges = 3;
        const unsigned detail = range + (isNatural(memory) ? ranges : 0);
        for (unsigned bit = 0; (end - 1) >> bit != 0; ++bit) {
            const std::string address =
                "bit " + std::to_string(bit) + " of the address of " + memory.values + within + " reads as ";
            add({memory.misread, AddressError{AddressError::stuckLow, bit, range}},
                address + "0" + memory.rule,
                addressesOf(memory),
                detail);
            add({memory.misread, AddressError{AddressError::stuckHigh, bit, range}},
                address + "1" + memory.rule,
                addressesOf(memory),
                detail);
        }
    }

    /// Metrics are read in ascending or descending order, soft values by address.
    void addHeld(const Memory& memory)
    {
        for (unsigned step = 0; step < itsModel.cut.K(); ++step) {
            add({memory.misread, AddressError{AddressError::held, step}},
                "the address of " + std::string(memory.values) + " stays at " + std::to_string(step) + memory.rule,
                addressesOf(memory),
                isNatural(memory) ? 1 : 0);
        }
    }

    /// Factors m / 2^n; those of fewer bits are the simpler ones.
    void addFactors()
    {
        const double right = rules::extrinsicScale(itsModel.generics.C_ALGORITHM_TYPE);
        for (int number = 1; number <= 2 * factorUnits; ++number) {
            const double factor = static_cast<double>(number) / factorUnits;
            if (factor == right || (right < 1 && number == factorUnits)) {
                continue;
            }
            add({Mistake::scaledBy, number},
                "the factor is " + decimal(number) + ", not " + decimal(static_cast<int>(right * factorUnits)) +
                    " (rule 14)",
                factors,
                fractionBits(number));
        }
    }

    /// Of number / factorUnits.
    static unsigned fractionBits(int number)
    {
        unsigned bits = 0;
        while ((number << bits) % factorUnits != 0) {
            ++bits;
        }
        return bits;
    }

    /// A factor of `number` / factorUnits: "0.625".
    static std::string decimal(int number)
    {
        std::string text = std::to_string(number / factorUnits);
        int rest = number % factorUnits;
        text += rest != 0 ? "." : "";
        while (rest != 0) {
            text += static_cast<char>('0' + 10 * rest / factorUnits);
            rest = 10 * rest % factorUnits;
        }
        return text;
    }

    const Model& itsModel;
    Stage itsStage;
    std::vector<KnownMistake> itsMistakes;
};

}  // namespace

std::vector<KnownMistake> fittedMistakes(const Model& model, Stage stage)
{
    return FittedList(model, stage).all();
}

}  // namespace morvik::comparison
