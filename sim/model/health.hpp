// The parts of the machine that make its health visible: plain values, of the state.
#pragma once

#include <map>
#include <string>
#include <vector>

namespace zavsim {

// A thermal or voltage probe of the main board.
struct Probe {
    double value = 0;
    int status = 0;       // of its alarm: 0 none, 1 latched, else the probe is faulty
    bool missing = false; // the driver does not find it
};

struct Sensors {
    std::vector<Probe> temperatures; // degrees Celsius
    std::vector<Probe> voltages;     // volts
    std::vector<int> fans;           // revolutions a minute of fans 1 to 3; fan 4 is a GPIO line
    int input = 0;                   // byte of the digital sensor port
};

// What was last written to the driver's outputs, by path below /proc/zav/sys/dev.
using Registers = std::map<std::string, std::string>;

// Of the appliance's own computer. Percentages, but for the counters.
struct Load {
    int processor = 0;
    int swap = 0;
    std::map<std::string, int> file_systems; // by mount point
    double since = 0;       // appliance time since which the processor has this load
    double busy_before = 0; // seconds that it worked until then
};

struct Ups {
    bool silent = false; // its daemon does not run
    bool on_battery = false;
    double charge = 100; // percent, when the power last failed or returned
    double since = 0;    // appliance time of that
    // The daemon's status as it was last written, and how often it was.
    double status_at = 0;
    bool status_on_battery = false;
    double status_charge = 100;
    int statuses = 0;
    // The same for what the appliance's hook wrote of a power event.
    double event_at = 0;
    int event_state = 0;
    double event_charge = 0;
    int events = 0;
};

struct Port {
    bool link = true;
    int speed = 1000;
    int failures = 0; // how often the link was lost
};

struct Network {
    std::vector<Port> ports;
    bool bonded = false;
    int active = -1; // index of the bond's active port; -1 for none
};

// What the appliance's driver tells of one thing that it watches.
struct DriverEvent {
    std::string kind; // fan, thermal, voltage, ups, disk, bay, array, port
    int number = 0;
    double value = 0; // reading, charge, speed; of an array the code of its level
    int state = 0;    // in the codes of that kind
};

} // namespace zavsim
