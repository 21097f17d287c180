#include "array_report.h"

#include "raid_set.h"
#include "slot_id.h"
#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *level_words[] = {"unknown", "none",   "raid0",  "raid1",  "raid5",
                                       "raid6",   "raid10", "raid50", "raid60", "linear"};

std::string array_name(const ArrayReport &array) {
    if (array.kernel_name.empty())
        return array_id(array);
    return fmt::format("{} ({})", array_id(array), array.kernel_name);
}

// "2 md1", "2-1 UNIT2VOL".
std::string array_title(const ArrayReport &array) {
    const std::string &name = array.kernel_name.empty() ? array.volume_name : array.kernel_name;
    return trimmed(fmt::format("{} {}", array_id(array), printable(name)));
}

bool is_same_disk(const DiskReport &disk, const Member &member) {
    const SlotId id = slot_id(member.address.device);
    return disk.unit == id.unit && disk.slot == id.number;
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
        if (is_same_disk(disk, member) && disk.state != ZAV_HDD_FOUND)
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
    Section section = section_of("arrays", arrays, array_json, finding);
    const auto normal = std::count_if(arrays.begin(), arrays.end(), [](const ArrayReport &array) {
        return severity(array) == Severity::ok && array.state != ZAV_RAID_NOT_EXIST;
    });
    section.well = counted(static_cast<std::size_t>(normal), "array", "normal");
    return section;
}

void add_reported(Details &details, const ArrayReport &array) {
    if (!array.volume_name.empty())
        details.add("Name", printable(array.volume_name));
    details.add("In", array.unit == 0 ? "the RAID controller's enclosure"
                                      : fmt::format("expansion unit {}", array.unit));
    if (!array.raid_set.empty())
        details.add("RAID set", printable(array.raid_set));
    details.add("Size", reported_size(array.size));
}

Details array_details(const ArrayReport &array) {
    Details details;
    details.add("Array", array_id(array));
    details.add("State", shown_state(array), severity(array));
    if (rebuild_percent(array))
        details.add("Rebuilt", rebuild_text(array));
    details.add("Level", shown_level(array.level));
    details.add("Device",
                array.address.path + (array.kernel_name.empty() ? "" : ", " + array.kernel_name));
    details.add("Members", members_text(array, {}));
    if (is_reported(array))
        add_reported(details, array);
    add_verdict(details, array_note(array), array.doubt);
    details.add_lines("Kernel", array.kernel_says);
    return details;
}

// As the RAID controller knows the disk: the kernel does not.
void add_state(Member &member, const sRaidSetInfo &set) {
    const int slot = slot_id(member.address.device).number;
    if (slot < 1 || slot > enclosure_slots)
        return;
    const std::string word = disk_status_word(set.sDiskInfo[slot - 1].status);
    member.state = word == "found" ? "active" : word == "failed" ? "faulty" : "unknown";
    if (!is_member(set, slot))
        member.state = "out";
}

std::string no_known_state(const ArrayReport &array) {
    return fmt::format("the library says {}, which is no known state", array.state);
}

std::string note_of_reported(const ArrayReport &array) {
    if (!array.doubt.empty())
        return array.doubt;
    if (array.state == 0 && !array.in_report)
        return "the RAID controller's report has no such volume, though its device is there";
    if (array_state_word(array) == "unknown")
        return no_known_state(array);
    if (array.state != ZAV_RAID_NOT_EXIST)
        return "";
    if (array.node_present)
        return "the RAID controller reports it as not existing";
    return array.in_report ? "the RAID controller's report has it, but its device is missing"
                           : "the RAID controller's report has no such volume";
}

} // namespace

std::string level_word(int level) {
    const bool named = level >= 0 && level < static_cast<int>(std::size(level_words));
    return named ? level_words[level] : "unknown";
}

std::string array_id(const ArrayReport &array) {
    return in_words(SlotId{array.unit, array.number});
}

bool is_reported(const ArrayReport &array) {
    const int minor = array.address.device.minor_type;
    return minor == ZAV_MINDEV_RAID_HW || minor == ZAV_MINDEV_RAID_SAS;
}

void tell_enclosure(ArrayReport &array, int result, const sRaidSetInfo &set) {
    if (result == ZAV_RC_ERR_ENODEV)
        array.doubt = doubt_without_set(array.unit);
    if (result != ZAV_RC_OK)
        return;
    array.raid_set = set_name(set);
    for (Member &member : array.members)
        add_state(member, set);
    if (const sVolSetInfo *volume = volume_of(set, array.number)) {
        array.volume_name = volume_name(*volume);
        array.size = as_written(volume->volsize).value_or(0);
        array.in_report = array.expected = true;
    }
}

std::string array_state_word(const ArrayReport &array) {
    if (array.failure)
        return "unknown";
    if (array.state == 0 && !is_reported(array))
        return "present"; // an iSCSI target that exists has no state bits
    return volume_status_word(array.state);
}

Severity severity(const ArrayReport &array) {
    const std::string word = array_state_word(array);
    if (word == "unknown")
        return Severity::unknown;
    if (!array.doubt.empty() && (word != "not_exist" || is_reported(array)))
        return Severity::unknown;
    if (word == "degraded" || word == "resync")
        return Severity::warning;
    if (word == "failed")
        return Severity::critical;
    return word == "not_exist" && array.expected ? Severity::critical : Severity::ok;
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
    if (is_reported(array))
        return note_of_reported(array);
    if (array_state_word(array) == "unknown")
        return no_known_state(array);
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
    json["id"] = array_id(array);
    json["unit"] = array.unit == 0 ? Json(nullptr) : Json(array.unit);
    json["volume_name"] = array.volume_name.empty() ? Json(nullptr) : Json(array.volume_name);
    json["size"] = array.size == 0 ? Json(nullptr) : Json(array.size);
    json["raid_set"] = array.raid_set.empty() ? Json(nullptr) : Json(array.raid_set);
    add_verdict(json, severity(array), array_note(array), array.doubt, array.failure);
    return json;
}

Section array_list_section(const std::vector<ArrayReport> &arrays,
                           const std::vector<DiskReport> &disks) {
    Section section = common_section(arrays);
    const bool sized = std::any_of(arrays.begin(), arrays.end(),
                                   [](const ArrayReport &array) { return is_reported(array); });
    section.table = sized ? Table({"ARRAY", "LEVEL", "STATE", "SIZE", "MEMBERS"}, 2)
                          : Table({"ARRAY", "LEVEL", "STATE", "MEMBERS"}, 2);
    for (const ArrayReport &array : arrays) {
        const std::string note = array_note(array);
        std::vector<std::string> cells = {array_title(array), shown_level(array.level),
                                          shown_state(array), members_text(array, disks)};
        if (sized)
            cells.insert(cells.begin() + 3, reported_size(array.size));
        section.table.add(severity(array), std::move(cells),
                          note.empty() ? rebuild_text(array) : note);
    }
    return section;
}

Section array_show_section(const std::vector<ArrayReport> &arrays) {
    Section section = common_section(arrays);
    add_details(section, arrays, array_details);
    return section;
}

} // namespace zavctl
