// The constituent code's trellis and kernels for checking, computed plainly from the encoder's shift register.
#ifndef MORVIK_TESTS_SUPPORT_PLAINTRELLIS_H
#define MORVIK_TESTS_SUPPORT_PLAINTRELLIS_H

#include <array>
#include <cstddef>
#include <vector>

namespace morvik::plain {

// All metrics are 16-bit values held in ints, aligned like the state format of 12 bits with 3 fraction bits (Fix_12_3):
// multiples of 16.
using Column = std::array<int, 8>;        // one metric for each trellis state
using BranchColumn = std::array<int, 4>;  // the metrics of the four parity patterns of an information bit of 1

// The result of a decision between two metrics.
enum class Decision {
    max,      // MOD: the greater one
    maxStar,  // MOD*: the greater one, plus the correction of this decision
    maxHash,  // MOD#: the greater one, plus the correction of the decision from which that one came
};

// One edge of the trellis.
struct Transition {
    std::size_t from;
    std::size_t to;
    unsigned bit;
    unsigned parity0;
    unsigned parity1;
};

// The edge of an information bit from a state.
Transition transition(std::size_t state, unsigned bit);

// The value modulo 2^16, in -32768 ... 32767.
int wrap16(int value);

// The nearest value in low ... high.
int clip(int value, int low, int high);

// The correction of a decision for every difference d = c1 - c2 of its candidates, in entry d + 32768. `points` is a
// power of two, or 0 for 65536; any other number gives an empty table.
std::vector<int> correctionTable(unsigned points);

BranchColumn branchMetrics(int intrinsic, int parity0, int parity1);

// Columns 0 to n - 1 for n >= 1 branch columns: the first is the start, column j + 1 follows from column j and g[j].
std::vector<Column> forward(const std::vector<BranchColumn>& g,
                            const Column& start,
                            Decision rule,
                            const std::vector<int>& table);

// Columns 0 to n - 1 for n >= 1 branch columns: the last is the start, column j - 1 follows from column j and g[j].
std::vector<Column> backward(const std::vector<BranchColumn>& g,
                             const Column& start,
                             Decision rule,
                             const std::vector<int>& table);

// From the forward column before a step, the backward column after it and the step's branch metrics.
int logLikelihoodRatio(
    const Column& a, const Column& b, const BranchColumn& g, Decision rule, const std::vector<int>& table);

}  // namespace morvik::plain

#endif
