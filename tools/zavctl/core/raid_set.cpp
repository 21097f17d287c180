#include "raid_set.h"

#include "text.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <charconv>
#include <cmath>
#include <cstring>

namespace zavctl {

namespace {

constexpr int striped = 0;
constexpr int mirrored = 1;
constexpr int with_parity = 3;

// The arrays are terminated unless a line with a number out of place has written over the end.
template <std::size_t size>
std::string text_of(const char (&text)[size]) {
    return {text, strnlen(text, size)};
}

Json or_null(const std::optional<double> &number) {
    return number ? Json(*number) : Json(nullptr);
}

Json volume_json(const sVolSetInfo &volume, int disks) {
    Json json;
    json["number"] = volume.volnum;
    json["name"] = text_of(volume.volname);
    json["level"] = reported_level(volume.raidlevel, disks);
    json["size"] = or_null(as_written(volume.volsize));
    json["progress"] = volume.progress;
    json["status"] = volume.status;
    json["state"] = volume_status_word(volume.status);
    return json;
}

Json disk_json(const sPhyDiskInfo &disk) {
    Json json;
    json["number"] = disk.disknum;
    json["size"] = or_null(as_written(disk.disksize));
    json["status"] = disk.status;
    json["state"] = disk.disksize == 0.0F ? "absent" : disk_status_word(disk.status);
    return json;
}

std::string state_text(int status, const std::string &word) {
    return word == "unknown" ? fmt::format("unknown status {}", status)
                             : fmt::format("status {} ({})", status, word);
}

} // namespace

std::string enclosure_words(int unit) {
    return unit == controller ? "the controller" : fmt::format("unit {}", unit);
}

std::string disk_status_word(int status) {
    switch (status) {
    case ZAV_HDD_FOUND:
        return "found";
    case ZAV_HDD_ABSENT:
        return "absent";
    case ZAV_HDD_FAILED:
        return "failed";
    default:
        return "unknown";
    }
}

std::string volume_status_word(int status) {
    switch (status) {
    case ZAV_RAID_NORMAL:
        return "normal";
    case ZAV_RAID_DEGRADED:
        return "degraded";
    case ZAV_RAID_RESYNC:
        return "resync";
    case ZAV_RAID_FAILED:
        return "failed";
    case ZAV_RAID_NOT_EXIST:
        return "not_exist";
    default:
        return "unknown";
    }
}

std::string reported_level(int level, int disks) {
    switch (level) {
    case striped:
        return "RAID0";
    case mirrored:
        return disks == enclosure_slots ? "RAID10" : "RAID1";
    case with_parity:
        return "RAID5";
    default:
        return fmt::format("level {}", level);
    }
}

std::optional<double> as_written(float number) {
    if (!std::isfinite(number))
        return std::nullopt;
    const std::string text = fmt::format("{}", number); // the shortest that reads as this number
    double exact = 0;
    std::from_chars(text.data(), text.data() + text.size(), exact);
    return exact;
}

std::string reported_size(double size) {
    return std::isfinite(size) && size != 0 ? fmt::format("{:.1f}", size) : "-";
}

bool is_member(const sRaidSetInfo &set, int slot) {
    const std::string members = member_digits(set);
    if (members.find_first_of("1234") == std::string::npos)
        return slot <= set.diskcount; // the members are not told by their slots
    return members.find(static_cast<char>('0' + slot)) != std::string::npos;
}

const sVolSetInfo *volume_of(const sRaidSetInfo &set, int number) {
    const bool fits = number >= 1 && number <= static_cast<int>(std::size(set.sVolInfo));
    return fits && set.sVolInfo[number - 1].volnum == number ? &set.sVolInfo[number - 1] : nullptr;
}

std::string set_name(const sRaidSetInfo &set) {
    return text_of(set.raidname);
}

std::string volume_name(const sVolSetInfo &volume) {
    return text_of(volume.volname);
}

std::string member_digits(const sRaidSetInfo &set) {
    return text_of(set.diskmember);
}

std::string doubt_without_set(int unit) {
    return fmt::format("the RAID controller's report has no section of {}, or no RAID set in it",
                       enclosure_words(unit));
}

Json set_json(const sRaidSetInfo &set) {
    Json json;
    json["number"] = set.raidnum;
    json["name"] = set_name(set);
    json["size"] = or_null(as_written(set.raidsize));
    json["disk_count"] = set.diskcount;
    json["members"] = member_digits(set);
    return json;
}

Json volumes_json(const sRaidSetInfo &set) {
    Json list = Json::array();
    for (int number = 1; number <= static_cast<int>(std::size(set.sVolInfo)); ++number)
        if (const sVolSetInfo *volume = volume_of(set, number))
            list.push_back(volume_json(*volume, set.diskcount));
    return list;
}

Json disks_json(const sRaidSetInfo &set) {
    Json list = Json::array();
    for (const sPhyDiskInfo &disk : set.sDiskInfo)
        list.push_back(disk_json(disk));
    return list;
}

std::string in_words(const sVolSetInfo &volume, int disks) {
    const std::string word = volume_status_word(volume.status);
    std::string text = fmt::format(
        "\"{}\" {} {} {}", printable(volume_name(volume)), reported_level(volume.raidlevel, disks),
        reported_size(as_written(volume.volsize).value_or(0)), state_text(volume.status, word));
    if (volume.status == ZAV_RAID_RESYNC)
        text += fmt::format(", {} %", volume.progress);
    return text;
}

std::string in_words(const sPhyDiskInfo &disk) {
    if (disk.disksize == 0.0F)
        return "no size: absent";
    return fmt::format("{} {}", reported_size(as_written(disk.disksize).value_or(0)),
                       state_text(disk.status, disk_status_word(disk.status)));
}

std::string in_words(const sRaidSetInfo &set) {
    return fmt::format("\"{}\" {}, {} disks ({})", printable(set_name(set)),
                       reported_size(as_written(set.raidsize).value_or(0)), set.diskcount,
                       printable(member_digits(set)));
}

} // namespace zavctl
