// ChiSquare: tests how well counts fit their expectations.
#ifndef MORVIK_TESTS_SUPPORT_CHISQUARE_H
#define MORVIK_TESTS_SUPPORT_CHISQUARE_H

#include <cmath>
#include <cstddef>
#include <vector>

/// Returns by how many standard deviations chi-square exceeds its mean. Adjacent classes with expectations below ten
/// are merged. `bothCounted`: the expectations are counts themselves, of as many draws.
inline double chiSquareExcess(const std::vector<double>& counted, const std::vector<double>& expected, bool bothCounted)
{
    double sum = 0;
    double classes = 0;
    double count = 0;
    double expectation = 0;
    for (std::size_t i = 0; i < counted.size(); ++i) {
        count += counted[i];
        expectation += expected[i];
        if (expectation >= 10) {
            // The difference of two counts has the variance of both.
            const double variance = bothCounted ? count + expectation : expectation;
            sum += (count - expectation) * (count - expectation) / variance;
            classes += 1;
            count = 0;
            expectation = 0;
        }
    }
    const double freedom = classes - 1;
    return (sum - freedom) / std::sqrt(2 * freedom);
}

#endif
