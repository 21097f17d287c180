#include "action_report.h"

#include "verdict.h"

#include <fmt/format.h>

#include <array>
#include <charconv>

namespace zavctl {

namespace {

constexpr int bits_of_byte = 8;

std::vector<int> set_bits(int value) {
    std::vector<int> bits;
    for (int bit = 0; bit < bits_of_byte; ++bit)
        if ((value >> bit & 1) != 0)
            bits.push_back(bit);
    return bits;
}

std::string bits_text(int value) {
    std::vector<std::string> words;
    for (const int bit : set_bits(value))
        words.push_back(fmt::format("{}", bit));
    return words.empty() ? "none" : listed(words);
}

Details bits_details(int value) {
    std::vector<int> places;
    std::vector<int> digits;
    for (int bit = bits_of_byte - 1; bit >= 0; --bit) {
        places.push_back(bit);
        digits.push_back(value >> bit & 1);
    }
    Details details;
    details.add("Byte", fmt::format("{} ({})", hex_byte(value), value));
    details.add("Bit", fmt::format("{}", fmt::join(places, " ")));
    details.add("", fmt::format("{}", fmt::join(digits, " ")));
    details.add("Set", bits_text(value));
    return details;
}

} // namespace

Section action_section(const ActionReport &report) {
    const Severity severity = report.failure ? Severity::critical : Severity::ok;
    const std::string text = report.failure
                                 ? fmt::format("{}: {}", report.what, in_words(*report.failure))
                                 : report.done;
    Section section;
    section.key = report.key;
    section.records = report.facts;
    section.records["kind"] = report.kind;
    section.records["outcome"] = report.failure ? "failed" : "done";
    add_verdict(section.records, severity, text, "", report.failure);
    if (report.failure)
        section.findings = {{severity, text}};
    section.well = report.done;
    return section;
}

std::vector<GpioLine> uart_lines(int mode) {
    constexpr std::array<int, 3> lines = {34, 35, 49};
    constexpr std::array<std::array<int, 3>, 4> values = {
        {{1, 1, 0}, {0, 0, 1}, {0, 0, 0}, {0, 1, 0}}};
    std::vector<GpioLine> set;
    for (std::size_t i = 0; i < lines.size(); ++i)
        set.push_back({lines.at(i), values.at(static_cast<std::size_t>(mode - 1)).at(i)});
    return set;
}

ActionReport uart_report(int mode, const std::optional<Failure> &failure) {
    ActionReport report;
    std::vector<std::string> texts;
    report.key = report.kind = "uart";
    report.facts["mode"] = mode;
    report.facts["lines"] = Json::array();
    for (const GpioLine &set : uart_lines(mode)) {
        report.facts["lines"].push_back({{"line", set.line}, {"value", set.value}});
        texts.push_back(fmt::format("line {} to {}", set.line, set.value));
    }
    report.done = fmt::format("serial port in mode {}: GPIO {}", mode, listed(texts));
    report.what = fmt::format("the serial port was not brought into mode {}", mode);
    report.failure = failure;
    return report;
}

ActionReport sync_report(const std::optional<Failure> &failure) {
    ActionReport report;
    report.key = report.kind = "sync";
    report.done = "/usr/bin/syncConf.sh has synchronised the configuration";
    report.what = "the configuration was not synchronised";
    report.failure = failure;
    return report;
}

ActionReport led_alarm_report(int priority, int code, int state,
                              const std::optional<Failure> &failure) {
    ActionReport report;
    report.key = "alarm";
    report.kind = "led_alarm";
    report.facts = {{"priority", priority}, {"code", code}, {"state", state}};
    report.done = fmt::format("LED alarm handed to the driver: priority {}, code {}, state {}",
                              priority, code, state);
    report.what = "the LED alarm was not handed to the driver";
    report.failure = failure;
    return report;
}

std::string hex_byte(int value) {
    return fmt::format("0x{:02X}", value);
}

Section port_section(const PortReport &report, bool hex_alone) {
    Section section;
    section.key = "port";
    const Severity severity = report.failure ? Severity::unknown : Severity::ok;
    const std::string note = report.failure ? in_words(*report.failure) : "";
    Json json;
    json["kind"] = "sensor_port";
    json["value"] = report.failure ? Json(nullptr) : Json(report.value);
    json["hex"] = report.failure ? Json(nullptr) : Json(hex_byte(report.value));
    json["set_bits"] = report.failure ? Json(nullptr) : Json(set_bits(report.value));
    add_verdict(json, severity, note, "", report.failure);
    section.records = json;
    section.well = fmt::format("the sensor ports read {}", hex_byte(report.value));
    if (report.failure)
        section.findings = {{severity, "the sensor ports cannot be read: " + note}};
    else if (!hex_alone)
        section.details = {bits_details(report.value)};
    return section;
}

ActionReport port_set_report(int value, const std::optional<Failure> &failure) {
    ActionReport report;
    report.key = "port";
    report.kind = "sensor_port";
    report.facts["value"] = value;
    report.facts["hex"] = hex_byte(value);
    report.facts["set_bits"] = set_bits(value);
    report.done = fmt::format("{} was written to the sensor ports, bits set: {}; nothing can be "
                              "read back",
                              hex_byte(value), bits_text(value));
    report.what = fmt::format("{} was not written to the sensor ports", hex_byte(value));
    report.failure = failure;
    return report;
}

std::optional<int> byte_of(const std::string &word) {
    const bool hex = word.starts_with("0x") || word.starts_with("0X");
    const std::string digits = hex ? word.substr(2) : word;
    int value = 0;
    const char *end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, value, hex ? 16 : 10);
    if (digits.empty() || error != std::errc() || stop != end || value < 0 || value > 255)
        return std::nullopt;
    return value;
}

} // namespace zavctl
