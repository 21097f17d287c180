// What the RAID controller's report says of one enclosure, in words. Sizes, levels and statuses are
// the report's own numbers.
#pragma once

#include "address.h"

#include "zav_hwraid.h"

#include <optional>
#include <string>

namespace zavctl {

constexpr int controller = 0; // as the number of a unit: the enclosure of the controller itself
constexpr int last_unit = 7;
constexpr int enclosure_slots = 4;

// "the controller", "unit 2".
std::string enclosure_words(int unit);

// "found", "absent", "failed"; "unknown" for a number without a meaning.
std::string disk_status_word(int status);

// "normal", "degraded", "resync", "failed", "not_exist"; "unknown" for a number without a meaning.
std::string volume_status_word(int status);

// "RAID5"; "level 7" for a number without a meaning.
std::string reported_level(int level, int disks);

// Single precision as it was written: 500.1, not 500.1000061. None for what is no number.
std::optional<double> as_written(float number);

// "500.1", "-" for what is no size.
std::string reported_size(double size);

// Whether the RAID set is made of the disk in that slot.
bool is_member(const sRaidSetInfo &set, int slot);

// The volume of that number; null if the report has none.
const sVolSetInfo *volume_of(const sRaidSetInfo &set, int number);

std::string set_name(const sRaidSetInfo &set);
std::string volume_name(const sVolSetInfo &volume);
std::string member_digits(const sRaidSetInfo &set);

// Why an enclosure of which updateData says ENODEV cannot be told.
std::string doubt_without_set(int unit);

// {"number", "name", "size", "disk_count", "members"}
Json set_json(const sRaidSetInfo &set);
// Lists of {"number", "name", "level", "size", "progress", "status", "state"} and
// {"number", "size", "status", "state"}.
Json volumes_json(const sRaidSetInfo &set);
Json disks_json(const sRaidSetInfo &set);

// "SYSTEMDATA", RAID5, 1200.2, normal
std::string in_words(const sVolSetInfo &volume, int disks);
// 500.1, found
std::string in_words(const sPhyDiskInfo &disk);
// "MAINSET", 2000.4, 4 disks (1234)
std::string in_words(const sRaidSetInfo &set);

} // namespace zavctl
