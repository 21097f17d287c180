// Disks and volumes behind the RAID controller.
#include "harness.h"

#include <cerrno>
#include <cstring>
#include <sys/stat.h>

namespace {

using harness::record;
using harness::row;

constexpr const char *kReportPath = "/etc/Kiru/zav/.raidinfo";
constexpr int kKey = 0x6912;

const std::string kReport = "PCI\n"
                            "M:card\nS:C1\nI:\n"
                            "R:1:Raid Set # 00:1500:4:1234:0\n"
                            "V:1:SYSTEM:3:500:0:1\n"
                            "V:2:DATA:1:1000:42:4\n"
                            "D:1:500.1:1\nD:2:500.1:4\nD:4:500.1:1\n"
                            "H:38:1:2:3:4\n"
                            "RBOD#1\n"
                            "M:HBQE-T500\nS:U1\nI:\n"
                            "R:2:Raid Set # 01:3000:3:123:0\n"
                            "V:1:UNIT1:1:3000:0:2\n"
                            "D:1:1000:1\nD:2:-1:1\nD:3:nan:4\n"
                            "H:45:1:2:3:1.2\n";

class Controller : public harness::Appliance {
  protected:
    Controller() {
        model("SV-2980\n", "raidtype=5;0;4\n");
        put(kReportPath, kReport);
    }

    template <class Call>
    static int checked(const Call &call) {
        const int rc = Appliance::checked(call);
        EXPECT_NE(semaphore_value(kKey), 0) << "the turn at the report has ended";
        return rc;
    }

    static zavDevice on_unit(int type, int minor, int unit, int number) {
        return {type, minor, unit << 8 | number, 0};
    }
};

// ---- The report ----

class ControllerReport : public Controller {
  protected:
    int update(int minor, int disk) {
        zavDevice dev = {ZAV_DEV_HDD, minor, disk, 0};
        memset(&info, 0x55, sizeof info);
        return checked([&] { return updateData(&dev, &info); });
    }

    void expect_zero() const {
        const sRaidSetInfo zero = {};
        EXPECT_EQ(memcmp(&info, &zero, sizeof info), 0);
    }

    sRaidSetInfo info = {};
};

TEST_F(ControllerReport, GivesTheControllersOwnSection) {
    for (const int minor : {ZAV_MINDEV_HDD_HWSATA, ZAV_MINDEV_RAID_HW}) {
        EXPECT_EQ(update(minor, 1), ZAV_RC_OK);
        EXPECT_STREQ(info.raidname, "Raid Set # 00");
        EXPECT_STREQ(info.sVolInfo[1].volname, "DATA");
        EXPECT_EQ(+info.sVolInfo[1].progress, 42);
        EXPECT_EQ(+info.sDiskInfo[1].status, 4);
    }
    EXPECT_EQ(semaphore_value(kKey), 1);
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(ControllerReport, GivesTheSectionOfTheUnitInTheSecondByte) {
    for (const int minor : {ZAV_MINDEV_HDD_SAS, ZAV_MINDEV_RAID_SAS}) {
        EXPECT_EQ(update(minor, 0x55AA0102), ZAV_RC_OK);
        EXPECT_STREQ(info.raidname, "Raid Set # 01");
    }
}

TEST_F(ControllerReport, TakesUnitsFrom1To7) {
    for (int unit = 0; unit < 256; ++unit) {
        const bool known = unit >= 1 && unit <= 7;
        const int rc = known ? unit == 1 ? ZAV_RC_OK : ZAV_RC_ERR_ENODEV : ZAV_RC_ERR_EINVAL;
        EXPECT_EQ(update(ZAV_MINDEV_HDD_SAS, unit << 8 | 1), rc) << unit;
        if (rc != ZAV_RC_OK)
            expect_zero();
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(ControllerReport, TakesTheseMinorTypesOnly) {
    for (int minor = -1; minor < 0x300; ++minor) {
        const bool known = minor == ZAV_MINDEV_HDD_HWSATA || minor == ZAV_MINDEV_RAID_HW ||
                           minor == ZAV_MINDEV_HDD_SAS || minor == ZAV_MINDEV_RAID_SAS;
        EXPECT_EQ(update(minor, 0x101), known ? ZAV_RC_OK : ZAV_RC_ERR_EINVAL) << minor;
        if (!known)
            expect_zero();
    }
}

TEST_F(ControllerReport, RefusesBeforeItWaits) {
    EXPECT_EQ(update(ZAV_MINDEV_HDD_SATA, 1), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(update(ZAV_MINDEV_HDD_SAS, 1), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(semaphore_value(kKey), -1);
}

TEST_F(ControllerReport, NeedsItsArguments) {
    zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0};
    EXPECT_EQ(updateData(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    memset(&info, 0x55, sizeof info);
    EXPECT_EQ(updateData(nullptr, &info), ZAV_RC_ERR_EINVAL);
    expect_zero();
}

TEST_F(ControllerReport, ThatCannotBeOpenedIsLogged) {
    remove(kReportPath);
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR_READINFOFAIL);
    expect_zero();
    EXPECT_EQ(record().log,
              std::vector{row("updateData", 4,
                              "[8961] Failed to open file /etc/Kiru/zav/.raidinfo. Return "
                              "ZAV_RC_ERR_READINFOFAIL.")});
    EXPECT_EQ(semaphore_value(kKey), 1);
}

TEST_F(ControllerReport, WithoutASetIsNoDevice) {
    put(kReportPath, "PCI\nV:1:v:3:1:0:1\nH:1\n");
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR_ENODEV);
    expect_zero();
    put(kReportPath, "");
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR_ENODEV);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(ControllerReport, ThatIsADirectoryIsNoDevice) {
    remove(kReportPath);
    put(std::string(kReportPath) + "/x", "");
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR_ENODEV);
}

TEST_F(ControllerReport, WithoutTheSemaphoreIsLogged) {
    record().semget_fails = true;
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR);
    expect_zero();
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_EQ(record().log[1], row("updateData", 1, "[3] Get Semaphore [26898] failed!!"));
}

TEST_F(ControllerReport, ThatGivesNoTurnIsLogged) {
    record().semop_fails = [](short step) { return step < 0; };
    EXPECT_EQ(update(ZAV_MINDEV_HDD_HWSATA, 1), ZAV_RC_ERR);
    expect_zero();
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("Failed to Lock Semaphore. key[0x1]"), std::string::npos);
    EXPECT_EQ(record().log[1], row("updateData", 1, "[3] semaphore_p [26898] failed!!"));
}

TEST_F(ControllerReport, WhoseTurnCannotBeEndedIsGivenAllTheSame) {
    record().semop_fails = [](short step) { return step > 0; };
    zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0};
    EXPECT_EQ(updateData(&dev, &info), ZAV_RC_OK);
    EXPECT_EQ(+info.raidnum, 1);
    ASSERT_EQ(record().log.size(), 1U);
    EXPECT_NE(record().log[0].text.find("Failed to Unlock Semaphore. key[0x6912]"),
              std::string::npos);
}

// ---- Disks of the controller ----

class ControllerDisk : public Controller {
  protected:
    int ask(int disk) {
        dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, disk, 0};
        info = {9, {9, 9, 9, 9}, 9};
        return checked([&] { return zavGetStateDisk(&dev, &info); });
    }

    void expect(int state) const {
        EXPECT_EQ(info.type, ZAV_EVENT_HDD);
        EXPECT_EQ(info.dev, dev);
        EXPECT_EQ(info.state, state);
    }

    void report_disk(const std::string &line) {
        put(kReportPath, "PCI\nR:1:set:1:4:1234:0\n" + line + "\nH:1\n");
    }

    zavDevice dev = {};
    zavHddState info = {};
};

TEST_F(ControllerDisk, HasTheStatusThatTheReportGives) {
    EXPECT_EQ(ask(1), ZAV_RC_OK);
    expect(ZAV_HDD_FOUND);
    EXPECT_EQ(ask(2), ZAV_RC_OK);
    expect(ZAV_HDD_FAILED);
    report_disk("D:1:5:1234");
    EXPECT_EQ(ask(1), ZAV_RC_OK);
    expect(1234);
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(ControllerDisk, WithoutASizeIsAbsent) {
    EXPECT_EQ(ask(3), ZAV_RC_OK);
    expect(ZAV_HDD_ABSENT);
    for (const char *size : {"0", "-1", "nan", "x", "-0.0"}) {
        report_disk(std::string("D:1:") + size + ":4");
        EXPECT_EQ(ask(1), ZAV_RC_OK);
        expect(ZAV_HDD_ABSENT);
    }
}

TEST_F(ControllerDisk, OfAReportWithoutAControllerIsAbsent) {
    put(kReportPath, "RBOD#1\nR:1:set:1:4:1234:0\nD:1:1:1\nH:1\n");
    EXPECT_EQ(ask(1), ZAV_RC_OK);
    expect(ZAV_HDD_ABSENT);
}

TEST_F(ControllerDisk, PassesOnWhatTheReportFailsWith) {
    remove(kReportPath);
    testing::internal::CaptureStdout();
    EXPECT_EQ(ask(1), ZAV_RC_ERR_READINFOFAIL);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "getDiskStateHWSATA() - UpadteData Failed!\n");
    expect(ZAV_HDD_FOUND);
    record().semget_fails = true;
    EXPECT_EQ(ask(1), ZAV_RC_ERR);
}

TEST_F(ControllerDisk, IsNumbered1To4) {
    for (const int disk : {0, 5, -1, 0x101}) {
        record().log.clear();
        EXPECT_EQ(ask(disk), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().log, std::vector{row("getDiskStateHWSATA", 4,
                                                "[22] dev->disk(" + std::to_string(disk) +
                                                    ") is not acceptable. Return "
                                                    "ZAV_RC_ERR_EINVAL.")});
        expect(0);
    }
    EXPECT_EQ(semaphore_value(kKey), -1);
}

TEST_F(ControllerDisk, IsKnownToItsModelAlone) {
    four_disk_model();
    EXPECT_EQ(ask(77), ZAV_RC_ERR_EINVAL) << "before the number is looked at";
    EXPECT_EQ(record().log,
              std::vector{row("getDiskStateHWSATA", 4,
                              "[22] Current model is not solvane 2980. The device just can be "
                              "queried under model 2980.")});
    expect(0);
}

TEST_F(ControllerDisk, ReaderFillsTheRecordItself) {
    dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 2, 0};
    info = {9, {9, 9, 9, 9}, 9};
    EXPECT_EQ(getDiskStateHWSATA(&dev, &info), ZAV_RC_OK);
    expect(ZAV_HDD_FAILED);
    dev.disk = 5;
    info = {9, {9, 9, 9, 9}, 9};
    EXPECT_EQ(getDiskStateHWSATA(&dev, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(info.state, 9) << "refused before it is filled";
    EXPECT_EQ(getDiskStateHWSATA(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getDiskStateHWSATA(&dev, nullptr), ZAV_RC_ERR_EINVAL);
}

// ---- Disks of a unit ----

class UnitDisk : public Controller {
  protected:
    int ask(int unit, int disk) {
        dev = on_unit(ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, unit, disk);
        info = {9, {9, 9, 9, 9}, 9};
        return checked([&] { return zavGetStateDisk(&dev, &info); });
    }

    void expect(int state, int type = ZAV_DEV_HDD) const {
        zavDevice expected = dev;
        expected.type = type;
        EXPECT_EQ(info.type, ZAV_EVENT_HDD);
        EXPECT_EQ(info.dev, expected);
        EXPECT_EQ(info.state, state);
    }

    zavDevice dev = {};
    zavHddState info = {};
};

TEST_F(UnitDisk, HasTheStatusThatTheReportGives) {
    EXPECT_EQ(ask(1, 1), ZAV_RC_OK);
    expect(ZAV_HDD_FOUND);
}

TEST_F(UnitDisk, WithASizeThatIsNoSizeIsPresent) {
    EXPECT_EQ(ask(1, 2), ZAV_RC_OK);
    expect(ZAV_HDD_FOUND);
    EXPECT_EQ(ask(1, 3), ZAV_RC_OK);
    expect(ZAV_HDD_FAILED);
}

TEST_F(UnitDisk, WithoutASizeIsAbsentAndHasNoType) {
    EXPECT_EQ(ask(1, 4), ZAV_RC_OK);
    expect(ZAV_HDD_ABSENT, 0);
}

TEST_F(UnitDisk, OfAUnitThatTheReportLacksIsAbsent) {
    EXPECT_EQ(ask(2, 1), ZAV_RC_OK);
    expect(ZAV_HDD_ABSENT);
}

TEST_F(UnitDisk, HasAUnitFrom1To7AndANumberFrom1To4) {
    for (const auto &[unit, disk] : {std::pair{0, 1}, {8, 1}, {255, 1}, {1, 0}, {1, 5}, {1, 255}}) {
        EXPECT_EQ(ask(unit, disk), ZAV_RC_ERR_EINVAL) << unit << " " << disk;
        expect(ZAV_HDD_FOUND);
    }
    EXPECT_EQ(ask(0x101, 1), ZAV_RC_ERR_EINVAL) << "what is above the unit belongs to the number";
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(semaphore_value(kKey), -1);
}

TEST_F(UnitDisk, IsAnsweredOnEveryModel) {
    four_disk_model();
    EXPECT_EQ(ask(1, 1), ZAV_RC_OK);
    expect(ZAV_HDD_FOUND);
}

TEST_F(UnitDisk, PassesOnWhatTheReportFailsWith) {
    remove(kReportPath);
    testing::internal::CaptureStdout();
    EXPECT_EQ(ask(1, 1), ZAV_RC_ERR_READINFOFAIL);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "getDiskStateSAS() - UpadteData Failed!\n");
    expect(ZAV_HDD_FOUND);
}

TEST_F(UnitDisk, ReaderTakesTheAddressFromItsOwnAnswer) {
    info = {9, on_unit(ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 1, 1), 9};
    EXPECT_EQ(getDiskStateSAS(&info.dev, &info), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_HDD_FOUND);
    EXPECT_EQ(getDiskStateSAS(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getDiskStateSAS(&info.dev, nullptr), ZAV_RC_ERR_EINVAL);
}

// ---- Volumes ----

class HardwareVolume : public Controller {
  protected:
    HardwareVolume() {
        put("/dev/hwraid/disk1", "");
        put("/dev/hwraid/disk2", "");
        put("/dev/sasraid/r1disk1", "");
    }

    int ask(int minor, int disk, int part = 0) {
        dev = {ZAV_DEV_RAID, minor, disk, part};
        memset(&info, 0x55, sizeof info);
        return checked([&] { return zavGetStateRaid(&dev, &info); });
    }
    int controller(int number, int part = 0) { return ask(ZAV_MINDEV_RAID_HW, number, part); }
    int unit(int unit, int number = 1, int part = 0) {
        return ask(ZAV_MINDEV_RAID_SAS, unit << 8 | number, part);
    }

    void expect(int state, int level, int count, float resync) const {
        EXPECT_EQ(info.type, ZAV_EVENT_RAID);
        EXPECT_EQ(info.dev, dev);
        EXPECT_EQ(+info.state, state);
        EXPECT_EQ(+info.raidlevel, level);
        EXPECT_EQ(+info.raidcount, count);
        EXPECT_EQ(+info.resync, resync);
    }
    void expect_undecided(int state) const {
        expect(state, ZAV_RAIDLVL_NONE, 0, 0.0F);
        for (const zavDevice &member : info.hdddev)
            EXPECT_EQ(member, (zavDevice{0, 0, 0, 0}));
    }
    void expect_untouched() const { EXPECT_EQ(info.type, 0x55555555); }

    zavDevice dev = {};
    zavRaidState info = {};
};

TEST_F(HardwareVolume, OfTheControllerIsWhatTheReportSays) {
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    expect(ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    EXPECT_EQ(controller(2), ZAV_RC_OK);
    expect(ZAV_RAID_RESYNC, ZAV_RAIDLVL_10, 4, 42.0F);
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(HardwareVolume, OfTheControllerHasItsDisksAsMembers) {
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    EXPECT_EQ(info.hdddev[0], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0}));
    EXPECT_EQ(info.hdddev[1], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 2, 0}));
    EXPECT_EQ(info.hdddev[2], (zavDevice{0, 0, 3, 0})) << "no disk";
    EXPECT_EQ(info.hdddev[3], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 4, 0}));
}

TEST_F(HardwareVolume, OfAUnitIsWhatTheReportSays) {
    EXPECT_EQ(unit(1), ZAV_RC_OK);
    expect(ZAV_RAID_DEGRADED, ZAV_RAIDLVL_1, 3, 0.0F);
    EXPECT_EQ(info.hdddev[0], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x101, 0}));
    EXPECT_EQ(info.hdddev[1], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x102, 0}));
    EXPECT_EQ(info.hdddev[2], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x103, 0}));
    EXPECT_EQ(info.hdddev[3], (zavDevice{0, 0, 0x104, 0}));
}

TEST_F(HardwareVolume, HasALevelByTheControllersNumberAndTheDisks) {
    struct Row {
        const char *level;
        const char *disks;
        int expected;
    };
    for (const Row &row : {Row{"1", "4", ZAV_RAIDLVL_10},
                           {"1", "2", ZAV_RAIDLVL_1},
                           {"1", "5", ZAV_RAIDLVL_1},
                           {"3", "4", ZAV_RAIDLVL_5},
                           {"3", "3", ZAV_RAIDLVL_5},
                           {"0", "4", ZAV_RAIDLVL_0},
                           {"2", "4", ZAV_RAIDLVL_0},
                           {"5", "4", ZAV_RAIDLVL_0}}) {
        put(kReportPath, std::string("PCI\nR:1:s:1:") + row.disks + ":12:0\nV:1:v:" + row.level +
                             ":1:0:1\nRBOD#1\n");
        EXPECT_EQ(controller(1), ZAV_RC_OK);
        EXPECT_EQ(+info.raidlevel, row.expected) << row.level << " " << row.disks;
    }
}

TEST_F(HardwareVolume, HidesAMemberWhoseStatusHasBit9) {
    const std::string set = "R:1:s:1:4:1234:0\nV:1:v:3:1:0:1\nD:1:1:512\nD:2:1:4\nD:3:1:1023\n"
                            "D:4:1:1\nH:1\n";
    put(kReportPath, "PCI\n" + set + "RBOD#1\n" + set);
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    EXPECT_EQ(info.hdddev[0], (zavDevice{0, 0, 1, 0}));
    EXPECT_EQ(info.hdddev[1], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 2, 0}));
    EXPECT_EQ(info.hdddev[2], (zavDevice{0, 0, 3, 0}));
    EXPECT_EQ(info.hdddev[3], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 4, 0}));
    EXPECT_EQ(unit(1), ZAV_RC_OK);
    EXPECT_EQ(info.hdddev[0], (zavDevice{0, 0, 0x101, 0}));
    EXPECT_EQ(info.hdddev[3], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x104, 0}));
}

TEST_F(HardwareVolume, KeepsAMemberThatCannotBeAsked) {
    // On another model the controller's disks are unknown, its volumes are not.
    four_disk_model();
    dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0};
    EXPECT_EQ(getRaidStateHW(&dev, &info), ZAV_RC_OK);
    EXPECT_EQ(info.hdddev[0], (zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0}));
    EXPECT_EQ(record().log.size(), 3U) << "one line for every disk";
}

TEST_F(HardwareVolume, TakesAnySizeButZeroForADisk) {
    put(kReportPath, "PCI\nR:1:s:1:4:1234:0\nV:1:v:3:1:0:1\nD:1:-5:1\nD:2:nan:1\nD:3:0:1\nH:1\n");
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    EXPECT_EQ(info.hdddev[0].type, ZAV_DEV_HDD);
    EXPECT_EQ(info.hdddev[1].type, ZAV_DEV_HDD);
    EXPECT_EQ(info.hdddev[2].type, 0);
}

TEST_F(HardwareVolume, ThatTheReportDoesNotTellIsStripedAndStateless) {
    put(kReportPath, "PCI\nR:1:s:1:4:1234:0\nH:1\n");
    EXPECT_EQ(controller(2), ZAV_RC_OK);
    expect(0, ZAV_RAIDLVL_0, 4, 0.0F);
}

TEST_F(HardwareVolume, OfAnEnclosureThatTheReportLacksDoesNotExist) {
    put(kReportPath, "x\n");
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    expect_undecided(ZAV_RAID_NOT_EXIST);
    EXPECT_EQ(unit(1), ZAV_RC_OK);
    expect_undecided(ZAV_RAID_NOT_EXIST);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HardwareVolume, WithoutItsNodeDoesNotExist) {
    remove("/dev/hwraid/disk2");
    EXPECT_EQ(controller(2), ZAV_RC_OK);
    expect_undecided(ZAV_RAID_NOT_EXIST);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    EXPECT_EQ(record().log,
              std::vector{row("getRaidStateHW", 4,
                              "[19] Device /dev/hwraid/disk2 not found[1]. ErrCode[0x2] No such "
                              "file or directory")});
    EXPECT_EQ(semaphore_value(kKey), -1) << "the report is not read";
}

TEST_F(HardwareVolume, OfAUnitWithoutItsNodeDoesNotExist) {
    EXPECT_EQ(unit(2), ZAV_RC_OK);
    expect_undecided(ZAV_RAID_NOT_EXIST);
    EXPECT_EQ(record().log,
              std::vector{row("getRaidStateSAS", 4,
                              "[19] Device /dev/sasraid/r2disk1 not found[1]. ErrCode[0x2] No such "
                              "file or directory")});
}

TEST_F(HardwareVolume, WhoseNodeComesLateIsFound) {
    remove("/dev/hwraid/disk1");
    record().during_sleep = [](size_t count) {
        if (count == 2)
            put("/dev/hwraid/disk1", "");
    };
    EXPECT_EQ(controller(1), ZAV_RC_OK);
    expect(ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 4, 0.0F);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HardwareVolume, WhoseNodeIsNotAccessibleFails) {
    remove("/dev/hwraid");
    put("/dev/hwraid", "a file where the directory was");
    EXPECT_EQ(controller(1), ZAV_RC_ERR);
    expect_undecided(ZAV_RAID_NOT_EXIST);
    ASSERT_EQ(record().log.size(), 3U);
    EXPECT_EQ(record().log[2], row("getRaidStateHW", 4,
                                   "[19] access device /dev/hwraid/disk1 failed for 3 times. "
                                   "ErrCode[0x14] Not a directory"));
}

TEST_F(HardwareVolume, PassesOnWhatTheReportFailsWith) {
    remove(kReportPath);
    testing::internal::CaptureStdout();
    EXPECT_EQ(controller(1), ZAV_RC_ERR_READINFOFAIL);
    expect_undecided(0);
    EXPECT_EQ(unit(1), ZAV_RC_ERR_READINFOFAIL);
    expect_undecided(0);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "getRaidStateHW() - UpadteData Failed!\n"
                                                      "getRaidStateSAS() - UpadteData Failed!\n");
}

TEST_F(HardwareVolume, OfTheControllerIsNumbered1Or2AndHasNoPartition) {
    for (const auto &[disk, part] : {std::pair{0, 0}, {3, 0}, {-1, 0}, {1, 1}, {3, 1}}) {
        EXPECT_EQ(controller(disk, part), ZAV_RC_ERR_EINVAL);
        expect_untouched();
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HardwareVolume, OfAUnitIsItsFirst) {
    for (const auto &[id, number] :
         {std::pair{0, 1}, {8, 1}, {1, 0}, {1, 2}, {1, 255}, {0x101, 1}}) {
        EXPECT_EQ(unit(id, number), ZAV_RC_ERR_EINVAL);
        expect_undecided(0);
    }
    EXPECT_EQ(unit(0, 0, 1), ZAV_RC_ERR_EINVAL);
    expect_untouched();
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(HardwareVolume, ReadersNeedTheirArguments) {
    dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0};
    EXPECT_EQ(getRaidStateHW(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getRaidStateHW(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getRaidStateSAS(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getRaidStateSAS(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    dev.type = ZAV_DEV_NIC; // a type without such names
    EXPECT_EQ(getRaidStateHW(&dev, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(+info.state, 0);
}

TEST_F(HardwareVolume, ReaderTakesTheAddressFromItsOwnAnswer) {
    info.dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 2, 0};
    EXPECT_EQ(getRaidStateHW(&info.dev, &info), ZAV_RC_OK);
    EXPECT_EQ(+info.state, ZAV_RAID_RESYNC);
    info.dev = on_unit(ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 1, 1);
    EXPECT_EQ(getRaidStateSAS(&info.dev, &info), ZAV_RC_OK);
    EXPECT_EQ(+info.state, ZAV_RAID_DEGRADED);
}

} // namespace
