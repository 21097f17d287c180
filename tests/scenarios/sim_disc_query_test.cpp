// The optical drive and its discs as programs and the library find them.
#include "sim_runner.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <iterator>

namespace {

Outcome library(const std::string &script, std::vector<std::string> options = {}) {
    return on_appliance("probe=" DISC_PROBE "\n" + script, std::move(options));
}

std::string capture(const std::string &name) {
    std::ifstream in(CAPTURES "/" + name);
    return {std::istreambuf_iterator<char>(in), {}};
}

struct Disc {
    const char *sentence; // behind "drive gets"
    const char *answer;
};

class EveryDisc : public testing::TestWithParam<Disc> {};

TEST_P(EveryDisc, IsToldByTheLibrary) {
    EXPECT_EQ(
        library(std::string("zavsim act drive gets ") + GetParam().sentence + "; $probe query").out,
        std::string(GetParam().answer) + "\n");
}

// 100 MB are 51200 sectors; a CD's next session begins 11400 behind them.
INSTANTIATE_TEST_SUITE_P(
    Discs, EveryDisc,
    testing::Values(
        Disc{"complete DVD-ROM", "DVD-ROM unknown 0 0"},
        Disc{"blank DVD-R", "DVD-R blank 4590000 4590000"},
        Disc{"appendable DVD-R", "DVD-R appendable 4590000 4483504"},
        Disc{"complete DVD-R", "DVD-R complete 4590000 0"},
        Disc{"unknown DVD-R", "DVD-R unknown 4590000 4483504"},
        Disc{"blank DVD-RAM", "DVD-RAM blank 0 0"},
        Disc{"complete DVD-RAM", "DVD-RAM complete 0 0"},
        Disc{"blank DVD-RW restricted", "DVD-RW restricted blank 4590000 4590000"},
        Disc{"appendable DVD-RW restricted", "DVD-RW restricted appendable 4590000 4487600"},
        Disc{"complete DVD-RW restricted", "DVD-RW restricted complete 4590000 4487600"},
        Disc{"blank DVD-RW sequential", "DVD-RW sequential blank 4590000 4590000"},
        Disc{"appendable DVD-RW sequential", "DVD-RW sequential appendable 4590000 4483504"},
        Disc{"complete DVD-RW sequential", "DVD-RW sequential complete 4590000 0"},
        Disc{"blank DVD+RW", "DVD+RW blank 4590000 4590000"},
        Disc{"appendable DVD+RW", "DVD+RW appendable 4590000 4487600"},
        Disc{"complete DVD+RW", "DVD+RW complete 4590000 4487600"},
        Disc{"complete DVD+RW with 1000 MB used", "DVD+RW complete 4590000 3566000"},
        Disc{"unknown DVD+RW", "DVD+RW unknown 4590000 4487600"},
        Disc{"blank DVD+R", "DVD+R blank 4590000 4590000"},
        Disc{"appendable DVD+R with 200 MB used", "DVD+R appendable 4590000 4381104"},
        Disc{"complete DVD+R", "DVD+R complete 4590000 0"},
        Disc{"blank DVD+R double", "DVD+R double blank 8347000 8347000"},
        Disc{"appendable DVD+R double", "DVD+R double appendable 8347000 8240504"},
        Disc{"complete DVD+R double", "DVD+R double complete 8347000 0"},
        Disc{"blank CD-R", "CD-R blank 719698 719698"},
        Disc{"appendable CD-R", "CD-R appendable 719698 580698"},
        Disc{"complete CD-R", "CD-R complete 719698 0"},
        Disc{"unknown CD-R", "CD-R unknown 719698 0"},
        Disc{"blank CD-RW", "CD-RW blank 719698 719698"},
        Disc{"appendable CD-RW with 200 MB used", "CD-RW appendable 719698 478298"},
        Disc{"complete CD-RW", "CD-RW complete 719698 0"},
        Disc{"unknown CD-RW", "CD-RW unknown 719698 0"}));

TEST(Drive, IsEmptyAtTheStart) {
    EXPECT_EQ(library("$probe query").out, "none unknown 0 0\n");
}

TEST(Drive, IsEmptyAgainWithoutItsDisc) {
    EXPECT_EQ(library("zavsim act drive gets blank CD-R; zavsim act drive loses its disc\n"
                      "$probe query")
                  .out,
              "none unknown 0 0\n");
}

TEST(Drive, GivesItsDiscOutWhenTheTrayOpens) {
    EXPECT_EQ(library("zavsim act drive gets blank CD-R; $probe eject; $probe query").out,
              "none unknown 0 0\n");
}

TEST(Drive, CanBeAway) {
    EXPECT_EQ(library("zavsim act drive vanishes; $probe query; ls /dev/sr0 2>&1 | grep -c such\n"
                      "zavsim act drive appears; $probe query")
                  .out,
              "error\n1\nnone unknown 0 0\n");
}

TEST(Drive, KeepsItsDiscWhileItIsAway) {
    EXPECT_EQ(library("zavsim act drive gets blank DVD-R; zavsim act drive vanishes\n"
                      "zavsim act drive appears; $probe query")
                  .out,
              "DVD-R blank 4590000 4590000\n");
}

TEST(Drive, IsABurnerOrACombo) {
    EXPECT_EQ(library("$probe combo; zavsim act drive is a combo; $probe combo\n"
                      "zavsim act drive is a burner; $probe combo")
                  .out,
              "1\n0\n1\n");
}

TEST(Drive, IsReset) {
    EXPECT_EQ(library("$probe reset; zavsim act drive vanishes; $probe reset").out,
              "CDROM Resetfailed");
}

TEST(Drive, IsDetachedAndAttachedThroughItsAddress) {
    const Outcome outcome =
        library("echo 'scsi remove-single-device 4:0:0:0' > /proc/scsi/scsi; sleep 1; ls /dev/sr0\n"
                "echo 'scsi add-single-device 4:0:0:0' > /proc/scsi/scsi; sleep 1; ls /dev/sr0\n"
                "ls /sys/block/sr0/device");
    EXPECT_EQ(outcome.out, "/dev/sr0\nscsi_device:4:0:0:0\n");
    EXPECT_NE(outcome.err.find("/dev/sr0"), std::string::npos);
}

TEST(DiscInformation, TellsTheDiscsStatus) {
    EXPECT_EQ(library("for state in blank appendable complete unknown; do\n"
                      "zavsim act drive gets $state CD-R; $probe packet\n"
                      "zavsim act drive loses its disc; done")
                  .out,
              "status 0\nstatus 1\nstatus 2\nstatus 3\n");
}

TEST(DiscInformation, IsRefusedWithoutADisc) {
    const Outcome outcome = library("$probe packet");
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.err, "ioctl!: No medium found\n");
}

TEST(Mediainfo, PrintsWhatACurrentLinuxPrints) {
    EXPECT_EQ(on_appliance("dvd+rw-mediainfo /dev/scd0 2>&1").out,
              capture("no-disc/dvd+rw-mediainfo.txt"));
    EXPECT_EQ(on_appliance("zavsim act drive gets complete CD-ROM\n"
                           "dvd+rw-mediainfo /dev/scd0 2>&1; echo $?")
                  .out,
              capture("cd-rom/dvd+rw-mediainfo.txt") + "252\n");
    EXPECT_EQ(on_appliance("zavsim act drive gets complete DVD-ROM with 900 MB used\n"
                           "dvd+rw-mediainfo /dev/scd0")
                  .out,
              capture("dvd-rom/dvd+rw-mediainfo.txt"));
}

TEST(MountedDisc, ShowsWhatIsOnIt) {
    EXPECT_EQ(on_appliance("zavsim act drive gets complete CD-R with 3 MB used\n"
                           "stat -c '%n %s' /media/cdrom/*; grep -c cdrom /etc/mtab\n"
                           "du -sL /media/cdrom; zavsim act drive loses its disc\n"
                           "du -sL /media/cdrom; grep -c cdrom /etc/mtab")
                  .out,
              "/media/cdrom/DATA.BIN 3143680\n1\n3072\t/media/cdrom\n0\t/media/cdrom\n0\n");
}

TEST(Du, IsTheHostsElsewhere) {
    EXPECT_EQ(
        on_appliance("mkdir /tmp/d; head -c 10000 /dev/zero > /tmp/d/f; du -s --apparent-size "
                     "-b /tmp/d/f")
            .out,
        "10000\t/tmp/d/f\n");
}

TEST(Killall, EndsProcessesByTheirNames) {
    EXPECT_EQ(on_appliance("sleep 1000 & killall sleep; echo $?; wait $!; echo $?").out,
              "0\n143\n");
}

TEST(Killall, FailsForANameThatNobodyHas) {
    EXPECT_EQ(on_appliance("sleep 1000 & killall sleep nobody 2>&1; echo $?").out,
              "nobody: no process found\n1\n");
}

TEST(DriveSentences, RefuseWhatCannotBe) {
    const Outcome outcome = on_appliance(
        "zavsim act drive gets blank DVD-ROM; zavsim act drive gets appendable DVD-RAM\n"
        "zavsim act drive gets blank CD-R with 5 MB used\n"
        "zavsim act drive gets complete CD-R with 900 MB used\n"
        "zavsim act drive loses its disc; zavsim act drive appears\n"
        "zavsim act drive gets blank CD-R; zavsim act drive gets blank CD-R\n"
        "zavsim act tool mdadm fails at 40%");
    EXPECT_EQ(outcome.err,
              "zavsim: there is no blank DVD-ROM\nzavsim: there is no appendable DVD-RAM\n"
              "zavsim: nothing is used on a blank disc\nzavsim: a CD-R holds 702 MB\n"
              "zavsim: there is no disc in the drive\nzavsim: the drive is there\n"
              "zavsim: there is a disc in the drive\n"
              "zavsim: only cdrecord, cdrwtool, dvd+rw-format, growisofs, mkisofs, mkudffs, "
              "pktsetup fail at N% (0 to 100)\n");
}

TEST(DriveSentences, RefuseOtherWords) {
    for (const char *words :
         {"drive", "drive gets", "drive gets a disc", "drive gets blank VHS",
          "drive gets complete CD-R with 5 used", "drive writes at 0", "drive is blue"})
        EXPECT_EQ(zavsim({"--", "zavsim", "act", words}).status, 64) << words;
}

} // namespace
