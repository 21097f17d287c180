#pragma once

#include "objects.h"

namespace zavctl {

// The verb that goes on until it is stopped.
void add_event_follow(Command event, Session &session);

// The option for the driver's other queue.
void add_private(Command verb, bool &is_private);

} // namespace zavctl
