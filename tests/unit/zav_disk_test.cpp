// Is a disk present and healthy?
#include "harness.h"

#include <cerrno>
#include <climits>

namespace {

using harness::record;
using harness::row;

constexpr zavDevice kDisk3 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};

class Disk : public harness::Appliance {
  protected:
    Disk() { four_disk_model(); }

    // Asks with a record full of garbage.
    int ask(zavDevice dev) {
        info = {9, {9, 9, 9, 9}, 9};
        const size_t open_before = open_descriptors();
        const int rc = zavGetStateDisk(&dev, &info);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        return rc;
    }

    void expect_untouched() const {
        EXPECT_EQ(info.type, 9);
        EXPECT_EQ(info.dev, (zavDevice{9, 9, 9, 9}));
        EXPECT_EQ(info.state, 9);
    }

    void expect_filled(const zavDevice &dev, int state) const {
        EXPECT_EQ(info.type, 16010);
        EXPECT_EQ(info.dev, dev);
        EXPECT_EQ(info.state, state);
    }

    static void insert(int disk) { put("/dev/sata/disk" + std::to_string(disk), ""); }
    static void smartctl_exits(int status) {
        tool("/bin/smartctl", "noise on standard output\n", status);
    }

    zavHddState info = {};
};

TEST_F(Disk, ThatIsHealthyIsFound) {
    insert(3);
    smartctl_exits(0);
    testing::internal::CaptureStdout();
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    expect_filled(kDisk3, ZAV_HDD_FOUND);
    EXPECT_EQ(record().commands,
              std::vector<std::string>{"smartctl -H -d ata /dev/sata/disk3 &>/dev/null"});
    EXPECT_TRUE(record().log.empty());
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(Disk, ThatSmartctlCannotOpenIsAbsent) {
    insert(3);
    smartctl_exits(2);
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_ABSENT);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Disk, WithAnyOtherExitStatusIsFailed) {
    insert(3);
    for (const int status : {1, 3, 4, 8, 64, 127, 255}) {
        smartctl_exits(status);
        EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
        expect_filled(kDisk3, ZAV_HDD_FAILED);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Disk, WithoutSmartctlIsFailed) {
    insert(3);
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_FAILED); // the shell exits with 127
}

TEST_F(Disk, WhoseCheckIsKilledIsFailed) {
    insert(3);
    record().system_status = 9; // killed by a signal: the exit status in it is 0
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_FAILED);
}

TEST_F(Disk, WithoutAShellIsUndecided) {
    insert(3);
    for (const int status : {-1, 127}) {
        record().log.clear();
        record().system_status = status;
        EXPECT_EQ(ask(kDisk3), ZAV_RC_ERR);
        expect_filled(kDisk3, 0);
        EXPECT_EQ(record().log,
                  std::vector{row("getDiskStateSATA", 4,
                                  "[128] system() function call returns failure.\n")});
    }
}

TEST_F(Disk, ThatIsMissingIsAbsentAfterTwoGraceWaits) {
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_ABSENT);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    EXPECT_EQ(record().log,
              std::vector{row("getDiskStateSATA", 4,
                              "[19] Device /dev/sata/disk3 not found[1]. ErrCode[0x2] No such file "
                              "or directory")});
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(Disk, ThatComesUpDuringAGraceWaitIsChecked) {
    for (const size_t wait : {1U, 2U}) {
        remove("/dev/sata/disk3");
        smartctl_exits(0);
        record().sleeps.clear();
        record().during_sleep = [=](size_t waits) {
            if (waits == wait)
                insert(3);
        };
        EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
        expect_filled(kDisk3, ZAV_HDD_FOUND);
        EXPECT_EQ(record().sleeps.size(), wait);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Disk, WhoseNodeIsInaccessibleIsAnError) {
    remove("/dev/sata");
    put("/dev/sata", "a file where the directory should be");
    EXPECT_EQ(ask(kDisk3), ZAV_RC_ERR);
    expect_filled(kDisk3, ZAV_HDD_ABSENT);
    EXPECT_EQ(record().sleeps, (std::vector{10U, 10U}));
    std::vector<harness::LogRow> expected;
    for (const char *attempt : {"1", "2", "3"})
        expected.push_back(row("getDiskStateSATA", 4,
                               std::string("[19] access device /dev/sata/disk3 failed for ") +
                                   attempt + " times. ErrCode[0x14] Not a directory"));
    EXPECT_EQ(record().log, expected);
}

TEST_F(Disk, WhoseNodeHasNoDeviceIsMissing) {
    insert(3);
    record().access_error = ENODEV;
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_ABSENT);
    EXPECT_EQ(record().log,
              std::vector{row("getDiskStateSATA", 4,
                              "[19] Device /dev/sata/disk3 not found[1]. ErrCode[0x13] No such "
                              "device")});
}

TEST_F(Disk, TheLastAttemptDecidesWhetherTheNodeIsMissing) {
    remove("/dev/sata");
    put("/dev/sata", "");
    record().during_sleep = [](size_t waits) {
        if (waits == 2)
            remove("/dev/sata");
    };
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_ABSENT);
    ASSERT_EQ(record().log.size(), 3U);
    EXPECT_EQ(record().log[2].text,
              "[19] Device /dev/sata/disk3 not found[1]. ErrCode[0x2] No such "
              "file or directory");
}

TEST_F(Disk, ArgumentsMustNotBeNull) {
    zavDevice dev = kDisk3;
    EXPECT_EQ(zavGetStateDisk(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetStateDisk(&dev, nullptr), ZAV_RC_ERR_EINVAL);
    const auto refused =
        row("zavGetStateDisk", 1, "[22] Arguments can't be null. Return ZAV_RC_ERR_EINVAL.");
    EXPECT_EQ(record().log, (std::vector{refused, refused}));
}

TEST_F(Disk, ReaderTakesNoNullPointers) {
    zavDevice dev = kDisk3;
    EXPECT_EQ(getDiskStateSATA(nullptr, &info), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(getDiskStateSATA(&dev, nullptr), ZAV_RC_ERR_EINVAL);
}

TEST_F(Disk, ReaderAnswersByItself) {
    insert(3);
    smartctl_exits(0);
    zavDevice dev = kDisk3;
    EXPECT_EQ(checked([&] { return getDiskStateSATA(&dev, &info); }), ZAV_RC_OK);
    EXPECT_EQ(info.state, ZAV_HDD_FOUND);
}

TEST_F(Disk, ReaderNeedsAnAddressThatHasAName) {
    zavDevice dev = {0, ZAV_MINDEV_HDD_SATA, 3, 0};
    info.state = 9;
    EXPECT_EQ(checked([&] { return getDiskStateSATA(&dev, &info); }), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(info.state, 9);
    EXPECT_TRUE(record().sleeps.empty());
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(Disk, OtherDeviceTypesAreRefused) {
    EXPECT_EQ(ask({ZAV_DEV_RAID, ZAV_MINDEV_HDD_SATA, 3, 1}), ZAV_RC_ERR_EINVAL);
    expect_untouched();
    EXPECT_EQ(record().log, std::vector{row("zavGetStateDisk", 1,
                                            "[22] Device's type is not ZAV_DEV_HDD. Return "
                                            "ZAV_RC_ERR_EINVAL.")});
}

TEST_F(Disk, PartitionsAreRefusedWithoutAWord) {
    for (const int part : {1, -1}) {
        EXPECT_EQ(ask({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, part}), ZAV_RC_ERR_EINVAL);
        expect_untouched();
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Disk, OtherMinorTypesAreRefusedWithTheRecordFilled) {
    for (const int minor : {ZAV_MINDEV_HDD_IUFD, ZAV_MINDEV_HDD_EUFD, ZAV_MINDEV_RAID_SW, 0}) {
        record().log.clear();
        const zavDevice dev = {ZAV_DEV_HDD, minor, 3, 0};
        testing::internal::CaptureStdout();
        EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
        expect_filled(dev, 0);
        EXPECT_EQ(record().log,
                  std::vector{row("zavGetStateDisk", 1,
                                  "[22] device's minor type is not "
                                  "ZAV_MINDEV_HDD_SATA/ZAV_MINDEV_HDD_SAS/ZAV_MINDEV_HDD_HWSATA. "
                                  "Not allowed and return ZAV_RC_ERR_EINVAL.")});
    }
}

TEST_F(Disk, SlotsGoFromOneToTheModelsMaximum) {
    smartctl_exits(0);
    insert(1);
    insert(4);
    EXPECT_EQ(ask({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0}), ZAV_RC_OK);
    EXPECT_EQ(ask({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 4, 0}), ZAV_RC_OK);
    EXPECT_TRUE(record().log.empty());
    for (const int slot : {0, 5, -1, INT_MAX}) {
        record().log.clear();
        const zavDevice dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
        EXPECT_EQ(ask(dev), ZAV_RC_ERR_EINVAL);
        expect_filled(dev, 0);
        EXPECT_EQ(record().log, std::vector{row("getDiskStateSATA", 4,
                                                "[22] dev->disk(" + std::to_string(slot) +
                                                    ") is not acceptable.")});
    }
}

TEST_F(Disk, OfATwoDiskModelMaySitInAnySlot) {
    two_disk_model();
    smartctl_exits(0);
    insert(4);
    EXPECT_EQ(ask({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 4, 0}), ZAV_RC_OK);
    expect_filled({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 4, 0}, ZAV_HDD_FOUND);
}

TEST_F(Disk, EveryKnownModelPassesTheGate) {
    model("SV-2980\n", "t;0;4\n");
    smartctl_exits(0);
    insert(3);
    EXPECT_EQ(ask(kDisk3), ZAV_RC_OK);
    expect_filled(kDisk3, ZAV_HDD_FOUND);
}

TEST_F(Disk, WithoutAKnownModelIsUndecided) {
    model("SV-3000\n", "t;0;4\n");
    EXPECT_EQ(ask(kDisk3), 0x1301);
    expect_filled(kDisk3, 0);
    EXPECT_TRUE(record().log.empty());
}

} // namespace
