// ethtool DEVICE
#include "model/network.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr int no_such_device = 75;

// One complaint for each of the questions that a report is made of.
int complain() {
    for (int question = 0; question < 5; ++question)
        fmt::print(stderr, "netlink error: no device matches name (offset 24)\n"
                           "netlink error: No such device\n");
    fmt::print("No data available\n");
    return no_such_device;
}

} // namespace

int run_ethtool(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "ethtool", arguments.unknown.empty() ? "anything but DEVICE" : arguments.unknown, 1);
    Turn turn;
    const std::string text = ethtool_text(turn.state().network, arguments.names.front());
    if (text.empty())
        return complain();
    fmt::print("{}", text);
    return 0;
}

} // namespace zavsim
