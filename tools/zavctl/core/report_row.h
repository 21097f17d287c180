// Where the library puts a volume or a disk of the RAID controller's report.
#pragma once

#include "severity.h"

#include <optional>
#include <string>

namespace zavctl {

struct ReportRow {
    std::string text; // volume 1 "DATA" RAID5 4000.0 status 1 (normal)
    Severity severity = Severity::ok;
};

// What becomes of a line with a volume or a disk, as the library's reader answers when it is given
// this line alone. `disks` is the number of disks of the RAID set.
ReportRow row_of_volume(const std::string &piece, int number, int disks);
ReportRow row_of_disk(const std::string &piece, int number);

} // namespace zavctl
