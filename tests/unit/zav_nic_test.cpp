// Ethernet ports and bonds.
#include "harness.h"

namespace {

using harness::data;
using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

class Nic : public harness::Appliance {
  protected:
    Nic() { record().shell = ScriptedShell{}; }

    int ask(int minor, int number) {
        dev = {ZAV_DEV_NIC, minor, number, 0};
        info = {9, {9, 9, 9, 9}, 9, 9};
        return checked([this] { return zavGetStateNic(&dev, &info); });
    }
    int port(int number) { return ask(ZAV_MINDEV_NIC_ETH, number); }
    int bond(int number) { return ask(ZAV_MINDEV_NIC_BOND, number); }

    void expect(int state, int value) const {
        EXPECT_EQ(info.type, ZAV_EVENT_NET);
        EXPECT_EQ(info.dev, dev);
        EXPECT_EQ(info.state, state);
        EXPECT_EQ(info.value, value);
    }
    void expect_untouched() const { EXPECT_EQ(info.type, 9); }

    static void ethtool(const std::string &interface, const std::string &text) {
        record().shell->first("/sbin/ethtool " + interface + " 2>&1", prints(text));
    }
    static void active_slave(const std::string &line) {
        record().shell->first("grep \"Currently Active Slave\"", prints(line));
    }

    zavDevice dev = {};
    zavNetState info = {};
};

const std::string kUp = "Settings for eth0:\n\tSpeed: 1000Mb/s\n\tDuplex: Full\n"
                        "\tLink detected: yes\n";

TEST_F(Nic, PortHasLinkAndSpeed) {
    ethtool("eth0", kUp);
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_UP, 1000);
    EXPECT_EQ(record().commands, (std::vector<std::string>{"/sbin/ethtool eth0 > /dev/null  2>&1",
                                                           "/sbin/ethtool eth0 2>&1"}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Nic, PortIsNumberedFrom1) {
    for (int number = 1; number <= 4; ++number) {
        record().commands.clear();
        EXPECT_EQ(port(number), ZAV_RC_OK);
        EXPECT_EQ(record().commands[1], "/sbin/ethtool eth" + std::to_string(number - 1) + " 2>&1");
    }
    for (const int number : {0, 5, -1}) {
        record().commands.clear();
        EXPECT_EQ(port(number), ZAV_RC_ERR_EINVAL);
        expect(ZAV_NET_ERR, 0);
        EXPECT_TRUE(record().commands.empty());
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Nic, PortHasTheSpeedInMegabits) {
    const std::pair<const char *, int> rows[] = {
        {"1000Mb/s", 1000}, {"100Mb/s", 100}, {"10Mb/s", 10}, {"Unknown!", 0}};
    for (const auto &[speed, value] : rows) {
        ethtool("eth1", std::string("Speed: ") + speed + "\nLink detected: no\n");
        EXPECT_EQ(port(2), ZAV_RC_OK);
        expect(ZAV_NET_DOWN, value);
    }
}

TEST_F(Nic, PortWithAnotherSpeedIsAnError) {
    for (const char *speed : {"2500Mb/s", "10000Mb/s", "40000Mb/s", "fast", ""}) {
        ethtool("eth0", std::string("Link detected: yes\nSpeed: ") + speed + "\nx\n");
        EXPECT_EQ(port(1), ZAV_RC_ERR_NIC) << speed;
        expect(ZAV_NET_UP, 0);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Nic, PortWithAnotherLinkIsAnError) {
    ethtool("eth0", "Speed: 100Mb/s\nLink detected: maybe\n");
    EXPECT_EQ(port(1), ZAV_RC_ERR_NIC);
    expect(ZAV_NET_ERR, 100);
}

TEST_F(Nic, PortWithoutALinkLineHasNoState) {
    ethtool("eth0", "Speed: 100Mb/s\n");
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_ERR, 100);
    ethtool("eth0", "");
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_ERR, 0);
}

TEST_F(Nic, PortsLastLineCountsOnlyWithItsEnd) {
    ethtool("eth0", "Speed: 100Mb/s\nLink detected: yes");
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_ERR, 100);
    ethtool("eth0", "Speed: 2500Mb/s");
    EXPECT_EQ(port(1), ZAV_RC_OK);
}

TEST_F(Nic, PortsLinesAreReadInPiecesOf79Characters) {
    ethtool("eth0", std::string(79, 'x') + "Speed: 10Mb/s\nLink detected: yes\n");
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_UP, 10);
    ethtool("eth0", std::string(76, 'x') + "Speed: 10Mb/s\n");
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_ERR, 0);
}

TEST_F(Nic, PortThatEthtoolDoesNotKnowDoesNotExist) {
    record().shell->first("> /dev/null", exits(75));
    EXPECT_EQ(port(1), ZAV_RC_OK);
    expect(ZAV_NET_NOT_EXIST, 0);
    EXPECT_EQ(record().commands.size(), 1U);
}

TEST_F(Nic, PortNeedsAPipe) {
    record().shell->first("ethtool eth0 2>&1", no_start());
    EXPECT_EQ(port(1), ZAV_RC_ERR_ESTRPIPE);
    expect(ZAV_NET_ERR, 0);
}

TEST_F(Nic, BondIsItsActivePort) {
    for (int active = 1; active <= 4; ++active) {
        const std::string name = "eth" + std::to_string(active - 1);
        active_slave("Currently Active Slave: " + name + "\n");
        ethtool(name, "Speed: 100Mb/s\nLink detected: yes\n");
        record().commands.clear();
        EXPECT_EQ(bond(1), ZAV_RC_OK);
        expect(ZAV_NET_UP, 100);
        EXPECT_EQ(record().commands,
                  (std::vector<std::string>{
                      "cat /proc/net/bonding/bond0  >/dev/null 2>&1",
                      "cat /proc/net/bonding/bond0 | grep \"Currently Active Slave\" 2>&1",
                      "/sbin/ethtool " + name + " > /dev/null  2>&1",
                      "/sbin/ethtool " + name + " 2>&1"}));
    }
    EXPECT_EQ(bond(2), ZAV_RC_OK);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Nic, BondWithoutAnActivePortIsDown) {
    active_slave("Currently Active Slave: None\n");
    EXPECT_EQ(bond(1), ZAV_RC_OK);
    expect(ZAV_NET_DOWN, 0);
}

TEST_F(Nic, BondThatNamesNoPortIsNoDevice) {
    for (const char *line : {"", "Currently Active Slave: eth0"}) {
        active_slave(line);
        EXPECT_EQ(bond(1), ZAV_RC_ERR_ENODEV) << line;
        expect(ZAV_NET_ERR, 0);
    }
}

TEST_F(Nic, BondWithAStrangersPortIsAnError) {
    for (const char *line :
         {"Currently Active Slave: eth4\n", "Currently Active Slave: enp1s0\n"}) {
        active_slave(line);
        EXPECT_EQ(bond(1), ZAV_RC_ERR_NIC);
        expect(ZAV_NET_ERR, 0);
    }
}

TEST_F(Nic, BondThatThereIsNotDoesNotExist) {
    record().shell->first("bond1  >/dev/null", exits(1));
    EXPECT_EQ(bond(2), ZAV_RC_OK);
    expect(ZAV_NET_NOT_EXIST, 0);
    for (const int number : {0, 3, -1}) {
        EXPECT_EQ(bond(number), ZAV_RC_ERR_EINVAL);
        expect(ZAV_NET_ERR, 0);
    }
}

TEST_F(Nic, BondNeedsAPipeAndItsPort) {
    record().shell->first("grep", no_start());
    EXPECT_EQ(bond(1), ZAV_RC_ERR_ESTRPIPE);
    active_slave("Currently Active Slave: eth0\n");
    ethtool("eth0", "Link detected: yes\nSpeed: 2500Mb/s\n");
    EXPECT_EQ(bond(1), ZAV_RC_ERR_NIC);
    expect(ZAV_NET_ERR, 0);
    record().shell->first("eth0 > /dev/null", exits(75));
    EXPECT_EQ(bond(1), ZAV_RC_OK);
    expect(ZAV_NET_NOT_EXIST, 0);
}

// What a current system prints for two ports with and without a bond.
TEST_F(Nic, ReadsACurrentSystem) {
    struct Row {
        const char *machine;
        int first_state, first_value; // eth0
        int bond_rc, bond_state, bond_value;
    };
    for (const Row &row :
         {Row{"bond-active-backup", ZAV_NET_UP, 1000, ZAV_RC_OK, ZAV_NET_UP, 1000},
          {"bond-failover", ZAV_NET_DOWN, 0, ZAV_RC_OK, ZAV_NET_UP, 1000},
          {"bond-none", ZAV_NET_DOWN, 0, ZAV_RC_OK, ZAV_NET_DOWN, 0},
          {"bond-round-robin", ZAV_NET_UP, 1000, ZAV_RC_ERR_ENODEV, ZAV_NET_ERR, 0},
          {"bond-slave-admin-down", ZAV_NET_DOWN, 1000, ZAV_RC_OK, ZAV_NET_UP, 1000},
          {"no-bond", ZAV_NET_UP, 1000, ZAV_RC_OK, ZAV_NET_NOT_EXIST, 0}}) {
        const std::string folder = std::string("captures/") + row.machine + "/";
        record().shell = ScriptedShell{};
        ethtool("eth0", data(folder + "ethtool-eth0.txt"));
        ethtool("eth1", data(folder + "ethtool-eth1.txt"));
        active_slave(data(folder + "bond0-active.txt"));
        if (row.machine == std::string("no-bond"))
            record().shell->first("bond0  >/dev/null", exits(1));
        EXPECT_EQ(port(1), ZAV_RC_OK) << row.machine;
        expect(row.first_state, row.first_value);
        EXPECT_EQ(bond(1), row.bond_rc) << row.machine;
        expect(row.bond_state, row.bond_value);
    }
}

TEST_F(Nic, ChecksItsArgumentsInThisOrder) {
    dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0};
    info = {9, {9, 9, 9, 9}, 9, 9};
    EXPECT_EQ(zavGetStateNic(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetStateNic(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetStateNic(&dev, &info), ZAV_RC_ERR_EINVAL);
    dev.type = ZAV_DEV_NIC;
    EXPECT_EQ(zavGetStateNic(&dev, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log,
              (std::vector{row("zavGetStateNic", 1, "[22] Arguments can't be null."),
                           row("zavGetStateNic", 1, "[22] Arguments can't be null."),
                           row("zavGetStateNic", 1,
                               "[22] Device's type is not ZAV_DEV_NIC. Return ZAV_RC_ERR_EINVAL."),
                           row("zavGetStateNic", 1,
                               "[22] Input device's minor_type is neither ZAV_MINDEV_NIC_ETH nor "
                               "ZAV_MINDEV_NIC_BOND. Return ZAV_RC_ERR_EINVAL.")}));
    expect_untouched();
}

TEST_F(Nic, ReadersNeedTheirArguments) {
    dev = {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0};
    EXPECT_EQ(getNicStateETH(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getNicStateETH(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getNicStateBOND(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getNicStateBOND(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    dev.type = ZAV_DEV_LVM; // has no such names
    EXPECT_EQ(getNicStateETH(&dev, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getNicStateBOND(&dev, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
}

} // namespace
