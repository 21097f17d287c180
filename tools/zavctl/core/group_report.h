// What the library says about one volume group, judged and shown.
#pragma once

#include "answer.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

struct GroupReport {
    int number = 0;
    Address address;
    std::string name;       // "DataVG1"
    int state = 0;          // ZAV_LVM_* bits
    std::uint64_t size = 0; // as the library gives it, see shown_size(); 0 if not told
    int pv_count = 0;       // as the library counts; its tables may hold less
    int lv_count = 0;
    std::vector<Address> devices; // under its physical volumes, those that the table holds
    std::vector<int> volumes;     // numbers of its logical volumes, likewise
    std::vector<int> pvs;         // numbers of its physical volumes, likewise
    bool expected = false;        // this machine should have it
    std::string doubt;            // why the answer cannot be trusted, "" if it can
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;

    // Whether the group answered, so that what it consists of is known.
    bool answered() const;
};

// The groups of the appliance among the names in the first column of what vgs prints.
std::vector<int> groups_in_list(std::string_view vgs_output);

// The library's sizes are whole GB of 2^30 bytes, rounded down, and one added: "<4 GB".
std::string shown_size(std::uint64_t size);

// "array 2", "disk 3", "a device without an address": what a physical volume lies on.
std::string device_words(const Address &address);

// "normal", "inactive", "failed", "not_exist", "unknown".
std::string group_state_word(const GroupReport &group);

Severity severity(const GroupReport &group);
std::string shown_state(const GroupReport &group);
std::string group_note(const GroupReport &group);

// What is not well with the groups; an empty list of volumes alone would look well.
std::vector<Finding> group_findings(const std::vector<GroupReport> &groups);

Json group_json(const GroupReport &group);
Section group_list_section(const std::vector<GroupReport> &groups);
Section group_show_section(const std::vector<GroupReport> &groups);

} // namespace zavctl
