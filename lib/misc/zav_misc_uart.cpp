// The routing of the serial port.
#include "common/diag.h"
#include "common/owner.h"
#include "zav_api.h"

#include <cstdio>

namespace {

constexpr const char *kLines[] = {
    "/proc/zav/sys/dev/gpio/ich9/34",
    "/proc/zav/sys/dev/gpio/ich9/35",
    "/proc/zav/sys/dev/gpio/ich9/49",
};

struct Setting {
    int line; // index into kLines
    int value;
};

// By mode, in the order in which the lines are set.
constexpr Setting kModes[][3] = {
    {{0, 1}, {1, 1}, {2, 0}},
    {{1, 0}, {2, 1}, {0, 0}},
    {{1, 0}, {2, 0}, {0, 0}},
    {{1, 1}, {2, 0}, {0, 0}},
};

} // namespace

int zavUARTMode(int uartmode) {
    if (uartmode < 1 || uartmode > 4)
        return ZAV_RC_ERR_EINVAL;

    zav::File lines[3];
    for (int i = 0; i < 3; ++i) {
        lines[i].open(kLines[i], "we");
        if (!lines[i]) {
            ZAV_LOG(zav::kAlert, 0, "Can't open GPIO(%s)", kLines[i]);
            return ZAV_RC_ERR_ENOENT;
        }
    }
    const auto &mode = kModes[uartmode - 1];
    for (const Setting &setting : mode) {
        if (fprintf(lines[setting.line].get(), "%d", setting.value) < 0) {
            ZAV_LOG(zav::kAlert, -1, "Can't write GPIO");
            return ZAV_RC_ERR;
        }
    }
    // A value reaches its line when the file is closed.
    for (const Setting &setting : mode)
        lines[setting.line].close();
    return ZAV_RC_OK;
}
