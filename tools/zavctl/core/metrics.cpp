#include "metrics.h"

#include "metrics_tables.h"
#include "record.h"
#include "thing.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <utility>
#include <vector>

namespace zavctl {

namespace {

using Labels = std::vector<std::pair<std::string, std::string>>;

// Backslash, quote and line feed are the format's own.
std::string escaped(const std::string &text) {
    std::string result;
    for (const char c : text) {
        if (c == '\n') {
            result += "\\n";
            continue;
        }
        if (c == '\\' || c == '"')
            result += '\\';
        result += c;
    }
    return result;
}

// Label values are UTF-8: other bytes become U+FFFD, as in JSON.
std::string utf8(const std::string &text) {
    const Json json(text);
    return Json::parse(json.dump(-1, ' ', false, Json::error_handler_t::replace))
        .get<std::string>();
}

// A family: what it is, and its samples.
class Family {
  public:
    Family(std::string name, std::string help) : name_(std::move(name)), help_(std::move(help)) {}

    void add(const Labels &labels, double value) {
        std::vector<std::string> words;
        for (const auto &[label, text] : labels)
            words.push_back(fmt::format("{}=\"{}\"", label, escaped(utf8(text))));
        const std::string braces =
            words.empty() ? "" : fmt::format("{{{}}}", fmt::join(words, ","));
        samples_ += fmt::format("{}{} {}\n", name_, braces, value);
    }

    // Nothing for a family without samples.
    std::string text() const {
        if (samples_.empty())
            return "";
        return fmt::format("# HELP {0} {1}\n# TYPE {0} gauge\n{2}", name_, help_, samples_);
    }

  private:
    std::string name_;
    std::string help_;
    std::string samples_;
};

std::string label_value(const Json &record, const char *field) {
    const std::string text = text_in(record, field);
    return text.empty() ? number_in(record, field) : text;
}

void add_labels(Labels &labels, std::span<const LabelField> fields, const Json &record) {
    for (const LabelField &field : fields)
        if (field.label != nullptr)
            labels.emplace_back(field.label, label_value(record, field.field));
}

void add_measure(const Measure &measure, const Json &record, Family &family) {
    if (*measure.filter != '\0' && text_in(record, measure.filter) != measure.word)
        return;
    const Json holder = *measure.object == '\0' ? record : record.value(measure.object, Json());
    const std::optional<double> value =
        holder.is_object() ? real_in(holder, measure.field) : std::nullopt;
    if (!value || !std::isfinite(*value))
        return;
    Labels labels;
    add_labels(labels, measure.labels, record);
    family.add(labels, *value / measure.divisor);
}

std::string measured(const Measure &measure, const Answer &answer) {
    Family family(measure.family, measure.help);
    if (const Section *section = section_named(answer, measure.key); section != nullptr)
        for_each_record(*section, [&measure, &family](const Json &record) {
            add_measure(measure, record, family);
        });
    return family.text();
}

void add_states(const StateSet &set, const Json &record, Family &family) {
    std::string has = text_in(record, set.field);
    std::vector<std::string> states;
    for (const char *state : set.states)
        if (state != nullptr)
            states.emplace_back(state);
    if (std::find(states.begin(), states.end(), has) == states.end() ||
        severity_in(record) == Severity::unknown)
        has = "unknown";
    states.emplace_back("unknown");
    for (const std::string &state : states) {
        Labels labels;
        add_labels(labels, set.labels, record);
        labels.emplace_back("state", state);
        family.add(labels, state == has ? 1 : 0);
    }
}

// A unit's own state is told by itself: its severity is that of its sensors, too.
Json by_itself(const StateSet &set, Json record) {
    if (std::string_view(set.key) == "units")
        record["severity"] = text_in(record, "state") == "unknown" ? "unknown" : "ok";
    return record;
}

std::string stated(const StateSet &set, const Answer &answer) {
    Family family(set.family, set.help);
    if (const Section *section = section_named(answer, set.key); section != nullptr)
        for_each_record(*section, [&set, &family](const Json &record) {
            add_states(set, by_itself(set, record), family);
        });
    return family.text();
}

std::string network_up(const Answer &answer) {
    Family family("zav_network_up", "1 if the port or bond has a link.");
    if (const Section *section = section_named(answer, "nics"); section != nullptr)
        for_each_record(*section, [&family](const Json &record) {
            family.add({{"device", text_in(record, "nic")}},
                       text_in(record, "link") == "up" ? 1 : 0);
        });
    return family.text();
}

std::string latched(const Answer &answer) {
    Family family("zav_sensor_alarm_latched", "1 if the sensor's alarm is latched.");
    if (const Section *section = section_named(answer, "sensors"); section != nullptr)
        for_each_record(*section, [&family](const Json &record) {
            if (const Json alarm = record.value("latched", Json()); alarm.is_boolean())
                family.add({{"sensor", text_in(record, "sensor")}}, alarm.get<bool>() ? 1 : 0);
        });
    return family.text();
}

std::string answered(const Answer &answer) {
    Family family("zav_answered", "1 if the thing gave an answer to trust.");
    for (const Thing &thing : things_of(answer))
        family.add({{"object", thing.subject}}, thing.severity == Severity::unknown ? 0 : 1);
    return family.text();
}

std::string general(const Answer &answer, double seconds) {
    const Section *section = section_named(answer, "model");
    const Json model = section == nullptr ? Json::object() : section->records;
    const bool known = model.is_object() && model.value("error", Json()).is_null();
    Family up("zav_up", "1 if the model is known and its objects were asked.");
    up.add({}, known ? 1 : 0);
    Family info("zav_info", "What the appliance is.");
    info.add({{"model", text_in(model, "model")},
              {"product", text_in(model, "product_name")},
              {"serial", text_in(model, "serial")}},
             1);
    Family state("zav_state", "State of the whole appliance, the worst of its things.");
    for (const Severity one :
         {Severity::ok, Severity::warning, Severity::unknown, Severity::critical})
        state.add({{"state", word(one)}}, severity(answer) == one ? 1 : 0);
    Family duration("zav_scrape_duration_seconds", "How long it took to ask.");
    duration.add({}, seconds);
    return up.text() + info.text() + state.text() + duration.text();
}

} // namespace

std::string metrics_text(const Answer &answer, double seconds) {
    std::string text = general(answer, seconds) + answered(answer);
    for (const StateSet &set : state_sets())
        text += stated(set, answer);
    for (const Measure &measure : measures())
        text += measured(measure, answer);
    return text + network_up(answer) + latched(answer);
}

} // namespace zavctl
