// What came of an action that leaves nothing to look at afterwards: the library's code alone tells.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// NOLINTNEXTLINE(bugprone-exception-escape): no exception leaves the move of a Json
struct ActionReport {
    std::string key;  // member of the JSON object: "uart"
    std::string kind; // of the record
    std::string done; // in words, when it is done
    std::string what; // "the serial port was not routed", when it is not
    Json facts;       // fields of the record besides
    std::optional<Failure> failure;
};

// A failure is critical.
Section action_section(const ActionReport &report);

// The GPIO lines that route the serial port, in the order of their numbers, by mode 1 to 4.
struct GpioLine {
    int line;
    int value;
};
std::vector<GpioLine> uart_lines(int mode);
ActionReport uart_report(int mode, const std::optional<Failure> &failure);

// The byte of the digital sensor ports.
struct PortReport {
    int value = 0;
    std::optional<Failure> failure;
};
std::string hex_byte(int value); // "0x3F"
Section port_section(const PortReport &report, bool hex_alone);
ActionReport sync_report(const std::optional<Failure> &failure);
ActionReport led_alarm_report(int priority, int code, int state,
                              const std::optional<Failure> &failure);
ActionReport port_set_report(int value, const std::optional<Failure> &failure);

// "63", "0x3f": 0 to 255; none for anything else.
std::optional<int> byte_of(const std::string &word);

} // namespace zavctl
