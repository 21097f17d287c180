// Discs for the tests of what is said of them.
#pragma once

#include "core/disc_outcome.h"
#include "core/disc_plan.h"

#include "zav_api.h"

#include <gtest/gtest.h>

namespace zavctl {

inline DiscReport disc(int type, int state, int total = 4590000, int free = 4590000) {
    DiscReport report;
    report.drive = DriveKind::dvd_writer;
    report.media = {ZAV_EVENT_DISC, type, state, total, free};
    return report;
}

inline DiscReport in_combo_drive(DiscReport report) {
    report.drive = DriveKind::combo;
    return report;
}

inline DiscReport no_disc() {
    return disc(ZAV_DISC_NONE, ZAV_DISC_STATE_UNKNOWN, 0, 0);
}

inline DiscReport silent_drive() {
    DiscReport report = disc(ZAV_DISC_UNKNOWN, ZAV_DISC_STATE_UNKNOWN, 0, 0);
    report.failure = Failure{128, "ZAV_RC_ERR", "dvd+rw-mediainfo tells nothing"};
    return report;
}

} // namespace zavctl
