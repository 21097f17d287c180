// What ethtool and the bonding driver say about a port: text in, state out.
#pragma once

#include "zav_event.h"

namespace zav {

constexpr int kNoPort = 0;
constexpr int kUnknownPort = -1;

// Takes in one line of ethtool's report. False if it tells a speed or a link in words that are not
// known.
bool read_port_line(const char *line, zavNetState &info);

// The port, 1 to 4, that the bonding driver's line names as the active one.
int active_port(const char *line);

} // namespace zav
