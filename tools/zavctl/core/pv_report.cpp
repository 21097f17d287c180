#include "pv_report.h"

#include "group_report.h"
#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

Finding finding(const PvReport &pv) {
    const Severity bad = severity(pv);
    const auto about = [&pv, bad](const std::string &is, const std::string &are) {
        return finding_about(bad, "physical volume", in_words(pv.id), is, are);
    };
    if (bad == Severity::unknown)
        return about("gives no answer to trust", "give no answer to trust");
    if (pv.state == ZAV_LVM_FAILED)
        return about("has failed", "have failed");
    return about("does not exist", "do not exist");
}

std::string device_text(const PvReport &pv) {
    if (pv.failure && pv.device.device.disk == 0)
        return "-";
    std::string words = device_words(pv.device);
    if (pv.device.device.disk == 0 || pv.device.path.empty() || words == pv.device.path)
        return words;
    return fmt::format("{} ({})", words, pv.device.path);
}

Section common_section(const std::vector<PvReport> &pvs) {
    Section section = section_of("physical_volumes", pvs, pv_json, finding);
    section.well = counted(count_well(pvs), "physical volume", "normal");
    return section;
}

Details pv_details(const PvReport &pv) {
    Details details;
    details.add("Physical volume", in_words(pv.id));
    details.add("State", shown_state(pv), severity(pv));
    details.add("Group", group_name(pv.id.group));
    details.add("Size", shown_size(pv.size));
    details.add("Device", device_text(pv));
    add_verdict(details, pv_note(pv), pv.doubt);
    return details;
}

} // namespace

std::string pv_state_word(const PvReport &pv) {
    if (pv.failure)
        return "unknown";
    switch (pv.state) {
    case ZAV_LVM_NORMAL:
        return "normal";
    case ZAV_LVM_FAILED:
        return "failed";
    case ZAV_LVM_NOT_EXIST:
        return "not_exist";
    default:
        return "unknown";
    }
}

Severity severity(const PvReport &pv) {
    const std::string word = pv_state_word(pv);
    if (!pv.doubt.empty() || word == "unknown")
        return Severity::unknown;
    return word == "normal" ? Severity::ok : Severity::critical;
}

std::string shown_state(const PvReport &pv) {
    if (severity(pv) == Severity::unknown)
        return "unknown";
    const std::string word = pv_state_word(pv);
    return word == "not_exist" ? "missing" : word;
}

std::string pv_note(const PvReport &pv) {
    if (pv.failure)
        return in_words(*pv.failure);
    if (severity(pv) == Severity::unknown)
        return fmt::format("the library says {}, which cannot be trusted", pv_state_word(pv));
    if (pv.state == ZAV_LVM_FAILED)
        return "what it lies on has failed, or LVM does not find it there";
    if (pv.state == ZAV_LVM_NOT_EXIST)
        return "the group has no such physical volume, or the array under it does not exist";
    return "";
}

Json pv_json(const PvReport &pv) {
    Json json;
    json["kind"] = "physical_volume";
    json["volume"] = in_words(pv.id);
    json["group"] = pv.id.group;
    json["group_name"] = group_name(pv.id.group);
    json["number"] = pv.id.number;
    json["address"] = to_json(pv.address);
    json["state"] = pv_state_word(pv);
    json["state_bits"] = pv.state;
    json["size_gb"] = pv.size > 0 ? Json(pv.size) : Json(nullptr);
    json["device"] = pv.device.device.disk == 0 ? Json(nullptr) : to_json(pv.device);
    add_verdict(json, severity(pv), pv_note(pv), pv.doubt, pv.failure);
    return json;
}

Section pv_list_section(const std::vector<PvReport> &pvs, int more) {
    Section section = common_section(pvs);
    section.table = Table({"VOLUME", "STATE", "SIZE", "GROUP", "ON"}, 1);
    for (const PvReport &pv : pvs)
        section.table.add(severity(pv),
                          {in_words(pv.id), shown_state(pv), shown_size(pv.size),
                           group_name(pv.id.group), device_text(pv)},
                          pv_note(pv));
    if (more > 0)
        section.lines.push_back(
            fmt::format("    and {} more, which the library does not name", more));
    return section;
}

Section pv_show_section(const std::vector<PvReport> &pvs) {
    Section section = common_section(pvs);
    add_details(section, pvs, pv_details);
    return section;
}

} // namespace zavctl
