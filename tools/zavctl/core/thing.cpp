#include "thing.h"

#include "event.h"
#include "record.h"
#include "text.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *not_trusted = ", not to be trusted";

// How the records of one key name a thing, and where its state stands.
struct Listing {
    const char *key;
    std::string (*subject)(const Json &record);
    const char *state;
};

std::string load_subject(const Json &record) {
    const std::string path = text_in(record, "path");
    return path.empty() ? text_in(record, "probe") : "file system " + path;
}

const Listing listings[] = {
    {"units", [](const Json &record) { return "unit " + number_in(record, "unit"); }, "state"},
    {"disks", [](const Json &record) { return "disk " + text_in(record, "id"); }, "state"},
    {"arrays", [](const Json &record) { return "array " + text_in(record, "id"); }, "state"},
    {"volume_groups",
     [](const Json &record) { return "volume group " + number_in(record, "group"); }, "state"},
    {"physical_volumes",
     [](const Json &record) { return "physical volume " + text_in(record, "volume"); }, "state"},
    {"logical_volumes", [](const Json &record) { return "volume " + text_in(record, "volume"); },
     "state"},
    {"sensors", [](const Json &record) { return text_in(record, "sensor"); }, "state"},
    {"nics", [](const Json &record) { return text_in(record, "nic"); }, "link"},
    {"ups", [](const Json &) { return std::string("UPS"); }, "state"},
    {"load", load_subject, "state"},
};

const Listing *listing_of(const std::string &key) {
    const auto *found = std::find_if(std::begin(listings), std::end(listings),
                                     [&key](const Listing &one) { return key == one.key; });
    return found == std::end(listings) ? nullptr : found;
}

std::string state_in(const Json &record, const char *field, Severity severity) {
    const std::string state = text_in(record, field);
    if (severity == Severity::unknown && state.empty())
        return "unknown";
    return severity == Severity::unknown && state != "unknown" ? state + not_trusted : state;
}

// A unit's sensors are things of their own, whose states do not count for the unit.
void add_unit_sensors(const Json &unit, const std::string &subject, std::vector<Thing> &things) {
    for (const char *sensor : {"temperature", "voltage"}) {
        const auto found = unit.find(sensor);
        if (found == unit.end() || !found->is_object())
            continue;
        const Severity severity = severity_in(*found);
        things.push_back({"units", fmt::format("{} {}", subject, sensor),
                          state_in(*found, "state", severity), severity});
    }
}

Severity severity_of_unit(const Json &record) {
    const std::string state = text_in(record, "state");
    if (state == "present")
        return Severity::ok;
    return state == "missing" ? Severity::critical : Severity::unknown;
}

void add_thing(const Listing &listing, const Json &record, std::vector<Thing> &things) {
    const bool unit = std::string_view(listing.key) == "units";
    const Severity severity = unit ? severity_of_unit(record) : severity_in(record);
    const std::string subject = listing.subject(record);
    things.push_back({listing.key, subject, state_in(record, listing.state, severity), severity});
    if (unit)
        add_unit_sensors(record, subject, things);
}

const Thing *find(const std::vector<Thing> &things, const std::string &subject) {
    const auto found = std::find_if(things.begin(), things.end(), [&subject](const Thing &thing) {
        return thing.subject == subject;
    });
    return found == things.end() ? nullptr : &*found;
}

// ---- Events. ----

std::optional<float> float_in(const Json &record, const char *field) {
    const std::optional<double> value = real_in(record, field);
    return value ? std::optional(static_cast<float>(*value)) : std::nullopt;
}

int integer_in(const Json &record, const char *field) {
    const auto found = record.find(field);
    return found != record.end() && found->is_number_integer() ? found->get<int>() : 0;
}

std::optional<zavSystemEvent> sensor_event(const Json &record) {
    const std::optional<int> type = code_of(event_types(), text_in(record, "kind"));
    const std::optional<float> value = float_in(record, "value");
    const std::optional<int> state = code_of(sensor_states(), text_in(record, "state"));
    if (!type || !value || !state)
        return std::nullopt;
    return event_of(zavFanState{*type, integer_in(record, "number"), *value, *state});
}

std::optional<zavSystemEvent> network_event(const Json &record) {
    std::string link = text_in(record, "link");
    if (link == "not existing")
        link = "not_exist";
    const std::optional<int> state = code_of(network_states(), link);
    if (!state)
        return std::nullopt;
    const bool bond = text_in(record, "kind") == "bond";
    return event_of(zavNetState{ZAV_EVENT_NET,
                                {ZAV_DEV_NIC, bond ? ZAV_MINDEV_NIC_BOND : ZAV_MINDEV_NIC_ETH,
                                 integer_in(record, "number"), 0},
                                integer_in(record, "speed_mbit"),
                                *state});
}

std::optional<zavSystemEvent> ups_event(const Json &record) {
    const std::optional<float> charge = float_in(record, "charge_percent");
    if (!charge || integer_in(record, "code") == 0)
        return std::nullopt;
    return event_of(zavUpsState{ZAV_EVENT_UPS, *charge, integer_in(record, "code")});
}

std::optional<zavSystemEvent> load_event(const Json &record) {
    const std::string path = text_in(record, "path");
    const std::optional<int> probe =
        code_of(load_probes(), path.empty() ? text_in(record, "probe") : path);
    const std::optional<float> used = float_in(record, "used_percent");
    const std::optional<int> state = code_of(load_states(), text_in(record, "state"));
    if (!probe || !used || !state)
        return std::nullopt;
    return event_of(zavSysinfoState{ZAV_EVENT_SYSINFO, *probe, *used, *state});
}

using MakeEvent = std::optional<zavSystemEvent> (*)(const Json &record);

MakeEvent event_maker(const std::string &key) {
    if (key == "sensors")
        return sensor_event;
    if (key == "nics")
        return network_event;
    if (key == "ups")
        return ups_event;
    return key == "load" ? load_event : nullptr;
}

} // namespace

std::vector<Thing> things_of(const Answer &answer) {
    std::vector<Thing> things;
    for (const Section &section : answer.sections)
        if (const Listing *listing = listing_of(section.key); listing != nullptr)
            for_each_record(section, [listing, &things](const Json &record) {
                add_thing(*listing, record, things);
            });
    return things;
}

std::vector<zavSystemEvent> events_of(const Answer &answer) {
    std::vector<zavSystemEvent> events;
    for (const Section &section : answer.sections) {
        events.insert(events.end(), section.events.begin(), section.events.end());
        const MakeEvent make = section.events.empty() ? event_maker(section.key) : nullptr;
        if (make != nullptr)
            for_each_record(section, [make, &events](const Json &record) {
                if (const std::optional<zavSystemEvent> event = make(record))
                    events.push_back(*event);
            });
    }
    return events;
}

std::vector<Change> changes(const std::vector<Thing> &before, const std::vector<Thing> &after) {
    std::vector<Change> all;
    for (const Thing &thing : before)
        if (find(after, thing.subject) == nullptr)
            all.push_back({thing.key, thing.subject, thing.state, std::nullopt, Severity::warning});
    for (const Thing &thing : after) {
        const Thing *old = find(before, thing.subject);
        if (old == nullptr)
            all.push_back({thing.key, thing.subject, std::nullopt, thing.state, thing.severity});
        else if (old->state != thing.state || old->severity != thing.severity)
            all.push_back({thing.key, thing.subject, old->state, thing.state, thing.severity});
    }
    return all;
}

std::string change_text(const Change &change) {
    const auto told = [](const std::optional<std::string> &state, const char *none) {
        std::string words = state.value_or(none);
        std::replace(words.begin(), words.end(), '_', ' ');
        return words.empty() ? "told" : words;
    };
    return printable(fmt::format("{}: {} -> {}", change.subject, told(change.before, "not listed"),
                                 told(change.after, "not listed any more")));
}

Json change_json(const Change &change, const std::string &time) {
    Json json;
    json["kind"] = "change";
    json["time"] = time;
    json["key"] = change.key;
    json["subject"] = change.subject;
    json["before"] = change.before ? Json(*change.before) : Json(nullptr);
    json["after"] = change.after ? Json(*change.after) : Json(nullptr);
    json["severity"] = word(change.severity);
    json["text"] = change_text(change);
    return json;
}

} // namespace zavctl
