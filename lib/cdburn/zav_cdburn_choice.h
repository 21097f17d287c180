// Which command burns a disc: by its type, its state and the kind of session.
#pragma once

#include "zav_api.h"

namespace zav {

enum class Recipe {
    none, // the disc is refused with a code
    dvd_new,
    dvd_append,
    dvd_closed,
    dvd_at_once,
    dvd_double_at_once,
    cd_closed,
    cd_first_session,
    cd_next_session,
};

struct Choice {
    Recipe recipe;
    int refusal; // ZAV_RC_*, for no recipe

    bool operator==(const Choice &) const = default;
};

// Session types: 0 closes the disc, 1 leaves it open, 2 overwrites it.
Choice choose(int disc_type, int disc_state, int session_type);

// A combo drive writes CDs only. Of the DVDs, those that it refuses.
bool combo_drive_refuses(int disc_type);

// Is there room for a source of so many kilobytes? For other session types nobody asks. -1: the
// source could not be measured.
bool has_room(const zavMediaInfo &disc, int session_type, int source_kilobytes);

} // namespace zav
