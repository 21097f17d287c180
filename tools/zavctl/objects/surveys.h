// What disks and arrays are asked, and how their answers are shown.
#pragma once

#include "../core/array_report.h"
#include "../core/disk_report.h"
#include "objects.h"

namespace zavctl {

// The slots that a list asks: those of the model's arrays, and others whose node exists.
std::vector<int> listed_slots(const Machine &machine, bool all);

// The arrays that a list asks: those that some disk has a partition for, or whose node exists.
std::vector<int> listed_arrays(const Machine &machine, bool all);

// Adds a question per disk or array; the reports begin as "no answer in time".
std::vector<Question> ask_disks(const Machine &machine, const std::vector<int> &slots,
                                const Session &session, const Shared<DiskReport> &reports);
std::vector<Question> ask_arrays(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<ArrayReport> &reports);

} // namespace zavctl
