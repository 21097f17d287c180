// dvd+rw-mediainfo DEVICE
#include "model/texts_optical.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_device.hpp"

#include <cerrno>
#include <fmt/format.h>

namespace zavsim {

namespace {

// Failures are told at once, the report when it is whole.
int refuse(const char *reason, int status) {
    fmt::print(stderr, ":-( {} mounted, exiting...\n", reason);
    fmt::print("{}", mediainfo_head());
    return status;
}

} // namespace

int run_mediainfo(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty() || arguments.names.size() != 1) {
        fmt::print(stderr, "usage: dvd+rw-mediainfo /dev/dvd\n");
        return 1;
    }
    Turn turn;
    const OpticalDrive &drive = turn.state().drive;
    if (const int error = device_error(arguments.names.front(), drive); error != 0) {
        fmt::print(stderr, "{}: unable to open: {}\n", arguments.names.front(), strerror(error));
        return fatal_status(error);
    }
    const Medium *medium = medium_in(drive);
    if (medium == nullptr)
        return refuse("no media", fatal_status(ENOMEDIUM));
    if (kind_of(medium->type).cd)
        return refuse("non-DVD media", fatal_status(EMEDIUMTYPE));
    fmt::print("{}", mediainfo_text(turn.state(), *medium));
    return 0;
}

} // namespace zavsim
