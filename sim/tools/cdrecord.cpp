// cdrecord: the drive's and the disc's sheets, the tray.
#include "model/texts_optical.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_device.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr int failure = 255;

int refuse(const std::string &text) {
    fmt::print(stderr, "{}", text);
    return failure;
}

int show_atip(const State &state) {
    const Medium *medium = medium_in(state.drive);
    fmt::print("{}", recorder_text(state));
    fflush(stdout);
    if (medium == nullptr)
        return refuse(no_disc_text());
    fmt::print("{}", kind_of(medium->type).cd ? atip_text(*medium) : "");
    return 0;
}

int show_session_offsets(const State &state) {
    const Medium *medium = medium_in(state.drive);
    if (medium == nullptr)
        return refuse(no_disc_text());
    const std::string offsets = session_offsets(*medium);
    if (offsets.empty())
        return refuse("wodim: Cannot read first writable address\n");
    fmt::print("{}\n", offsets);
    return 0;
}

int eject() {
    Turn turn;
    fmt::print("{}", recorder_text(turn.state()));
    turn.state().drive.medium.reset();
    turn.commit();
    return 0;
}

std::string device_of(const std::vector<std::string> &words) {
    for (const std::string &word : words)
        if (word.rfind("dev=", 0) == 0)
            return word.substr(4);
    return "";
}

bool has(const std::vector<std::string> &words, const std::string &wanted) {
    for (const std::string &word : words)
        if (word == wanted)
            return true;
    return false;
}

} // namespace

int run_cdrecord(const std::vector<std::string> &words) {
    const std::string device = device_of(words);
    if (const int error = device_error(device, Turn().state().drive); error != 0)
        return refuse(fmt::format("wodim: {}. Cannot open SCSI driver!\n", strerror(error)));
    if (has(words, "-atip"))
        return show_atip(Turn().state());
    if (has(words, "-msinfo"))
        return show_session_offsets(Turn().state());
    if (has(words, "-eject"))
        return eject();
    return not_simulated("cdrecord", "anything but -atip, -msinfo and -eject", failure);
}

} // namespace zavsim
