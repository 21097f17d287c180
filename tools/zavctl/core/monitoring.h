// The appliance in the form that monitoring schedulers run plugins for: a line, performance data
// and an exit status.
#pragma once

#include "answer.h"

#include <string>
#include <vector>

namespace zavctl {

struct PluginResult {
    std::string output; // with line ends
    int status = 0;     // 0 OK, 1 WARNING, 2 CRITICAL, 3 UNKNOWN
};

// The words that name an object: "disk", "array"...
std::vector<std::string> checked_objects();

// Judges the sections of the objects, of none: all. An object that no section tells of, or a word
// that names none, is UNKNOWN.
PluginResult checked(const Answer &answer, const std::vector<std::string> &objects);

// "UNKNOWN: why".
PluginResult unknown_result(const std::string &why);

} // namespace zavctl
