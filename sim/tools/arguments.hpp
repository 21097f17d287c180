// The words of a tool's command line, sorted.
#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

namespace zavsim {

struct Arguments {
    std::set<std::string> flags;
    std::map<std::string, std::string> values; // of options that have one
    std::vector<std::string> names;            // what is no option
    std::string unknown;                       // the first option that is not simulated

    bool has(const std::string &flag) const { return flags.count(flag) != 0; }
};

// `with_value` are the options whose value is the next word.
Arguments sort_words(const std::vector<std::string> &words, const std::set<std::string> &flags,
                     const std::set<std::string> &with_value = {});

// Says on standard error that a tool does not do that here; answers the status.
int not_simulated(const std::string &tool, const std::string &what, int status);

} // namespace zavsim
