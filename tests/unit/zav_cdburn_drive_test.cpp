// The drive itself.
#include "cdburn.h"

namespace {

using namespace cdburn;

class OpticalDrive : public Drive {
  protected:
    OpticalDrive() { put("/proc/sys/dev/cdrom/info", ""); }

    int send(int quiet, const std::function<int(cdrom_generic_command &)> &answer) {
        record().drive = [answer](unsigned long, void *argument) {
            return answer(*static_cast<cdrom_generic_command *>(argument));
        };
        return checked([&] {
            return wait_cmd(7, &command, buffer, sizeof buffer, CGC_DATA_READ, 1234, quiet);
        });
    }

    // What a call prints to a standard stream.
    static std::string printed(const std::function<void()> &call) {
        testing::internal::CaptureStdout();
        call();
        return testing::internal::GetCapturedStdout();
    }

    cdrom_generic_command command = {};
    unsigned char buffer[8] = {};
};

TEST_F(OpticalDrive, HasItsToolsLookedForInOrder) {
    EXPECT_EQ(checkExternalBin(), ZAV_RC_OK);
    Lines expected;
    for (const std::string tool : {"cdrecord", "mkisofs", "growisofs", "dvd+rw-mediainfo",
                                   "dvd+rw-format", "cdrwtool", "pktsetup", "mkudffs"})
        expected.push_back("which " + tool + " &>/dev/null");
    EXPECT_EQ(record().commands, expected);
}

TEST_F(OpticalDrive, LacksAToolThatIsNotFound) {
    fails("which growisofs");
    EXPECT_EQ(checkExternalBin(), ZAV_RC_ERR);
    EXPECT_EQ(record().commands.size(), 3U);
}

TEST_F(OpticalDrive, IsAComboDriveIfItWritesNoDvd) {
    put("/proc/sys/dev/cdrom/info", "drive name:\t\tsr0\nCan write CD-R:\t\t1\n"
                                    "Can write DVD-R:\t0\nCan write DVD-RAM:\t1\n");
    EXPECT_EQ(checked(zavIsComboDrive), 0);
    put("/proc/sys/dev/cdrom/info", harness::data("captures/cd-rom/cdrom-info.txt"));
    EXPECT_EQ(zavIsComboDrive(), 0);
}

TEST_F(OpticalDrive, IsNoneIfItWritesDvdsOrTheKernelDoesNotSay) {
    put("/proc/sys/dev/cdrom/info", "Can write DVD-R:\t1\nCan write DVD-RAM:\t0\n");
    EXPECT_EQ(zavIsComboDrive(), 1);
    put("/proc/sys/dev/cdrom/info", "Can write DVD-RAM:\t0\n");
    EXPECT_EQ(zavIsComboDrive(), 1);
}

TEST_F(OpticalDrive, IsAComboDriveIfAnyLineSaysSo) {
    put("/proc/sys/dev/cdrom/info", "Can write DVD-R:\t1\nCan write DVD-R:\t0\n");
    EXPECT_EQ(zavIsComboDrive(), 0);
}

TEST_F(OpticalDrive, IsNotKnownWithoutTheKernelsTable) {
    remove("/proc/sys/dev/cdrom/info");
    EXPECT_EQ(zavIsComboDrive(), ZAV_RC_ERR_ENOENT);
}

TEST_F(OpticalDrive, OpensItsTray) {
    zavEjectDVD();
    EXPECT_EQ(record().commands, Lines{"cdrecord dev=/dev/scd0 -eject &>/dev/null"});
}

TEST_F(OpticalDrive, IsReset) {
    record().drive = [](unsigned long request, void *) {
        EXPECT_EQ(request, static_cast<unsigned long>(CDROMRESET));
        return 0;
    };
    EXPECT_EQ(printed([] { checked([] { return cdrom_reset(), 0; }); }), "");
    EXPECT_EQ(record().requests.size(), 1U);
}

TEST_F(OpticalDrive, TellsAResetThatFails) {
    EXPECT_EQ(printed(cdrom_reset), "CDROM Resetfailed");
    remove("/dev/cdrom");
    EXPECT_EQ(printed(cdrom_reset), "CDROM Resetfailed");
}

TEST_F(OpticalDrive, IsDetachedAndAttachedAgain) {
    record().shell->first("ls /sys/block", prints("scsi_device:2:0:0:0\nscsi_device:9:9:9:9\n"));
    checked([] { return rm_add_odd(), 0; });
    EXPECT_EQ(record().commands,
              (Lines{"ls /sys/block/sr0/device | grep \"scsi_device\"",
                     "echo \"scsi remove-single-device 2:0:0:0\" > /proc/scsi/scsi",
                     "echo \"scsi add-single-device 2:0:0:0\" > /proc/scsi/scsi"}));
}

TEST_F(OpticalDrive, StaysAttachedWithoutAnAddress) {
    for (const char *name : {"", "scsi_device\n", "scsi_device:\n", "x scsi_device:1:0:0:0\n",
                             "scsi_device:1\" > /scratch/ran; \"\n"}) {
        record().shell->first("ls /sys/block", prints(name));
        record().commands.clear();
        rm_add_odd();
        EXPECT_EQ(record().commands.size(), 1U) << name;
    }
    record().shell->first("ls /sys/block", no_start());
    record().commands.clear();
    rm_add_odd();
    EXPECT_EQ(record().commands.size(), 1U);
}

TEST_F(OpticalDrive, IsSentAPacketCommand) {
    command.cmd[0] = 0x51;
    command.quiet = 1;
    EXPECT_EQ(send(0,
                   [this](cdrom_generic_command &sent) {
                       EXPECT_EQ(sent.cmd[0], 0x51);
                       EXPECT_EQ(sent.buffer, buffer);
                       EXPECT_EQ(sent.buflen, sizeof buffer);
                       EXPECT_EQ(sent.data_direction, CGC_DATA_READ);
                       EXPECT_EQ(sent.timeout, 1234);
                       EXPECT_EQ(sent.quiet, 0);
                       EXPECT_NE(sent.sense, nullptr);
                       const auto *sense = reinterpret_cast<unsigned char *>(sent.sense);
                       for (int i = 0; i < 64; ++i)
                           EXPECT_EQ(sense[i], 0);
                       return 5;
                   }),
              5);
    EXPECT_EQ(command.sense, nullptr);
}

TEST_F(OpticalDrive, TellsAPacketCommandThatFailsUnlessToldToBeQuiet) {
    const auto failing = [](cdrom_generic_command &) {
        errno = ENOTTY;
        return -1;
    };
    testing::internal::CaptureStderr();
    EXPECT_EQ(send(0, failing), -1);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "ioctl!: Inappropriate ioctl for device\n");
    testing::internal::CaptureStderr();
    EXPECT_EQ(send(1, failing), -1);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST_F(OpticalDrive, IsNotSentANullCommand) {
    EXPECT_EQ(wait_cmd(7, nullptr, buffer, sizeof buffer, CGC_DATA_READ, 0, 1), -1);
    EXPECT_TRUE(record().requests.empty());
}

using OpticalDriveDeathTest = OpticalDrive;

TEST_F(OpticalDriveDeathTest, EndsTheProcessOnSenseDataThatNameAField) {
    const auto with_sense = [this](unsigned char byte15) {
        dup2(2, 1); // what it prints is looked for where the test looks
        send(1, [byte15](cdrom_generic_command &sent) {
            auto *sense = reinterpret_cast<unsigned char *>(sent.sense);
            sense[12] = 0x24;
            sense[13] = 0x0A;
            sense[15] = byte15;
            return 0;
        });
    };
    EXPECT_EXIT(with_sense(0xC0), testing::ExitedWithCode(0), "failed!! sense is c0:24-a\n");
    EXPECT_EQ(send(1,
                   [](cdrom_generic_command &sent) {
                       reinterpret_cast<unsigned char *>(sent.sense)[15] = 0x7F;
                       return 0;
                   }),
              0);
}

} // namespace
