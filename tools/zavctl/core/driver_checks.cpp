#include "driver_checks.h"

#include <fmt/format.h>

#include <cstring>

namespace zavctl {

namespace {

Check directory_check(const std::string &name, const std::string &directory, int error,
                      const std::string &means) {
    if (error == 0)
        return {Severity::ok, name, directory + " is there", ""};
    return {Severity::warning, name, fmt::format("{}: {}", directory, std::strerror(error)), means};
}

Check device_check(const std::string &name, const std::string &device, bool there,
                   const std::string &means) {
    if (there)
        return {Severity::ok, name, device + " is there", ""};
    return {Severity::warning, name, device + " is missing", means};
}

} // namespace

std::vector<Check> driver_checks(const DriverFacts &facts) {
    return {directory_check("sensors", "/proc/zav/sys/sensor", facts.sensor_error,
                            "no temperature, no voltage and no fan can be told"),
            directory_check("gpio", "/proc/zav/sys/dev/gpio/ich9", facts.gpio_error,
                            "LEDs, fan 4 and the routing of the serial port do not work"),
            device_check("event-device", "/dev/zavevent0", facts.event_device,
                         "no event can be taken, waited for or put"),
            device_check("led-device", "/dev/zavledevent", facts.led_device,
                         "LED alarms can be neither handed over nor taken")};
}

} // namespace zavctl
