// Moments in words.
#pragma once

#include <ctime>
#include <string>

namespace zavctl {

// "2026-11-22T12:03:41+01:00": RFC 3339, in the local time zone.
std::string rfc3339(std::time_t moment);

// "12:03:41", local time.
std::string time_of_day(std::time_t moment);

} // namespace zavctl
