#include "zav_raid_parse.h"

#include "common/text.h"
#include "zav_api.h"

#include <cstdint>
#include <cstring>
#include <initializer_list>

namespace zav {

namespace {

// Searched in this order: "raid1" is part of "raid10".
constexpr struct {
    const char *text;
    int level;
} kLevels[] = {
    {"raid10", ZAV_RAIDLVL_10}, {"linear", ZAV_RAIDLVL_JBOD}, {"raid0", ZAV_RAIDLVL_0},
    {"raid5", ZAV_RAIDLVL_5},   {"raid1", ZAV_RAIDLVL_1},
};

// The number behind the first colon.
void read_count(char *line, int &count) {
    Fields fields(line);
    fields.next(":");
    char *value = fields.next(" :");
    if (value == nullptr)
        return;
    trim(value);
    count = to_int(value);
}

constexpr RaidDecision normal() {
    return {true, ZAV_RAID_NORMAL, 0.0F, nullptr};
}

// These levels have no redundancy to lose, and nothing to rebuild.
RaidDecision decide_plain() {
    return {true, ZAV_RAID_NORMAL, 100.0F, "RAID0/JBOD"};
}

// A mirror is never FAILED: the rule that would say so asks for more active members than the
// layout has, and none at once.
RaidDecision decide_mirror(int members, int active, const char *status) {
    if (members == 2 && (contains(status, "[UU__]") || contains(status, "[UU]")))
        return normal();
    if (members == 4 && contains(status, "[UUUU]"))
        return normal();
    if ((members != 2 && members != 4) || active == members)
        return normal();
    return {true, ZAV_RAID_DEGRADED, 0.0F, "RAID1"};
}

// Both numbers are told by a tool, and may be any.
int64_t lost_members(int members, int active) {
    return int64_t{members} - active;
}

RaidDecision decide_parity(int members, int active, const char *status) {
    if (contains(status, "[UUU]") || contains(status, "[UUUU]") || active == members)
        return normal();
    const int64_t lost = lost_members(members, active);
    int state = ZAV_RAID_NORMAL; // more active members than the layout has
    if (lost == 1)
        state = ZAV_RAID_DEGRADED;
    else if (lost >= 2)
        state = ZAV_RAID_FAILED;
    return {true, state, 0.0F, "RAID5"};
}

// Members (1,2) and (3,4) mirror each other: one of each pair must be alive.
bool one_of_each_pair(const char *status) {
    for (const char *pattern : {"[_U_U]", "[U_U_]", "[U__U]", "[_UU_]"})
        if (contains(status, pattern))
            return true;
    return false;
}

RaidDecision decide_striped_mirror(int members, int active, const char *status) {
    if (contains(status, "[UUUU]") || active == members)
        return normal();
    const int64_t lost = lost_members(members, active);
    int state = ZAV_RAID_NORMAL; // more active members than the layout has
    if (lost == 1 || (lost == 2 && one_of_each_pair(status)))
        state = ZAV_RAID_DEGRADED;
    else if (lost >= 2)
        state = ZAV_RAID_FAILED;
    return {true, state, 0.0F, "RAID10"};
}

// The percentage stands behind the '=' that follows this column; the bar before it is made of '='
// signs too.
constexpr size_t kBehindBar = 29;

bool read_percent(const char *line, int &percent) {
    if (strlen(line) <= kBehindBar)
        return false;
    char text[80];
    copy_text(text, sizeof text, line + kBehindBar);
    Fields fields(text);
    fields.next("=");
    const char *value = fields.next("%");
    if (value == nullptr)
        return false;
    percent = whole_part(to_double(value));
    return true;
}

} // namespace

bool read_detail_line(char *line, RaidDetail &detail) {
    if (contains(line, " Raid Level")) {
        for (const auto &level : kLevels) {
            if (contains(line, level.text)) {
                detail.level = level.level;
                return true;
            }
        }
        return false;
    }
    if (contains(line, "Raid Devices"))
        read_count(line, detail.raid_devices);
    else if (contains(line, "Active Devices"))
        read_count(line, detail.active_devices);
    return true;
}

RaidDecision decide_raid_state(int level, int members, int active, const char *status) {
    switch (level) {
    case ZAV_RAIDLVL_0:
    case ZAV_RAIDLVL_JBOD:
        return decide_plain();
    case ZAV_RAIDLVL_1:
        return decide_mirror(members, active, status);
    case ZAV_RAIDLVL_5:
        return decide_parity(members, active, status);
    case ZAV_RAIDLVL_10:
        return decide_striped_mirror(members, active, status);
    default:
        return {false, ZAV_RAID_NORMAL, 0.0F, nullptr};
    }
}

RebuildLine read_rebuild_line(const char *line, int &percent) {
    if (contains(line, "resync=DELAYED\n"))
        return RebuildLine::kDelayed;
    if (contains(line, "recovery") || contains(line, "resync"))
        return read_percent(line, percent) ? RebuildLine::kRunning : RebuildLine::kUnreadable;
    if (strcmp(line, "      \n") == 0)
        return RebuildLine::kIdle;
    return RebuildLine::kUnexpected;
}

} // namespace zav
