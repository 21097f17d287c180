#include "led_report.h"

#include "verdict.h"

#include "zav_led.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr int three_state_led = 5;

struct LedState {
    const char *word;
    int state;
    bool of_panel;
    bool of_disk;
};

constexpr LedState led_states[] = {
    {"off", ZAV_LED_OFF, true, true},
    {"on", ZAV_LED_ON, true, false},
    {"value2", ZAV_LED_VALUE2, true, false},
    {"second-on", ZAV_HDDLED_SECOND_ON, false, true},
    {"first-on", ZAV_HDDLED_FIRST_ON, false, true},
    {"first-2", ZAV_HDDLED_FIRST_2, false, true},
    {"first-2-second-on", ZAV_HDDLED_FIRST_2_SECOND_ON, false, true},
};

bool can_be(int led, const LedState &state) {
    if (is_disk_led(led))
        return state.of_disk;
    return state.of_panel && (state.state != ZAV_LED_VALUE2 || led == three_state_led);
}

std::string state_text(const LedReport &report) {
    return report.failure ? "unknown" : led_state_word(report.state).value_or("unknown");
}

std::string note_of(const LedReport &report) {
    return report.failure ? in_words(*report.failure) : "";
}

Finding finding(const LedReport &report) {
    return finding_about(severity(report), "LED", led_name(report.led), "cannot be read",
                         "cannot be read");
}

void add_table(Section &section, const std::vector<LedReport> &reports) {
    section.table = Table({"LED", "NAME", "STATE", "NOTE"}, 2);
    for (const LedReport &report : reports)
        section.table.add(severity(report), {fmt::format("{}", report.led), led_name(report.led),
                                             state_text(report), note_of(report)});
}

std::string change_trouble(const LedChange &change) {
    const std::string name = led_name(change.after.led);
    if (change.failure)
        return fmt::format("LED {} was not set: {}", name, in_words(*change.failure));
    if (change.after.failure)
        return fmt::format("LED {} was set, but cannot be read back", name);
    if (change.after.state != change.wanted)
        return fmt::format("LED {} was set, but reads {}", name, state_text(change.after));
    return "";
}

} // namespace

bool is_disk_led(int led) {
    return led >= first_disk_led;
}

std::string led_name(int led) {
    return is_disk_led(led) ? fmt::format("disk {}", led - first_disk_led + 1)
                            : fmt::format("panel {}", led);
}

std::optional<int> led_number(std::string_view word) {
    for (int led = 1; led <= last_led; ++led) {
        std::string name = led_name(led);
        std::replace(name.begin(), name.end(), ' ', '-');
        if (name == word || fmt::format("{}", led) == word)
            return led;
    }
    return std::nullopt;
}

std::optional<std::string> led_state_word(int state) {
    for (const LedState &known : led_states)
        if (known.state == state)
            return known.word;
    return std::nullopt;
}

std::optional<int> led_state(std::string_view word) {
    for (const LedState &known : led_states)
        if (known.word == word)
            return known.state;
    return std::nullopt;
}

std::vector<std::string> states_of(int led) {
    std::vector<std::string> words;
    for (const LedState &state : led_states)
        if (can_be(led, state))
            words.emplace_back(state.word);
    return words;
}

Severity severity(const LedReport &report) {
    return report.failure || !led_state_word(report.state) ? Severity::unknown : Severity::ok;
}

Json led_json(const LedReport &report) {
    Json json;
    json["kind"] = "led";
    json["led"] = report.led;
    json["name"] = led_name(report.led);
    json["state"] = state_text(report);
    add_verdict(json, severity(report), note_of(report), "", report.failure);
    return json;
}

Section led_section(const std::vector<LedReport> &reports) {
    Section section = section_of("leds", reports, led_json, finding);
    add_table(section, reports);
    section.well = counted(count_well(reports), "LED", "read");
    return section;
}

Section led_change_section(const LedChange &change) {
    Section section = led_section({change.after});
    section.records[0]["wanted"] = *led_state_word(change.wanted);
    section.records[0]["set_error"] = to_json(change.failure);
    section.well =
        fmt::format("LED {} is {}", led_name(change.after.led), state_text(change.after));
    const std::string trouble = change_trouble(change);
    section.findings.clear();
    if (!trouble.empty())
        section.findings = {
            {change.after.failure && !change.failure ? Severity::unknown : Severity::critical,
             trouble}};
    return section;
}

Section led_alarm_section(const LedAlarm &alarm) {
    Section section;
    section.key = "alarm";
    section.records = nullptr;
    section.well = "no LED alarm is pending";
    if (alarm.failure)
        section.findings = {{Severity::unknown, "whether an LED alarm is pending cannot be told: " +
                                                    in_words(*alarm.failure)}};
    if (!alarm.pending)
        return section;
    section.records = {{"kind", "led_alarm"},
                       {"priority", alarm.priority},
                       {"code", alarm.code},
                       {"state", alarm.state}};
    Details details;
    details.add("Priority", fmt::format("{}", alarm.priority));
    details.add("Code", fmt::format("{}", alarm.code));
    details.add("State", fmt::format("{}", alarm.state));
    section.details = {details};
    section.well = "one LED alarm taken";
    return section;
}

} // namespace zavctl
