// What the library says about one disk, judged and shown.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct DiskReport {
    int slot = 0;
    Address address;
    int state = 0;             // ZAV_HDD_* bits
    bool expected = false;     // the model's arrays use this slot
    bool node_present = false; // the device node exists
    std::string doubt;         // why the answer cannot be trusted, "" if it can
    std::optional<Failure> failure;
};

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
