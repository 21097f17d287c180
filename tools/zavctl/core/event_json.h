// Event records as JSON, both ways.
#pragma once

#include "address.h"
#include "event.h"

#include <functional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

// Why something is no event.
class NoEvent : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// The path that the library gives a device, "" for none.
using PathOf = std::function<std::string(const zavDevice &)>;

// {"kind": "event", "received", "type", "type_code", "subject", "text", "severity"}, then the
// record's fields. `received` is null for "".
Json event_json(const zavSystemEvent &event, const std::string &received, const PathOf &path_of);

// The record again: "type" and the record's fields are read, words where their code is not given;
// a field that is missing is 0. Throws NoEvent, also when a word and its code contradict.
zavSystemEvent event_of_json(const Json &json);

// The events of a text: one object or a list, several lines of one each, or what `--json` printed
// of others. Throws NoEvent with the number of the line.
std::vector<zavSystemEvent> events_of_text(std::string_view text);

} // namespace zavctl
