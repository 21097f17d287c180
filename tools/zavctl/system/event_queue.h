// The appliance's event driver, through the library.
#pragma once

#include "zav_event.h"

#include <string>

namespace zavctl::library {

struct EventAnswer {
    int result = 0;
    zavSystemEvent event{};
};

// What the library answers when no event is there.
constexpr int no_event_pending = 0x1201;

EventAnswer poll_event();
EventAnswer poll_private_event();
int push_event(const zavSystemEvent &event);

// Why the event device was not to be had, in words; "" if somebody else had it open, which ends.
// To be asked when the library says ZAV_RC_ERR_EACCES, as that has many reasons.
std::string event_device_trouble();

// What a result means, in words, of an event that was put or taken.
std::string event_failure(int result);

} // namespace zavctl::library
