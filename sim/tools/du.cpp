// du: the mounted disc is the model's, everything else the host's own du's.
#include "model/texts_optical.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/host_program.hpp"

#include <filesystem>
#include <fmt/format.h>

namespace zavsim {

namespace {

bool is_mount_point(const std::string &name) {
    std::error_code error;
    return std::filesystem::canonical(name, error) == disc_mount_point && !error;
}

} // namespace

int run_du(const std::vector<std::string> &words) {
    const Arguments arguments =
        sort_words(words, {"-s", "-k", "-L", "-sL", "-Ls", "-sk", "-skL", "-sLk"});
    if (arguments.names.size() != 1 || !is_mount_point(arguments.names.front()))
        return exec_host_program("du", words);
    if (!arguments.unknown.empty() || arguments.flags.empty())
        return not_simulated("du", "of a disc anything but -s, -k and -L", 1);
    std::uint64_t kib = 0;
    {
        Turn turn;
        const Medium *medium = medium_in(turn.state().drive);
        kib = medium != nullptr && is_mountable(*medium) ? used_kib(*medium) : 0;
    }
    fmt::print("{}\t{}\n", kib, arguments.names.front());
    return 0;
}

} // namespace zavsim
