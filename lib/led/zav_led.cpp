// LEDs of the front panel and of the disks, and the alarms of the LED-event driver.
#include "common/diag.h"
#include "common/driver.h"
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdio>
#include <cstring>
#include <iterator>

namespace {

using zav::Driver;

constexpr const char *kAlarmDevice = "/dev/zavledevent";

// ---- The lines, one file each. Writing a digit sets one. ----

constexpr const char *kPanelLines[] = {
    "/proc/zav/sys/dev/gpio/ich9/38", "/proc/zav/sys/dev/gpio/ich9/39",
    "/proc/zav/sys/dev/gpio/ich9/07", "/proc/zav/sys/dev/gpio/ich9/23",
    "/proc/zav/sys/dev/gpio/ich9/21", "/proc/zav/sys/dev/gpio/ich9/22",
};
constexpr int kThreeStateLed = 5;

constexpr int kFirstDiskLed = 7;
constexpr const char *kDiskLines[][2] = {
    {"/proc/zav/sys/dev/gpio/ich9/10", "/proc/zav/sys/dev/gpio/ich9/40"},
    {"/proc/zav/sys/dev/gpio/ich9/04", "/proc/zav/sys/dev/gpio/ich9/41"},
    {"/proc/zav/sys/dev/gpio/ich9/02", "/proc/zav/sys/dev/gpio/ich9/42"},
    {"/proc/zav/sys/dev/gpio/ich9/00", "/proc/zav/sys/dev/gpio/ich9/43"},
};

// ---- The states ----

struct PanelState {
    int state;
    int digit;
};

constexpr PanelState kPanelStates[] = {{ZAV_LED_OFF, 0}, {ZAV_LED_ON, 1}, {ZAV_LED_VALUE2, 2}};

struct DiskState {
    int state;
    int digits[2]; // of the first and the second line
};

constexpr DiskState kDiskStates[] = {
    {ZAV_LED_OFF, {0, 0}},
    {ZAV_HDDLED_SECOND_ON, {0, 1}},
    {ZAV_HDDLED_FIRST_ON, {1, 0}},
    {ZAV_HDDLED_FIRST_2, {2, 0}},
    {ZAV_HDDLED_FIRST_2_SECOND_ON, {2, 1}},
};

template <class Table, class Test>
auto find(const Table &table, const Test &test) -> decltype(&table[0]) {
    for (const auto &row : table)
        if (test(row))
            return &row;
    return nullptr;
}

// Null for a number without an LED.
const char *panel_line(int led) {
    return led < 1 || led > static_cast<int>(std::size(kPanelLines)) ? nullptr
                                                                     : kPanelLines[led - 1];
}

const char *const *disk_lines(int led) {
    const int after_last = kFirstDiskLed + static_cast<int>(std::size(kDiskLines));
    return led < kFirstDiskLed || led >= after_last ? nullptr : kDiskLines[led - kFirstDiskLed];
}

// The disks' LEDs belong to the RAID controller where there is one.
bool controller_has_them() {
    return zavGetModel() == ZAV_MODEL_SOLVANE_2980;
}

// ---- Lines ----

int refuse(const char *function, int number, const char *format, const char *path, int rc) {
    zavlogd(const_cast<char *>(function), zav::kAlert, number, format, path);
    return rc;
}

int open_line(const char *function, const char *path, const char *mode, zav::File &line) {
    line.open(path, mode);
    return line ? ZAV_RC_OK : refuse(function, 0, "Can't open LED(%s)", path, ZAV_RC_ERR_ENOENT);
}

int write_line(const char *function, const char *path, int digit, zav::File &line) {
    if (fprintf(line.get(), "%d", digit) < 0 || !line.flush())
        return refuse(function, -1, "Can't write LED(%s)", path, ZAV_RC_ERR);
    return ZAV_RC_OK;
}

int unreadable(const char *function, const char *path) {
    return refuse(function, -1, "Can't read LED(%s)", path, ZAV_RC_ERR);
}

int read_disk_line(const char *function, const char *path, zav::File &line, int &digit) {
    char text[64];
    const size_t length = fread(text, 1, sizeof text - 1, line.get());
    text[length] = '\0';
    return zav::number_after(text, "", digit) ? ZAV_RC_OK : unreadable(function, path);
}

int open_both(const char *function, const char *const *paths, const char *mode,
              zav::File (&lines)[2]) {
    for (int i = 0; i < 2; ++i)
        if (const int rc = open_line(function, paths[i], mode, lines[i]); rc != ZAV_RC_OK)
            return rc;
    return ZAV_RC_OK;
}

} // namespace

int zavSetLED(int led, int state) {
    const char *path = panel_line(led);
    if (path == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File line; // opened, and so emptied, before the state is looked at
    if (const int rc = open_line(__func__, path, "we", line); rc != ZAV_RC_OK)
        return rc;
    const PanelState *known =
        find(kPanelStates, [&](const PanelState &row) { return row.state == state; });
    if (known == nullptr || (state == ZAV_LED_VALUE2 && led != kThreeStateLed))
        return ZAV_RC_ERR_EINVAL;
    return write_line(__func__, path, known->digit, line);
}

int zavGetLED(int led) {
    const char *path = panel_line(led);
    if (path == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File line;
    if (const int rc = open_line(__func__, path, "re", line); rc != ZAV_RC_OK)
        return rc;
    char text[64];
    if (!line.line(text, sizeof text))
        return unreadable(__func__, path);
    const int digit = zav::to_int(text);
    const PanelState *known =
        find(kPanelStates, [&](const PanelState &row) { return row.digit == digit; });
    return known != nullptr ? known->state : ZAV_RC_ERR;
}

int zavSetHDDLED(int led, int state) {
    if (controller_has_them())
        return ZAV_RC_ERR;
    const char *const *paths = disk_lines(led);
    if (paths == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File lines[2];
    if (const int rc = open_both(__func__, paths, "we", lines); rc != ZAV_RC_OK)
        return rc;
    const DiskState *known =
        find(kDiskStates, [&](const DiskState &row) { return row.state == state; });
    if (known == nullptr)
        return ZAV_RC_ERR_EINVAL;
    for (int i = 0; i < 2; ++i)
        if (const int rc = write_line(__func__, paths[i], known->digits[i], lines[i]);
            rc != ZAV_RC_OK)
            return rc;
    return ZAV_RC_OK;
}

int zavGetHDDLED(int led) {
    if (controller_has_them())
        return ZAV_RC_ERR;
    const char *const *paths = disk_lines(led);
    if (paths == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::File lines[2];
    if (const int rc = open_both(__func__, paths, "re", lines); rc != ZAV_RC_OK)
        return rc;
    int digits[2] = {};
    for (int i = 0; i < 2; ++i)
        if (const int rc = read_disk_line(__func__, paths[i], lines[i], digits[i]); rc != ZAV_RC_OK)
            return rc;
    const DiskState *known = find(kDiskStates, [&](const DiskState &row) {
        return row.digits[0] == digits[0] && row.digits[1] == digits[1];
    });
    return known != nullptr ? known->state : ZAV_RC_ERR;
}

int zavLEDAlarm(int priority, int ledcode, int state) {
    const Driver driver(kAlarmDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    zavLEDEvent event = {priority, ledcode, state};
    const int rc = driver.put(__func__, &event);
    if (rc == ZAV_RC_ERR)
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR, "Unknown error");
    return rc;
}

int zavLEDPollAlarm(zavLEDEvent *ledevent) {
    if (ledevent == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const Driver driver(kAlarmDevice);
    if (const int rc = driver.check(__func__); rc != ZAV_RC_OK)
        return rc;
    *ledevent = {};
    switch (driver.request(Driver::kTake, ledevent)) {
    case -1:
        return zav::kNothingPending;
    case 0:
        return ZAV_RC_OK;
    default:
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR, "Unknown error");
        return ZAV_RC_ERR;
    }
}
