// Ethernet ports and the bond of them.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

constexpr int most_ports = 2;

// none: no ports; two: two ports; bond: a bond of both
const std::vector<std::string> &network_kinds();
Network new_network(const std::string &kind);

// In Mbit/s; 0 for a word that is no speed of a port.
int port_speed(const std::string &word);

std::string act_on_network(State &state, const Action &action);

// /proc/net/bonding/bond0; empty where there is none.
std::string bonding_text(const Network &network);

// What ethtool prints about a device; empty when there is none of that name.
std::string ethtool_text(const Network &network, const std::string &device);

} // namespace zavsim
