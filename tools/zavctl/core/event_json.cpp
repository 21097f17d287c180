#include "event_json.h"

#include "event_fields.h"
#include "event_record_json.h"
#include "text.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstring>

namespace zavctl {

namespace {

// What has no fields of its own to show: the record's words, up to the last that is not zero.
constexpr std::size_t word_count = sizeof(zavSystemEvent) / sizeof(int);

Json raw_words(const zavSystemEvent &event) {
    int words[word_count];
    std::memcpy(words, &event, sizeof words);
    std::size_t used = word_count;
    while (used > 1 && words[used - 1] == 0)
        --used;
    Json list = Json::array();
    for (std::size_t i = 0; i < used; ++i)
        list.push_back(words[i]);
    return list;
}

zavSystemEvent event_of_words(const Json &list) {
    int words[word_count] = {};
    if (!list.is_array() || list.size() > word_count)
        throw NoEvent(fmt::format("'words' is a list of at most {} numbers", word_count));
    for (std::size_t i = 0; i < list.size(); ++i)
        words[i] = integer_of(list[i], "words");
    zavSystemEvent event;
    std::memcpy(static_cast<void *>(&event), words, sizeof words);
    return event;
}

bool has_fields(const zavSystemEvent &event) {
    if (event.type == ZAV_EVENT_LVM)
        return find_minor_type(event.lvm.dev.lvmtype) != nullptr;
    return event_type_word(event) != "unknown";
}

bool is_blank(std::string_view text) {
    return trimmed(text).empty();
}

Json parsed_json(std::string_view text) {
    return Json::parse(text.begin(), text.end(), nullptr, false);
}

void add_events(const Json &json, std::vector<zavSystemEvent> &events) {
    if (json.is_object() && json.contains("events"))
        return add_events(json["events"], events);
    if (!json.is_array()) {
        events.push_back(event_of_json(json));
        return;
    }
    for (const Json &one : json)
        events.push_back(event_of_json(one));
}

void add_line(std::string_view line, std::size_t number, std::vector<zavSystemEvent> &events) {
    const Json json = parsed_json(line);
    if (json.is_discarded())
        throw NoEvent(fmt::format("line {}: this is no JSON", number));
    try {
        add_events(json, events);
    } catch (const NoEvent &problem) {
        throw NoEvent(fmt::format("line {}: {}", number, problem.what()));
    }
}

} // namespace

Json event_json(const zavSystemEvent &event, const std::string &received, const PathOf &path_of) {
    Json json;
    json["kind"] = "event";
    json["received"] = received.empty() ? Json(nullptr) : Json(received);
    json["type"] = event_type_word(event);
    json["type_code"] = event.type;
    json["subject"] = event_subject(event);
    json["text"] = event_text(event);
    json["severity"] = word(event_severity(event));
    if (has_fields(event))
        add_record(json, event, path_of);
    else
        json["words"] = raw_words(event);
    return json;
}

zavSystemEvent event_of_json(const Json &json) {
    if (!json.is_object())
        throw NoEvent("an event is a JSON object");
    if (json.contains("words"))
        return event_of_words(json["words"]);
    zavSystemEvent event = event_of(zavInitState{});
    event.type = coded(json, "type", event_types());
    if (event_type_word(event) == "unknown")
        throw NoEvent(fmt::format("an event of type {} is given by its 'words'", event.type));
    read_record(json, event);
    return event;
}

std::vector<zavSystemEvent> events_of_text(std::string_view text) {
    std::vector<zavSystemEvent> events;
    if (const Json whole = parsed_json(text); !whole.is_discarded()) {
        add_events(whole, events);
        return events;
    }
    for (std::size_t number = 1; !text.empty(); ++number) {
        const std::size_t end = std::min(text.find('\n'), text.size());
        if (!is_blank(text.substr(0, end)))
            add_line(text.substr(0, end), number, events);
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return events;
}

} // namespace zavctl
