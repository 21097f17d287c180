// Shows the state: files under /proc, nodes under /dev, ports in sysfs, tools in their places.
#pragma once

#include "model/state.hpp"
#include "root/driver_files.hpp"

#include <string>

namespace zavsim {

// What programs wrote into the appliance's files and a turn acted on. What has come since stays
// there for the next turn.
struct Taken {
    std::string scsi_command; // found in /proc/scsi/scsi
    DriverTexts driver_files;
};

// False when something could not be shown yet.
bool publish(const State &state, const Taken &taken);

} // namespace zavsim
