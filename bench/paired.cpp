#include "paired.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <utility>

namespace bench {

namespace {

using Clock = std::chrono::steady_clock;

// The order statistics between which the true median lies with 95 % probability, whatever the
// distribution.
std::pair<double, double> median_interval(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    const auto count = static_cast<double>(values.size());
    const double half_width = 1.96 * std::sqrt(count) / 2;
    const auto low = static_cast<std::size_t>(std::max(0.0, std::floor(count / 2 - half_width)));
    return {values[low], values[values.size() - 1 - low]};
}

} // namespace

double microseconds(const Action &action) {
    const auto start = Clock::now();
    action();
    return std::chrono::duration<double, std::micro>(Clock::now() - start).count();
}

double median(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    const std::size_t middle = values.size() / 2;
    return values.size() % 2 == 1 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

double Pairs::time(const Action &action) const {
    const double all = microseconds([&] {
        for (std::size_t call = 0; call < calls_; ++call)
            action();
    });
    return all / static_cast<double>(calls_);
}

void Pairs::measure(std::size_t pairs) {
    for (std::size_t pair = 0; pair < pairs; ++pair) {
        // Neither gets the advantage of always coming second.
        if (pair % 2 == 0) {
            bare_times_.push_back(time(bare_));
            call_times_.push_back(time(call_));
        } else {
            call_times_.push_back(time(call_));
            bare_times_.push_back(time(bare_));
        }
    }
}

std::size_t Pairs::fitting(double seconds, std::size_t least, std::size_t most) const {
    const double pair = (median(bare_times_) + median(call_times_)) * static_cast<double>(calls_);
    return std::clamp(static_cast<std::size_t>(seconds * 1e6 / pair), least, most);
}

Comparison Pairs::compared() const {
    std::vector<double> ratios;
    for (std::size_t pair = 0; pair < bare_times_.size(); ++pair)
        ratios.push_back(call_times_[pair] / bare_times_[pair]);
    const auto [low, high] = median_interval(ratios);
    return {median(bare_times_), median(call_times_), median(ratios), low, high, ratios.size()};
}

void Pairs::forget() {
    bare_times_.clear();
    call_times_.clear();
}

} // namespace bench
