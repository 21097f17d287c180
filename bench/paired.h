// How much longer does a library call take than what it relies upon? Both are timed in turn, pair
// by pair, so that whatever else the machine does disturbs both alike.
#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace bench {

// Throws if it did not get the answer that it should.
using Action = std::function<void()>;

// Microseconds that the action takes.
double microseconds(const Action &action);

double median(std::vector<double> values);

// Of call / bare over the pairs, with its 95 % confidence interval.
struct Ratio {
    double median;
    double low;
    double high;
};

struct Comparison {
    double bare; // microseconds, median
    double call;
    Ratio time;
    Ratio processor; // of the processor time, children included: others' load does not count
    std::size_t pairs;
};

class Pairs {
  public:
    // Each time that is taken is that of so many calls, for what is too short for the clock.
    Pairs(Action bare, Action call, std::size_t calls = 1)
        : bare_(std::move(bare)), call_(std::move(call)), calls_(calls) {}

    // Adds to the pairs that were measured before.
    void measure(std::size_t pairs);

    // How many pairs fit into that time, going by those measured; no fewer than `least`, and no
    // more than `most`.
    std::size_t fitting(double seconds, std::size_t least, std::size_t most) const;

    Comparison compared() const;

    void forget();

  private:
    // Microseconds per call, a row for each sample.
    struct Times {
        std::vector<double> real;
        std::vector<double> processor;
    };

    void sample(const Action &action, Times &times) const;

    Action bare_;
    Action call_;
    std::size_t calls_;
    Times bare_times_;
    Times call_times_;
};

} // namespace bench
