// CInterface: the functions of morvik_units.h. No exception passes out of them.
#include <algorithm>
#include <array>
#include <cstddef>
#include <exception>

#include "Ports.h"
#include "Units.h"
#include "morvik_units.h"
#include "rules/BlockSizes.h"

namespace {

namespace units = morvik::units;

using units::Branches;
using units::Column;
using units::Kind;
using units::Metrics;
using units::TailValues;

constexpr std::int32_t statusOf(Kind kind)
{
    return MORVIK_UNIT_SOFT_VALUE + static_cast<std::int32_t>(kind);
}

static_assert(statusOf(Kind::apriori) == MORVIK_UNIT_APRIORI);
static_assert(statusOf(Kind::twiceIntrinsic) == MORVIK_UNIT_TWICE_INTRINSIC);
static_assert(statusOf(Kind::branch) == MORVIK_UNIT_BRANCH_METRIC);
static_assert(statusOf(Kind::metric) == MORVIK_UNIT_METRIC);
static_assert(statusOf(Kind::pending) == MORVIK_UNIT_PENDING);
static_assert(statusOf(Kind::blockSize) == MORVIK_UNIT_BLOCK_SIZE);
static_assert(statusOf(Kind::step) == MORVIK_UNIT_STEP);

/// Collects the checks of a call, which come in the order of the statuses.
class Checks {
public:
    template <class... Pointer>
    explicit Checks(const Pointer*... pointers)
        : itsStatus((... || (pointers == nullptr)) ? MORVIK_UNIT_NULL_POINTER : MORVIK_UNIT_OK)
    {
    }

    Checks& algorithm(std::int32_t given)
    {
        return expect(given >= 0 && given <= units::tableAlgorithm, MORVIK_UNIT_ALGORITHM);
    }

    Checks& value(Kind kind, std::int32_t given)
    {
        return expect(given >= units::rangeOf(kind).lowest && given <= units::rangeOf(kind).highest, statusOf(kind));
    }

    /// Returns the row, zeros if it cannot be read.
    template <class Row>
    Row row(Kind kind, const std::int32_t* given)
    {
        Row values{};
        if (itsStatus == MORVIK_UNIT_OK) {
            std::copy_n(given, values.size(), values.begin());
        }
        for (const std::int32_t each : values) {
            value(kind, each);
        }
        return values;
    }

    Metrics pending(std::int32_t algorithm, const std::int32_t* given)
    {
        const Metrics none{};
        if (given == nullptr) {
            return none;
        }
        const auto values = row<Metrics>(Kind::pending, given);
        expect(algorithm == units::tableAlgorithm || values == none, MORVIK_UNIT_PENDING);
        return values;
    }

    Checks& expect(bool good, std::int32_t status)
    {
        itsStatus = itsStatus != MORVIK_UNIT_OK || good ? itsStatus : status;
        return *this;
    }

    /// Does the work if all checks passed. Returns the status.
    template <class Work>
    std::int32_t pass(Work work) const
    {
        if (itsStatus != MORVIK_UNIT_OK) {
            return itsStatus;
        }
        try {
            work();
            return MORVIK_UNIT_OK;
        } catch (const std::exception&) {
            return MORVIK_UNIT_OUT_OF_MEMORY;  // of the correction table
        }
    }

private:
    std::int32_t itsStatus;
};

template <class Row>
void give(const Row& values, std::int32_t* taken)
{
    if (taken != nullptr) {
        std::copy(values.begin(), values.end(), taken);
    }
}

/// A step of either recursion.
std::int32_t step(Column (*unit)(int, const Column&, const Branches&),
                  std::int32_t algorithm,
                  const std::int32_t* metrics,
                  const std::int32_t* pending,
                  const std::int32_t* g,
                  std::int32_t* reached,
                  std::int32_t* reachedPending)
{
    Checks checks(metrics, g, reached);
    checks.algorithm(algorithm);
    const auto branches = checks.row<Branches>(Kind::branch, g);
    Column from;
    from.metrics = checks.row<Metrics>(Kind::metric, metrics);
    from.pending = checks.pending(algorithm, pending);
    return checks.pass([&] {
        const Column column = unit(algorithm, from, branches);
        give(column.metrics, reached);
        give(column.pending, reachedPending);
    });
}

}  // namespace

const char* morvik_unit_status_text(int32_t status)
{
    switch (status) {
    case MORVIK_UNIT_OK:
        return "ok";
    case MORVIK_UNIT_NULL_POINTER:
        return "an array is a null pointer";
    case MORVIK_UNIT_ALGORITHM:
        return "the algorithm is not 0 to 2";
    case MORVIK_UNIT_SOFT_VALUE:
        return "a systematic or parity value is not from -128 to 127";
    case MORVIK_UNIT_APRIORI:
        return "the a-priori value is not from -128 to 127";
    case MORVIK_UNIT_TWICE_INTRINSIC:
        return "twice the intrinsic value is not from -192 to 190";
    case MORVIK_UNIT_BRANCH_METRIC:
        return "a branch metric is not from -128 to 127";
    case MORVIK_UNIT_METRIC:
        return "a metric or the ratio is not from -2048 to 2047";
    case MORVIK_UNIT_PENDING:
        return "a pending correction is not from 0 to 6, or not 0 with an algorithm that has no table";
    case MORVIK_UNIT_BLOCK_SIZE:
        return "K is not one of the 188 block sizes";
    case MORVIK_UNIT_STEP:
        return "the step is not from 0 to K - 1";
    case MORVIK_UNIT_OUT_OF_MEMORY:
        return "memory is exhausted";
    default:
        return "unknown status";
    }
}

int32_t morvik_unit_intrinsic(int32_t apriori, int32_t systematic, int32_t* twice_intrinsic)
{
    return Checks(twice_intrinsic).value(Kind::soft, systematic).value(Kind::apriori, apriori).pass([&] {
        *twice_intrinsic = units::twiceIntrinsic(apriori, systematic);
    });
}

int32_t morvik_unit_branch(int32_t twice_intrinsic, int32_t parity, int32_t* g)
{
    return Checks(g).value(Kind::soft, parity).value(Kind::twiceIntrinsic, twice_intrinsic).pass([&] {
        give(units::branchMetrics(twice_intrinsic, parity), g);
    });
}

int32_t morvik_unit_forward(int32_t algorithm,
                            const int32_t* alpha,
                            const int32_t* pending,
                            const int32_t* g,
                            int32_t* next,
                            int32_t* next_pending)
{
    return step(units::forward, algorithm, alpha, pending, g, next, next_pending);
}

int32_t morvik_unit_backward(int32_t algorithm,
                             const int32_t* beta,
                             const int32_t* pending,
                             const int32_t* g,
                             int32_t* previous,
                             int32_t* previous_pending)
{
    return step(units::backward, algorithm, beta, pending, g, previous, previous_pending);
}

int32_t morvik_unit_ratio(
    int32_t algorithm, const int32_t* alpha, const int32_t* beta, const int32_t* g, int32_t* ratio)
{
    Checks checks(alpha, beta, g, ratio);
    checks.algorithm(algorithm);
    const auto branches = checks.row<Branches>(Kind::branch, g);
    const auto before = checks.row<Metrics>(Kind::metric, alpha);
    const auto behind = checks.row<Metrics>(Kind::metric, beta);
    return checks.pass([&] { *ratio = units::ratio(algorithm, before, behind, branches); });
}

int32_t morvik_unit_extrinsic(int32_t algorithm, int32_t ratio, int32_t twice_intrinsic, int32_t* extrinsic)
{
    return Checks(extrinsic)
        .algorithm(algorithm)
        .value(Kind::twiceIntrinsic, twice_intrinsic)
        .value(Kind::metric, ratio)
        .pass([&] { *extrinsic = units::extrinsic(algorithm, ratio, twice_intrinsic); });
}

int32_t morvik_unit_address(int32_t block_size, int32_t step, int32_t* address)
{
    const auto K = static_cast<std::uint32_t>(block_size);
    return Checks(address)
        .expect(morvik::rules::findBlockSize(K) != nullptr, MORVIK_UNIT_BLOCK_SIZE)
        .expect(static_cast<std::uint32_t>(step) < K, MORVIK_UNIT_STEP)
        .pass([&] { *address = static_cast<std::int32_t>(units::address(K, static_cast<std::uint32_t>(step))); });
}

int32_t morvik_unit_tail(const int32_t* systematic, const int32_t* parity, int32_t* beta)
{
    Checks checks(systematic, parity, beta);
    const auto x = checks.row<TailValues>(Kind::soft, systematic);
    const auto p = checks.row<TailValues>(Kind::soft, parity);
    return checks.pass([&] { give(units::tail(x, p), beta); });
}

int32_t morvik_unit_border(const int32_t* column, int32_t* border)
{
    Checks checks(column, border);
    const auto metrics = checks.row<Metrics>(Kind::metric, column);
    return checks.pass([&] { give(units::border(metrics), border); });
}
