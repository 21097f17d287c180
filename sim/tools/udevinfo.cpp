// udevinfo -q symlink -p DEVICE
#include "model/texts_volumes.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

// "/block/sdb/sdb1" and "/sys/block/sdb" name their last part.
std::string kernel_name_of(const std::string &path) {
    const std::string below = path.rfind("/sys/", 0) == 0 ? path.substr(4) : path;
    return below.rfind("/block/", 0) == 0 ? below.substr(below.rfind('/') + 1) : "";
}

} // namespace

int run_udevinfo(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {}, {"-q", "-p"});
    const auto query = arguments.values.find("-q");
    const auto path = arguments.values.find("-p");
    if (!arguments.unknown.empty() || !arguments.names.empty() || query == arguments.values.end() ||
        query->second != "symlink" || path == arguments.values.end())
        return not_simulated("udevinfo", "anything but -q symlink -p DEVICE", 1);
    Turn turn;
    const std::string links = udev_links(turn.state(), kernel_name_of(path->second));
    if (links.empty()) {
        fmt::print(stderr, "no record for '{}' in database\n", path->second);
        return 3;
    }
    fmt::print("{}\n", links);
    return 0;
}

} // namespace zavsim
