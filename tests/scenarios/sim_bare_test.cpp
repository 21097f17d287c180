// The private root without a model: what a unit test finds and may make of it.
#include "sim_runner.hpp"

#include <gtest/gtest.h>

namespace {

Outcome bare(const std::string &script) {
    return on_appliance(script, {"--bare"});
}

TEST(BareRoot, LetsTheProgramWriteWhereTheApplianceHasItsFiles) {
    const Outcome run = bare(
        "for f in /proc/mdstat /proc/scsi/scsi /proc/net/bonding/bond0 /proc/zav/sys/x "
        "/sbin/mdadm /usr/bin/syncConf.sh /dev/sata/disk1 /dev/swraid/disk1p1 /dev/nvram "
        "/sys/class/dmi/id/product_name /sys/devices/pci0000:00/0000:00:1f.2/host0 "
        "/etc/Kiru/raidtype /etc/Kiru/zav/x /etc/sysconfig/clock /etc/mtab /var/log/apcupsd.status "
        "/proc/sys/dev/cdrom/info /tmp/x; do echo text > $f && grep -q text $f || echo $f; done");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err, "");
}

TEST(BareRoot, RunsTheProgramAsRoot) {
    EXPECT_EQ(bare("id -u; id -g").out, "0\n0\n");
}

TEST(BareRoot, HasNoApplianceInIt) {
    EXPECT_EQ(bare("ls /etc/Kiru/zav /dev/sata /proc/scsi; ls /dev/log /proc/mdstat 2>/dev/null; "
                   "echo $LD_PRELOAD")
                  .out,
              "/dev/sata:\n\n/etc/Kiru/zav:\n\n/proc/scsi:\n\n");
}

TEST(BareRoot, ReachesNoToolOfTheHost) {
    EXPECT_EQ(bare("for t in mdadm smartctl sfdisk vgs lvs pvs lvm vgdisplay udevinfo udevadm "
                   "ethtool cdrecord growisofs mkisofs mknod hbqSetup.sh; do type -P $t; done")
                  .out,
              "");
}

TEST(BareRoot, RunsAScriptPutInAToolsPlace) {
    EXPECT_EQ(
        bare("printf '#!/bin/sh\\necho \"called $1\"\\n' > /sbin/mdadm; chmod +x /sbin/mdadm; "
             "mdadm --detail; /usr/sbin/mdadm -x")
            .out,
        "called --detail\ncalled -x\n");
}

TEST(BareRoot, HasBashForAShell) {
    EXPECT_EQ(bare("false &>/dev/null; echo $?; echo -ne '\\x4D' | od -An -tx1").out, "1\n 4d\n");
}

TEST(BareRoot, ShowsRunningProcessesByTheirNumbers) {
    // By its parent: its name may still be the shell's, which has only just forked it.
    EXPECT_EQ(bare("for i in 1 2 3 4 5; do (true); done; sleep 5 & "
                   "test \"$(sed -n 's/^PPid:\\t//p' /proc/$!/status)\" = $$ && echo child; "
                   "head -n 1 /proc/self/status")
                  .out,
              "child\nName:\thead\n");
}

TEST(BareRoot, LeavesTheHostsProgramsAndFilesReadable) {
    EXPECT_EQ(
        bare("ls / >/dev/null && grep -c ^root: /etc/passwd && cat /proc/uptime >/dev/null && "
             "test $(nproc) -gt 0 && hostname")
            .out,
        "1\nappliance\n");
}

TEST(PrivateRoot, HasSemaphoresOfItsOwn) {
    const Outcome run = bare("ipcs -s | grep -c 0x; ipcmk -S 1 >/dev/null; ipcs -s | grep -c 0x");
    EXPECT_EQ(run.out, "0\n1\n");
}

TEST(PrivateRoot, LeavesNoSemaphoreOrFileOnTheHost) {
    const std::string before = execute({"ipcs", "-s"}).out;
    const Outcome run =
        on_appliance("ipcmk -S 1; touch /tmp/zavsim-left /etc/zavsim-left /dev/zavsim-left "
                     "/usr/bin/zavsim-left && echo made");
    EXPECT_NE(run.out.find("made\n"), std::string::npos) << run.err;
    EXPECT_EQ(execute({"ipcs", "-s"}).out, before);
    EXPECT_EQ(execute({"sh", "-c",
                       "ls -d /tmp/zavsim-left /etc/zavsim-left /dev/zavsim-left "
                       "/usr/bin/zavsim-left 2>/dev/null"})
                  .out,
              "");
}

} // namespace
