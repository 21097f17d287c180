// A whole exchange of a disk with the command lines that the library issues, in its order.
#include "sim_runner.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <regex>

namespace {

std::string captured(const std::string &file) {
    std::ifstream in(std::string(CAPTURES) + "/" + file, std::ios::binary);
    EXPECT_TRUE(in) << file;
    return {std::istreambuf_iterator<char>(in), {}};
}

// Disk 1 tells what disk 4 ($T) belongs to.
const std::string library = R"SH(
exec 2>/tmp/errors
S=/dev/sata/disk1 T=/dev/sata/disk4

# The array of a partition of disk 1 and its level, by the words of the scan.
scan() {
    array= level=
    for word in $(/sbin/mdadm --query --examine --scan $1 2>&1 | tr '= \t' '\n\n\n'); do
        case $word in
            /dev/md*) test -z "$array" && array=$word ;;
            raid0|raid1|raid5|raid10|linear) test -z "$level" && level=$word ;;
        esac
    done
    test -n "$array" -a -n "$level"
}

release_volumes() {
    for v in 1 2; do
        /bin/umount /mnt/internal/data1-$v 2>&1
        /usr/sbin/lvremove -f /dev/DataVG1/LogVol$v 2>&1
    done
    /usr/sbin/vgremove DataVG1 >/dev/null 2>&1
    /usr/sbin/pvremove $1 >/dev/null 2>&1
    sleep 2
    /sbin/mdadm --manage --stop $1 &>/dev/null || echo "$1 does not stop"
}

remove_vanished() {
    set -- $1 $(/sbin/mdadm --detail $1 | grep "faulty spare" 2>&1)
    mknod /dev/sata/hotrmtmp b $3 $4
    /sbin/mdadm $1 -f /dev/sata/hotrmtmp 2>&1
    /sbin/mdadm $1 -r /dev/sata/hotrmtmp 2>&1
    rm /dev/sata/hotrmtmp
}

remove_disk() {
    present=yes
    for p in 15 14 13 12 11 10 9 8 7 6 5 4 3 2 1; do
        test -e ${S}p$p || continue
        test -e ${T}p$p || present=no
        scan ${S}p$p || continue
        case $level$present in
            raid0*|linear*) release_volumes $array ;;
            *yes) /sbin/mdadm $array -f ${T}p$p 2>&1; sleep 2
                  /sbin/mdadm $array -r ${T}p$p 2>&1; sleep 1 ;;
            *no) remove_vanished $array ;;
        esac
    done >/tmp/removal
    echo "scsi remove-single-device 3 0 0 0" > /proc/scsi/scsi
    for i in $(seq 600); do test -e $T || return; sleep 10; done
    echo "$T is there"
}

create_again() {
    /bin/dd if=/dev/zero of=${T}p2 bs=1M count=1 &>/dev/null
    echo 'y' | mdadm --create $1 --force --level=$2 --raid-devices=4 --metadata=1.2 --name=MD1 /dev/sata/disk1p2 /dev/sata/disk2p2 /dev/sata/disk3p2 /dev/sata/disk4p2 &>/dev/null
    sleep 10
    /usr/bin/hbqSetup.sh lvmrestore 2>&1
}

prepare_disk() {
    echo "scsi add-single-device 3 0 0 0" > /proc/scsi/scsi
    for i in $(seq 600); do test -e $T && break; sleep 10; done
    mdadm --zero-superblock $T &>/dev/null
    /bin/dd if=/dev/zero of=$T bs=2M count=1 &>/dev/null
    /sbin/sfdisk -d $S | sfdisk $T &>/dev/null
    echo -ne "\x4D\x10" | dd of=$T bs=1 seek=440 count=2 &>/dev/null
}

add_disk() {
    prepare_disk
    for p in 1 2 3 4 5 6 7 8 9 10 11 12 13 14 15; do
        test -e ${S}p$p -a -e ${T}p$p || continue
        scan ${S}p$p || continue
        if test -e $array; then
            /sbin/mdadm $array -a ${T}p$p 2>&1
        else
            create_again $array $level
        fi
    done >/tmp/addition
}

new_disk() { zavsim act disk 4 vanishes; zavsim act disk 4 appears; sleep 1; }

arrays() { grep -A 1 '^md' /proc/mdstat | grep -o '^md[0-9]* : active [a-z0-9]*\|\[[U_]*\]$'; }

settled() {
    for i in $(seq 2000); do
        grep -q 'recovery\|resync' /proc/mdstat || break
        sleep 5
    done
}

volumes() {
    vgs DataVG1 &>/dev/null && grep -o '/mnt/internal/[^ ]*' /etc/mtab
    od -An -tx1 -j440 -N2 $T
}
)SH";

const std::string healthy_volumes = "/mnt/internal/data1-1\n/mnt/internal/data1-2\n 4d 10\n";

std::string arrays_of(const std::string &level, const std::string &data_pattern,
                      const std::string &pattern) {
    const std::string data = data_pattern.empty() ? "" : data_pattern + "\n";
    return "md2 : active raid1\n" + pattern + "\nmd1 : active " + level + "\n" + data +
           "md0 : active raid1\n" + pattern + "\n";
}

Outcome run_exchange(const std::string &level, const std::string &script) {
    return on_appliance(library + script + "\ncat /tmp/errors",
                        {"--level", level, "--time-scale", "200"});
}

class Exchange : public testing::TestWithParam<std::string> {};

TEST_P(Exchange, OfADiskThatIsThereEndsWithWholeArrays) {
    const Outcome run = run_exchange(
        GetParam(), "remove_disk; arrays; new_disk; add_disk; settled; arrays; volumes");
    EXPECT_EQ(run.out, arrays_of(GetParam(), "[UUU_]", "[UUU_]") +
                           arrays_of(GetParam(), "[UUUU]", "[UUUU]") + healthy_volumes);
}

TEST_P(Exchange, OfADiskThatVanishedEndsWithWholeArrays) {
    const Outcome run = run_exchange(
        GetParam(), "zavsim act disk 4 vanishes; remove_disk; grep -c '(F)' /proc/mdstat; "
                    "arrays; zavsim act disk 4 appears; add_disk; settled; arrays; "
                    "volumes");
    EXPECT_EQ(run.out, "0\n" + arrays_of(GetParam(), "[UUU_]", "[UUU_]") +
                           arrays_of(GetParam(), "[UUUU]", "[UUUU]") + healthy_volumes);
}

INSTANTIATE_TEST_SUITE_P(Levels, Exchange, testing::Values("raid1", "raid5", "raid10"),
                         [](const auto &each) { return each.param; });

class ExchangeWithoutRedundancy : public testing::TestWithParam<std::string> {
  protected:
    // The other arrays by themselves: whether the data array stands first depends on its creation.
    static std::string sorted_end() { return "settled; arrays | sort; volumes"; }
    static std::string expected_end() {
        return "[UUUU]\n[UUUU]\nmd0 : active raid1\nmd1 : active " + GetParam() +
               "\nmd2 : active raid1\n" + healthy_volumes;
    }
};

TEST_P(ExchangeWithoutRedundancy, MakesTheDataArrayAnew) {
    const Outcome run = run_exchange(
        GetParam(), "zavsim act volume 1-1 fills 50%; remove_disk; arrays; vgs DataVG1; echo $?; "
                    "new_disk; add_disk; df | grep -c ' 14 .*/mnt/internal'; " +
                        sorted_end());
    EXPECT_EQ(run.out.substr(0, run.out.rfind("  Volume group")),
              "md2 : active raid1\n[UUU_]\nmd0 : active raid1\n[UUU_]\n5\n2\n" + expected_end());
}

TEST_P(ExchangeWithoutRedundancy, ReleasesAnArrayThatLostItsLastDisk) {
    const Outcome run = run_exchange(
        GetParam(), "zavsim act disk 4 vanishes; mdadm --detail /dev/md1 | grep -c FAILED; "
                    "remove_disk; grep -c ^md1 /proc/mdstat; "
                    "zavsim act disk 4 appears; add_disk; " +
                        sorted_end());
    EXPECT_EQ(run.out, "1\n0\n" + expected_end());
}

TEST_P(ExchangeWithoutRedundancy, LeavesAnArrayThatSomebodyUses) {
    const Outcome run =
        run_exchange(GetParam(), "zavsim act volume 1-1 is busy; remove_disk; cat /tmp/removal; "
                                 "ls /dev/DataVG1; grep -c ^md1 /proc/mdstat");
    EXPECT_NE(run.out.find("target is busy"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("device is busy"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("/dev/md/MD1 does not stop\n"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("LogVol1\n1\n"), std::string::npos) << run.out;
}

INSTANTIATE_TEST_SUITE_P(Levels, ExchangeWithoutRedundancy, testing::Values("raid0", "linear"),
                         [](const auto &each) { return each.param; });

TEST(SetupScript, MakesWhatIsNotThereAndNothingElse) {
    const Outcome run = run_exchange(
        "raid5", R"(cd /dev/sata; for c in createraid lvmrestore; do /usr/bin/hbqSetup.sh $c; done
        for v in 1 2; do zavsim act volume 1-$v is inactive; done; zavsim act array 2 stops
        for c in createraid lvmrestore; do /usr/bin/hbqSetup.sh $c; done
        for d in 1 2 3 4; do mdadm --zero-superblock disk${d}p2; done; arrays
        for c in createraid lvmrestore; do /usr/bin/hbqSetup.sh $c; done; arrays; volumes)");
    EXPECT_EQ(run.out, "hbqSetup: the data array is there\n"
                       "hbqSetup: the data array carries DataVG1\n"
                       "hbqSetup: the data array is stopped, its disks still tell of it\n"
                       "hbqSetup: there is no data array\n"
                       "md2 : active raid1\n[UUUU]\nmd0 : active raid1\n[UUUU]\n"
                       "hbqSetup: made the data array: raid5 over 4 disks\n"
                       "hbqSetup: made DataVG1 on /dev/md1 with 2 volumes\n"
                       "md1 : active raid5\n[UUUU]\nmd2 : active raid1\n[UUUU]\n"
                       "md0 : active raid1\n[UUUU]\n" +
                           healthy_volumes);
}

TEST(ArrayCreation, OfTodayTakesANumberFromTheTop) {
    const Outcome run = on_appliance(R"(exec 2>&1
        for v in 1 2; do zavsim act volume 1-$v is inactive; done; mdadm --stop /dev/md1
        for d in 1 2; do /bin/dd if=/dev/zero of=/dev/sata/disk${d}p2 bs=1M count=1 status=none; done
        echo 'y' | mdadm --create /dev/md/MD1 --force --level=raid1 --raid-devices=2 --metadata=1.2 --name=MD1 /dev/sata/disk1p2 /dev/sata/disk2p2
        readlink /dev/md/MD1; ls /dev/md /dev/swraid | xargs; /sbin/mdadm --detail /dev/md1; echo $?
        grep -A 1 md127 /proc/mdstat
        /sbin/mdadm --query --examine --scan /dev/sata/disk1p2 | sed 's/UUID=[0-9a-f:]*/UUID/')",
                                     {"--model", "2860-2", "--tools", "current"});
    const std::string scan =
        std::regex_replace(captured("recreate-by-name/examine-scan-disk1p2.txt"),
                           std::regex("UUID=[0-9a-f:]*"), "UUID");
    EXPECT_EQ(run.out, captured("recreate-by-name/stop.txt") +
                           captured("recreate-by-name/create.txt") +
                           "../md127\n/dev/md: MD0 MD1 MD2 /dev/swraid: disk1p1 disk3p1\n" +
                           captured("recreate-by-name/mdadm-detail-md1.txt") +
                           "1\nmd127 : active raid1 sdb2[1] sda2[0]\n"
                           "      326656 blocks super 1.2 [2/2] [UU]\n" +
                           scan);
}

TEST(ArrayCreation, AsksBeforeItWritesOverAnArray) {
    const std::string create = "mdadm --create /dev/md/MD1 --force --level=raid0 --raid-devices=2 "
                               "/dev/sata/disk1p2 /dev/sata/disk2p2 &>/tmp/said; echo $?; ";
    const Outcome run = on_appliance("for v in 1 2; do zavsim act volume 1-$v is inactive; done; " +
                                         create + "mdadm --stop /dev/md1; " + create + "echo n | " +
                                         create + "echo y | " + create +
                                         "grep -c 'part of a raid array' /tmp/said; "
                                         "grep ^md1 /proc/mdstat; pvs | grep -c md1",
                                     {"--model", "2860-2"});
    EXPECT_EQ(run.out, "1\n1\n1\n0\n2\nmd1 : active raid0 sda2[0] sdb2[1]\n0\n");
}

TEST(ArrayCreation, RefusesWhatCannotBe) {
    for (const std::string devices :
         {"/dev/sata/disk1p1 /dev/sata/disk2p1", "/dev/sata/disk1p2 /dev/sata/disk1p2",
          "/dev/sata/disk1 /dev/sata/disk2", "/dev/sata/disk1p2 /dev/sata/disk9p2",
          "/dev/sata/disk1p2"}) {
        const Outcome run = on_appliance(
            "for v in 1 2; do zavsim act volume 1-$v is inactive; done; zavsim act array 2 stops; "
            "yes | mdadm --create /dev/md/MD1 --force --level=raid1 --raid-devices=2 " +
            devices + " >/dev/null; echo $?; grep -c ^md1 /proc/mdstat");
        EXPECT_EQ(run.out, "1\n0\n") << devices;
    }
}

TEST(DiskTools, OfTodaySayWhatTheySay) {
    const Outcome run = on_appliance(R"(exec 2>&1
        zavsim act disk 4 vanishes; zavsim act disk 4 appears
        mdadm --zero-superblock /dev/sata/disk4; echo $?
        /sbin/sfdisk -d /dev/sata/disk4 >/dev/null; echo $?
        /sbin/sfdisk -d /dev/sata/disk1 | sfdisk /dev/sata/disk4 &>/dev/null; echo $?
        /sbin/sfdisk -d /dev/sata/disk4 | tail -n +4 | sed s/disk4/disk1/ > /tmp/copy
        /sbin/sfdisk -d /dev/sata/disk1 | tail -n +4 | cmp - /tmp/copy && ls /dev/sata/disk4*
        echo -ne "\x4D\x10" | dd of=/dev/sata/disk4 bs=1 seek=440 count=2 &>/dev/null
        for a in 0 1; do /sbin/mdadm /dev/md$a -a /dev/sata/disk4p$((a + 1)) 2>&1; done
        until test -e /dev/sata/disk4p1; do sleep 0.02; done
        /sbin/mdadm /dev/md0 -a /dev/sata/disk4p1 2>&1)",
                                     {"--tools", "current", "--time-scale", "0.2"});
    EXPECT_EQ(run.out, captured("disk-back/zero-superblock.txt") +
                           "0\nsfdisk: /dev/sata/disk4: does not contain a recognized partition "
                           "table\n1\n0\n/dev/sata/disk4\n/dev/sata/disk4p1\n/dev/sata/disk4p2\n"
                           "/dev/sata/disk4p3\n" +
                           captured("disk-back/add-md0-at-once.txt") +
                           captured("disk-back/add-md1-at-once.txt") +
                           captured("disk-back/add-md0-later.txt"));
}

TEST(DiskTools, RefuseATableThatIsNone) {
    const Outcome run = on_appliance(R"(
        zavsim act disk 4 vanishes; zavsim act disk 4 appears; D=/dev/sata/disk4
        try() { sfdisk $D &>/dev/null && echo made || echo refused; }
        try < /dev/null; echo garbage | try; head -c 4096 /dev/urandom | try
        echo '/dev/sata/disk1p1 : start= 2048, size= 99999999, type=fd' | try
        printf 'a1 : start= 2048, size= 4096, type=fd\na2 : start= 4096, size= 4096, type=fd\n' | try
        printf 'a1 : start= 2048, size= 99999999999999999999, type=fd\n' | try
        sfdisk -d /dev/sata/disk1 | sfdisk /dev/sata/disk2 &>/dev/null && echo made || echo refused
        ls $D*)");
    EXPECT_EQ(run.out, "refused\nrefused\nrefused\nrefused\nrefused\nrefused\nrefused\n"
                       "/dev/sata/disk4\n");
}

TEST(DiskTools, WriteOnADeviceWithoutCuttingItOff) {
    const Outcome run = on_appliance(R"(
        wc -c < /dev/sata/disk4; /bin/dd if=/dev/zero of=/dev/sata/disk4 bs=2M count=1 &>/dev/null
        wc -c < /dev/sata/disk4; od -An -tx1 -j440 -N2 /dev/sata/disk4; ls /dev/sata | grep -c disk4p
        mdadm --query --examine --scan /dev/sata/disk4p1; mdadm --query --examine --scan /dev/sata/disk4p2 | wc -l
        dd if=/dev/zero of=/dev/sata/disk4p3 bs=1M 2>/dev/null; echo $?; wc -c < /dev/sata/disk4p3
        echo text | dd of=/tmp/plain status=none; cat /tmp/plain)");
    EXPECT_EQ(run.out, "536870912\n536870912\n 00 00\n3\n1\n1\n99614720\ntext\n");
}

TEST(DiskTools, FindTheFactorysMarkOnItsDisks) {
    const Outcome run = on_appliance(
        "for d in 1 2 3 4; do od -An -tx1 -j440 -N2 /dev/sata/disk$d; done; zavsim act disk 4 "
        "vanishes; zavsim act disk 4 appears; od -An -tx1 -j440 -N2 /dev/sata/disk4; zavsim act "
        "disk 4 joins; "
        "od -An -tx1 -j440 -N2 /dev/sata/disk4");
    EXPECT_EQ(run.out, " 4d 10\n 4d 10\n 4d 10\n 4d 10\n 00 00\n 4d 10\n");
}

} // namespace
