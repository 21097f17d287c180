#include "array_report.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *level_words[] = {"unknown", "none",   "raid0",  "raid1",  "raid5",
                                       "raid6",   "raid10", "raid50", "raid60", "linear"};

std::string array_name(const ArrayReport &array) {
    if (array.kernel_name.empty())
        return fmt::format("{}", array.number);
    return fmt::format("{} ({})", array.number, array.kernel_name);
}

Finding finding(const ArrayReport &array) {
    const Severity bad = severity(array);
    const auto about = [&array, bad](const std::string &is, const std::string &are) {
        return finding_about(bad, "array", array_name(array), is, are);
    };
    const std::string progress = fmt::format("rebuilding, {:.0f} %", array.resync);
    if (bad == Severity::unknown)
        return about("gives no answer to trust", "give no answer to trust");
    switch (array.state) {
    case ZAV_RAID_RESYNC:
        return about("is " + progress, "are " + progress);
    case ZAV_RAID_FAILED:
        return about("has failed", "have failed");
    case ZAV_RAID_DEGRADED:
        return about("is degraded", "are degraded");
    default:
        return about("does not exist", "do not exist");
    }
}

// "disk3p2" of "/dev/sata/disk3p2".
std::string short_name(const Address &address) {
    return address.path.substr(address.path.rfind('/') + 1);
}

// The partition, and what keeps it from working: its disk, or that the array has put it out.
std::string member_text(const Member &member, const std::vector<DiskReport> &disks) {
    std::string name = short_name(member.address);
    for (const DiskReport &disk : disks)
        if (disk.slot == member.address.device.disk && disk.state != ZAV_HDD_FOUND)
            return fmt::format("{}({})", name, disk_state_word(disk));
    if (member.state == "active" || member.state == "unknown")
        return name;
    return fmt::format("{}({})", name, member.state == "no_partition" ? "none" : member.state);
}

std::string members_text(const ArrayReport &array, const std::vector<DiskReport> &disks) {
    std::vector<std::string> names;
    for (const Member &member : array.members)
        names.push_back(member_text(member, disks));
    return names.empty() ? "-" : fmt::format("{}", fmt::join(names, " "));
}

std::string rebuild_text(const ArrayReport &array) {
    const std::optional<double> percent = rebuild_percent(array);
    if (!percent)
        return "";
    const std::string bar = fmt::format("{} {:3.0f} %", progress_bar(*percent), *percent);
    return *percent > 0 ? bar : bar + " (started or waiting)";
}

std::string shown_level(int level) {
    if (level == ZAV_RAIDLVL_NONE || level == 0)
        return "-";
    std::string word = level_word(level);
    return word.starts_with("raid") ? "RAID" + word.substr(4) : word;
}

Section common_section(const std::vector<ArrayReport> &arrays) {
    Section section;
    section.key = "arrays";
    section.records = Json::array();
    for (const ArrayReport &array : arrays) {
        section.records.push_back(array_json(array));
        if (severity(array) != Severity::ok)
            section.findings.push_back(finding(array));
    }
    const auto normal = std::count_if(arrays.begin(), arrays.end(), [](const ArrayReport &array) {
        return severity(array) == Severity::ok && array.state != ZAV_RAID_NOT_EXIST;
    });
    section.well = fmt::format("{} {} normal", normal, normal == 1 ? "array" : "arrays");
    return section;
}

Details array_details(const ArrayReport &array) {
    Details details;
    details.add("Array", fmt::format("{}", array.number));
    details.add("State", shown_state(array), severity(array));
    if (rebuild_percent(array))
        details.add("Rebuilt", rebuild_text(array));
    details.add("Level", shown_level(array.level));
    details.add("Device",
                array.address.path + (array.kernel_name.empty() ? "" : ", " + array.kernel_name));
    details.add("Members", members_text(array, {}));
    if (!array_note(array).empty())
        details.add("Note", array_note(array));
    if (!array.doubt.empty())
        details.add("Doubt", array.doubt, Severity::unknown);
    details.add_lines("Kernel", array.kernel_says);
    return details;
}

} // namespace

std::string level_word(int level) {
    const bool named = level >= 0 && level < static_cast<int>(std::size(level_words));
    return named ? level_words[level] : "unknown";
}

std::string array_state_word(const ArrayReport &array) {
    if (array.failure)
        return "unknown";
    switch (array.state) {
    case 0: // an iSCSI target that exists has no state bits
        return "present";
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

Severity severity(const ArrayReport &array) {
    if (array.failure)
        return Severity::unknown;
    if (!array.doubt.empty() && array.state != ZAV_RAID_NOT_EXIST)
        return Severity::unknown;
    switch (array.state) {
    case 0:
    case ZAV_RAID_NORMAL:
        return Severity::ok;
    case ZAV_RAID_DEGRADED:
    case ZAV_RAID_RESYNC:
        return Severity::warning;
    case ZAV_RAID_FAILED:
        return Severity::critical;
    case ZAV_RAID_NOT_EXIST:
        return array.expected ? Severity::critical : Severity::ok;
    default:
        return Severity::unknown;
    }
}

std::string shown_state(const ArrayReport &array) {
    if (severity(array) == Severity::unknown)
        return "unknown";
    if (array.state == ZAV_RAID_RESYNC)
        return "rebuilding";
    return array.state == ZAV_RAID_NOT_EXIST ? "missing" : array_state_word(array);
}

std::string array_note(const ArrayReport &array) {
    if (array.failure && !array.refusal.empty())
        return in_words(*array.failure) + ": " + array.refusal;
    if (array.failure)
        return in_words(*array.failure);
    if (severity(array) == Severity::unknown)
        return fmt::format("the library says {}, which cannot be trusted", array_state_word(array));
    if (array.state == ZAV_RAID_NOT_EXIST && array.expected)
        return "disks have partitions for it, but it is not running";
    if (array.state == ZAV_RAID_NOT_EXIST)
        return "no disk has a partition for it";
    return "";
}

std::optional<double> rebuild_percent(const ArrayReport &array) {
    if (array.failure || array.state != ZAV_RAID_RESYNC)
        return std::nullopt;
    return array.resync;
}

Json array_json(const ArrayReport &array) {
    const std::optional<double> percent = rebuild_percent(array);
    Json json;
    json["kind"] = "array";
    json["array"] = array.number;
    json["address"] = to_json(array.address);
    json["kernel_name"] = array.kernel_name.empty() ? Json(nullptr) : Json(array.kernel_name);
    json["state"] = array_state_word(array);
    json["state_bits"] = array.state;
    json["level"] = level_word(array.level);
    json["level_code"] = array.level;
    json["rebuild_percent"] = percent ? Json(*percent) : Json(nullptr);
    json["members"] = Json::array();
    for (const Member &member : array.members)
        json["members"].push_back({{"address", to_json(member.address)}, {"state", member.state}});
    json["expected"] = array.expected;
    json["severity"] = word(severity(array));
    json["note"] = array_note(array);
    json["doubt"] = array.doubt.empty() ? Json(nullptr) : Json(array.doubt);
    json["error"] = to_json(array.failure);
    return json;
}

Section array_list_section(const std::vector<ArrayReport> &arrays,
                           const std::vector<DiskReport> &disks) {
    Section section = common_section(arrays);
    section.table = Table({"ARRAY", "LEVEL", "STATE", "MEMBERS"}, 2);
    for (const ArrayReport &array : arrays) {
        const std::string note = array_note(array);
        section.table.add(severity(array),
                          {trimmed(fmt::format("{} {}", array.number, array.kernel_name)),
                           shown_level(array.level), shown_state(array),
                           members_text(array, disks)},
                          note.empty() ? rebuild_text(array) : note);
    }
    return section;
}

Section array_show_section(const std::vector<ArrayReport> &arrays) {
    Section section = common_section(arrays);
    for (const ArrayReport &array : arrays)
        section.details.push_back(array_details(array));
    return section;
}

} // namespace zavctl
