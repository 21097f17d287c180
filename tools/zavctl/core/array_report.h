// What the library says about one array, judged and shown.
#pragma once

#include "answer.h"
#include "disk_report.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct Member {
    Address address;
    // As the kernel lists it, see member_state(), or "no_partition".
    std::string state = "unknown";
};

struct ArrayReport {
    int number = 0; // in its enclosure
    int unit = 0;   // the expansion unit that holds it, 0: none
    Address address;
    std::string kernel_name;   // "md1", "" for an array of the RAID controller
    int state = 0;             // ZAV_RAID_* bits
    int level = 0;             // ZAV_RAIDLVL_*, 0 if not told
    double resync = 0;         // as the library gives it
    bool expected = false;     // some disk has a partition for it, or its node exists
    bool node_present = false; // the device node exists; looked at for reported ones
    std::vector<Member> members;
    bool in_report = false;  // the RAID controller's report has it
    std::string volume_name; // as the RAID controller's report has it, "" if not told
    double size = 0;         // likewise, 0 if not told
    std::string raid_set;    // the name of the RAID set that it lies on, likewise
    std::string doubt;       // why the answer cannot be trusted, "" if it can
    std::string kernel_says; // the array's lines in /proc/mdstat, "" if there are none
    std::string refusal;     // what in those lines the library does not take, "" if nothing
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;
};

// "2", "2-1".
std::string array_id(const ArrayReport &array);

// Whether the RAID controller's report tells of it.
bool is_reported(const ArrayReport &array);

// Adds what updateData answered about the array's enclosure.
void tell_enclosure(ArrayReport &array, int result, const sRaidSetInfo &set);

// "normal", "degraded", "resync", "failed", "not_exist", "present", "unknown".
std::string array_state_word(const ArrayReport &array);

// "raid5", "linear", "none", "unknown".
std::string level_word(int level);

Severity severity(const ArrayReport &array);
std::string shown_state(const ArrayReport &array);
std::string array_note(const ArrayReport &array);

// The progress of a rebuild in percent; none unless one runs or waits.
std::optional<double> rebuild_percent(const ArrayReport &array);

Json array_json(const ArrayReport &array);

// `disks` are those asked in the same run, if any: a member on a disk that is not found is marked.
Section array_list_section(const std::vector<ArrayReport> &arrays,
                           const std::vector<DiskReport> &disks);
Section array_show_section(const std::vector<ArrayReport> &arrays);

} // namespace zavctl
