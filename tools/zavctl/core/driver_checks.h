// The appliance's own drivers, as doctor finds them.
#pragma once

#include "doctor.h"

#include <vector>

namespace zavctl {

struct DriverFacts {
    int sensor_error = 0; // errno of looking into the directory of the sensors
    int gpio_error = 0;   // and of the GPIO lines
    bool event_device = false;
    bool led_device = false;
};

// What is missing is a warning: the states of disks and arrays do not depend on it.
std::vector<Check> driver_checks(const DriverFacts &facts);

} // namespace zavctl
