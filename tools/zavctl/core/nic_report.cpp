#include "nic_report.h"

#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace zavctl {

namespace {

Finding finding(const NicReport &nic) {
    const Severity bad = severity(nic);
    const std::string noun = nic.id.bond ? "bond" : "port";
    const auto about = [&](const std::string &is, const std::string &are) {
        return finding_about(bad, noun, name_of(nic.id), is, are);
    };
    if (bad == Severity::unknown)
        return about("gives no answer to trust", "give no answer to trust");
    if (link_word(nic) == "down")
        return about("has no link", "have no link");
    return about("does not exist", "do not exist");
}

// An answer that is not believed is not shown as if it were.
std::string shown_link(const NicReport &nic) {
    return severity(nic) == Severity::unknown ? "unknown" : link_word(nic);
}

Section common_section(const std::vector<NicReport> &nics) {
    Section section = section_of("nics", nics, nic_json, finding);
    const auto up = std::count_if(nics.begin(), nics.end(),
                                  [](const NicReport &nic) { return link_word(nic) == "up"; });
    section.well = counted(static_cast<std::size_t>(up), "network port", "up");
    return section;
}

Details nic_details(const NicReport &nic) {
    Details details;
    details.add(nic.id.bond ? "Bond" : "Port", name_of(nic.id));
    details.add("Link", shown_link(nic), severity(nic));
    details.add("Speed", speed_text(nic));
    add_verdict(details, nic_note(nic), nic.doubt);
    return details;
}

} // namespace

std::optional<NicId> nic_id(std::string_view word) {
    for (const NicId &id : all_nics())
        if (name_of(id) == word || (!id.bond && fmt::format("{}", id.number) == word))
            return id;
    return std::nullopt;
}

std::string name_of(const NicId &id) {
    return fmt::format("{}{}", id.bond ? "bond" : "eth", id.number - 1);
}

const std::vector<NicId> &all_nics() {
    static const std::vector<NicId> nics = {{false, 1}, {false, 2}, {false, 3},
                                            {false, 4}, {true, 1},  {true, 2}};
    return nics;
}

void doubt_nic(NicReport &nic, bool tool_missing) {
    if (nic.failure || nic.state != ZAV_NET_NOT_EXIST || !nic.in_kernel.value_or(tool_missing))
        return;
    if (tool_missing)
        nic.doubt = "/sbin/ethtool is missing: every port reads as not existing";
    else
        nic.doubt = "the kernel has it, but ethtool or /proc/net/bonding tells nothing about it";
}

std::string link_word(const NicReport &nic) {
    if (nic.failure)
        return "unknown";
    switch (nic.state) {
    case ZAV_NET_UP:
        return "up";
    case ZAV_NET_DOWN:
        return "down";
    case ZAV_NET_NOT_EXIST:
        return "not existing";
    default:
        return "unknown";
    }
}

Severity severity(const NicReport &nic) {
    const std::string word = link_word(nic);
    if (!nic.doubt.empty() || word == "unknown")
        return Severity::unknown;
    if (word == "down")
        return nic.switched_off ? Severity::ok : Severity::warning;
    if (word == "not existing")
        return nic.asked_for ? Severity::critical : Severity::ok;
    return Severity::ok;
}

std::string speed_text(const NicReport &nic) {
    return nic.speed > 0 ? fmt::format("{} Mbit/s", nic.speed) : "-";
}

std::string nic_note(const NicReport &nic) {
    if (nic.failure)
        return in_words(*nic.failure);
    if (!nic.doubt.empty())
        return nic.doubt;
    const std::string word = link_word(nic);
    if (word == "unknown")
        return "ethtool tells no link";
    if (word == "down" && nic.switched_off)
        return "switched off: no link is expected";
    if (word == "down" && nic.id.bond)
        return "no port of the bond has a link";
    return word == "up" && nic.speed == 0 ? "ethtool does not know its speed" : "";
}

Json nic_json(const NicReport &nic) {
    Json json;
    json["nic"] = name_of(nic.id);
    json["kind"] = nic.id.bond ? "bond" : "port";
    json["number"] = nic.id.number;
    json["link"] = link_word(nic);
    json["speed_mbit"] = nic.speed > 0 ? Json(nic.speed) : Json(nullptr);
    json["switched_off"] = nic.switched_off;
    add_verdict(json, severity(nic), nic_note(nic), nic.doubt, nic.failure);
    return json;
}

std::vector<NicReport> existing(const std::vector<NicReport> &nics) {
    std::vector<NicReport> there;
    std::copy_if(nics.begin(), nics.end(), std::back_inserter(there), [](const NicReport &nic) {
        return !nic.doubt.empty() || link_word(nic) != "not existing";
    });
    return there;
}

Section nic_list_section(const std::vector<NicReport> &nics) {
    Section section = common_section(nics);
    section.table = Table({"PORT", "LINK", "SPEED", "NOTE"}, 1);
    for (const NicReport &nic : nics)
        section.table.add(severity(nic),
                          {name_of(nic.id), shown_link(nic), speed_text(nic), nic_note(nic)});
    return section;
}

Section nic_show_section(const std::vector<NicReport> &nics) {
    Section section = common_section(nics);
    add_details(section, nics, nic_details);
    return section;
}

} // namespace zavctl
