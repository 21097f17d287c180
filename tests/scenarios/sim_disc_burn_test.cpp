// The library burns, erases and formats discs of the simulated drive.
#include "sim_runner.hpp"

#include <gtest/gtest.h>

namespace {

// Two directories to burn, the first with one below it; `on_disc DIR` tells whether the disc shows
// what DIR holds, `gets DISC` changes the disc.
constexpr const char *prelude =
    "probe=" DISC_PROBE "\n"
    "mkdir -p /tmp/s/below /tmp/t; head -c 6000000 /dev/zero > /tmp/s/big; echo small > /tmp/s/f\n"
    "head -c 3000 /dev/zero > /tmp/s/below/deep; echo later > /tmp/t/g\n"
    "files() { (cd $1; find -L . -type f -printf '%P %s\\n' | sort); }\n"
    "on_disc() { [ \"$(files $1)\" = \"$(files /media/cdrom)\" ] && echo same || echo different; "
    "}\n"
    "gets() { zavsim act drive loses its disc 2> /dev/null; zavsim act drive gets \"$@\"; }\n"
    "reaches() { until [ $($probe progress 2> /dev/null) -ge $1 ]; do sleep 1; done; }\n";

Outcome library(const std::string &script,
                std::vector<std::string> options = {"--time-scale", "100"}) {
    return on_appliance(prelude + script, std::move(options));
}

// ---- What is on the disc afterwards ----

TEST(Burning, ClosesADvd) {
    EXPECT_EQ(library("gets blank DVD+R; $probe burn /tmp/s 0; on_disc /tmp/s; $probe query").out,
              "ok\nsame\nDVD+R complete 4590000 0\n");
}

TEST(Burning, LeavesADvdOpen) {
    EXPECT_EQ(library("gets blank DVD-R; $probe burn /tmp/s 1; on_disc /tmp/s; $probe query").out,
              "ok\nsame\nDVD-R appendable 4590000 4579664\n");
}

TEST(Burning, AddsASessionToADvd) {
    EXPECT_EQ(library("gets blank DVD+R; $probe burn /tmp/s 1; $probe burn /tmp/t 1\n"
                      "cp /tmp/t/* /tmp/s; on_disc /tmp/s; $probe query | cut -d ' ' -f 2")
                  .out,
              "ok\nok\nsame\nappendable\n");
}

TEST(Burning, ClosesADoubleLayerDvd) {
    EXPECT_EQ(library("gets blank DVD+R double; $probe burn /tmp/s 0; on_disc /tmp/s\n"
                      "$probe query")
                  .out,
              "ok\nsame\nDVD+R double complete 8347000 0\n");
}

TEST(Burning, WritesASequentialDvdAtOnce) {
    EXPECT_EQ(library("gets blank DVD-RW sequential; $probe burn /tmp/s 0; on_disc /tmp/s\n"
                      "$probe query")
                  .out,
              "ok\nsame\nDVD-RW sequential complete 4590000 0\n");
}

TEST(Burning, OverwritesADvd) {
    EXPECT_EQ(
        library("gets complete DVD+RW; $probe burn /tmp/t 2; on_disc /tmp/t; $probe query").out,
        "ok\nsame\nDVD+RW complete 4590000 4589997\n");
}

TEST(Burning, AddsToAnOverwritableDvd) {
    EXPECT_EQ(library("gets blank DVD-RW restricted; $probe burn /tmp/s 1; $probe burn /tmp/t 1\n"
                      "cp /tmp/t/* /tmp/s; on_disc /tmp/s")
                  .out,
              "ok\nok\nsame\n");
}

TEST(Burning, ClosesACd) {
    EXPECT_EQ(library("gets blank CD-R; $probe burn /tmp/s 0; on_disc /tmp/s; $probe query").out,
              "ok\nsame\nCD-R complete 719698 0\n");
}

TEST(Burning, AddsASessionToACd) {
    EXPECT_EQ(
        library("gets blank CD-R; $probe burn /tmp/s 1; on_disc /tmp/s; $probe burn /tmp/t 1\n"
                "cp /tmp/t/* /tmp/s; on_disc /tmp/s; $probe query | cut -d ' ' -f 2")
            .out,
        "ok\nsame\nok\nsame\nappendable\n");
}

TEST(Burning, TakesTheRoomOfTheLeadsOfACd) {
    EXPECT_EQ(library("gets blank CD-R; $probe burn /tmp/t 1; cdrecord dev=/dev/scd0 -msinfo\n"
                      "$probe burn /tmp/t 1; cdrecord dev=/dev/scd0 -msinfo")
                  .out,
              "ok\n0,11584\nok\n11584,18668\n");
}

TEST(Burning, TakesADirectoryOfAnyName) {
    EXPECT_EQ(library("mkdir '/tmp/a b; reboot'; echo x > '/tmp/a b; reboot/x y'\n"
                      "gets blank DVD+R; $probe burn '/tmp/a b; reboot' 1; ls /media/cdrom")
                  .out,
              "ok\nx y\n");
}

TEST(Burning, PutsADirectoryBelowAnother) {
    EXPECT_EQ(library("gets blank CD-R; $probe burn-below /tmp/t 'new one' 1\n"
                      "ls -R /media/cdrom | grep -v '^$'")
                  .out,
              "ok\n/media/cdrom:\nnew one\n/media/cdrom/new one:\ng\n");
}

// ---- Progress ----

TEST(BurningProgress, RisesFromLineToLine) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act tool growisofs fails at 90%\n"
                      "$probe burn /tmp/s 1; grep 'done, estimate finish' /tmp/progress.outfile > "
                      "/tmp/lines; [ $(wc -l < /tmp/lines) -gt 10 ] && echo many\n"
                      "sort -nc /tmp/lines && echo rising")
                  .out,
              "DVD tool failed\nmany\nrising\n");
}

TEST(BurningProgress, IsSeenWhileItBurns) {
    EXPECT_EQ(library("gets blank CD-R; zavsim act drive writes at 100; $probe burn /tmp/s 1 &\n"
                      "reaches 10; reaches 50; reaches 100; wait")
                  .out,
              "ok\n");
}

TEST(BurningProgress, HasItsToolsInTheProcessTable) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                      "reaches 10; for tool in growisofs mkisofs; do\n"
                      "grep Name: /proc/$($probe pidof $tool)/status; done\n"
                      "$probe cancel > /dev/null")
                  .out,
              "Name:\tgrowisofs\nName:\tmkisofs\nDVD tool failed\n");
}

TEST(BurningProgress, StandsInTheState) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                      "reaches 10; zavsim state | grep -E '\"(tool|kind)\": \"(gro|wr)'\n"
                      "$probe cancel > /dev/null; wait; zavsim state | grep '\"job\"'")
                  .out,
              "      \"kind\": \"write\",\n      \"tool\": \"growisofs\"\nDVD tool failed\n"
              "    \"job\": null,\n");
}

// ---- Breaking off ----

TEST(Cancelling, EndsABurnOfADvd) {
    EXPECT_EQ(
        library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                "reaches 30; $probe cancel > /dev/null; wait; $probe query | cut -d ' ' -f 2\n"
                "ls /media/cdrom; $probe burn /tmp/t 1")
            .out,
        "DVD tool failed\nappendable\nDVD tool failed\n");
}

TEST(Cancelling, EndsABurnOfACdThatCanBeErasedThen) {
    EXPECT_EQ(library("gets blank CD-RW; zavsim act drive writes at 5; $probe burn /tmp/s 0 &\n"
                      "reaches 30; $probe cancel > /dev/null; wait; $probe query; $probe blank\n"
                      "$probe query")
                  .out,
              "CD tool failed\nCD-RW appendable 719698 0\nok\nCD-RW blank 719698 719698\n");
}

TEST(Cancelling, LeavesTheOldFilesOfAnOverwritableDvdThatIsAddedTo) {
    EXPECT_EQ(library("gets blank DVD+RW; $probe burn /tmp/t 1; zavsim act drive writes at 5\n"
                      "rm /tmp/progress.outfile; $probe burn /tmp/s 1 & reaches 30; $probe cancel "
                      "> /dev/null; wait\n"
                      "on_disc /tmp/t")
                  .out,
              "ok\nDVD tool failed\nsame\n");
}

TEST(Cancelling, ByForceBreaksTheSessionAsWell) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                      "reaches 30; kill -9 $($probe pidof growisofs); wait\n"
                      "$probe query | cut -d ' ' -f 2")
                  .out,
              "DVD tool failed\nappendable\n");
}

TEST(Cancelling, FindsNothingToEnd) {
    EXPECT_EQ(library("$probe cancel").out, "ok\n");
}

TEST(BusyDrive, KeepsItsDisc) {
    const Outcome outcome =
        library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                "reaches 10; zavsim act drive loses its disc; $probe cancel > /dev/null; wait\n");
    EXPECT_EQ(outcome.err, "zavsim: the drive is at work\n");
}

TEST(BusyDrive, FailsTheBurnWhenItVanishes) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act drive writes at 5; $probe burn /tmp/s 1 &\n"
                      "reaches 10; zavsim act drive vanishes; wait; $probe query")
                  .out,
              "DVD tool failed\nerror\n");
}

// ---- Failures ----

TEST(FailingTool, LeavesABlankDiscWhenItFailsAtOnce) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act tool growisofs fails at 0%\n"
                      "$probe burn /tmp/s 1; $probe query")
                  .out,
              "DVD tool failed\nDVD+R blank 4590000 4590000\n");
}

TEST(FailingTool, LeavesADvdThatTakesNothingMore) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act tool growisofs fails at 40%\n"
                      "$probe burn /tmp/s 1; zavsim act tool growisofs works again\n"
                      "$probe query | cut -d ' ' -f 2; $probe burn /tmp/t 1")
                  .out,
              "DVD tool failed\nappendable\nDVD tool failed\n");
}

TEST(FailingTool, MayBeTheOneThatMakesTheImage) {
    EXPECT_EQ(library("zavsim act tool mkisofs fails at 40%; gets blank DVD+R\n"
                      "$probe burn /tmp/s 1; gets blank CD-R; $probe burn /tmp/s 0")
                  .out,
              "DVD tool failed\nCD tool failed\n");
}

TEST(FailingTool, LeavesAnIncompleteSessionAlsoWhenItMakesTheImage) {
    EXPECT_EQ(
        library("gets blank DVD+R; zavsim act tool mkisofs fails at 40%; $probe burn /tmp/s 1\n"
                "zavsim act tool mkisofs works again; ls /media/cdrom; $probe burn /tmp/t 1")
            .out,
        "DVD tool failed\nDVD tool failed\n");
}

TEST(FailingTool, GoesUnseenBeforeACdThatStaysOpen) {
    EXPECT_EQ(library("zavsim act tool mkisofs fails at 40%; gets blank CD-R\n"
                      "$probe burn /tmp/s 1; on_disc /tmp/s")
                  .out,
              "ok\ndifferent\n");
}

TEST(FailingTool, WritesOrErasesACd) {
    EXPECT_EQ(library("zavsim act tool cdrecord fails at 50%; gets blank CD-R\n"
                      "$probe burn /tmp/s 1; $probe query; gets complete CD-RW; $probe blank\n"
                      "$probe query")
                  .out,
              "CD tool failed\nCD-R appendable 719698 0\nblanking failed\n"
              "CD-RW unknown 719698 0\n");
}

TEST(FailingTool, FormatsADvdThatCanBeFormattedAgain) {
    EXPECT_EQ(
        library("zavsim act tool dvd+rw-format fails at 50%; gets complete DVD-RW sequential\n"
                "$probe blank; $probe query | cut -d ' ' -f 3\n"
                "zavsim act tool dvd+rw-format works again; $probe blank",
                {"--time-scale", "1000"})
            .out,
        "blanking failed\nunknown\nok\n");
}

TEST(FailingTool, PreparesPacketWriting) {
    EXPECT_EQ(library("gets blank DVD+RW; zavsim act tool pktsetup fails at 0%; $probe format\n"
                      "zavsim act tool pktsetup works again; zavsim act tool mkudffs fails at 50%\n"
                      "$probe format; pktsetup -d pktcdvd0; gets blank CD-RW\n"
                      "zavsim act tool cdrwtool fails at 50%; $probe format")
                  .out,
              "packet device failed\nformatting failed\nformatting failed\n");
}

TEST(MissingTool, IsNoticed) {
    EXPECT_EQ(library("$probe tools; zavsim act tool mkudffs is missing; $probe tools").out,
              "ok\nerror\n");
}

TEST(MissingTool, FailsTheBurn) {
    EXPECT_EQ(library("gets blank DVD+R; zavsim act tool growisofs is missing\n"
                      "$probe burn /tmp/s 1; zavsim act tool growisofs works again\n"
                      "zavsim act tool mkisofs is missing; $probe burn /tmp/s 1; $probe query")
                  .out,
              "DVD tool failed\nDVD tool failed\nDVD+R blank 4590000 4590000\n");
}

// ---- Discs and drives that refuse ----

TEST(Refusal, OfACombosDvd) {
    EXPECT_EQ(library("zavsim act drive is a combo; gets complete DVD+RW; $probe burn /tmp/s 2\n"
                      "gets blank DVD+R; $probe burn /tmp/s 1; gets blank CD-R\n"
                      "$probe burn /tmp/s 1")
                  .out,
              "bad disc\nDVD tool failed\nok\n");
}

TEST(Refusal, WithoutADiscAndWithoutADrive) {
    EXPECT_EQ(library("$probe burn /tmp/s 1; $probe blank; zavsim act drive vanishes\n"
                      "$probe burn /tmp/s 1; $probe blank")
                  .out,
              "no disc\nno disc\nerror\nerror\n");
}

// Files full of holes take no room where they are, but on the disc.
TEST(Refusal, OfASourceThatIsTooLarge) {
    EXPECT_EQ(library("truncate -s 3G /tmp/t/1 /tmp/t/2; gets blank DVD+R; $probe burn /tmp/t 1\n"
                      "grep -o 'blocks are free, .*' /tmp/progress.outfile; $probe query\n"
                      "gets blank CD-R; $probe burn /tmp/t 0; $probe query")
                  .out,
              "DVD tool failed\nblocks are free, 3145912 to be written!\n"
              "DVD+R blank 4590000 4590000\nCD tool failed\nCD-R blank 719698 719698\n");
}

TEST(Growisofs, HoldsToTheRulesOfTheMedia) {
    EXPECT_EQ(library("try() { gets $2 $3; growisofs $1 /dev/scd0 -R -J -f /tmp/t 2> /dev/null\n"
                      "echo $1 $2 $3: $?; }\n"
                      "try -M blank DVD+R; try -M complete DVD-R; try -Z appendable DVD+R\n"
                      "try -Z complete DVD-R; try -Z blank CD-R; try -Z complete DVD-ROM\n"
                      "try -M blank DVD+RW; try -M complete DVD+RW; try -Z blank DVD-R")
                  .out,
              "-M blank DVD+R: 150\n-M complete DVD-R: 150\n-Z appendable DVD+R: 22\n"
              "-Z complete DVD-R: 22\n-Z blank CD-R: 252\n-Z complete DVD-ROM: 252\n"
              "-M blank DVD+RW: 150\n-M complete DVD+RW: 0\n-Z blank DVD-R: 0\n");
}

TEST(Growisofs, OfTodayOverwritesOnlyForSomebodyAtATerminal) {
    EXPECT_EQ(
        library("gets complete DVD+RW; setsid growisofs -Z /dev/scd0 -R /tmp/t 2>&1 | cat\n"
                "setsid growisofs -use-the-force-luke=tty -Z /dev/scd0 -R /tmp/t 2> /dev/null\n"
                "echo $?",
                {"--tools", "current", "--time-scale", "100"})
            .out,
        "FATAL: /dev/scd0 already carries isofs!\n0\n");
}

TEST(Cdrecord, HoldsToTheRulesOfTheMedia) {
    EXPECT_EQ(library("erase() { gets $1 $2; cdrecord dev=/dev/scd0 -blank=fast > /dev/null 2>&1\n"
                      "echo $2: $?; }\n"
                      "erase complete CD-R; erase complete CD-RW; erase complete DVD+RW\n"
                      "gets complete CD-R; echo | cdrecord dev=/dev/scd0 -data - 2>&1 | "
                      "grep -c 'next writable'")
                  .out,
              "CD-R: 255\nCD-RW: 0\nDVD+RW: 255\n1\n");
}

TEST(DvdFormat, TakesRewritableDvdsAlone) {
    EXPECT_EQ(library("form() { gets $1 $2 $3; dvd+rw-format /dev/scd0 -force=full 2> /dev/null\n"
                      "echo $2: $?; }\n"
                      "form blank DVD+R; form blank CD-RW; form complete DVD+RW\n"
                      "form complete DVD-RW sequential; dvd+rw-mediainfo /dev/scd0 | grep Mounted",
                      {"--time-scale", "1000"})
                  .out,
              "DVD+R: 252\nCD-RW: 252\nDVD+RW: 0\nDVD-RW: 0\n"
              " Mounted Media:         13h, DVD-RW Restricted Overwrite\n");
}

// ---- Erasing and formatting ----

TEST(Blanking, EmptiesACd) {
    EXPECT_EQ(library("gets complete CD-RW; $probe blank; $probe query; ls /media/cdrom").out,
              "ok\nCD-RW blank 719698 719698\n");
}

TEST(Blanking, LeavesDvdsWithAnEmptyFileSystem) {
    EXPECT_EQ(library("for disc in 'DVD-RW restricted' 'DVD-RW sequential' DVD+RW; do\n"
                      "gets complete $disc; $probe blank; $probe query; ls /media/cdrom; done",
                      {"--time-scale", "1000"})
                  .out,
              "ok\nDVD-RW restricted complete 4590000 4589998\n"
              "ok\nDVD-RW restricted complete 4590000 4589998\n"
              "ok\nDVD+RW complete 4590000 4589998\n");
}

TEST(Formatting, PreparesPacketWriting) {
    EXPECT_EQ(library("gets complete DVD+RW; $probe format; ls /dev/pktcdvd /media/cdrom\n"
                      "pktsetup -d pktcdvd0; gets complete CD-RW; $probe format; $probe format")
                  .out,
              "ok\n/dev/pktcdvd:\npktcdvd0\n\n/media/cdrom:\nok\npacket device failed\n");
}

// ---- The tools' own texts ----

TEST(Mkisofs, CountsTheSectorsOfAnImage) {
    EXPECT_EQ(on_appliance("mkdir /tmp/d; truncate -s 20M /tmp/d/1 /tmp/d/2 /tmp/d/3\n"
                           "mkisofs -R -J -f -q -print-size /tmp/d; mkisofs -q -o /tmp/i /tmp/d\n"
                           "stat -c %s /tmp/i; mkisofs -q -print-size /tmp/no-such-dir 2>&1")
                  .out,
              "30903\n63289344\ngenisoimage: No such file or directory. Invalid node - "
              "'/tmp/no-such-dir'.\n");
}

} // namespace
