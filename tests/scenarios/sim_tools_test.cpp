// The appliance's screens, as its programs see them.
#include "sim_runner.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <regex>

namespace {

bool contains(const std::string &text, const std::string &part) {
    return text.find(part) != std::string::npos;
}

std::string captured(const std::string &file) {
    std::ifstream in(std::string(CAPTURES) + "/" + file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

TEST(Appliance, ShowsItsHealthyArrays) {
    const Outcome run = on_appliance("cat /proc/mdstat; mdadm --detail /dev/swraid/disk2p1");
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(contains(run.out, "md1 : active raid5 sda2[0] sdb2[1] sdc2[2] sdd2[3]\n"
                                  "      976896 blocks super 1.2 level 5, 512k chunk, algorithm 2 "
                                  "[4/4] [UUUU]\n      \n"))
        << run.out;
    EXPECT_TRUE(contains(run.out, "/dev/swraid/disk2p1:\n        Version : 1.2\n"));
    EXPECT_TRUE(contains(run.out, "     Raid Level : raid5\n"));
}

TEST(Appliance, ShowsItsIdentity) {
    const Outcome run = on_appliance("cat /sys/class/dmi/id/product_name /sys/class/dmi/id/"
                                     "product_serial /etc/Kiru/raidtype; wc -c < /dev/nvram");
    EXPECT_EQ(run.out, "SV-2860\nAB1234\nraidtype=5;0;4\n114\n");
}

TEST(Appliance, TakesAnIdentityOfOnesOwn) {
    const Outcome run = on_appliance("cat /sys/class/dmi/id/product_name /sys/class/dmi/id/"
                                     "product_serial /etc/Kiru/raidtype",
                                     {"--model", "2740-2", "--product", "Bench 2740H", "--serial",
                                      "S1", "--raidtype", "raidtype=9;1;2"});
    EXPECT_EQ(run.out, "Bench 2740H\nS1\nraidtype=9;1;2\n");
}

TEST(Appliance, ListsItsDisksToTheScsiLayer) {
    const Outcome run =
        on_appliance("cat /proc/scsi/scsi | grep 'Vendor: ATA' | wc -l", {"--model", "2860-2"});
    EXPECT_EQ(run.out, "2\n");
    EXPECT_EQ(on_appliance("cat /proc/scsi/scsi").out, captured("healthy-4disk/scsi.txt"));
}

TEST(Appliance, HasDisksAndArraysUnderTheirNames) {
    const Outcome run =
        on_appliance("readlink /dev/sata/disk2 /dev/sata/disk4p3 /dev/swraid/disk1p1 "
                     "/dev/md/MD2; ls -d /sys/devices/pci0000:00/0000:00:1f.2/host?");
    EXPECT_TRUE(contains(run.out, "../sdb\n../sdd3\n../md0\n../md2\n"
                                  "/sys/devices/pci0000:00/0000:00:1f.2/host0\n"))
        << run.out;
}

TEST(Appliance, WithoutSoftwareRaidHasNoArrays) {
    const Outcome run =
        on_appliance("cat /sys/class/dmi/id/product_name; grep -c '^md' /proc/mdstat; "
                     "ls /dev/sata",
                     {"--model", "2980"});
    EXPECT_EQ(run.out, "SV-2980\n0\n");
}

TEST(Smartctl, TellsHealthyFailingAndMissingDisksByItsStatus) {
    const Outcome run = on_appliance("smartctl -H -d ata /dev/sata/disk3 >/dev/null; echo $?\n"
                                     "zavsim act disk 3 fails\n"
                                     "smartctl -H -d ata /dev/sata/disk3 | grep result; "
                                     "smartctl -H -d ata /dev/sata/disk3 &>/dev/null; echo $?\n"
                                     "zavsim act disk 3 vanishes\n"
                                     "smartctl -H -d ata /dev/sata/disk3 &>/dev/null; echo $?");
    EXPECT_EQ(run.out, "0\nSMART overall-health self-assessment test result: FAILED!\n8\n2\n");
}

TEST(Smartctl, PrintsWhatACurrentOnePrints) {
    const Outcome run = on_appliance("smartctl -H -d ata /dev/sata/disk1", {"--tools", "current"});
    EXPECT_EQ(run.out, captured("healthy-4disk/smartctl-disk1.txt"));
}

TEST(Mdadm, FailsRemovesAndAddsAMember) {
    const Outcome run =
        on_appliance("for o in -f -r -a; do mdadm /dev/md0 $o /dev/sata/disk4p1; done; "
                     "cat /proc/mdstat");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.err, "mdadm: set /dev/sata/disk4p1 faulty in /dev/md0\n"
                       "mdadm: hot removed /dev/sata/disk4p1\n"
                       "mdadm: added /dev/sata/disk4p1\n");
    EXPECT_TRUE(std::regex_search(
        run.out, std::regex("md0 : active raid1 sdd1\\[4\\] sda1\\[0\\] sdb1\\[1\\] sdc1\\[2\\]\n"
                            "      97280 blocks super 1.2 \\[4/3\\] \\[UUU_\\]\n"
                            "      \\[>\\.{20}\\]  recovery =  0\\.")))
        << run.out;
}

TEST(Mdadm, OfTodaySaysWhatItSays) {
    const Outcome run =
        on_appliance("exec 2>&1; for a in 1 2; do m=/dev/md$((a-1)) p=/dev/sata/disk4p$a\n"
                     "mdadm $m -f $p; mdadm $m -r $p; echo $?; mdadm $m --remove $p; "
                     "mdadm $m -a $p; done",
                     {"--tools", "current"});
    std::string expected;
    for (const std::string name : {"md0", "md1"})
        expected += captured("member-failed/fail-" + name + ".txt") +
                    captured("member-failed-after-r/remove-" + name + ".txt") + "0\n" +
                    captured("degraded-3disk/remove-" + name + ".txt") +
                    captured("resyncing/add-" + name + ".txt");
    EXPECT_EQ(run.out, expected);
}

TEST(Mdadm, OfTodayNamesWhatIsNotThere) {
    const Outcome run =
        on_appliance("exec 2>&1; mdadm --detail /dev/md3; echo $?; zavsim act disk 4 "
                     "vanishes; mdadm /dev/md1 -f /dev/sata/disk4p2; echo $?; "
                     "mdadm --misc --query /dev/sata/disk9p3; echo $?; "
                     "mdadm --query --examine --scan /dev/sata/disk9p1; echo $?",
                     {"--tools", "current"});
    EXPECT_EQ(run.out, captured("other-partitions/detail-missing.txt") + "1\n" +
                           captured("disk-vanished/fail-by-name.txt") + "1\n" +
                           captured("other-partitions/misc-query-missing.txt") + "1\n0\n");
}

TEST(Mdadm, OfTodayRefusesTheLastMemberOfAMirror) {
    const Outcome run =
        on_appliance("exec 2>&1; for n in 4 3 2; do mdadm /dev/md0 -f "
                     "/dev/sata/disk${n}p1; done; mdadm /dev/md0 -f /dev/sata/disk1p1; "
                     "echo $?",
                     {"--tools", "current"});
    EXPECT_TRUE(contains(run.out, captured("raid10-pair-fail-refused/fail.txt") +
                                      captured("raid10-pair-fail-refused/fail-last.txt") + "2\n"))
        << run.out;
}

TEST(Mdadm, TellsWhichArrayAPartitionBelongsTo) {
    const Outcome run = on_appliance("mdadm --query --examine --scan /dev/sata/disk3p1; "
                                     "mdadm --misc --query /dev/sata/disk3p1");
    EXPECT_TRUE(
        contains(run.out, "ARRAY /dev/md/MD0 level=raid1 metadata=1.2 num-devices=4 UUID="));
    EXPECT_TRUE(
        contains(run.out, "/dev/sata/disk3p1: device 2 in 4 device active raid1 /dev/md0."));
}

TEST(Mdadm, TakesANodeMadeFromItsOwnTableForAVanishedMember) {
    const Outcome run = on_appliance(
        "exec 2>&1; zavsim act disk 4 vanishes\n"
        "set -- $(mdadm --detail /dev/md0 | grep 'faulty spare')\n"
        "mknod /dev/sata/hotrmtmp b $2 $3 && mdadm /dev/md0 -f /dev/sata/hotrmtmp; "
        "mdadm /dev/md0 -r /dev/sata/hotrmtmp; rm /dev/sata/hotrmtmp; grep ^md0 /proc/mdstat");
    EXPECT_EQ(run.out, "mdadm: set /dev/sata/hotrmtmp faulty in /dev/md0\n"
                       "mdadm: hot removed /dev/sata/hotrmtmp\n"
                       "md0 : active raid1 sda1[0] sdb1[1] sdc1[2]\n");
}

TEST(Mdadm, SaysWhatItDoesNotSimulate) {
    const Outcome run = on_appliance("mdadm --grow /dev/md1 --bitmap=internal");
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.err, "mdadm: --grow is not simulated\n");
}

// What changes is written down in the order in which it was seen, at whatever pace the machine has.
TEST(Replacement, RunsFromFailureToNormalByItself) {
    const ScratchFile scenario("at 20s disk 3 fails\n"
                               "at 70s disk 3 vanishes\n"
                               "at 120s disk 3 appears\n"
                               "at 170s disk 3 joins\n");
    const Outcome run = on_appliance(R"(
        look() {
            block=$(grep -A2 ^md1 /proc/mdstat)
            members=$(echo "$block" | grep -o '\[[U_]*\]$')
            sync=$(echo "$block" | grep -o 'recovery\|DELAYED')
            test -e /dev/sata/disk3 && disk=present || disk=gone
            echo $members $disk $sync
        }
        for i in $(seq 1000); do
            now=$(look)
            test "$now" != "$last" && echo "$now"
            last=$now
            test $i -gt 100 -a "$now" = '[UUUU] present' && break
            sleep 2
        done)",
                                     {"--scenario", scenario.path(), "--time-scale", "150"});
    EXPECT_EQ(run.out, "[UUUU] present\n"
                       "[UU_U] present\n"
                       "[UU_U] gone\n"
                       "[UU_U] present\n"
                       "[UU_U] present DELAYED\n"
                       "[UU_U] present recovery\n"
                       "[UUUU] present\n");
}

TEST(Replacement, ADetachedDiskKeepsItsContent) {
    const Outcome run = on_appliance(
        "echo -ne '\\x4D\\x10' | dd of=/dev/sata/disk4 bs=1 seek=440 count=2 conv=notrunc "
        "2>/dev/null\n"
        "echo -n 'scsi remove-single-device 3 0 0 0' > /proc/scsi/scsi; sleep 1\n"
        "ls /dev/sata | grep -c disk4; echo -n 'scsi add-single-device 3 0 0 0' > /proc/scsi/scsi\n"
        "sleep 1; dd if=/dev/sata/disk4 bs=1 skip=440 count=2 2>/dev/null | od -An -tx1",
        {"--time-scale", "4"});
    EXPECT_EQ(run.out, "0\n 4d 10\n");
}

TEST(Replacement, NoCommandToTheKernelIsLost) {
    const Outcome run = on_appliance(
        "c=/proc/scsi/scsi; for i in $(seq 25); do\n"
        "echo -n 'scsi remove-single-device 3 0 0 0' > $c; mdadm --detail /dev/md0 >/dev/null\n"
        "mdadm /dev/md0 -f /dev/sata/disk1p9 2>/dev/null; test -e /dev/sata/disk4 && echo lost\n"
        "echo -n 'scsi add-single-device 3 0 0 0' > $c\n"
        "mdadm /dev/md0 -f /dev/sata/disk1p9 2>/dev/null; mdadm /dev/md0 -f /dev/sda9 2>/dev/null\n"
        "test -e /dev/sata/disk4 || echo lost; done; echo done");
    EXPECT_EQ(run.out, "done\n");
}

TEST(Faults, AToolPrintsGarbage) {
    const Outcome run =
        on_appliance("zavsim act tool mdadm prints 'no such\nthing'; mdadm --detail "
                     "/dev/md0; echo; echo $?; zavsim act tool mdadm works again; "
                     "mdadm --detail /dev/md0 | head -n 1");
    EXPECT_EQ(run.out, "no such\nthing\n0\n/dev/md0:\n");
}

TEST(Faults, AToolExitsWithAStatus) {
    EXPECT_EQ(
        on_appliance("zavsim act tool smartctl exits 3; smartctl -H -d ata /dev/sata/disk1").status,
        3);
}

TEST(Faults, AToolIsMissing) {
    const Outcome run =
        on_appliance("zavsim act tool mdadm is missing; /sbin/mdadm --detail /dev/md0; "
                     "echo $?; zavsim act tool mdadm works again; ls /sbin/mdadm");
    EXPECT_EQ(run.out, "127\n/sbin/mdadm\n");
}

TEST(Faults, AToolHangsInApplianceTime) {
    const Outcome run =
        on_appliance("zavsim act tool mdadm hangs 30s; s=$(date +%s%N); mdadm --detail "
                     "/dev/md0 >/dev/null; e=$(date +%s%N); echo $(((e - s) / 1000000))",
                     {"--time-scale", "50"});
    const int milliseconds = std::stoi(run.out);
    EXPECT_GE(milliseconds, 600);
    EXPECT_LT(milliseconds, 30000); // what it takes on a clock that is not scaled
}

TEST(Faults, HappenByScenario) {
    const ScratchFile scenario("at 200s tool mdadm prints \"busy\"\n"); // ten of the host's
    const Outcome run =
        on_appliance("mdadm --detail /dev/md0 | head -n 1; sleep 210; mdadm --detail "
                     "/dev/md0",
                     {"--scenario", scenario.path(), "--time-scale", "20"});
    EXPECT_EQ(run.out, "/dev/md0:\nbusy");
}

TEST(Acting, RefusesWhatCannotBe) {
    const Outcome run = on_appliance("zavsim act disk 3 sings; echo $?; zavsim act disk 3 appears; "
                                     "echo $?");
    EXPECT_EQ(run.out, "64\n1\n");
    EXPECT_EQ(run.err, "zavsim: disk 3 fails, vanishes, appears, joins, detaches or "
                       "attaches\n"
                       "zavsim: disk 3 is in its slot\n");
}

TEST(Acting, TheModelIsShownAsJson) {
    const Outcome run = on_appliance("zavsim state");
    EXPECT_EQ(run.out.rfind("{\n", 0), 0U);
    EXPECT_TRUE(contains(run.out, "\"level\": \"raid5\""));
}

TEST(Log, RecordsEndInTheMessagesFile) {
    const Outcome run = on_appliance("logger -t probe -p daemon.alert 'a message'; sleep 0.3; "
                                     "cat /var/log/messages");
    EXPECT_TRUE(std::regex_search(run.out, std::regex("^<25>.* probe(\\[[0-9]+\\])?: a message\n")))
        << run.out;
}

} // namespace
