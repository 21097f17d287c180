// LEDs of the front panel and of the disks: names, states, and what is said of them.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

constexpr int first_disk_led = 7;
constexpr int last_led = 10;

bool is_disk_led(int led);
std::string led_name(int led); // "panel 1", "disk 1"

// "1" to "10", "panel-1" to "panel-6", "disk-1" to "disk-4".
std::optional<int> led_number(std::string_view word);

// "off", "on", "first-2"; none for a number that is no state.
std::optional<std::string> led_state_word(int state);
std::optional<int> led_state(std::string_view word);

// The states that an LED can be set to, in words.
std::vector<std::string> states_of(int led);

struct LedReport {
    int led = 1;
    int state = 0; // ZAV_LED_*, ZAV_HDDLED_*
    std::optional<Failure> failure;
};

Severity severity(const LedReport &report);
Json led_json(const LedReport &report);
Section led_section(const std::vector<LedReport> &reports);

// What became of setting an LED, and what it shows then.
struct LedChange {
    int wanted = 0;
    std::optional<Failure> failure; // of setting
    LedReport after;
};
Section led_change_section(const LedChange &change);

// An alarm taken from the driver of LED alarms.
struct LedAlarm {
    bool pending = false;
    int priority = 0;
    int code = 0;
    int state = 0;
    std::optional<Failure> failure;
};
Section led_alarm_section(const LedAlarm &alarm);

} // namespace zavctl
