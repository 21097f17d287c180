// The hardware-RAID model as its programs meet it: files, nodes, the report's semaphore, tools.
#include "sim_runner.hpp"

#include <algorithm>
#include <gtest/gtest.h>
#include <sstream>

namespace {

const std::string probe = SIM_PROBE;

// A script on a 2980, with words for what it looks at.
Outcome on_2980(const std::string &script, std::vector<std::string> options = {}) {
    options.insert(options.end(), {"--model", "2980"});
    return on_appliance("report=/etc/Kiru/zav/.raidinfo probe=" + probe + "\n" + script, options);
}

TEST(HardwareRaid, HasItsReportFromTheStart) {
    EXPECT_EQ(on_2980("head -n 3 $report; grep '^RBOD' $report").out,
              "PCI\nM:HBRC-R16\nS:HR25C01741\nRBOD#1\nRBOD#2\n");
}

TEST(HardwareRaid, HasAsManyUnitsAsIsWished) {
    EXPECT_EQ(on_2980("grep -c '^RBOD' $report", {"--units", "0"}).out, "0\n");
    EXPECT_EQ(on_2980("grep -c '^RBOD' $report", {"--units", "7"}).out, "7\n");
}

TEST(HardwareRaid, PrintsItsTopology) {
    EXPECT_EQ(on_2980("/usr/bin/query_sas.sh | grep 'phy   0'").out,
              "phy   0:D:attached:[5001B4D5008FF01F800:00  V i(SSP+SMP) t(SSP)]  6 Gbps\n"
              "phy   0:D:attached:[5001B4D5008FF03F800:00  V i(SSP+SMP) t(SSP)]  6 Gbps\n");
}

TEST(HardwareRaid, HasNodesForDisksAndVolumes) {
    EXPECT_EQ(on_2980("cd /dev; ls hwsata hwraid sas sasraid; stat -L -c %s hwsata/disk1 "
                      "sasraid/r1disk1",
                      {"--units", "1"})
                  .out,
              "hwraid:\ndisk1\ndisk2\n\nhwsata:\ndisk1\ndisk2\ndisk3\ndisk4\n\n"
              "sas:\nr1disk1\nr1disk2\nr1disk3\nr1disk4\n\nsasraid:\nr1disk1\n"
              "536870912\n536870912\n");
}

TEST(HardwareRaid, LetsTheLibraryKeepAFileBesideTheReport) {
    EXPECT_EQ(on_2980("echo kept > /etc/Kiru/zav/.RBODinfo; cat /etc/Kiru/zav/.RBODinfo").out,
              "kept\n");
}

TEST(HardwareRaid, ShowsAtOnceWhatWasActed) {
    EXPECT_EQ(on_2980("zavsim act disk 3 vanishes; grep ^D:3 $report | head -n 1; ls /dev/hwsata\n"
                      "zavsim act unit 2 vanishes; grep -c ^RBOD $report; ls /dev/sasraid\n"
                      "query_sas.sh | grep -c 'phy   0'")
                  .out,
              "D:3:0.0:2\ndisk1\ndisk2\ndisk4\n1\nr1disk1\n1\n");
}

TEST(HardwareRaid, PlaysAScenario) {
    const ScratchFile scenario("at 5s unit 2 vanishes\nat 5s unit 1 temperature 88\n");
    const Outcome run =
        on_2980("until grep -q ^H:88 $report; do sleep 1; done; grep -c ^RBOD $report",
                {"--scenario", scenario.path(), "--time-scale", "20"});
    EXPECT_EQ(run.out, "1\n");
}

TEST(HardwareRaid, IsNowhereOnOtherModels) {
    const Outcome run = on_appliance("ls -A /etc/Kiru/zav /usr/bin/query_sas.sh /dev/hwsata "
                                     "2>/dev/null; ipcs -s | grep -c 6912");
    EXPECT_EQ(run.out, "/etc/Kiru/zav:\n0\n");
}

TEST(HardwareRaidNodes, KeepWhatIsWrittenWhileTheirUnitIsAway) {
    EXPECT_EQ(on_2980("printf MARK | dd of=/dev/sasraid/r1disk1 bs=1 seek=440 2>/dev/null\n"
                      "zavsim act unit 1 vanishes; ls /dev/sasraid; zavsim act unit 1 appears\n"
                      "dd if=/dev/sasraid/r1disk1 bs=1 skip=440 count=4 2>/dev/null\n"
                      "stat -c ' %s' /dev/sasraid/r1disk1")
                  .out,
              "MARK 536870912\n");
}

TEST(HardwareRaidNodes, OfAReplacementIsEmpty) {
    EXPECT_EQ(on_2980("printf MARK | dd of=/dev/hwsata/disk2 bs=1 seek=440 2>/dev/null\n"
                      "zavsim act disk 2 vanishes; zavsim act disk 2 appears\n"
                      "head -c 4096 /dev/hwsata/disk2 | tr -d '\\0' | wc -c")
                  .out,
              "0\n");
}

TEST(HardwareRaidReport, IsRewrittenInPlace) {
    const Outcome run = on_2980("exec 3< $report; zavsim act disk 3 fails; cat <&3 | grep ^D:3");
    EXPECT_EQ(run.out.rfind("D:3:500.1:4\n", 0), 0U) << run.out;
}

TEST(HardwareRaidReport, LeavesAProgramsOwnTextUntilItChanges) {
    EXPECT_EQ(on_2980("echo mine > $report; zavsim act tool mdadm exits 3; cat $report\n"
                      "zavsim act unit 1 temperature 60; grep ^H:60 $report")
                  .out,
              "mine\nH:60.0:2710:12.05:5.02:1.20\n");
}

TEST(HardwareRaidReport, ShowsARebuildUntilItsEnd) {
    const Outcome run = on_2980("zavsim act disk 1 vanishes; zavsim act disk 1 appears\n"
                                "line() { grep ^V:1 $report | head -n 1; }; line\n"
                                "until line | grep -q ':[1-9][0-9]*:4$'; do sleep 1; done\n"
                                "until line | grep -q ':0:1$'; do sleep 5; done; line",
                                {"--time-scale", "100"});
    EXPECT_EQ(run.out.rfind("V:1:SYSTEMDATA:3:1200.2:", 0), 0U) << run.out;
    EXPECT_NE(run.out.find(":4\nV:1:SYSTEMDATA:3:1200.2:0:1\n"), std::string::npos) << run.out;
}

TEST(HardwareRaidReport, CanBeMissingTruncatedOrGarbled) {
    const Outcome run =
        on_2980("cp $report /tmp/whole; zavsim act report is truncated\n"
                "cmp -n $(wc -c < $report) $report /tmp/whole && tail -c 1 $report | wc -l\n"
                "zavsim act report is garbled; grep -c PCI $report\n"
                "zavsim act report is missing; ls -A /etc/Kiru/zav\n"
                "zavsim act report works again; cmp $report /tmp/whole && echo whole");
    EXPECT_EQ(run.out, "0\n0\nwhole\n");
}

// Holds the semaphore between `hold` and `let_go`.
const std::string holding = R"(
    mkfifo /tmp/hold
    hold() {
        $probe hold /tmp/held < /tmp/hold > /tmp/said & exec 3> /tmp/hold
        until test -e /tmp/held; do sleep 0.1; done
    }
    let_go() { exec 3>&-; wait $!; cat /tmp/said; }
)";

TEST(ReportSemaphore, IsThereForEverybody) {
    EXPECT_EQ(on_2980("ipcs -s | grep 6912 | tr -s ' ' | cut -d ' ' -f 1,4,5").out,
              "0x00006912 666 1\n");
}

TEST(ReportSemaphore, KeepsTheAgentFromWritingWhileSomebodyHoldsIt) {
    const Outcome run = on_2980(holding + "hold; zavsim act disk 3 fails; echo $?; sleep 0.3\n"
                                          "grep ^D:3 $report | head -n 1; let_go\n"
                                          "until grep -q ^D:3:500.1:4 $report; do sleep 0.1; done\n"
                                          "echo written");
    EXPECT_EQ(run.out, "0\nD:3:500.1:1\ntook ok\ngave back ok\nwritten\n");
}

// Whoever acts gives up after two seconds; a round in which the machine was too slow does not
// count.
TEST(ReportSemaphore, IsWaitedForByWhoeverActs) {
    const Outcome run = on_2980(holding + R"(
        for t in 61 62 63 64 65 66 67 68; do
            rm -f /tmp/held; hold; holder=$!; start=$(date +%s%N)
            zavsim act unit 1 temperature $t 3>&- & act=$!
            until zavsim state | grep -q " $t.0"; do :; done
            exec 3>&-; wait $act
            shown=$(grep -c ^H:$t $report)
            test $((($(date +%s%N) - start) / 1000000)) -lt 2000 && break
            wait $holder
        done; echo $shown)");
    EXPECT_EQ(run.out, "1\n");
}

TEST(ReportSemaphore, DoesNotHoldUpWhatElseIsActed) {
    const Outcome run =
        on_2980(holding + "hold; zavsim act disk 3 vanishes; ls /dev/hwsata; let_go");
    EXPECT_EQ(run.out, "disk1\ndisk2\ndisk4\ntook ok\ngave back ok\n");
}

TEST(SlowRewrite, ShowsHalfToWhoDoesNotTakeTheSemaphore) {
    EXPECT_EQ(on_2980("size=$(wc -c < $report); zavsim act report rewrites 60s\n"
                      "test $(wc -c < $report) -lt $size && echo half; grep -c PCI $report")
                  .out,
              "half\n1\n");
}

TEST(SlowRewrite, ShowsTheWholeToWhoTakesTheSemaphore) {
    EXPECT_EQ(on_2980("cp $report /tmp/whole; zavsim act report rewrites 100s\n"
                      "cmp -s $report /tmp/whole || echo half\n"
                      "$probe read $report | cmp - /tmp/whole && echo whole",
                      {"--time-scale", "20"})
                  .out,
              "half\nwhole\n");
}

TEST(SlowRewrite, LetsTheClockRunOn) {
    EXPECT_EQ(on_2980("zavsim act report rewrites 10m; zavsim act unit 2 vanishes; echo $?\n"
                      "ls /dev/sasraid; zavsim state | grep -c '\"slow_rewrites\": 1'")
                  .out,
              "0\nr1disk1\n1\n");
}

TEST(SlowRewrite, IsFollowedByWhatHappenedMeanwhile) {
    EXPECT_EQ(on_2980("zavsim act report rewrites 20s; zavsim act disk 3 fails\n"
                      "until grep -q ^D:3:500.1:4 $report; do sleep 1; done\n"
                      "$probe read $report | grep -c ^H:",
                      {"--time-scale", "20"})
                  .out,
              "3\n");
}

TEST(SlowRewrite, CanBeAskedForAgain) {
    EXPECT_EQ(on_2980("cp $report /tmp/whole; zavsim act report rewrites 10s\n"
                      "$probe read $report | cmp - /tmp/whole && echo whole\n"
                      "zavsim act report rewrites 999m; cmp -s $report /tmp/whole || echo half",
                      {"--time-scale", "20"})
                  .out,
              "whole\nhalf\n");
}

TEST(QuerySas, HasTheFaultsOfATool) {
    EXPECT_EQ(on_2980("zavsim act tool query_sas.sh prints nonsense; query_sas.sh; echo; "
                      "zavsim act tool query_sas.sh exits 7; query_sas.sh; echo \" $?\"\n"
                      "zavsim act tool query_sas.sh works again; query_sas.sh | wc -l\n"
                      "zavsim act tool query_sas.sh is missing; /usr/bin/query_sas.sh "
                      "2>/dev/null; echo $?; zavsim act tool query_sas.sh works again\n"
                      "query_sas.sh | wc -l")
                  .out,
              "nonsense\nnonsense 7\n28\n127\n28\n");
}

TEST(QuerySas, HangsInApplianceTime) {
    const Outcome run = on_2980("zavsim act tool query_sas.sh hangs 30s; s=$(date +%s%N)\n"
                                "query_sas.sh >/dev/null; e=$(date +%s%N)\n"
                                "echo $(((e - s) / 1000000))",
                                {"--time-scale", "50"});
    EXPECT_GE(std::stoi(run.out), 600);
}

TEST(QuerySas, DoesNothingElse) {
    const Outcome run = on_2980("query_sas.sh --reset");
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.err, "query_sas.sh: --reset is not simulated\n");
}

} // namespace
