#include "ups_report.h"

#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr double nearly_empty = 20; // percent

bool is_low(const UpsReport &ups) {
    return ups.charge && *ups.charge <= nearly_empty;
}

std::string charge_text(const UpsReport &ups) {
    return ups.charge && !ups.failure ? fmt::format("{:.1f} %", *ups.charge) : "-";
}

std::string source_text(const UpsReport &ups) {
    return ups.from_hook ? "the appliance's hook" : "the UPS daemon";
}

std::string code_text(const UpsReport &ups) {
    return ups_state_word(ups) == "other" ? fmt::format("other (code {})", ups.state)
                                          : ups_state_word(ups);
}

std::string finding_text(const UpsReport &ups) {
    if (severity(ups) == Severity::unknown)
        return "the UPS gives no answer to trust: " + ups_note(ups);
    const std::string word = ups_state_word(ups);
    if (word == "other")
        return fmt::format("the UPS is neither on line nor on battery (code {})", ups.state);
    return fmt::format("the UPS is {}, charged {}", word == "online" ? "on line" : word,
                       charge_text(ups));
}

Section common_section(const UpsReport &ups) {
    Section section;
    section.key = "ups";
    section.records = ups_json(ups);
    if (severity(ups) != Severity::ok)
        section.findings = {{severity(ups), finding_text(ups)}};
    section.well = ups.present ? "UPS on line" : "no UPS";
    return section;
}

} // namespace

void doubt_charge(UpsReport &ups) {
    if (ups.failure)
        return;
    if (!ups.charge)
        ups.doubt = "the charge is no number";
    else if (*ups.charge < 0 || *ups.charge > 100)
        ups.doubt = fmt::format("no battery is charged {} %", *ups.charge);
}

std::string ups_state_word(const UpsReport &ups) {
    if (!ups.present)
        return "none";
    if (ups.failure)
        return "unknown";
    switch (ups.state) {
    case ZAV_UPS_ONLINE:
        return "online";
    case ZAV_UPS_ONBATT:
        return "on battery";
    default:
        return "other";
    }
}

Severity severity(const UpsReport &ups) {
    const std::string word = ups_state_word(ups);
    if (word == "none")
        return Severity::ok;
    if (word == "unknown" || !ups.doubt.empty())
        return Severity::unknown;
    if (word == "on battery")
        return is_low(ups) ? Severity::critical : Severity::warning;
    return word == "online" && !is_low(ups) ? Severity::ok : Severity::warning;
}

std::string ups_note(const UpsReport &ups) {
    if (!ups.present)
        return "neither a UPS daemon nor the appliance's hook has left word of one";
    if (ups.failure)
        return in_words(*ups.failure);
    if (!ups.doubt.empty())
        return ups.doubt;
    if (!is_low(ups))
        return "";
    return ups_state_word(ups) == "on battery" ? "the battery is nearly empty"
                                               : "the battery would not last through a power cut";
}

Json ups_json(const UpsReport &ups) {
    const bool told = ups.present && !ups.failure;
    Json json;
    json["kind"] = "ups";
    json["state"] = ups_state_word(ups);
    json["code"] = told ? Json(ups.state) : Json(nullptr);
    json["charge_percent"] = told && ups.charge ? Json(*ups.charge) : Json(nullptr);
    json["source"] = told ? Json(ups.from_hook ? "hook" : "daemon") : Json(nullptr);
    add_verdict(json, severity(ups), ups_note(ups), ups.doubt, ups.failure);
    return json;
}

Section ups_section(const UpsReport &ups) {
    Section section = common_section(ups);
    Details details;
    details.add("UPS", code_text(ups), severity(ups));
    if (ups.present && !ups.failure) {
        details.add("Charge", charge_text(ups));
        details.add("Told by", source_text(ups));
    }
    add_verdict(details, ups_note(ups), "");
    section.details = {details};
    return section;
}

Section ups_overview_section(const UpsReport &ups) {
    Section section = common_section(ups);
    section.table = Table({"STATE", "CHARGE", "NOTE"}, 0);
    section.table.add(severity(ups), {code_text(ups), charge_text(ups), ups_note(ups)});
    if (!ups.present)
        section.table = Table();
    return section;
}

} // namespace zavctl
