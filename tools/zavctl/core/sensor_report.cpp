#include "sensor_report.h"

#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *latched_note = "latched alarm: the reading is {}, 'zavctl sensor reset "
                                     "{}' clears it";

std::string number_text(const Sensor &sensor, double value) {
    switch (sensor.kind) {
    case SensorKind::thermal:
        return fmt::format("{:.1f} C", value);
    case SensorKind::volt:
        return fmt::format("{:.2f} V", value);
    case SensorKind::fan:
        break;
    }
    return fmt::format("{:.0f} rpm", value);
}

bool reaches(double value, double low, double high) {
    return value <= low || value >= high;
}

Severity by_limits(const Limits &limits, double value) {
    if (reaches(value, limits.critical_low, limits.critical_high))
        return Severity::critical;
    return reaches(value, limits.warning_low, limits.warning_high) ? Severity::warning
                                                                   : Severity::ok;
}

// "<= 1.08, >= 1.32", ">= 65", "-".
std::string limits_text(const Sensor &sensor, double low, double high) {
    const char *format = sensor.kind == SensorKind::volt ? "{} {:.2f}" : "{} {:g}";
    std::vector<std::string> texts;
    if (low != no_lower_limit)
        texts.push_back(fmt::format(fmt::runtime(format), "<=", low));
    if (high != no_upper_limit)
        texts.push_back(fmt::format(fmt::runtime(format), ">=", high));
    return fmt::format("{}", fmt::join(texts, ", "));
}

std::string warning_text(const Sensor &sensor) {
    if (tells_only_turning(sensor))
        return "-";
    return limits_text(sensor, sensor.limits.warning_low, sensor.limits.warning_high);
}

std::string critical_text(const Sensor &sensor) {
    if (sensor.kind == SensorKind::fan)
        return "still";
    return limits_text(sensor, sensor.limits.critical_low, sensor.limits.critical_high);
}

std::string latch_text(const SensorReport &report) {
    const Severity now = by_limits(report.sensor->limits, *report.value);
    return fmt::format(latched_note, now == Severity::ok ? "normal again" : "no longer critical",
                       word_of(*report.sensor));
}

Finding finding(const SensorReport &report) {
    const Severity bad = severity(report);
    const std::string name = word_of(*report.sensor);
    if (bad == Severity::unknown)
        return finding_about(bad, "sensor", name, "gives no answer to trust",
                             "give no answer to trust");
    const std::string place =
        *report.sensor->place == '\0' ? "" : fmt::format(" ({})", report.sensor->place);
    if (is_latched(report))
        return {bad, fmt::format("sensor {}{} has a latched alarm", name, place)};
    return {bad, fmt::format("sensor {}{} reads {} ({})", name, place, value_text(report),
                             sensor_state_word(report))};
}

// An answer that is not believed is not shown as if it were.
std::string shown_state(const SensorReport &report) {
    return severity(report) == Severity::unknown ? "unknown" : sensor_state_word(report);
}

bool has_driver_file(const SensorReport &report) {
    return std::string_view(report.sensor->file).starts_with("sensor/");
}

bool is_readable(const SensorReport &report) {
    return !report.failure || report.failure->code != ZAV_RC_ERR_EACCES;
}

// Without the driver no sensor has a file: that is one thing, not a dozen.
bool driver_is_missing(const std::vector<SensorReport> &reports) {
    const auto have = std::count_if(reports.begin(), reports.end(), has_driver_file);
    return have > 1 && std::none_of(reports.begin(), reports.end(), [](const SensorReport &report) {
               return has_driver_file(report) && is_readable(report);
           });
}

std::vector<Finding> findings_without_driver(const std::vector<SensorReport> &reports) {
    std::vector<Finding> findings = {{Severity::unknown, "no sensor can be read: the files of the "
                                                         "appliance's driver, in "
                                                         "/proc/zav/sys/sensor, are missing"}};
    for (const SensorReport &report : reports)
        if (!has_driver_file(report) && severity(report) != Severity::ok)
            findings.push_back(finding(report));
    return findings;
}

Section common_section(const std::vector<SensorReport> &reports) {
    Section section = section_of("sensors", reports, sensor_json, finding);
    if (driver_is_missing(reports))
        section.findings = findings_without_driver(reports);
    section.well = counted(count_well(reports), "sensor", "normal");
    return section;
}

Json sensor_base(const SensorReport &report) {
    const Sensor &sensor = *report.sensor;
    Json json;
    json["sensor"] = fmt::format("{} {}", kind_word(sensor.kind), sensor.number);
    json["kind"] = kind_word(sensor.kind);
    json["number"] = sensor.number;
    json["place"] = *sensor.place == '\0' ? Json(nullptr) : Json(sensor.place);
    return json;
}

Json limit_json(double limit) {
    return limit == no_lower_limit || limit == no_upper_limit ? Json(nullptr) : Json(limit);
}

Json limits_json(const Limits &limits) {
    return {{"critical_low", limit_json(limits.critical_low)},
            {"warning_low", limit_json(limits.warning_low)},
            {"warning_high", limit_json(limits.warning_high)},
            {"critical_high", limit_json(limits.critical_high)}};
}

Details sensor_details(const SensorReport &report) {
    const Sensor &sensor = *report.sensor;
    Details details;
    details.add("Sensor", word_of(sensor));
    if (*sensor.place != '\0')
        details.add("Place", sensor.place);
    details.add("State", shown_state(report), severity(report));
    details.add("Reading", value_text(report));
    details.add("Warning at", warning_text(sensor));
    details.add("Critical at", critical_text(sensor));
    add_verdict(details, sensor_note(report), report.doubt);
    return details;
}

// "LT 45.0 C", "2 still".
std::string short_text(const SensorReport &report) {
    const Sensor &sensor = *report.sensor;
    const std::string name =
        *sensor.place == '\0' ? fmt::format("{}", sensor.number) : std::string(sensor.place);
    const std::string text = fmt::format("{}: {}", name, value_text(report));
    return severity(report) == Severity::ok
               ? text
               : fmt::format("{} ({})", text,
                             is_latched(report) ? "latched alarm" : shown_state(report));
}

void add_kind(Table &table, SensorKind kind, const std::vector<SensorReport> &reports) {
    Severity worst = Severity::ok;
    std::vector<std::string> texts;
    for (const SensorReport &report : reports) {
        if (report.sensor->kind != kind)
            continue;
        worst = worse(worst, severity(report));
        texts.push_back(short_text(report));
    }
    if (!texts.empty())
        table.add(worst, {kind_word(kind), worst == Severity::ok ? "normal" : word(worst),
                          fmt::format("{}", fmt::join(texts, ", "))});
}

} // namespace

void doubt_reading(SensorReport &report) {
    if (report.failure)
        return;
    if (!report.value)
        report.doubt = "the reading is no number";
    else if (report.sensor->kind == SensorKind::thermal && *report.value == 0)
        report.doubt = "a temperature of 0 is what a sensor that gives no number reads as";
}

void doubt_status(SensorReport &report, const std::string &status) {
    const std::string word = trimmed(status);
    if (report.failure || !latches(*report.sensor) || word == "0" || word == "1")
        return;
    report.doubt = fmt::format("its status file holds '{}', neither 0 nor 1: the probe may be "
                               "faulty",
                               printable(word));
}

std::string sensor_state_word(const SensorReport &report) {
    if (report.failure)
        return "unknown";
    switch (report.state) {
    case ZAV_SENSOR_NORMAL:
        return "normal";
    case ZAV_SENSOR_WARNING:
        return "warning";
    case ZAV_SENSOR_CRITICAL:
        return "critical";
    default:
        return "unknown";
    }
}

Severity severity(const SensorReport &report) {
    const std::string word = sensor_state_word(report);
    if (word == "critical")
        return Severity::critical; // a latched alarm is certain whatever the reading is worth
    if (!report.doubt.empty() || word == "unknown")
        return Severity::unknown;
    return word == "normal" ? Severity::ok : Severity::warning;
}

bool is_latched(const SensorReport &report) {
    return latches(*report.sensor) && sensor_state_word(report) == "critical" && report.value &&
           by_limits(report.sensor->limits, *report.value) != Severity::critical;
}

std::string value_text(const SensorReport &report) {
    if (report.failure || !report.value)
        return "-";
    if (tells_only_turning(*report.sensor))
        return *report.value > 0 ? "turning" : "still";
    return number_text(*report.sensor, *report.value);
}

std::string sensor_note(const SensorReport &report) {
    if (report.failure)
        return in_words(*report.failure);
    if (is_latched(report))
        return latch_text(report);
    return report.doubt;
}

Json sensor_json(const SensorReport &report) {
    Json json = sensor_base(report);
    json["value"] = report.failure || !report.value ? Json(nullptr) : Json(*report.value);
    json["unit"] = unit_word(report.sensor->kind);
    json["state"] = sensor_state_word(report);
    json["latched"] = is_latched(report);
    json["limits"] = limits_json(report.sensor->limits);
    add_verdict(json, severity(report), sensor_note(report), report.doubt, report.failure);
    return json;
}

Section sensor_list_section(const std::vector<SensorReport> &reports) {
    Section section = common_section(reports);
    section.table = Table({"SENSOR", "VALUE", "WARNING AT", "CRITICAL AT", "STATE", "NOTE"}, 4);
    const bool silent = driver_is_missing(reports);
    for (const SensorReport &report : reports) {
        const Sensor &sensor = *report.sensor;
        const std::string note = silent && has_driver_file(report) ? "" : sensor_note(report);
        section.table.add(severity(report),
                          {word_of(sensor), value_text(report), warning_text(sensor),
                           critical_text(sensor), shown_state(report), sensor.place},
                          note);
    }
    return section;
}

Section sensor_show_section(const std::vector<SensorReport> &reports) {
    Section section = common_section(reports);
    add_details(section, reports, sensor_details);
    return section;
}

Section sensor_overview_section(const std::vector<SensorReport> &reports) {
    Section section = common_section(reports);
    section.table = Table({"KIND", "STATE", "READINGS"}, 1);
    for (const SensorKind kind : {SensorKind::thermal, SensorKind::volt, SensorKind::fan})
        add_kind(section.table, kind, reports);
    return section;
}

Section sensor_reset_section(const std::vector<SensorReset> &resets) {
    std::vector<SensorReport> after;
    after.reserve(resets.size());
    for (const SensorReset &reset : resets)
        after.push_back(reset.after);
    Section section = common_section(after);
    section.table = Table({"SENSOR", "ALARM", "VALUE", "STATE", "NOTE"}, 3);
    std::size_t index = 0;
    for (const SensorReset &reset : resets) {
        const std::string name = word_of(*reset.after.sensor);
        section.table.add(reset.failure ? Severity::critical : severity(reset.after),
                          {name, reset.failure ? "not cleared" : "cleared", value_text(reset.after),
                           shown_state(reset.after), reset.after.sensor->place},
                          reset.failure ? in_words(*reset.failure) : sensor_note(reset.after));
        Json &record = section.records[index++];
        record["reset"] = reset.failure ? "failed" : "cleared";
        record["reset_error"] = to_json(reset.failure);
        if (reset.failure)
            section.findings.push_back(finding_about(Severity::critical, "sensor", name,
                                                     "keeps an alarm that could not be cleared",
                                                     "keep alarms that could not be cleared"));
    }
    section.well = counted(resets.size(), "alarm", "cleared") + ", " + section.well;
    return section;
}

} // namespace zavctl
