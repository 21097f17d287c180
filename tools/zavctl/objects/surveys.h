// What disks and arrays are asked, and how their answers are shown.
#pragma once

#include "../core/array_report.h"
#include "../core/disk_report.h"
#include "cascade.h"
#include "objects.h"

namespace zavctl {

// The disks that a list asks: in the slots of the model's arrays, and in others whose node exists;
// behind a RAID controller those in every slot of every enclosure.
std::vector<zavDevice> listed_disks(const Machine &machine, const CascadeReport &cascade, bool all);

// The arrays that a list asks: those that some disk has a partition for, or whose node exists;
// behind a RAID controller those that its report has, too.
std::vector<zavDevice> listed_arrays(const Machine &machine, const CascadeReport &cascade,
                                     bool all);

// Adds a question per disk or array; the reports begin as "no answer in time".
std::vector<Question> ask_disks(const Machine &machine, const std::vector<zavDevice> &disks,
                                const Session &session, const Shared<DiskReport> &reports);
std::vector<Question> ask_arrays(const Machine &machine, const std::vector<zavDevice> &arrays,
                                 const Session &session, const Shared<ArrayReport> &reports);

// The same for disks and arrays of the machine itself, by their numbers.
std::vector<Question> ask_disks(const Machine &machine, const std::vector<int> &slots,
                                const Session &session, const Shared<DiskReport> &reports);
std::vector<Question> ask_arrays(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<ArrayReport> &reports);

} // namespace zavctl
