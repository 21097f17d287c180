#include "disk_report.h"

#include "raid_set.h"
#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

Finding finding(const DiskReport &disk) {
    const Severity bad = severity(disk);
    const std::string name = disk_name(disk);
    if (bad == Severity::unknown)
        return finding_about(bad, "disk", name, "gives no answer to trust",
                             "give no answer to trust");
    if (disk.state == ZAV_HDD_FAILED)
        return finding_about(bad, "disk", name, "has failed", "have failed");
    return finding_about(bad, "disk", name, "is absent", "are absent");
}

// Doubts that several disks share are said once.
void add_doubts(Section &section, const std::vector<DiskReport> &disks) {
    std::vector<std::string> said;
    for (const DiskReport &disk : disks)
        if (!disk.doubt.empty() && std::find(said.begin(), said.end(), disk.doubt) == said.end())
            said.push_back(disk.doubt);
    for (const std::string &doubt : said)
        section.lines.push_back(" ?  " + doubt);
}

Section common_section(const std::vector<DiskReport> &disks) {
    Section section = section_of("disks", disks, disk_json, finding);
    const auto found = std::count_if(disks.begin(), disks.end(), [](const DiskReport &disk) {
        return disk.state == ZAV_HDD_FOUND;
    });
    section.well = counted(static_cast<std::size_t>(found), "disk", "found");
    return section;
}

void add_place(Details &details, const DiskReport &disk) {
    if (!is_reported(disk)) {
        details.add("Used by arrays", disk.expected ? "yes" : "no");
        return;
    }
    details.add("In", disk.unit == 0 ? "the RAID controller's enclosure"
                                     : fmt::format("expansion unit {}", disk.unit));
    if (!disk.raid_set.empty())
        details.add("RAID set", printable(disk.raid_set) + (disk.expected ? "" : ", not a member"));
    details.add("Size", reported_size(disk.size));
}

Details disk_details(const DiskReport &disk) {
    Details details;
    details.add("Disk", disk_name(disk));
    details.add("State", shown_state(disk), severity(disk));
    details.add("Device", fmt::format("{} ({})", disk.address.path,
                                      disk.node_present ? "node present" : "no node"));
    add_place(details, disk);
    add_verdict(details, disk_note(disk), disk.doubt);
    return details;
}

// Of a disk on the motherboard, which has a device node and a health check.
std::string note_of_attached(const DiskReport &disk) {
    if (disk.state == ZAV_HDD_FAILED)
        return "its health check does not pass";
    if (disk.state == ZAV_HDD_ABSENT && disk.node_present)
        return "its device node exists, but smartctl cannot open it";
    if (disk.state == ZAV_HDD_ABSENT && disk.expected)
        return "no disk in the slot";
    return disk.expected ? "" : "not used by the arrays of this model";
}

std::string note_of_reported(const DiskReport &disk) {
    if (disk.state == ZAV_HDD_FAILED)
        return "the RAID controller reports it as failed";
    if (disk.state == ZAV_HDD_ABSENT && disk.expected)
        return "no disk in the slot, the RAID set lacks it";
    return disk.expected ? "" : "not a member of the RAID set";
}

} // namespace

std::string disk_name(const DiskReport &disk) {
    return in_words(SlotId{disk.unit, disk.slot});
}

bool is_reported(const DiskReport &disk) {
    const int minor = disk.address.device.minor_type;
    return minor == ZAV_MINDEV_HDD_HWSATA || minor == ZAV_MINDEV_HDD_SAS;
}

void tell_enclosure(DiskReport &disk, int result, const sRaidSetInfo &set) {
    if (result == ZAV_RC_ERR_ENODEV)
        disk.doubt = doubt_without_set(disk.unit);
    if (result != ZAV_RC_OK || disk.slot < 1 || disk.slot > enclosure_slots)
        return;
    const float size = set.sDiskInfo[disk.slot - 1].disksize;
    disk.size = as_written(size).value_or(0);
    disk.raid_set = set_name(set);
    disk.expected = is_member(set, disk.slot);
    if (!disk.failure && disk.state == ZAV_HDD_ABSENT && size > 0.0F &&
        set.sDiskInfo[disk.slot - 1].status != ZAV_HDD_ABSENT)
        disk.doubt = "the RAID controller's report was rewritten meanwhile";
}

std::string disk_state_word(const DiskReport &disk) {
    return disk.failure ? "unknown" : disk_status_word(disk.state);
}

Severity severity(const DiskReport &disk) {
    if (disk.failure)
        return Severity::unknown;
    // An absent node is seen without any tool: no doubt about a tool touches that.
    if (disk.state == ZAV_HDD_ABSENT && !disk.node_present && !is_reported(disk))
        return disk.expected ? Severity::critical : Severity::ok;
    if (!disk.doubt.empty())
        return Severity::unknown;
    switch (disk.state) {
    case ZAV_HDD_FOUND:
        return Severity::ok;
    case ZAV_HDD_ABSENT:
        return is_reported(disk) && !disk.expected ? Severity::ok : Severity::critical;
    case ZAV_HDD_FAILED:
        return Severity::critical;
    default:
        return Severity::unknown;
    }
}

std::string shown_state(const DiskReport &disk) {
    const Severity bad = severity(disk);
    if (bad == Severity::unknown)
        return "unknown";
    return disk.state == ZAV_HDD_ABSENT && bad == Severity::ok ? "empty" : disk_state_word(disk);
}

std::string disk_note(const DiskReport &disk) {
    if (disk.failure)
        return in_words(*disk.failure);
    const bool unknown = severity(disk) == Severity::unknown;
    if (!disk.doubt.empty() && unknown)
        return fmt::format("the library says {}, which cannot be trusted", disk_state_word(disk));
    if (unknown)
        return fmt::format("the library says {}, which is no known state", disk.state);
    return is_reported(disk) ? note_of_reported(disk) : note_of_attached(disk);
}

Json disk_json(const DiskReport &disk) {
    Json json;
    json["kind"] = "disk";
    json["slot"] = disk.slot;
    json["address"] = to_json(disk.address);
    json["state"] = disk_state_word(disk);
    json["state_bits"] = disk.state;
    json["expected"] = disk.expected;
    json["node_present"] = disk.node_present;
    json["id"] = disk_name(disk);
    json["unit"] = disk.unit == 0 ? Json(nullptr) : Json(disk.unit);
    json["size"] = disk.size == 0 ? Json(nullptr) : Json(disk.size);
    json["raid_set"] = disk.raid_set.empty() ? Json(nullptr) : Json(disk.raid_set);
    add_verdict(json, severity(disk), disk_note(disk), disk.doubt, disk.failure);
    return json;
}

Section disk_list_section(const std::vector<DiskReport> &disks) {
    Section section = common_section(disks);
    const bool sized = std::any_of(disks.begin(), disks.end(),
                                   [](const DiskReport &disk) { return is_reported(disk); });
    section.table = sized ? Table({"DISK", "STATE", "SIZE", "DEVICE", "NOTE"}, 1)
                          : Table({"DISK", "STATE", "DEVICE", "NOTE"}, 1);
    for (const DiskReport &disk : disks) {
        std::vector<std::string> cells = {disk_name(disk), shown_state(disk), disk.address.path,
                                          disk_note(disk)};
        if (sized)
            cells.insert(cells.begin() + 2, reported_size(disk.size));
        section.table.add(severity(disk), std::move(cells));
    }
    add_doubts(section, disks);
    return section;
}

Section disk_show_section(const std::vector<DiskReport> &disks) {
    Section section = common_section(disks);
    add_details(section, disks, disk_details);
    return section;
}

} // namespace zavctl
