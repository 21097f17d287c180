// The queries that run commands, beside those commands.
#pragma once

namespace bench {

enum class Verdict {
    kKept,
    kNotKnown, // a ratio is over the limit, and the limit within its confidence interval
    kBroken,
};

// A call may take so many times as long as its commands.
constexpr double kLimit = 1.05;

Verdict compare_queries();

} // namespace bench
