// The fields of each kind of event record as JSON, both ways.
#pragma once

#include "event_json.h"

namespace zavctl {

// Adds the fields of a record whose type is known.
void add_record(Json &json, const zavSystemEvent &event, const PathOf &path_of);

// Fills the record of `event.type`.
void read_record(const Json &json, zavSystemEvent &event);

} // namespace zavctl
