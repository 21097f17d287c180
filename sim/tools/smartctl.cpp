// smartctl -H -d ata DEVICE
#include "model/disks.hpp"
#include "model/texts.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

// Bits of smartctl's exit status.
constexpr int bad_command_line = 1;
constexpr int cannot_open = 2;
constexpr int disk_failing = 8;

std::string device_of(const std::vector<std::string> &words) {
    std::string device;
    for (std::size_t i = 0; i < words.size(); ++i)
        if (words[i] == "-d")
            ++i;
        else if (words[i].rfind('-', 0) != 0)
            device = words[i];
    return device;
}

} // namespace

int run_smartctl(const std::vector<std::string> &words) {
    const std::string device = device_of(words);
    if (device.empty()) {
        fmt::print("ERROR: smartctl requires a device name as the final command-line argument.\n");
        return bad_command_line;
    }
    Turn turn;
    const auto place = device_behind(device);
    const Disk *disk = place ? attached_disk(turn.state(), place->letter) : nullptr;
    if (disk == nullptr) {
        fmt::print("{}", smartctl_no_device_text(turn.state(), device));
        return cannot_open;
    }
    fmt::print("{}", smartctl_text(turn.state(), disk->failing));
    return disk->failing ? disk_failing : 0;
}

} // namespace zavsim
