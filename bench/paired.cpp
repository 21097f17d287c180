#include "paired.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <sys/resource.h>

namespace bench {

namespace {

using Clock = std::chrono::steady_clock;

// The order statistics between which the true median lies with 95 % probability, whatever the
// distribution.
Ratio median_with_interval(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    const auto count = static_cast<double>(values.size());
    const double half_width = 1.96 * std::sqrt(count) / 2;
    const auto low = static_cast<std::size_t>(std::max(0.0, std::floor(count / 2 - half_width)));
    return {median(values), values[low], values[values.size() - 1 - low]};
}

Ratio ratio_of(const std::vector<double> &call, const std::vector<double> &bare) {
    std::vector<double> ratios;
    for (std::size_t pair = 0; pair < bare.size(); ++pair)
        ratios.push_back(call[pair] / bare[pair]);
    return median_with_interval(ratios);
}

double in_microseconds(const timeval &time) {
    return static_cast<double>(time.tv_sec) * 1e6 + static_cast<double>(time.tv_usec);
}

double processor_time() {
    double all = 0;
    for (const auto whose : {RUSAGE_SELF, RUSAGE_CHILDREN}) {
        rusage usage = {};
        getrusage(whose, &usage);
        all += in_microseconds(usage.ru_utime) + in_microseconds(usage.ru_stime);
    }
    return all;
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

void Pairs::sample(const Action &action, Times &times) const {
    const auto calls = static_cast<double>(calls_);
    const double processor_before = processor_time();
    const double real = microseconds([&] {
        for (std::size_t call = 0; call < calls_; ++call)
            action();
    });
    times.real.push_back(real / calls);
    times.processor.push_back((processor_time() - processor_before) / calls);
}

void Pairs::measure(std::size_t pairs) {
    for (std::size_t pair = 0; pair < pairs; ++pair) {
        // Neither gets the advantage of always coming second.
        if (pair % 2 == 0) {
            sample(bare_, bare_times_);
            sample(call_, call_times_);
        } else {
            sample(call_, call_times_);
            sample(bare_, bare_times_);
        }
    }
}

std::size_t Pairs::fitting(double seconds, std::size_t least, std::size_t most) const {
    const double pair =
        (median(bare_times_.real) + median(call_times_.real)) * static_cast<double>(calls_);
    return std::clamp(static_cast<std::size_t>(seconds * 1e6 / pair), least, most);
}

Comparison Pairs::compared() const {
    return {median(bare_times_.real), median(call_times_.real),
            ratio_of(call_times_.real, bare_times_.real),
            ratio_of(call_times_.processor, bare_times_.processor), bare_times_.real.size()};
}

void Pairs::forget() {
    bare_times_ = {};
    call_times_ = {};
}

} // namespace bench
