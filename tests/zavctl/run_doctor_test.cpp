// doctor on appliances that lack something.
#include "run.h"

namespace {

// The severity that doctor gives to a check, and everything that is not ok besides.
nlohmann::json checks(const std::string &script, const std::vector<std::string> &options = {}) {
    const nlohmann::json answer = parsed(on_zav(script + " zavctl doctor --json", options).out);
    nlohmann::json found;
    for (const nlohmann::json &check : answer.at("checks"))
        if (check["severity"] != "ok" || !found.contains(check["check"]))
            found[check["check"].get<std::string>()] = check["severity"];
    return found;
}

} // namespace

TEST(RunDoctor, TheSimulatedApplianceIsSound) {
    const Outcome run = on_zav("zavctl doctor");
    EXPECT_EQ(run.status, 0) << run.out;
    EXPECT_FALSE(holds(run.out, " critical ")) << run.out;
}

TEST(RunDoctor, SeesAShellThatIsNotBash) {
    EXPECT_EQ(checks("", {"--shell", "dash"})["shell"], "critical");
}

TEST(RunDoctor, SeesMissingTools) {
    EXPECT_EQ(checks("zavsim act tool smartctl is missing;")["smartctl"], "critical");
    EXPECT_EQ(checks("zavsim act tool mdadm is missing;")["mdadm"], "critical");
}

TEST(RunDoctor, SeesASmartctlThatAlwaysSucceeds) {
    EXPECT_EQ(checks("zavsim act tool smartctl exits 0;")["smartctl-status"], "critical");
}

TEST(RunDoctor, SeesATodaysMdadmWithoutLevelWords) {
    EXPECT_EQ(checks("", {"--tools", "current"})["mdadm-level"], "warning");
}

TEST(RunDoctor, SeesACheckOfAnArray) {
    EXPECT_EQ(checks("zavsim act array 2 checks;")["mdstat"], "warning");
}

TEST(RunDoctor, SeesAnUnreadableBiosDevice) {
    EXPECT_EQ(checks("rm /dev/nvram;")["nvram"], "warning");
}

TEST(RunDoctor, SeesAMissingRaidtypeFile) {
    EXPECT_EQ(checks("rm /etc/Kiru/raidtype;")["raidtype"], "warning");
}

TEST(RunDoctor, SeesAnUnknownModel) {
    EXPECT_EQ(checks("", {"--product", "Toaster"})["model"], "critical");
}

TEST(RunDoctor, SeesAnUnsupportedDiskCount) {
    EXPECT_EQ(checks("", {"--raidtype", "raidtype=5;0;3"})["raidtype"], "critical");
}

TEST(RunDoctor, SeesWhatVolumesNeed) {
    for (const char *tool : {"vgs", "lvs", "pvs", "vgdisplay", "lvdisplay", "pvdisplay"})
        EXPECT_EQ(checks("zavsim act tool " + std::string(tool) + " is missing;")[tool],
                  "critical");
    EXPECT_EQ(checks("rmdir /etc/Kiru/zav;")["volume-files"], "critical");
}

TEST(RunDoctor, SeesWhatTheExchangeOfADiskNeeds) {
    for (const char *tool : {"udevinfo", "sfdisk", "dd", "hbqSetup.sh"})
        EXPECT_EQ(checks("zavsim act tool " + std::string(tool) + " is missing;")[tool], "warning");
    EXPECT_EQ(checks("", {"--hosts", "ata"})["sata-hosts"], "warning");
}

TEST(RunDoctor, SeesWhatSensorsNetworkAndEventsNeed) {
    EXPECT_EQ(checks("zavsim act tool ethtool is missing;")["ethtool"], "warning");
    EXPECT_EQ(checks("rm /dev/zavevent0;")["event-device"], "warning");
    EXPECT_EQ(checks("rm /dev/zavledevent;")["led-device"], "warning");
    EXPECT_EQ(checks("", {"--bare"})["sensors"], "warning");
    EXPECT_EQ(checks("", {"--bare"})["gpio"], "warning");
}
