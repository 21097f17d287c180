// What mdadm and /proc/mdstat say about a software array: text and numbers in, state out.
#pragma once

namespace zav {

// Gathered from the lines of "mdadm --detail".
struct RaidDetail {
    int level;        // ZAV_RAIDLVL_*, ZAV_RAIDLVL_NONE until told
    int raid_devices; // what the array was built for
    int active_devices;
};

// Takes in one line, which is split in place. False if it names a level that the appliance does not
// build.
bool read_detail_line(char *line, RaidDetail &detail);

struct RaidDecision {
    bool known;        // false: the level has no rule
    int state;         // ZAV_RAID_*
    float resync;      // 100 for levels that never rebuild
    const char *trace; // how the trace calls the level, null when nothing is traced
};

// The state of an array of the model's `members` disks with `active` members alive, whose status
// line in /proc/mdstat ("... [4/3] [UUU_]") is `status`.
RaidDecision decide_raid_state(int level, int members, int active, const char *status);

enum class RebuildLine {
    kIdle,       // no rebuild
    kDelayed,    // a rebuild waits for another array
    kRunning,    // a rebuild runs; its percentage was read
    kUnreadable, // a rebuild, but no percentage
    kUnexpected, // something else
};

// The third line of an array's block in /proc/mdstat. `percent` is set for kRunning only.
RebuildLine read_rebuild_line(const char *line, int &percent);

} // namespace zav
