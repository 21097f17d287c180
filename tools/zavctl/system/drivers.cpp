#include "drivers.h"

#include "files.h"

#include <unistd.h>

namespace zavctl {

DriverFacts read_drivers() {
    DriverFacts facts;
    names_in("/proc/zav/sys/sensor", facts.sensor_error);
    names_in("/proc/zav/sys/dev/gpio/ich9", facts.gpio_error);
    facts.event_device = access("/dev/zavevent0", F_OK) == 0;
    facts.led_device = access("/dev/zavledevent", F_OK) == 0;
    return facts;
}

} // namespace zavctl
