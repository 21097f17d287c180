// What the queries of all kinds of arrays begin with.
#pragma once

#include "zav_api.h"

namespace zav {

// The state that nothing has been found out for. The members' addresses are given a minor type
// where it is known from the start.
zavRaidState undecided_raid(const zavDevice &dev, int member_minor_type);

// Looks for the array's node. When it is not there the query ends with what this stores in `rc`.
// `kind` is "Device" or "md", as the log calls it.
bool raid_node_present(const char *function, const char *kind, const char *path, int &state,
                       int &rc);

} // namespace zav
