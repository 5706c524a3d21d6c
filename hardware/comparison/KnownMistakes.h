// KnownMistakes: the mistakes that are tried on the faults of a stage, and how they are told.
#ifndef MORVIK_HARDWARE_COMPARISON_KNOWNMISTAKES_H
#define MORVIK_HARDWARE_COMPARISON_KNOWNMISTAKES_H

#include <string>
#include <vector>

#include "Candidates.h"
#include "Mistake.h"
#include "Model.h"

namespace morvik::comparison {

/// Families of mistakes that differ in a number alone, as Candidate has them; 0 is none. Each memory has addresses of
/// its own.
enum Family : unsigned { noFamily, masks, factors, addresses };

struct KnownMistake {
    Mistake mistake;
    std::string text;
    Candidate::Reach reach = Candidate::operation;
    Candidate::Rank rank = Candidate::telling;
    unsigned family = noFamily;
    unsigned detail = 0;  ///< as in Candidate
};

/// The mistakes of a stage, without those of many sizes.
std::vector<KnownMistake> knownMistakes(const Model& model, Stage stage);

/// The mistakes of a stage in which a size is fitted: factors and addresses. There are hundreds.
std::vector<KnownMistake> fittedMistakes(const Model& model, Stage stage);

/// Metrics of states in which the encoder is known not to be, in eighths.
KnownMistake otherKnownMetric(int metric);

/// Border metrics ANDed with a mask, in eighths.
KnownMistake otherMask(int mask);

}  // namespace morvik::comparison

#endif
