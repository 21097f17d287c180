// The simulated volume tools, called as programs call them.
#include "sim_runner.hpp"

#include <fstream>
#include <gtest/gtest.h>
#include <iterator>

namespace {

bool contains(const std::string &text, const std::string &part) {
    return text.find(part) != std::string::npos;
}

std::string captured(const std::string &file) {
    std::ifstream in(std::string(CAPTURES) + "/" + file, std::ios::binary);
    EXPECT_TRUE(in) << file;
    return {std::istreambuf_iterator<char>(in), {}};
}

const std::vector<std::string> current = {"--tools", "current"};

TEST(VolumeQueries, AreThoseThatTheLibraryIssues) {
    const Outcome run = on_appliance(R"(
        /usr/sbin/vgs &> /tmp/list; cat /tmp/list | grep DataVG1 &>/dev/null; echo $?
        cat /tmp/list | grep DataVG2 &>/dev/null; echo $?
        /usr/sbin/vgs DataVG1 &>/dev/null; echo $?; /usr/sbin/vgs DataVG2 &>/dev/null; echo $?
        /usr/sbin/vgdisplay DataVG1 &> /tmp/sheet
        grep "Cur PV" /tmp/sheet | cut -c 12-; grep "Cur LV" /tmp/sheet | cut -c 12-
        /usr/sbin/vgdisplay -c DataVG1 2>/dev/null | cut -d ':' -f 12
        /usr/sbin/vgcfgbackup -f /etc/Kiru/zav/DataVG1 DataVG1 &> /dev/null; echo $?
        grep -c 'LogVol. {' /etc/Kiru/zav/DataVG1
        /usr/sbin/lvdisplay /dev/DataVG1/LogVol1 2>/dev/null | grep "NOT available"; echo $?
        /usr/sbin/lvs /dev/DataVG1/LogVol1 &> /dev/null; echo $?
        lvdisplay -c /dev/DataVG1/LogVol1 2>/dev/null | cut -d ':' -f 7
        /usr/sbin/pvs /dev/swraid/disk2p1 &> /dev/null; echo $?
        pvdisplay -c /dev/md/MD1 >/dev/null 2>&1; echo $?
        pvdisplay /dev/md1 | grep "VG Name"; pvdisplay -c /dev/md2 >/dev/null 2>&1; echo $?)");
    EXPECT_EQ(run.out,
              "0\n1\n0\n5\n             1\n             2\n974848\n0\n2\n1\n0\n262144\n0\n0\n"
              "  VG Name               DataVG1\n5\n");
    EXPECT_EQ(run.err, "");
}

TEST(VolumeQueries, OfTodaySayWhatTheySay) {
    const std::string script = R"(exec 2>&1
        /usr/sbin/vgs DataVG3; echo $?; /usr/sbin/vgdisplay DataVG3
        /usr/sbin/vgcfgbackup -f /etc/Kiru/zav/DataVG3 DataVG3; ls /etc/Kiru/zav
        /usr/sbin/lvs /dev/DataVG3/LogVol1; /usr/sbin/lvdisplay /dev/DataVG3/LogVol1; echo $?
        pvs /dev/md/MD1; lvs /dev/DataVG1/LogVol1; lvdisplay -c /dev/DataVG1/LogVol1
        zavsim act array 3 stops; pvs /dev/md2 >/dev/null; echo $?)";
    const std::string missing = captured("vg-missing/vgs-DataVG3.txt");
    EXPECT_EQ(on_appliance(script, current).out,
              missing + "5\n" + captured("vg-missing/vgdisplay-DataVG3.txt") +
                  captured("vg-missing/vgcfgbackup-DataVG3.txt") +
                  captured("vg-missing/lvs-DataVG3-LogVol1.txt") +
                  captured("vg-missing/lvdisplay-DataVG3-LogVol1.txt") + "5\n" +
                  captured("healthy-4disk/pvs-_dev_md_MD1.txt") +
                  captured("healthy-4disk/lvs-DataVG1-LogVol1.txt") +
                  captured("healthy-4disk/lvdisplay-c-DataVG1-LogVol1.txt") +
                  "  Cannot use /dev/md2: device not found\n5\n");
}

TEST(VolumeQueries, FailWhereTheArrayDoes) {
    const Outcome run = on_appliance(R"(
        zavsim act disk 1 vanishes; zavsim act disk 2 vanishes
        /usr/sbin/vgs &> /tmp/list; grep -c DataVG1 /tmp/list; grep -c '^  DataVG1 ' /tmp/list
        for q in 'vgs DataVG1' 'lvs /dev/DataVG1/LogVol1' 'pvs /dev/md1' 'vgs PrimaryOSVG'; do
            /usr/sbin/$q &>/dev/null; echo $?
        done; umount /mnt/internal/data1-1; echo $?)");
    EXPECT_EQ(run.out, "2\n0\n5\n5\n5\n0\n0\n");
}

// A group over an array and a disk that is taken away.
TEST(VolumeQueries, TellAGroupThatIsNotWhole) {
    const std::string script =
        "zavsim act disk 4 vanishes; zavsim act disk 4 appears; vgextend DataVG1 /dev/sata/disk4 "
        "&>/dev/null; vgs DataVG1 | tail -n 1; zavsim act disk 4 detaches; "
        "vgs &> /tmp/list; grep -c DataVG1 /tmp/list; vgs DataVG1 &>/dev/null; echo $?; "
        "lvremove -f DataVG1/LogVol1 &>/dev/null; echo $?; zavsim act disk 4 attaches; "
        "vgs DataVG1 &>/dev/null; echo $?";
    const std::string whole = "  DataVG1   2   2   0 wz--n- <1.43g <1.24g\n";
    EXPECT_EQ(on_appliance(script).out, whole + "1\n5\n5\n0\n");
    EXPECT_EQ(on_appliance(script, current).out, whole + "1\n0\n5\n0\n");
}

TEST(VolumeQueries, FindNoGroupOnAStoppedArray) {
    const Outcome run = on_appliance("zavsim act volume 1-1 is inactive; zavsim act volume 1-2 is "
                                     "inactive; zavsim act array 2 stops; vgs DataVG1; echo $?; "
                                     "vgs | wc -l; ls /dev | grep -c -e DataVG1 -e md1");
    EXPECT_EQ(run.out, "5\n2\n0\n");
}

TEST(VolumeQueries, TellAnInactiveVolume) {
    const Outcome run = on_appliance(
        "zavsim act volume 1-2 is inactive; ls /dev/DataVG1; "
        "/usr/sbin/lvdisplay /dev/DataVG1/LogVol2 2>/dev/null | grep 'NOT available'; "
        "lvchange -ay DataVG1/LogVol2; ls /dev/DataVG1; lvchange -an DataVG1/LogVol1; echo $?",
        current);
    EXPECT_EQ(run.out,
              "LogVol1\n" + captured("lv-inactive/not-available.txt") + "LogVol1\nLogVol2\n5\n");
}

TEST(VolumeQueries, AreThereOnModelsWithoutGroups) {
    for (const std::string model : {"2740", "2980"}) {
        const Outcome run =
            on_appliance("cd /usr/sbin; ls vgs lvs pvs vgdisplay lvdisplay pvdisplay | wc -l; "
                         "vgs; lvs; pvs; echo $?; grep -c LogVol /etc/mtab; df | wc -l",
                         {"--model", model});
        EXPECT_EQ(run.out, "6\n0\n0\n1\n") << model;
    }
}

TEST(VolumeTools, VanishAndHangAsAnyTool) {
    const Outcome run =
        on_appliance("zavsim act tool vgs is missing; ls /usr/sbin/vgs 2>&1 | grep -c 'No such'; "
                     "zavsim act tool vgs works again; ls /usr/sbin/vgs; "
                     "zavsim act tool lvremove exits 7; lvremove -f /dev/DataVG1/LogVol1; echo $?; "
                     "zavsim act tool pvs prints \"odd\"; pvs; lvs | wc -l");
    EXPECT_EQ(run.out, "1\n/usr/sbin/vgs\n7\nodd5\n");
}

TEST(VolumeTools, AreAllKnownToTheSentences) {
    const Outcome run = on_appliance(
        "for t in $(zavsim act tool none is missing 2>&1 | sed 's/.*one of: //; s/,//g'); do\n"
        "zavsim act tool $t is missing; type -P $t; zavsim act tool $t works again\n"
        "type -P $t >/dev/null && echo back; done | sort | uniq -c | sed 's/ *//'; "
        "find /usr/bin /usr/sbin -lname '*/zavsim' | wc -l");
    EXPECT_EQ(run.out, "38 back\n39\n"); // and zavsim itself
}

TEST(VolumeTools, SayWhatTheyDoNotSimulate) {
    for (const std::string command :
         {"vgs -o name", "lvs -a", "pvs --noheadings", "vgdisplay -s", "vgcreate -s 8 A /dev/md2",
          "lvremove /dev/DataVG1/LogVol2", "df -h", "df /tmp", "mount -o ro a b", "umount -l a",
          "mkfs.ext4 -L x /dev/dm-0", "sfdisk -l /dev/sda", "hbqSetup.sh format", "udevinfo -a",
          "mdadm --create /dev/md3 --level=raid6 --raid-devices=4 a b c d",
          "dd if=/dev/zero of=/dev/sda bs=1 count=1 conv=sync"}) {
        const Outcome run = on_appliance("zavsim state > /tmp/before; " + command +
                                         "; echo $?; zavsim state > /tmp/after; "
                                         "sed -i /now/d /tmp/before /tmp/after; "
                                         "cmp /tmp/before /tmp/after");
        EXPECT_TRUE(contains(run.err, "is not simulated")) << command << ": " << run.err;
        EXPECT_NE(run.out, "0\n") << command;
        EXPECT_FALSE(contains(run.out, "differ")) << command;
    }
}

TEST(VolumeTools, OfTodayMakeAndDismantleAGroup) {
    const std::string script = R"(exec 2>&1
        zavsim act array 1 stops; lvchange -an PrimaryOSVG/LogVol1
        for v in 0-1 0-2; do zavsim act volume $v is inactive; done
        for v in LogVol1 LogVol2; do lvremove -f PrimaryOSVG/$v; done >/dev/null
        vgremove PrimaryOSVG >/dev/null; pvremove /dev/md0 >/dev/null
        zavsim act array 3 stops; mdadm --zero-superblock /dev/sata/disk1p3
        pvcreate /dev/md0; pvcreate /dev/md0; pvcreate /dev/sata/disk1p3
        pvcreate /dev/sata/disk1; echo $?; pvcreate /dev/sata/disk9; echo $?
        vgcreate DataVG2 /dev/md0; vgextend DataVG2 /dev/sata/disk1p3
        pvcreate /dev/md0; echo $?; vgextend DataVG2 /dev/sata/disk1p3 &>/dev/null; echo $?
        lvcreate -L 64 -n LogVol1 DataVG2 >/dev/null; lvcreate -L 16 -n LogVol2 DataVG2 >/dev/null
        lvremove -f /dev/DataVG2/LogVol1; vgremove DataVG2 </dev/null; echo $?
        lvremove -f /dev/DataVG2/LogVol2; vgremove DataVG2; pvremove -f /dev/md0
        pvdisplay /dev/sata/disk1p3 | grep "VG Name"; vgs DataVG2; echo $?)";
    const auto part = [](const std::string &name) {
        return captured("lvm-commands/" + name + ".txt");
    };
    EXPECT_EQ(on_appliance(script, current).out,
              "zavsim: array 1 is in use\n"
              "  Logical volume PrimaryOSVG/LogVol1 contains a filesystem in use.\n" +
                  part("pvcreate") + part("pvcreate-again") + part("pvcreate-disk") +
                  part("pvcreate-whole-disk-with-partitions") + "5\n" + part("pvcreate-missing") +
                  "5\n" + part("vgcreate") + part("vgextend") + part("pvcreate-in-group") +
                  "5\n5\n" + part("lvremove") + part("vgremove-with-volume") + "5\n" +
                  part("lvremove2") + part("vgremove") + part("pvremove") +
                  part("pvdisplay-vgname-free") + part("vgs-none") + "5\n");
}

TEST(VolumeTools, OfTodayLeaveAVolumeInUse) {
    const Outcome run = on_appliance(R"(exec 2>&1; zavsim act volume 1-1 is busy
        /bin/umount /mnt/internal/data1-1; echo $?
        /usr/sbin/lvremove -f /dev/DataVG1/LogVol1 2>&1; echo $?
        /usr/sbin/vgremove DataVG1; echo $?; /sbin/mdadm --manage --stop /dev/md1; echo $?)",
                                     current);
    EXPECT_EQ(run.out, captured("busy-volume/umount-busy.txt") + "32\n" +
                           captured("busy-volume/lvremove-busy.txt") + "5\n" +
                           captured("busy-volume/vgremove-with-volumes.txt") + "5\n" +
                           captured("busy-volume/stop-busy.txt") + "1\n");
}

TEST(VolumeTools, OfTheApplianceCallAMountedVolumeBusy) {
    const Outcome run = on_appliance("/usr/sbin/lvremove -f /dev/DataVG1/LogVol1 2>&1; echo $?");
    EXPECT_TRUE(contains(run.out, "device is busy")) << run.out;
    EXPECT_TRUE(contains(run.out, "\n5\n")) << run.out;
}

TEST(VolumeTools, TakeAWholeDiskWithoutPartitions) {
    const Outcome run = on_appliance(
        "zavsim act disk 4 vanishes; zavsim act disk 4 appears; vgs DataVG2 &>/dev/null || "
        "vgcreate DataVG2 /dev/sata/disk4; lvcreate -L 100 -n LogVol1 DataVG2; "
        "mkfs.ext4 /dev/DataVG2/LogVol1; mkdir -p /mnt/internal/data2-1; "
        "mount /dev/DataVG2/LogVol1 /mnt/internal/data2-1; grep data2 /etc/mtab; "
        "echo -n 'scsi remove-single-device 3 0 0 0' > /proc/scsi/scsi; vgs DataVG2; echo $?");
    EXPECT_EQ(run.out,
              "  Physical volume \"/dev/sata/disk4\" successfully created.\n"
              "  Volume group \"DataVG2\" successfully created\n"
              "  Logical volume \"LogVol1\" created.\n"
              "/dev/mapper/DataVG2-LogVol1 /mnt/internal/data2-1 ext4 rw,relatime 0 0\n5\n");
}

TEST(VolumeTools, RefuseNamesThatAreNone) {
    const Outcome run = on_appliance(
        "for n in sata md0 ../x a/b .. -x 'a b'; do vgcreate -- \"$n\" /dev/md2 && echo made; "
        "done; "
        "vgcreate sata /dev/md2 || lvcreate -L 4 -n a/b DataVG1 || vgcreate DataVG1 /dev/md2; "
        "echo $?; vgs | wc -l; pvs | wc -l");
    EXPECT_EQ(run.out, "5\n3\n3\n") << run.err;
}

TEST(Mounts, AreMountedAndUnmounted) {
    const Outcome run = on_appliance(R"(exec 2>&1
        df | grep "/mnt/internal/data1-1" &> /dev/null; echo $?
        /bin/umount /mnt/internal/data1-1; echo $?
        df | grep "/mnt/internal/data1-1" &> /dev/null; echo $?
        /bin/umount /mnt/internal/data1-1; echo $?; ls -la /mnt/internal/data1-1 &> /dev/null; echo $?
        mount /dev/DataVG1/LogVol1 /mnt/internal/data1-1; grep -c data1-1 /etc/mtab
        mount /dev/DataVG1/LogVol1 /mnt; echo $?; mount /dev/md2 /mnt; echo $?
        umount /no/such; echo $?)");
    EXPECT_EQ(run.out,
              "0\n0\n1\numount: /mnt/internal/data1-1: not mounted.\n32\n0\n1\n"
              "mount: /mnt: /dev/mapper/DataVG1-LogVol1 already mounted on /mnt/internal/data1-1.\n"
              "32\nmount: /mnt: wrong fs type, bad option, bad superblock on /dev/md2, missing "
              "codepage or helper program, or other error.\n32\n"
              "umount: /no/such: no mount point specified.\n32\n");
}

TEST(Udevinfo, AnswersTheLibrarysPipelines) {
    const Outcome run = on_appliance(R"PIPE(
echo /dev/`udevinfo -q symlink -p /block/md1`
echo /dev/`udevinfo -q symlink -p /sys/block/sda | sed -n 's/ /\n/gp' | sed '/^$/d' | sed '/^disk/d'`
echo /dev/sata/`udevinfo -q symlink -p /block/sda/sda2 | sed -n 's/sata\//\t/gp' | awk -F'\t' '{print $2}' | awk '{print $1}'`
echo /dev/sata/`udevinfo -q symlink -p /block/sda/sda3 | sed -n 's/sata\//\t/gp' | awk -F'\t' '{print $2}' | awk '{print $1}'`
echo /dev/`udevinfo -q symlink -p /block/md9 2>/dev/null`; udevinfo -q symlink -p /block/sdx 2>/dev/null || echo none
)PIPE");
    EXPECT_EQ(run.out, captured("healthy-4disk/udevinfo-pipe-md1.txt") +
                           captured("healthy-4disk/udevinfo-pipe-sda.txt") +
                           captured("healthy-4disk/udevinfo-pipe-sda2.txt") +
                           "/dev/sata/disk1p3\n/dev/\nnone\n");
}

TEST(Hosts, StandBelowTheirPortsIfAskedFor) {
    const std::string script = "cd /sys/devices/pci0000:00/0000:00:1f.2; echo host? ata?/host?";
    EXPECT_EQ(on_appliance(script).out, "host0 host1 host2 host3 host4 host5 ata?/host?\n");
    EXPECT_EQ(on_appliance(script, {"--hosts", "ata"}).out,
              "host? ata1/host0 ata2/host1 ata3/host2 ata4/host3 ata5/host4 ata6/host5\n");
}

} // namespace
