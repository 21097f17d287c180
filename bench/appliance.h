// The benchmark's appliance: a healthy four-disk model whose tools do nothing but print.
#pragma once

#include <string>

namespace bench {

// What mdadm and /proc/mdstat say of a healthy array.
extern const std::string detail_text;
extern const std::string mdstat_text;

// A metadata backup of a group with that many physical and logical volumes.
std::string backup_text(int physical, int logical);

// A RAID controller's report, its unit's section behind that many lines.
std::string report_text(int lines_before);

// Lays down files, device names and tools. False, with a word to the user, outside a private root:
// the files belong to the system there.
bool set_up_appliance();

} // namespace bench
