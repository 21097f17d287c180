// The cascade of expansion units, from what /usr/bin/query_sas.sh prints.
#pragma once

#include "zav_rbod.h"

namespace zav {

// Does the address stand for a link that leads nowhere?
bool is_no_link(const char *address);

struct Cascade {
    static constexpr int kExpanders = 7;

    sExpander expanders[kExpanders] = {};
    int current = 0; // the one that the lines are about

    // False if the line says that the expander has no upstream link, which every one must have.
    bool take(const char *line);
};

} // namespace zav
