// What the RAID controller's report tells of one enclosure, shown.
#pragma once

#include "address.h"
#include "text.h"

#include "zav_hwraid.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// RAID set, volumes and disks, and the raw readings of the enclosure's monitor.
struct EnclosureReport {
    std::optional<sRaidSetInfo> set;
    std::string no_set;                          // why there is none
    std::vector<std::optional<double>> readings; // in the order of their items
};

// "45.00, 2710.00, -"
std::string readings_text(const EnclosureReport &enclosure);

// Adds "readings", "raid_set", "volumes", "disks", "no_raid_set".
void add_enclosure(Json &json, const EnclosureReport &enclosure);

// Adds a line for each reading, the RAID set, its volumes and disks. Of a unit it is known what
// some readings are.
void add_enclosure(Details &details, const EnclosureReport &enclosure, bool of_unit);

// Null for a number that is none, or not told.
Json number_or_null(const std::optional<double> &number);

} // namespace zavctl
