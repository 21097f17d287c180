#include "monitoring.h"

#include "record.h"
#include "text.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

struct Object {
    const char *word;
    const char *key;  // of its section
    const char *what; // of which there may be none
};

constexpr Object objects_table[] = {
    {"disk", "disks", "disk"},
    {"array", "arrays", "array"},
    {"unit", "units", "expansion unit"},
    {"vg", "volume_groups", "volume group"},
    {"lv", "logical_volumes", "logical volume"},
    {"pv", "physical_volumes", "physical volume"},
    {"sensor", "sensors", "sensor"},
    {"nic", "nics", "network port"},
    {"ups", "ups", "UPS"},
    {"load", "load", "load"},
};

const Object *find(const std::string &word) {
    const auto *found = std::find_if(std::begin(objects_table), std::end(objects_table),
                                     [&word](const Object &one) { return word == one.word; });
    return found == std::end(objects_table) ? nullptr : found;
}

// A bar would begin the performance data, a line end the long output.
std::string plain(const std::string &text) {
    std::string result = printable(text);
    std::replace(result.begin(), result.end(), '|', '/');
    return result;
}

const char *status_word(int status) {
    constexpr const char *words[] = {"OK", "WARNING", "CRITICAL", "UNKNOWN"};
    return words[status];
}

// ---- Performance data. ----

std::string quoted(const std::string &label) {
    std::string result;
    for (const char c : label) {
        if (c == '=' || c == '|')
            continue;
        result += c == '\'' ? "''" : std::string(1, c);
    }
    return result.find(' ') == std::string::npos && result.find('\'') == std::string::npos
               ? result
               : "'" + result + "'";
}

struct Limits {
    std::string warning;
    std::string critical;
};

struct Datum {
    std::string label;
    std::optional<double> value;
    const char *unit; // "%", or "" for what the form has no unit for
    Limits limits;
};

void add(const Datum &datum, std::string &data) {
    if (!datum.value)
        return;
    const bool percent = std::string_view(datum.unit) == "%";
    data += fmt::format("{}{}={:g}{};{};{};{}", data.empty() ? "" : " ", quoted(datum.label),
                        *datum.value, datum.unit, datum.limits.warning, datum.limits.critical,
                        percent ? "0;100" : ";");
}

// Alert outside of a range, "low:high"; below 0 or above the end with "end" alone.
std::string range(const Json &limits, const char *low, const char *high) {
    const std::string from = number_in(limits, low);
    const std::string to = number_in(limits, high);
    return from.empty() ? to : from + ":" + to;
}

Limits sensor_limits(const Json &record) {
    const Json limits = record.value("limits", Json());
    if (!limits.is_object())
        return {};
    return {range(limits, "warning_low", "warning_high"),
            range(limits, "critical_low", "critical_high")};
}

void add_unit(const Json &record, std::string &data) {
    const std::string unit = "unit " + number_in(record, "unit");
    const Json temperature = record.value("temperature", Json());
    const Json voltage = record.value("voltage", Json());
    if (temperature.is_object())
        add({unit + " temperature", real_in(temperature, "value"), "", {"75", "85"}}, data);
    if (voltage.is_object())
        add({unit + " voltage", real_in(voltage, "value"), "", {"1.08:1.32", "0.96:1.44"}}, data);
}

void add_load(const Json &record, std::string &data) {
    const std::string path = text_in(record, "path");
    const std::string probe = text_in(record, "probe");
    Limits limits{"90", "95"};
    if (probe == "swap")
        limits = {"0", "10"};
    if (probe == "memory")
        limits = {};
    add({path.empty() ? probe : path, real_in(record, "used_percent"), "%", limits}, data);
}

void add_data(const std::string &key, const Json &record, std::string &data) {
    if (key == "sensors")
        add({text_in(record, "sensor"), real_in(record, "value"), "", sensor_limits(record)}, data);
    else if (key == "units")
        add_unit(record, data);
    else if (key == "load")
        add_load(record, data);
    else if (key == "ups")
        add({"UPS charge", real_in(record, "charge_percent"), "%", {}}, data);
    else if (key == "logical_volumes")
        add({"volume " + text_in(record, "volume"),
             real_in(record, "usage_percent"),
             "%",
             {"90", ""}},
            data);
    else if (key == "arrays")
        add({"rebuild of array " + text_in(record, "id"),
             real_in(record, "rebuild_percent"),
             "%",
             {}},
            data);
}

std::string performance_data(const Answer &answer) {
    std::string data;
    for (const Section &section : answer.sections)
        for_each_record(section, [&section, &data](const Json &record) {
            add_data(section.key, record, data);
        });
    return data;
}

// ---- What is judged. ----

// Whether there is anything to judge: records, or a reason why there are none.
bool tells(const Section *section) {
    if (section == nullptr)
        return false;
    const bool none = section->key == "ups" && section->records.is_object() &&
                      text_in(section->records, "state") == "none";
    return !section->findings.empty() || (!section->records.empty() && !none);
}

std::vector<std::string> sentences(const Answer &answer, Severity severity) {
    std::vector<Finding> findings;
    for (const Section &section : answer.sections)
        std::copy_if(section.findings.begin(), section.findings.end(), std::back_inserter(findings),
                     [severity](const Finding &one) { return one.severity == severity; });
    return told_together(findings);
}

// The worst first, each with its word once there are several.
PluginResult judged(const Answer &answer) {
    const int status = exit_status(severity(answer));
    std::vector<std::string> lines;
    for (const Severity one : {Severity::critical, Severity::unknown, Severity::warning})
        for (const std::string &sentence : sentences(answer, one))
            lines.push_back(fmt::format("{}: {}", status_word(exit_status(one)), plain(sentence)));
    if (lines.empty())
        lines.push_back(plain(summary(answer)));
    else if (lines.size() > 1)
        lines.front() += fmt::format(", and {} more", lines.size() - 1);
    if (const std::string data = performance_data(answer); !data.empty())
        lines.front() += " | " + data;
    return {fmt::format("{}\n", fmt::join(lines, "\n")), status};
}

// Why the objects cannot be judged, "" if they can.
std::string refusal(const Answer &answer, const std::vector<std::string> &objects) {
    const Section *model = section_named(answer, "model");
    for (const std::string &word : objects) {
        const Object *object = find(word);
        if (object == nullptr)
            return fmt::format("'{}' is no object to check: there are {}", word,
                               listed(checked_objects()));
        if ((model == nullptr || model->findings.empty()) && // else that is what is to be said
            !tells(section_named(answer, object->key)))
            return fmt::format("this appliance has no {}", object->what);
    }
    return "";
}

bool is_chosen(const std::string &key, const std::vector<std::string> &objects) {
    return objects.empty() || key == "model" ||
           std::any_of(objects.begin(), objects.end(),
                       [&key](const std::string &word) { return key == find(word)->key; });
}

} // namespace

std::vector<std::string> checked_objects() {
    std::vector<std::string> words;
    for (const Object &object : objects_table)
        words.emplace_back(object.word);
    return words;
}

PluginResult unknown_result(const std::string &why) {
    return {"UNKNOWN: " + plain(why) + "\n", exit_status(Severity::unknown)};
}

PluginResult checked(const Answer &answer, const std::vector<std::string> &objects) {
    if (const std::string why = refusal(answer, objects); !why.empty())
        return unknown_result(why);
    Answer chosen{answer.command, answer.heading, {}};
    std::copy_if(answer.sections.begin(), answer.sections.end(),
                 std::back_inserter(chosen.sections),
                 [&objects](const Section &section) { return is_chosen(section.key, objects); });
    return judged(chosen);
}

} // namespace zavctl
