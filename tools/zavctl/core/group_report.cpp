#include "group_report.h"

#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

Finding finding(const GroupReport &group) {
    const Severity bad = severity(group);
    const auto about = [&group, bad](const std::string &is, const std::string &are) {
        return finding_about(bad, "volume group", group.name, is, are);
    };
    if (bad == Severity::unknown)
        return about("gives no answer to trust", "give no answer to trust");
    if ((group.state & ZAV_LVM_FAILED) != 0)
        return about("has failed", "have failed");
    if ((group.state & ZAV_LVM_NOT_EXIST) != 0)
        return about("does not exist", "do not exist");
    return about("has an inactive volume", "have inactive volumes");
}

std::string devices_text(const GroupReport &group) {
    std::vector<std::string> words;
    words.reserve(group.devices.size() + 1);
    for (const Address &device : group.devices)
        words.push_back(device_words(device));
    const int more = group.pv_count - static_cast<int>(group.devices.size());
    if (more > 0)
        words.push_back(fmt::format("{} more", more));
    return words.empty() ? "-" : listed(words);
}

std::string count_text(const GroupReport &group, int count) {
    return group.answered() ? fmt::format("{}", count) : "-";
}

std::string volumes_text(const GroupReport &group) {
    std::vector<std::string> words;
    words.reserve(group.volumes.size() + 1);
    for (const int number : group.volumes)
        words.push_back(fmt::format("LogVol{}", number));
    const int more = group.lv_count - static_cast<int>(group.volumes.size());
    if (more > 0)
        words.push_back(fmt::format("{} more", more));
    return words.empty() ? "none" : listed(words);
}

Section common_section(const std::vector<GroupReport> &groups) {
    Section section = section_of("volume_groups", groups, group_json, finding);
    const auto normal = std::count_if(groups.begin(), groups.end(), [](const GroupReport &group) {
        return group.state == ZAV_LVM_NORMAL && severity(group) == Severity::ok;
    });
    section.well = counted(static_cast<std::size_t>(normal), "volume group", "normal");
    return section;
}

Details group_details(const GroupReport &group) {
    Details details;
    details.add("Group", fmt::format("{} {}", group.number, group.name));
    details.add("State", shown_state(group), severity(group));
    if (group.answered()) {
        details.add("Size", shown_size(group.size));
        details.add("Physical volumes",
                    fmt::format("{} on {}", group.pv_count, devices_text(group)));
        details.add("Logical volumes", fmt::format("{}: {}", group.lv_count, volumes_text(group)));
    }
    add_verdict(details, group_note(group), group.doubt);
    return details;
}

} // namespace

bool GroupReport::answered() const {
    return !failure && (state & ZAV_LVM_NORMAL) != 0;
}

std::vector<int> groups_in_list(std::string_view vgs_output) {
    std::vector<int> numbers;
    while (!vgs_output.empty()) {
        const std::size_t end = std::min(vgs_output.find('\n'), vgs_output.size());
        const std::string line = trimmed(vgs_output.substr(0, end));
        const auto number =
            group_number(std::string_view(line).substr(0, line.find_first_of(" \t")));
        if (number)
            numbers.push_back(*number);
        vgs_output.remove_prefix(std::min(end + 1, vgs_output.size()));
    }
    return numbers;
}

std::string shown_size(std::uint64_t size) {
    return size == 0 ? "-" : fmt::format("<{} GB", size);
}

std::string device_words(const Address &address) {
    const zavDevice &device = address.device;
    if (device.disk == 0 || address.path.empty())
        return "a device without an address";
    if (device.minor_type == ZAV_MINDEV_RAID_SW)
        return fmt::format("array {}", device.disk);
    if (device.minor_type == ZAV_MINDEV_HDD_SATA && device.part == 0)
        return fmt::format("disk {}", device.disk);
    if (device.minor_type == ZAV_MINDEV_HDD_SATA)
        return fmt::format("disk{}p{}", device.disk, device.part);
    return address.path;
}

std::string group_state_word(const GroupReport &group) {
    if (group.failure)
        return "unknown";
    if ((group.state & ZAV_LVM_FAILED) != 0)
        return "failed";
    if ((group.state & ZAV_LVM_NOT_EXIST) != 0)
        return "not_exist";
    if ((group.state & ZAV_LVM_INACTIVE) != 0)
        return "inactive";
    return group.state == ZAV_LVM_NORMAL ? "normal" : "unknown";
}

Severity severity(const GroupReport &group) {
    if (!group.doubt.empty() || group_state_word(group) == "unknown")
        return Severity::unknown;
    if ((group.state & ZAV_LVM_FAILED) != 0)
        return Severity::critical;
    if ((group.state & ZAV_LVM_NOT_EXIST) != 0)
        return group.expected ? Severity::warning : Severity::ok;
    return (group.state & ZAV_LVM_INACTIVE) != 0 ? Severity::warning : Severity::ok;
}

std::string shown_state(const GroupReport &group) {
    if (severity(group) == Severity::unknown)
        return "unknown";
    const std::string word = group_state_word(group);
    return word == "not_exist" ? "missing" : word;
}

std::string group_note(const GroupReport &group) {
    if (group.failure)
        return in_words(*group.failure);
    if (severity(group) == Severity::unknown)
        return fmt::format("the library says {}, which cannot be trusted", group_state_word(group));
    if ((group.state & ZAV_LVM_FAILED) != 0)
        return "it is listed, but does not answer: look at the arrays below it";
    if ((group.state & ZAV_LVM_NOT_EXIST) != 0)
        return "there is no volume group of this name";
    if ((group.state & ZAV_LVM_INACTIVE) != 0)
        return "a logical volume is not active";
    return "";
}

std::vector<Finding> group_findings(const std::vector<GroupReport> &groups) {
    std::vector<Finding> findings;
    for (const GroupReport &group : groups)
        if (severity(group) != Severity::ok)
            findings.push_back(finding(group));
    return findings;
}

Json group_json(const GroupReport &group) {
    const bool told = group.answered();
    Json json;
    json["kind"] = "volume_group";
    json["group"] = group.number;
    json["name"] = group.name;
    json["address"] = to_json(group.address);
    json["state"] = group_state_word(group);
    json["state_bits"] = group.state;
    json["size_gb"] = told && group.size > 0 ? Json(group.size) : Json(nullptr);
    json["physical_volumes"] = told ? Json(group.pv_count) : Json(nullptr);
    json["logical_volumes"] = told ? Json(group.lv_count) : Json(nullptr);
    json["devices"] = Json::array();
    for (const Address &device : group.devices)
        json["devices"].push_back(device.device.disk == 0 ? Json(nullptr) : to_json(device));
    json["expected"] = group.expected;
    add_verdict(json, severity(group), group_note(group), group.doubt, group.failure);
    return json;
}

Section group_list_section(const std::vector<GroupReport> &groups) {
    Section section = common_section(groups);
    section.table = Table({"GROUP", "STATE", "SIZE", "VOLUMES", "ON"}, 1);
    for (const GroupReport &group : groups)
        section.table.add(severity(group),
                          {fmt::format("{} {}", group.number, group.name), shown_state(group),
                           shown_size(group.answered() ? group.size : 0),
                           count_text(group, group.lv_count), devices_text(group)},
                          group_note(group));
    return section;
}

Section group_show_section(const std::vector<GroupReport> &groups) {
    Section section = common_section(groups);
    add_details(section, groups, group_details);
    return section;
}

} // namespace zavctl
