#include "disk_report.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

Finding finding(const DiskReport &disk) {
    const Severity bad = severity(disk);
    const std::string name = fmt::format("{}", disk.slot);
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
    Section section;
    section.key = "disks";
    section.records = Json::array();
    std::size_t found = 0;
    for (const DiskReport &disk : disks) {
        section.records.push_back(disk_json(disk));
        if (severity(disk) != Severity::ok)
            section.findings.push_back(finding(disk));
        found += disk.state == ZAV_HDD_FOUND ? 1U : 0U;
    }
    section.well = fmt::format("{} {} found", found, found == 1 ? "disk" : "disks");
    return section;
}

Details disk_details(const DiskReport &disk) {
    Details details;
    details.add("Disk", fmt::format("{}", disk.slot));
    details.add("State", shown_state(disk), severity(disk));
    details.add("Device", fmt::format("{} ({})", disk.address.path,
                                      disk.node_present ? "node present" : "no node"));
    details.add("Used by arrays", disk.expected ? "yes" : "no");
    if (!disk_note(disk).empty())
        details.add("Note", disk_note(disk));
    if (!disk.doubt.empty())
        details.add("Doubt", disk.doubt, Severity::unknown);
    return details;
}

} // namespace

std::string disk_state_word(const DiskReport &disk) {
    if (disk.failure)
        return "unknown";
    switch (disk.state) {
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

Severity severity(const DiskReport &disk) {
    if (disk.failure)
        return Severity::unknown;
    // An absent node is seen without any tool: no doubt about a tool touches that.
    if (disk.state == ZAV_HDD_ABSENT && !disk.node_present)
        return disk.expected ? Severity::critical : Severity::ok;
    if (!disk.doubt.empty())
        return Severity::unknown;
    switch (disk.state) {
    case ZAV_HDD_FOUND:
        return Severity::ok;
    case ZAV_HDD_ABSENT:
    case ZAV_HDD_FAILED:
        return Severity::critical;
    default:
        return Severity::unknown;
    }
}

std::string shown_state(const DiskReport &disk) {
    if (severity(disk) == Severity::unknown)
        return "unknown";
    if (disk.state == ZAV_HDD_ABSENT && !disk.expected && !disk.node_present)
        return "empty";
    return disk_state_word(disk);
}

std::string disk_note(const DiskReport &disk) {
    if (disk.failure)
        return in_words(*disk.failure);
    if (!disk.doubt.empty() && severity(disk) == Severity::unknown)
        return fmt::format("the library says {}, which cannot be trusted", disk_state_word(disk));
    if (disk.state == ZAV_HDD_FAILED)
        return "its health check does not pass";
    if (disk.state == ZAV_HDD_ABSENT && disk.node_present)
        return "its device node exists, but smartctl cannot open it";
    if (disk.state == ZAV_HDD_ABSENT)
        return disk.expected ? "no disk in the slot" : "not used by the arrays of this model";
    return disk.expected ? "" : "not used by the arrays of this model";
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
    json["severity"] = word(severity(disk));
    json["note"] = disk_note(disk);
    json["doubt"] = disk.doubt.empty() ? Json(nullptr) : Json(disk.doubt);
    json["error"] = to_json(disk.failure);
    return json;
}

Section disk_list_section(const std::vector<DiskReport> &disks) {
    Section section = common_section(disks);
    section.table = Table({"DISK", "STATE", "DEVICE", "NOTE"}, 1);
    for (const DiskReport &disk : disks)
        section.table.add(severity(disk), {fmt::format("{}", disk.slot), shown_state(disk),
                                           disk.address.path, disk_note(disk)});
    add_doubts(section, disks);
    return section;
}

Section disk_show_section(const std::vector<DiskReport> &disks) {
    Section section = common_section(disks);
    for (const DiskReport &disk : disks)
        section.details.push_back(disk_details(disk));
    return section;
}

} // namespace zavctl
