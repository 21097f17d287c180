#include "unit_report.h"

#include "raid_set.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <cstring>

namespace zavctl {

namespace {

constexpr const char *no_reading = "the unit's monitor line in the RAID controller's report is "
                                   "missing or damaged";

template <std::size_t size>
std::string text_of(const char (&text)[size]) {
    return trimmed({text, strnlen(text, size)});
}

UnitReport present_unit(const sRBOD &record, int number) {
    UnitReport unit;
    unit.number = number;
    unit.present = true;
    unit.sas_address = text_of(record.sasaddr);
    unit.serial = text_of(record.sn);
    unit.model = text_of(record.model);
    unit.parent = record.parentid;
    unit.upper_child = record.upperchildid;
    unit.lower_child = record.lowerchildid;
    return unit;
}

UnitReport missing_unit(int number, int linked_from) {
    UnitReport unit;
    unit.number = number;
    unit.linked_from = unit.parent = linked_from;
    return unit;
}

bool is_there(const sRBODSet &set, int number) {
    return number >= 1 && number <= last_unit && set.RBOD[number - 1].iExist == 1;
}

// The cascade goes on where the library's numbers end.
bool is_beyond(const UnitReport &unit) {
    return !unit.present && unit.number > last_unit;
}

bool cannot_be_told(const UnitReport &unit) {
    return unit.failure || !unit.doubt.empty() || is_beyond(unit);
}

Finding sensor_finding(const UnitReport &unit, const UnitSensor &sensor, const std::string &name,
                       const std::string &reading) {
    const Severity bad = severity(sensor);
    const std::string number = fmt::format("{}", unit.number);
    if (bad == Severity::unknown)
        return finding_about(bad, "unit", number, "tells no " + name, "tell no " + name);
    const std::string what = fmt::format("{} {} ({})", name, reading, sensor_state_word(sensor));
    return finding_about(bad, "unit", number, "has " + what, "have " + what);
}

Json text_or_null(const std::string &text) {
    return text.empty() ? Json(nullptr) : Json(text);
}

Json sensor_json(const UnitSensor &sensor) {
    Json json;
    json["value"] = sensor.failure ? Json(nullptr) : number_or_null(sensor.value);
    json["state"] = sensor_state_word(sensor);
    json["state_code"] = sensor.state;
    json["severity"] = word(severity(sensor));
    json["doubt"] = text_or_null(sensor.doubt);
    json["error"] = to_json(sensor.failure);
    return json;
}

Json link_json(int number) {
    return number < 0 ? Json(nullptr) : Json(number);
}

} // namespace

const UnitReport *CascadeReport::find(int number) const {
    const auto found = std::find_if(units.begin(), units.end(), [number](const UnitReport &unit) {
        return unit.number == number;
    });
    return found == units.end() ? nullptr : &*found;
}

std::vector<UnitReport> units_of(const sRBODSet &set) {
    std::vector<UnitReport> units;
    for (int number = 1; number <= last_unit; ++number)
        if (is_there(set, number))
            units.push_back(present_unit(set.RBOD[number - 1], number));
    const std::vector<UnitReport> present = units;
    for (const UnitReport &unit : present)
        for (const int child : {unit.upper_child, unit.lower_child})
            if (child > 0 && !is_there(set, child))
                units.push_back(missing_unit(child, unit.number));
    std::stable_sort(units.begin(), units.end(),
                     [](const UnitReport &a, const UnitReport &b) { return a.number < b.number; });
    return units;
}

std::string sensor_state_word(const UnitSensor &sensor) {
    if (sensor.failure)
        return "unknown";
    switch (sensor.state) {
    case ZAV_RBOD_NORMAL:
        return "normal";
    case ZAV_RBOD_WARN:
        return "warning";
    case ZAV_RBOD_ALARM:
        return "alarm";
    case ZAV_RBOD_FAIL:
        return "failed";
    default:
        return "unknown";
    }
}

Severity severity(const UnitSensor &sensor) {
    const std::string word = sensor_state_word(sensor);
    if (!sensor.doubt.empty() || word == "unknown")
        return Severity::unknown;
    if (word == "warning")
        return Severity::warning;
    return word == "normal" ? Severity::ok : Severity::critical;
}

void doubt_reading(UnitSensor &sensor) {
    if (!sensor.failure && (sensor.value == 0 || !std::isfinite(sensor.value)))
        sensor.doubt = no_reading;
}

std::string sensor_text(const UnitSensor &sensor, const char *format) {
    if (severity(sensor) == Severity::unknown)
        return "unknown";
    return fmt::format("{} {}", fmt::format(fmt::runtime(format), sensor.value),
                       sensor_state_word(sensor));
}

std::string unit_state_word(const UnitReport &unit) {
    if (cannot_be_told(unit))
        return "unknown";
    return unit.present ? "present" : "missing";
}

Severity severity(const UnitReport &unit) {
    if (cannot_be_told(unit))
        return Severity::unknown;
    if (!unit.present)
        return Severity::critical;
    return worse(severity(unit.temperature), severity(unit.voltage));
}

std::string unit_note(const UnitReport &unit) {
    if (unit.failure)
        return in_words(*unit.failure);
    if (!unit.doubt.empty())
        return unit.doubt;
    if (is_beyond(unit))
        return fmt::format("a link of unit {} leads to it, but the library takes {} units at most",
                           unit.linked_from, last_unit);
    if (!unit.present && unit.linked_from > 0)
        return fmt::format("does not answer: a link of unit {} leads to it", unit.linked_from);
    if (!unit.present)
        return "no unit has this place in the cascade";
    for (const UnitSensor *sensor : {&unit.temperature, &unit.voltage})
        if (sensor->failure || !sensor->doubt.empty())
            return sensor->failure ? in_words(*sensor->failure) : sensor->doubt;
    return "";
}

std::vector<Finding> unit_findings(const UnitReport &unit) {
    const std::string number = fmt::format("{}", unit.number);
    if (cannot_be_told(unit))
        return {finding_about(Severity::unknown, "unit", number, "gives no answer to trust",
                              "give no answer to trust")};
    if (!unit.present && !unit.asked_for)
        return {
            finding_about(Severity::critical, "unit", number, "does not answer", "do not answer")};
    if (!unit.present)
        return {finding_about(Severity::critical, "unit", number, "is not there", "are not there")};
    std::vector<Finding> findings;
    if (severity(unit.temperature) != Severity::ok)
        findings.push_back(sensor_finding(unit, unit.temperature, "temperature",
                                          fmt::format("{:.1f} C", unit.temperature.value)));
    if (severity(unit.voltage) != Severity::ok)
        findings.push_back(sensor_finding(unit, unit.voltage, "voltage",
                                          fmt::format("{:.2f} V", unit.voltage.value)));
    return findings;
}

std::vector<Finding> cascade_findings(const CascadeReport &cascade) {
    const bool some = std::any_of(cascade.units.begin(), cascade.units.end(),
                                  [](const UnitReport &unit) { return unit.present; });
    const char *what =
        some ? "not all expansion units may be listed: " : "the expansion units cannot be told: ";
    if (cascade.failure)
        return {{Severity::unknown, what + in_words(*cascade.failure)}};
    if (!cascade.doubt.empty())
        return {{Severity::unknown, what + cascade.doubt}};
    return {};
}

Json unit_json(const UnitReport &unit) {
    Json json;
    json["kind"] = "unit";
    json["unit"] = unit.number;
    json["state"] = unit_state_word(unit);
    json["present"] = cannot_be_told(unit) ? Json(nullptr) : Json(unit.present);
    json["model"] = text_or_null(unit.model);
    json["serial"] = text_or_null(unit.serial);
    json["sas_address"] = text_or_null(unit.sas_address);
    json["parent"] = link_json(unit.parent);
    json["upper_child"] = link_json(unit.upper_child);
    json["lower_child"] = link_json(unit.lower_child);
    json["temperature"] = unit.present ? sensor_json(unit.temperature) : Json(nullptr);
    json["voltage"] = unit.present ? sensor_json(unit.voltage) : Json(nullptr);
    add_enclosure(json, unit.enclosure);
    json["severity"] = word(severity(unit));
    json["note"] = unit_note(unit);
    json["doubt"] = text_or_null(unit.doubt);
    json["error"] = to_json(unit.failure);
    return json;
}

Json controller_json(const CascadeReport &cascade) {
    Json json;
    json["kind"] = "controller";
    add_enclosure(json, cascade.controller);
    json["error"] = to_json(cascade.failure);
    json["doubt"] = text_or_null(cascade.doubt);
    return json;
}

} // namespace zavctl
