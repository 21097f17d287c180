#include "paired.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <utility>

namespace bench {

namespace {

using Clock = std::chrono::steady_clock;

template <typename Action>
double microseconds(const Action &action) {
    const auto start = Clock::now();
    action();
    return std::chrono::duration<double, std::micro>(Clock::now() - start).count();
}

double median(const std::vector<double> &sorted) {
    const std::size_t middle = sorted.size() / 2;
    return sorted.size() % 2 == 1 ? sorted[middle] : (sorted[middle - 1] + sorted[middle]) / 2;
}

// The order statistics between which the true median lies with 95 % probability, whatever the
// distribution.
std::pair<double, double> median_interval(const std::vector<double> &sorted) {
    const auto count = static_cast<double>(sorted.size());
    const double half_width = 1.96 * std::sqrt(count) / 2;
    const auto low = static_cast<std::size_t>(std::max(0.0, std::floor(count / 2 - half_width)));
    const std::size_t high = sorted.size() - 1 - low;
    return {sorted[low], sorted[high]};
}

} // namespace

Comparison compare(const Query &query, std::size_t pairs) {
    std::vector<double> bare;
    std::vector<double> call;
    std::vector<double> ratio;
    const auto time_bare = [&] {
        bare.push_back(microseconds([&] { query.bare(query.command); }));
    };
    const auto time_call = [&] { call.push_back(microseconds(query.call)); };
    for (std::size_t pair = 0; pair < pairs; ++pair) {
        // Neither gets the advantage of always coming second.
        if (pair % 2 == 0) {
            time_bare();
            time_call();
        } else {
            time_call();
            time_bare();
        }
        ratio.push_back(call.back() / bare.back());
    }
    for (std::vector<double> *values : {&bare, &call, &ratio})
        std::sort(values->begin(), values->end());
    const auto [low, high] = median_interval(ratio);
    return {query.name, median(bare), median(call), median(ratio), low, high, pairs};
}

bool report(const std::vector<Comparison> &comparisons, double limit) {
    bool all_within = true;
    printf("\nWhole calls beside their bare commands (medians of pairs timed in turn; limit %.2f)\n"
           "%-34s %6s %10s %10s %7s  %s\n",
           limit, "query", "pairs", "bare us", "call us", "ratio", "95 % interval");
    for (const Comparison &row : comparisons) {
        const bool within = row.ratio <= limit;
        all_within = all_within && within;
        printf("%-34s %6zu %10.1f %10.1f %7.3f  %.3f .. %.3f  %s\n", row.name.c_str(), row.pairs,
               row.bare, row.call, row.ratio, row.low, row.high, within ? "OK" : "OVER");
    }
    return all_within;
}

} // namespace bench
