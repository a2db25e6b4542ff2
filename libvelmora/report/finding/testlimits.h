#pragma once

#include <velmora/topics.h>

#include <optional>

// The limits of on-board tests as numbers.

namespace velmora {

// A test's value and those of its limits that mean something.
struct TestLimits
{
    double value = 0.0;
    std::optional<double> min;
    std::optional<double> max;
};

// Nothing for a test without a result or a number, and for limits that can't be: a minimum above the maximum. A limit
// at the end of what the module can count to limits nothing, and neither does a minimum of 0 (SAE J1979: a test with
// one limit sends the end of the range for the other).
std::optional<TestLimits> limitsOf(LimitTest const& test);

enum class Closeness
{
    Far,
    NearMinimum,
    NearMaximum,
};

// Whether a passed test stands within a tenth of the span between its limits, or where it has one only, of that limit.
// A value at a limit has passed and is no sign of anything.
Closeness closenessOf(LimitTest const& test);

// The readiness monitor whose completion gives the results of that monitor of service 06 their meaning; null for none.
char const* readinessNameOf(int monitor, bool diesel);

} // namespace velmora
