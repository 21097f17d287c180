// How much longer does a library call take than the command that it runs? Both are timed in turn,
// pair by pair, so that whatever else the machine does disturbs both alike.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace bench {

// One query. Either function ends the program if it did not get the answer that it should.
struct Query {
    const char *name;
    const char *command; // what the library runs for it, byte for byte
    void (*bare)(const char *command);
    void (*call)();
};

struct Comparison {
    std::string name;
    double bare; // microseconds, median
    double call;
    double ratio; // median of call / bare over the pairs
    double low;   // the ratio's 95 % confidence interval
    double high;
    std::size_t pairs;
};

Comparison compare(const Query &query, std::size_t pairs);

// Prints the comparisons as a table; false if a ratio is over `limit`.
bool report(const std::vector<Comparison> &comparisons, double limit);

} // namespace bench
