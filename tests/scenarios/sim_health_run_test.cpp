// Load, UPS and network as programs and the library's readers meet them.
#include "sim_runner.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

namespace {

Outcome library(const std::string &script, std::vector<std::string> options = {}) {
    return on_appliance("probe=" HEALTH_PROBE "\n" + script, std::move(options));
}

TEST(LoadReaders, SeeAnIdleAppliance) {
    EXPECT_EQ(library("$probe load | grep -v 101:", {"--time-scale", "20"}).out,
              "load 102: 0 0 201\nload 103: 0 41 201\nload 105: 0 37 201\nload 106: 0 5 201\n"
              "load 107: 0 22 201\n/etc/Kiru: 0 12\n");
}

TEST(LoadReaders, SeeTheProcessorAtWork) {
    const std::vector<std::string> scale = {"--time-scale", "10"};
    EXPECT_EQ(library("$probe load | grep -c '101: 0 [0-9] 201'", scale).out, "1\n");
    EXPECT_EQ(library("zavsim act processor load 99%; $probe load | grep -Ec '101: 0 (9[89]|100) "
                      "203'",
                      scale)
                  .out,
              "1\n");
}

TEST(LoadReaders, SeeWhatFillsUp) {
    EXPECT_EQ(
        library("zavsim act swap use 12%; zavsim act file system /var fills 96%\n"
                "zavsim act file system /mnt/buffer fills 91%; zavsim act file system / fills "
                "100%; zavsim act file system /etc/Kiru fills 50%\n"
                "$probe load | grep -v -e 101: -e 106:",
                {"--time-scale", "20"})
            .out,
        "load 102: 0 12 203\nload 103: 0 100 203\nload 105: 0 96 203\nload 107: 0 91 202\n"
        "/etc/Kiru: 0 50\n");
}

TEST(Load, CountersGoOnWithTheAppliancesTime) {
    EXPECT_EQ(on_appliance("read a b c d idle rest < /proc/stat; sleep 5\n"
                           "read a b c d later rest < /proc/stat\n"
                           "[ $((later - idle)) -ge 200 ] && echo they went on",
                           {"--time-scale", "10"})
                  .out,
              "they went on\n");
}

TEST(Load, IsNotThatOfTheHost) {
    EXPECT_EQ(on_appliance("cat /proc/meminfo | head -n 1; grep -c ^cpu /proc/stat").out,
              "MemTotal:        2060000 kB\n2\n");
}

TEST(Load, IsTheHostsInABareRoot) {
    EXPECT_EQ(zavsim({"--bare", "--", "sh", "-c", "readlink /proc/stat /proc/meminfo"}).out,
              "/run/zavsim/proc/stat\n/run/zavsim/proc/meminfo\n");
}

TEST(UpsReaders, SeeAFullBattery) {
    EXPECT_EQ(library("$probe ups").out, "ups: 0 100.0 7\n");
}

TEST(UpsReaders, SeeAPowerCutAtOnceAndItsEnd) {
    EXPECT_EQ(library("zavsim act power fails; $probe ups; cat /var/log/zavapcupsd.event\n"
                      "zavsim act power returns; $probe ups | grep -c ' 7$'")
                  .out,
              "ups: 0 100.0 5\n5 100.0\n1\n");
}

TEST(UpsReaders, SeeTheBatteryRunDown) {
    EXPECT_EQ(library("zavsim act power fails\n"
                      "until $probe ups | grep -q ' [1-8][0-9][.][0-9] 5'; do sleep 20; done\n"
                      "grep STATUS /var/log/apcupsd.status",
                      {"--time-scale", "60"})
                  .out,
              "STATUS   : ONBATT \n");
}

TEST(UpsFiles, AreRewrittenEveryMinuteOfTheAppliance) {
    EXPECT_EQ(on_appliance("f=/var/log/apcupsd.status; cp $f /tmp/first; touch -d @1000 $f\n"
                           "until [ $(stat -c %Y $f) -gt 1000 ]; do sleep 5; done\n"
                           "diff $f /tmp/first | grep -c DATE",
                           {"--time-scale", "60"})
                  .out,
              "2\n");
}

TEST(UpsFiles, KeepAProgramsOwnTextUntilTheNextWriting) {
    EXPECT_EQ(on_appliance("f=/var/log/apcupsd.status; zavsim act ups is silent; echo mine > $f\n"
                           "zavsim act fan 1 stops; cat $f\n"
                           "zavsim act ups works again; grep STATUS $f")
                  .out,
              "mine\nSTATUS   : ONLINE \n");
}

TEST(UpsFiles, AgeWhileTheUpsIsSilent) {
    EXPECT_EQ(library("$probe ups; zavsim act ups is silent\n"
                      "until $probe ups 2>&1 | grep -q 'ups: 19'; do sleep 20; done; echo stale\n"
                      "zavsim act ups works again; $probe ups",
                      {"--time-scale", "60"})
                  .out,
              "ups: 0 100.0 7\nstale\nups: 0 100.0 7\n");
}

TEST(NetworkReaders, SeeTheFactorysBond) {
    EXPECT_EQ(library("$probe network").out,
              "eth0: 0 1000 1\neth1: 0 1000 1\neth2: 0 0 4\nbond0: 0 1000 1\n");
}

TEST(NetworkReaders, SeePortsAloneAndNone) {
    EXPECT_EQ(library("$probe network", {"--nics", "two"}).out,
              "eth0: 0 1000 1\neth1: 0 1000 1\neth2: 0 0 4\nbond0: 0 0 4\n");
    EXPECT_EQ(library("$probe network", {"--nics", "none"}).out,
              "eth0: 0 0 4\neth1: 0 0 4\neth2: 0 0 4\nbond0: 0 0 4\n");
}

TEST(NetworkReaders, SeeLinksAndSpeeds) {
    EXPECT_EQ(
        library("zavsim act port 1 loses its link; zavsim act port 2 runs at 100\n"
                "$probe network; zavsim act port 2 loses its link; $probe network | tail -n 1")
            .out,
        "eth0: 0 0 2\neth1: 0 100 1\neth2: 0 0 4\nbond0: 0 100 1\nbond0: 0 0 2\n");
}

TEST(NetworkReaders, SeeTheBondFailOver) {
    EXPECT_EQ(library("zavsim act port 1 runs at 10; zavsim act bond fails over\n"
                      "grep Active /proc/net/bonding/bond0; $probe network | tail -n 1")
                  .out,
              "Currently Active Slave: eth1\nbond0: 0 1000 1\n");
}

TEST(Ethtool, ComplainsOfAPortThatIsNotThereAsACurrentOneDoes) {
    std::ostringstream said; // read here: an appliance does not see the tests' data everywhere
    said << std::ifstream(CAPTURES "/bond-active-backup/ethtool-eth2-missing.txt").rdbuf();
    ASSERT_FALSE(said.str().empty());
    EXPECT_EQ(on_appliance("/sbin/ethtool eth2 2>&1; echo $?").out, said.str() + "75\n");
}

TEST(Ethtool, RefusesWhatIsNotSimulated) {
    const Outcome run = on_appliance("ethtool -s eth0 speed 100");
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.err, "ethtool: -s is not simulated\n");
}

TEST(Ethtool, CanBeMissing) {
    EXPECT_EQ(library("zavsim act tool ethtool is missing; $probe network | head -n 1").out,
              "eth0: 0 0 4\n");
}

} // namespace
