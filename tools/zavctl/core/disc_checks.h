// What burning needs of the system, as doctor finds it.
#pragma once

#include "disc.h"
#include "doctor.h"

#include <vector>

namespace zavctl {

struct BurnerPlatform {
    DriveFacts drive;
    int table_error = 0;         // errno of reading the kernel's table of drives
    std::vector<ToolFact> tools; // of the burner
};

// A machine without a drive needs nothing of all this. Elsewhere what is missing is a warning: the
// states of disks and arrays do not depend on it.
std::vector<Check> burner_checks(const BurnerPlatform &facts);

} // namespace zavctl
