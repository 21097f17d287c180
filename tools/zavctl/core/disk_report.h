// What the library says about one disk, judged and shown.
#pragma once

#include "answer.h"
#include "slot_id.h"

#include "zav_hwraid.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct DiskReport {
    int slot = 0; // in its enclosure
    int unit = 0; // the expansion unit that holds it, 0: none
    Address address;
    int state = 0;             // ZAV_HDD_* bits
    bool expected = false;     // the model's arrays use this slot
    bool node_present = false; // the device node exists
    double size = 0;           // as the RAID controller's report gives it, 0 if not told
    std::string raid_set;      // its name, "" if not told
    std::string doubt;         // why the answer cannot be trusted, "" if it can
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;
};

// "3", "2-3".
std::string disk_name(const DiskReport &disk);

// Whether the RAID controller's report tells of it: no device node and no tool does.
bool is_reported(const DiskReport &disk);

// Adds what updateData answered about the disk's enclosure.
void tell_enclosure(DiskReport &disk, int result, const sRaidSetInfo &set);

// "found", "absent", "failed", "unknown".
std::string disk_state_word(const DiskReport &disk);

Severity severity(const DiskReport &disk);

// The state as the screen calls it: an empty slot that no array uses is "empty".
std::string shown_state(const DiskReport &disk);

// Why, in words; "" if there is nothing to say.
std::string disk_note(const DiskReport &disk);

Json disk_json(const DiskReport &disk);
Section disk_list_section(const std::vector<DiskReport> &disks);
Section disk_show_section(const std::vector<DiskReport> &disks);

} // namespace zavctl
