// Ports and bond in the model, whose texts are those that a current system printed.
#include "sim_machines.hpp"

#include "model/actions.hpp"
#include "model/factory.hpp"
#include "model/json.hpp"
#include "model/network.hpp"
#include "model/sentences.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <iterator>

using namespace zavsim;

namespace {

std::string captured(const std::string &name) {
    std::ifstream in(std::string(CAPTURES) + "/" + name, std::ios::binary);
    EXPECT_TRUE(in) << name;
    return {std::istreambuf_iterator<char>(in), {}};
}

State with_nics(const std::string &kind) {
    Wishes wishes;
    wishes.nics = kind;
    return new_appliance(wishes);
}

void expect_captured(const State &state, const std::string &machine) {
    EXPECT_EQ(bonding_text(state.network), captured(machine + "/bond0.txt"));
    for (const std::string device : {"eth0", "eth1", "bond0", "lo"})
        EXPECT_EQ(ethtool_text(state.network, device),
                  captured(machine + "/ethtool-" + device + ".txt"))
            << device;
}

TEST(NetworkTexts, AreThoseOfABondWithBothLinks) {
    expect_captured(four_disks(), "bond-active-backup");
}

TEST(NetworkTexts, AreThoseOfABondThatFailedOver) {
    expect_captured(after(four_disks(), {"port 1 loses its link"}), "bond-failover");
}

TEST(NetworkTexts, AreThoseOfABondWithoutALink) {
    expect_captured(after(four_disks(), {"port 1 loses its link", "port 2 loses its link"}),
                    "bond-none");
}

TEST(NetworkTexts, AreThoseOfPortsAlone) {
    const State state = with_nics("two");
    EXPECT_EQ(ethtool_text(state.network, "eth1"), captured("no-bond/ethtool-eth1.txt"));
    EXPECT_EQ(bonding_text(state.network), "");
    EXPECT_EQ(ethtool_text(state.network, "bond0"), "");
}

TEST(Network, CanHaveNoPorts) {
    State state = with_nics("none");
    EXPECT_EQ(ethtool_text(state.network, "eth0"), "");
    EXPECT_EQ(bonding_text(state.network), "");
    EXPECT_EQ(perform_sentence(state, "port 1 loses its link"), "there is no port 1");
}

TEST(Network, TellsTheSpeedOfAPortInEveryText) {
    const State state = after(four_disks(), {"port 1 runs at 100"});
    for (const char *device : {"eth0", "bond0"})
        EXPECT_NE(ethtool_text(state.network, device).find("\tSpeed: 100Mb/s\n"), std::string::npos)
            << device;
    EXPECT_NE(bonding_text(state.network).find("\nSpeed: 100 Mbps\n"), std::string::npos);
    EXPECT_NE(ethtool_text(state.network, "eth1").find("\tSpeed: 1000Mb/s\n"), std::string::npos);
}

TEST(Bond, StaysWithThePortThatTookOver) {
    const State state = after(four_disks(), {"port 1 loses its link", "port 1 gets its link"});
    EXPECT_EQ(state.network.active, 1);
    EXPECT_EQ(state.network.ports.at(0).failures, 1);
}

TEST(Bond, TakesTheFirstPortThatGetsALink) {
    const State state = after(
        four_disks(), {"port 1 loses its link", "port 2 loses its link", "port 2 gets its link"});
    EXPECT_EQ(state.network.active, 1);
}

TEST(Bond, FailsOverToAPortWithALinkOnly) {
    State state = after(four_disks(), {"bond fails over"});
    EXPECT_EQ(state.network.active, 1);
    EXPECT_EQ(after(state, {"bond fails over"}).network.active, 0);
    state = after(state, {"port 1 loses its link"});
    EXPECT_EQ(perform_sentence(state, "bond fails over"), "no other port has a link");
    State alone = with_nics("two");
    EXPECT_EQ(perform_sentence(alone, "bond fails over"), "there is no bond");
}

TEST(Network, LosesOrGetsALinkOnce) {
    State state = four_disks();
    EXPECT_EQ(perform_sentence(state, "port 1 gets its link"), "port 1 has a link");
    state = after(state, {"port 1 loses its link"});
    EXPECT_EQ(perform_sentence(state, "port 1 loses its link"), "port 1 has no link");
}

TEST(Network, IsKeptInTheStateFile) {
    const State state = after(four_disks(), {"port 1 loses its link", "port 2 runs at 10"});
    EXPECT_EQ(to_text(state_from_text(to_text(state))), to_text(state));
}

TEST(NetworkSentences, RefuseWhatTheyDoNotMean) {
    for (const char *text :
         {"port", "port 1", "port 3 loses its link", "port 1 loses its", "port 1 runs",
          "port 1 runs at", "port 1 runs at 1001", "port 1 runs at full speed", "bond",
          "bond fails", "bond 1 fails over"})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

} // namespace
