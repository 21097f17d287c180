// Making, extending and dismantling volume groups: decided before it is done.
#pragma once

#include "array_report.h"
#include "exchange.h"
#include "group_report.h"
#include "plan.h"

#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace zavctl {

// "array 3", "disk 4", a path, or an address as `zavctl name` takes it. Throws BadWords.
std::variant<std::string, zavDevice> device_words_given(const std::vector<std::string> &words);

// A device that a group shall lie on.
struct DeviceFact {
    Address address;
    bool node_present = false;
    std::string state;   // in words: "normal", "degraded", "found"
    bool usable = false; // the state lets it carry data
    std::string trouble; // why its state cannot be told, "" if it can
    std::vector<int> partitions;
    std::vector<Membership> memberships;
    std::string mounted_at;              // "" if it is not mounted
    std::optional<std::string> in_group; // of which it is a physical volume; "" for one of none
};

struct GroupFacts {
    bool hardware_raid = false; // the model's arrays are the RAID controller's
    GroupReport group;
    std::vector<VolumeFact> volumes; // that the library names
    std::vector<DeviceFact> devices; // under its physical volumes, or the one to add
    std::vector<std::string> missing_tools;
};

Plan group_addition_plan(const GroupFacts &facts);
Plan group_removal_plan(const GroupFacts &facts, bool system_group_too);

// `after` holds what the same questions answer once the library has returned.
Outcome group_addition_outcome(const GroupFacts &before, const GroupFacts &after,
                               const std::optional<Failure> &failure);
Outcome group_removal_outcome(const GroupFacts &before, const GroupFacts &after,
                              const std::optional<Failure> &failure);

} // namespace zavctl
