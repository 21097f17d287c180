#include "growth.h"

#include <algorithm>
#include <cstdio>
#include <limits>

namespace bench {

namespace {

constexpr double kSample = 2000;   // microseconds; a call that is shorter is repeated
constexpr double kSteepest = 1.5;  // of the time per unit
constexpr int kMeasurements = 2;   // a table that seems steep is measured once more
using Times = std::vector<double>; // microseconds per call, for each size

double time_of_call(const Action &action) {
    action(); // fills the caches
    double all = 0;
    int calls = 0;
    do {
        all += microseconds(action);
        ++calls;
    } while (all < kSample);
    return all / calls;
}

// Rounds over all sizes, up and down in turn, so that whatever else the machine does disturbs all
// alike. The shortest of a size counts: disturbance only adds.
void measure(const Growth &growth, Times &times) {
    const std::size_t sizes = growth.sizes.size();
    for (std::size_t round = 0; round < growth.rounds; ++round) {
        for (std::size_t step = 0; step < sizes; ++step) {
            const std::size_t at = round % 2 == 0 ? step : sizes - 1 - step;
            times[at] = std::min(times[at], time_of_call(growth.at(growth.sizes[at])));
        }
    }
}

double per_unit(const Growth &growth, const Times &times, std::size_t at) {
    return times[at] * 1000 / growth.sizes[at];
}

// What a unit costs beyond those of the smallest size: without what every call costs.
double per_further_unit(const Growth &growth, const Times &times, std::size_t at) {
    return (times[at] - times[0]) * 1000 / (growth.sizes[at] - growth.sizes[0]);
}

// How much more a further unit costs at the largest size than at the two before it.
double steepness(const Growth &growth, const Times &times) {
    const std::size_t last = times.size() - 1;
    return per_further_unit(growth, times, last) /
           median({per_further_unit(growth, times, last - 1),
                   per_further_unit(growth, times, last - 2)});
}

bool grows_at_all(const Times &times) {
    return times.back() > kSteepest * times.front();
}

bool is_linear(const Growth &growth, const Times &times) {
    return !grows_at_all(times) || steepness(growth, times) <= kSteepest;
}

Times measured(const Growth &growth) {
    Times times(growth.sizes.size(), std::numeric_limits<double>::max());
    for (int i = 0; i < kMeasurements; ++i) {
        measure(growth, times);
        if (is_linear(growth, times))
            break;
    }
    return times;
}

void print_rows(const Growth &growth, const Times &times) {
    printf("\n%s\n%12s %12s %12s %12s   (unit: %s)\n", growth.name.c_str(), "size", "us a call",
           "ns a unit", "ns a further", growth.unit);
    printf("%12d %12.1f %12.1f\n", growth.sizes[0], times[0], per_unit(growth, times, 0));
    for (std::size_t at = 1; at < times.size(); ++at)
        printf("%12d %12.1f %12.1f %12.1f\n", growth.sizes[at], times[at],
               per_unit(growth, times, at), per_further_unit(growth, times, at));
}

bool report(const Growth &growth) {
    const Times times = measured(growth);
    print_rows(growth, times);
    const bool linear = is_linear(growth, times);
    if (!grows_at_all(times))
        puts("CONSTANT");
    else
        printf("%s: a further %s costs %.2f times as much at the largest size\n",
               linear ? "LINEAR" : "FASTER THAN LINEAR", growth.unit, steepness(growth, times));
    fflush(stdout);
    return linear;
}

} // namespace

bool report_growth() {
    printf(
        "\nTime against the size of what is read (shortest of several rounds). A further unit is "
        "one beyond the\nsmallest size; at the largest it may cost %.1f times what it costs at "
        "the two before\n",
        kSteepest);
    std::vector<Growth> all = growth_of_reports();
    const std::vector<Growth> groups = growth_of_groups();
    all.insert(all.end(), groups.begin(), groups.end());
    const std::vector<Growth> processes = growth_of_processes();
    all.insert(all.end(), processes.begin(), processes.end());
    bool linear = true;
    for (const Growth &growth : all)
        linear = report(growth) && linear;
    return linear;
}

} // namespace bench
