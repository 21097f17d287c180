#include "model/network.hpp"

#include <array>
#include <fmt/format.h>
#include <map>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr int no_port = -1;

std::string port_name(int index) {
    return fmt::format("eth{}", index);
}

// The port that takes over from `left`; it stays where it is when no other has a link.
int port_with_link(const Network &network, int left) {
    for (int index = 0; index < static_cast<int>(network.ports.size()); ++index)
        if (index != left && network.ports.at(static_cast<std::size_t>(index)).link)
            return index;
    return no_port;
}

void lose_link(Network &network, int index) {
    Port &port = network.ports.at(static_cast<std::size_t>(index));
    port.link = false;
    ++port.failures;
    if (network.active == index)
        network.active = port_with_link(network, index);
}

void get_link(Network &network, int index) {
    network.ports.at(static_cast<std::size_t>(index)).link = true;
    if (network.bonded && network.active == no_port)
        network.active = index;
}

std::string fail_over(Network &network) {
    if (!network.bonded)
        return "there is no bond";
    const int other = port_with_link(network, network.active);
    if (other == no_port)
        return "no other port has a link";
    network.active = other;
    return {};
}

std::string set_link(Network &network, int index, bool link) {
    if (network.ports.at(static_cast<std::size_t>(index)).link == link)
        return fmt::format("port {} {}", index + 1, link ? "has a link" : "has no link");
    if (link)
        get_link(network, index);
    else
        lose_link(network, index);
    return {};
}

std::string slave_text(const Network &network, int index) {
    const Port &port = network.ports.at(static_cast<std::size_t>(index));
    return fmt::format("\nSlave Interface: {}\n"
                       "MII Status: {}\n"
                       "Speed: {}\n"
                       "Duplex: {}\n"
                       "Link Failure Count: {}\n"
                       "Permanent HW addr: 52:54:00:12:34:{}\n"
                       "Slave queue ID: 0\n",
                       port_name(index), port.link ? "up" : "down",
                       port.link ? fmt::format("{} Mbps", port.speed) : "Unknown",
                       port.link ? "full" : "Unknown", port.failures, 56 + index);
}

struct Line {
    bool link;
    int speed;
};

std::string speed_lines(const Line &line) {
    return line.link ? fmt::format("\tSpeed: {}Mb/s\n\tDuplex: Full\n", line.speed)
                     : "\tSpeed: Unknown!\n\tDuplex: Unknown! (255)\n";
}

std::string link_line(bool link) {
    return fmt::format("\tLink detected: {}\n", link ? "yes" : "no");
}

std::string port_settings(const std::string &name, const Line &line) {
    constexpr const char *modes = "10baseT/Half 10baseT/Full\n"
                                  "\t                        100baseT/Half 100baseT/Full\n"
                                  "\t                        1000baseT/Full\n";
    return fmt::format("Settings for {}:\n"
                       "\tSupported ports: [ TP ]\n"
                       "\tSupported link modes:   {}"
                       "\tSupported pause frame use: No\n"
                       "\tSupports auto-negotiation: Yes\n"
                       "\tSupported FEC modes: Not reported\n"
                       "\tAdvertised link modes:  {}"
                       "\tAdvertised pause frame use: No\n"
                       "\tAdvertised auto-negotiation: Yes\n"
                       "\tAdvertised FEC modes: Not reported\n"
                       "{}"
                       "\tAuto-negotiation: on\n"
                       "\tPort: Twisted Pair\n"
                       "\tPHYAD: 0\n"
                       "\tTransceiver: internal\n"
                       "\tMDI-X: {} (auto)\n"
                       "\tSupports Wake-on: umbg\n"
                       "\tWake-on: d\n"
                       "        Current message level: 0x00000007 (7)\n"
                       "                               drv probe link\n",
                       name, modes, modes, speed_lines(line), line.link ? "off" : "Unknown") +
           link_line(line.link);
}

std::string bond_settings(const Line &line) {
    return "Settings for bond0:\n"
           "\tSupported ports: [  ]\n"
           "\tSupported link modes:   Not reported\n"
           "\tSupported pause frame use: No\n"
           "\tSupports auto-negotiation: No\n"
           "\tSupported FEC modes: Not reported\n"
           "\tAdvertised link modes:  Not reported\n"
           "\tAdvertised pause frame use: No\n"
           "\tAdvertised auto-negotiation: No\n"
           "\tAdvertised FEC modes: Not reported\n" +
           speed_lines(line) +
           "\tAuto-negotiation: off\n"
           "\tPort: Other\n"
           "\tPHYAD: 0\n"
           "\tTransceiver: internal\n" +
           link_line(line.link);
}

} // namespace

const std::vector<std::string> &network_kinds() {
    static const std::vector<std::string> kinds = {"none", "two", "bond"};
    return kinds;
}

Network new_network(const std::string &kind) {
    Network network;
    if (kind != "none")
        network.ports.resize(most_ports);
    network.bonded = kind == "bond";
    network.active = network.bonded ? 0 : no_port;
    return network;
}

int port_speed(const std::string &word) {
    static const std::map<std::string, int> speeds = {
        {"10", 10}, {"100", 100}, {"1000", 1000}, {"2500", 2500}, {"10000", 10000}};
    const auto found = speeds.find(word);
    return found == speeds.end() ? 0 : found->second;
}

std::string act_on_network(State &state, const Action &action) {
    Network &network = state.network;
    if (action.kind == Kind::bond_fails_over)
        return fail_over(network);
    if (action.number > static_cast<int>(network.ports.size()))
        return fmt::format("there is no port {}", action.number);
    if (action.kind == Kind::port_runs) {
        network.ports.at(static_cast<std::size_t>(action.number - 1)).speed =
            static_cast<int>(action.value);
        return {};
    }
    return set_link(network, action.number - 1, action.kind == Kind::port_gets_link);
}

std::string bonding_text(const Network &network) {
    if (!network.bonded)
        return {};
    std::string text = fmt::format("Ethernet Channel Bonding Driver: v6.1.0-56-amd64\n\n"
                                   "Bonding Mode: fault-tolerance (active-backup)\n"
                                   "Primary Slave: None\n"
                                   "Currently Active Slave: {}\n"
                                   "MII Status: {}\n"
                                   "MII Polling Interval (ms): 100\n"
                                   "Up Delay (ms): 0\n"
                                   "Down Delay (ms): 0\n"
                                   "Peer Notification Delay (ms): 0\n",
                                   network.active == no_port ? "None" : port_name(network.active),
                                   network.active == no_port ? "down" : "up");
    for (int index = 0; index < static_cast<int>(network.ports.size()); ++index)
        text += slave_text(network, index);
    return text;
}

std::string ethtool_text(const Network &network, const std::string &device) {
    if (device == "lo")
        return "Settings for lo:\n" + link_line(true);
    if (device == "bond0" && network.bonded) {
        const bool up = network.active != no_port;
        return bond_settings(
            {up, up ? network.ports.at(static_cast<std::size_t>(network.active)).speed : 0});
    }
    for (int index = 0; index < static_cast<int>(network.ports.size()); ++index) {
        const Port &port = network.ports.at(static_cast<std::size_t>(index));
        if (device == port_name(index))
            return port_settings(device, {port.link, port.speed});
    }
    return {};
}

} // namespace zavsim
