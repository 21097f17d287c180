#include "report_row.h"

#include "raid_set.h"

#include "common/raid_report.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <iterator>

namespace zavctl {

namespace {

sRaidSetInfo filled(const std::string &piece) {
    zav::EnclosureReader reader(zav::Marker::controller());
    for (std::string line : {std::string("PCI\n"), std::string("R:1:set:1:4:1234:0\n"), piece})
        reader.take(line.data());
    sRaidSetInfo info;
    reader.fill(info);
    return info;
}

// The first byte of the record that the line changes; none if it changes nothing.
std::optional<std::size_t> place_of(const std::string &piece) {
    const sRaidSetInfo without = filled("\n");
    const sRaidSetInfo with = filled(piece);
    const auto *old = reinterpret_cast<const char *>(&without);
    const auto *now = reinterpret_cast<const char *>(&with);
    const char *changed = std::mismatch(old, old + sizeof without, now).first;
    if (changed == old + sizeof without)
        return std::nullopt;
    return static_cast<std::size_t>(changed - old);
}

std::string region(std::size_t place) {
    if (place < offsetof(sRaidSetInfo, sVolInfo))
        return "the set's own fields";
    if (place < offsetof(sRaidSetInfo, sDiskInfo))
        return fmt::format("volume {}",
                           (place - offsetof(sRaidSetInfo, sVolInfo)) / sizeof(sVolSetInfo) + 1);
    return fmt::format("disk {}",
                       (place - offsetof(sRaidSetInfo, sDiskInfo)) / sizeof(sPhyDiskInfo) + 1);
}

// A row whose number has no slot of its own.
ReportRow misplaced(const std::string &piece, const char *what, int number) {
    const std::optional<std::size_t> place = place_of(piece);
    if (!place)
        return {fmt::format("{} number {} lies outside the record: ignored", what, number),
                Severity::warning};
    return {fmt::format("{} number {} overwrites {}", what, number, region(*place)),
            Severity::warning};
}

Severity severity_of(const std::string &status_word) {
    return status_word == "unknown" ? Severity::warning : Severity::ok;
}

} // namespace

ReportRow row_of_volume(const std::string &piece, int number, int disks) {
    const sRaidSetInfo info = filled(piece);
    if (number < 1 || number > static_cast<int>(std::size(info.sVolInfo)))
        return misplaced(piece, "volume", number);
    const sVolSetInfo &volume = info.sVolInfo[number - 1];
    return {fmt::format("volume {} {}", number, in_words(volume, disks)),
            severity_of(volume_status_word(volume.status))};
}

ReportRow row_of_disk(const std::string &piece, int number) {
    const sRaidSetInfo info = filled(piece);
    if (number < 1 || number > static_cast<int>(std::size(info.sDiskInfo)))
        return misplaced(piece, "disk", number);
    const sPhyDiskInfo &disk = info.sDiskInfo[number - 1];
    const bool absent = disk.disksize == 0.0F;
    return {fmt::format("disk {} {}", number, in_words(disk)),
            absent ? Severity::ok : severity_of(disk_status_word(disk.status))};
}

} // namespace zavctl
