// What the appliance's tools print and its files hold. Generated ones have any number of lines, the
// ones that are looked for among the last.
#pragma once

#include <string>

namespace bench {

// What mdadm and /proc/mdstat say of a healthy array.
extern const std::string detail_text;
extern const std::string mdstat_text;

extern const std::string cascade_text;
extern const std::string display_text;
extern const std::string dvd_text;
extern const std::string cd_text;
extern const std::string port_text;
extern const std::string ups_text;

// The firmware's memory, its table half-way through the range that is searched.
std::string firmware_image();

// A metadata backup of a group with that many physical and logical volumes, these of so many
// segments each.
std::string backup_text(int physical, int logical, int segments = 1);

// A RAID controller's report, unit 1 behind that many lines of the controller's own.
std::string report_text(int lines_before);

// The line so many times.
std::string repeated(const std::string &line, int times);

} // namespace bench
