// Looks whether the appliance's own drivers are there.
#pragma once

#include "../core/driver_checks.h"

namespace zavctl {

DriverFacts read_drivers();

} // namespace zavctl
