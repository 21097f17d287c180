#include "tools/arguments.hpp"

#include <fmt/format.h>

namespace zavsim {

Arguments sort_words(const std::vector<std::string> &words, const std::set<std::string> &flags,
                     const std::set<std::string> &with_value) {
    Arguments sorted;
    for (auto word = words.begin(); word != words.end(); ++word) {
        const bool has_value = with_value.count(*word) != 0;
        if (has_value && word + 1 == words.end()) {
            sorted.unknown = *word + " without a value";
            break;
        }
        if (has_value) {
            sorted.values[*word] = *(word + 1);
            ++word;
        } else if (flags.count(*word) != 0) {
            sorted.flags.insert(*word);
        } else if (word->rfind('-', 0) != 0) {
            sorted.names.push_back(*word);
        } else if (sorted.unknown.empty()) {
            sorted.unknown = *word;
        }
    }
    return sorted;
}

int not_simulated(const std::string &tool, const std::string &what, int status) {
    fmt::print(stderr, "{}: {} is not simulated\n", tool, what.empty() ? "no argument" : what);
    return status;
}

} // namespace zavsim
