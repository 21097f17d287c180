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

} // namespace zavsim
