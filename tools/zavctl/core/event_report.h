// Events that were taken or put, as an answer and as lines.
#pragma once

#include "answer.h"
#include "event_json.h"

#include <string>
#include <vector>

namespace zavctl {

struct ReceivedEvent {
    zavSystemEvent event;
    std::string received; // RFC 3339
};

// The events that a verb has taken.
Section taken_section(const std::vector<ReceivedEvent> &events, const PathOf &path_of);

// The events that were pushed, and for those that were not, why.
struct PushedEvent {
    zavSystemEvent event;
    std::string failure; // "" if it was put
};
Section pushed_section(const std::vector<PushedEvent> &events, const PathOf &path_of);

// One line of `event follow`, with its line end.
std::string event_line(const ReceivedEvent &event, const Style &style);
std::string event_json_line(const ReceivedEvent &event, const PathOf &path_of);

} // namespace zavctl
