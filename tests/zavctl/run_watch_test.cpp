// Watching a simulated appliance on which something happens.
#include "run.h"

namespace {

// The watch runs in the background until the script has seen what it waits for in "out".
std::string watched(const std::string &options, const std::string &happens, const std::string &seen,
                    const std::string &afterwards = "true") {
    return "zavctl watch --interval 1 " + options + " >out 2>err & pid=$!; " +
           "until [ -s out ]; do sleep 1; done; " + happens + "; until grep -q '" + seen +
           "' out; do sleep 1; done; kill $pid; wait $pid; status=$?; cat out err; " + afterwards +
           "; exit $status";
}

// A round asks a few groups and volumes, whose query writes this file: when it has been written
// that often, the first round is over.
constexpr const char *first_round_is_over =
    "writings=0; last=; while [ $writings -lt 10 ]; do "
    "now=$(stat -c %y /etc/Kiru/zav/.vgs 2>/dev/null); "
    "[ \"$now\" = \"$last\" ] || writings=$((writings + 1)); last=$now; sleep 1; done; ";

} // namespace

TEST(RunWatch, TellsTheFirstStateThenEachChange) {
    const Outcome run =
        on_zav(watched("", "zavsim act disk 3 fails", "array 3 *.*: normal -> degraded"));
    EXPECT_EQ(run.status, 0);
    const std::size_t first = run.out.find("OK: 4 disks found");
    const std::size_t change = run.out.find("  X  disk 3: found -> failed\n");
    EXPECT_NE(first, std::string::npos) << run.out;
    EXPECT_NE(change, std::string::npos) << run.out;
    EXPECT_LT(first, change);
}

TEST(RunWatch, EndsAfterItsRounds) {
    const Outcome run = on_zav("zavctl watch --rounds 2 --interval 1");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(std::count(run.out.begin(), run.out.end(), '\n'), 1) << run.out;
}

TEST(RunWatch, PrintsOneJsonObjectPerChange) {
    const Outcome run =
        on_zav(std::string("zavctl watch --interval 1 --until-change --jsonl >out & pid=$!; ") +
               first_round_is_over + "zavsim act volume 1-2 fills 95%; wait $pid; cat out");
    EXPECT_EQ(run.status, 0);
    const nlohmann::json change = parsed(run.out);
    EXPECT_EQ(change["subject"], "volume 1-2");
    EXPECT_EQ(change["before"], "normal");
    EXPECT_EQ(change["after"], "full");
    EXPECT_EQ(change["severity"], "warning");
}

// What the driver itself tells of the failed disk is taken away first.
TEST(RunWatch, PushesEachChangeAndNothingOfTheFirstRound) {
    const Outcome run =
        on_zav("zavsim act disk 4 fails; zavctl event poll --all >/dev/null; " +
               watched("--push", "zavsim act volume 1-2 fills 95%; zavctl event wait >taken",
                       "normal -> full", "cat taken; zavctl event poll"));
    EXPECT_TRUE(holds(run.out, " !  volume 1-2: full, 9")) << run.out;
    EXPECT_TRUE(holds(run.out, "OK: no event is pending")) << run.out;
}

// The driver tells of the power cut, the watch pushes what the library says of the UPS, and a third
// process prints both. The battery lasts for 1,000 s of the appliance's clock, here 200 s.
TEST(RunWatch, PassesAPowerCutOnToWhoeverFollowsTheEvents) {
    const Outcome run = on_zav(
        "zavctl event follow >followed & follow=$!; " +
            watched("--push",
                    "zavsim act power fails; "
                    "until [ $(grep -c 'UPS: on battery' followed) -ge 2 ]; do sleep 1; done",
                    "UPS: online -> on battery",
                    "kill $follow; wait $follow; echo follow ended with $?; cat followed"),
        {"--time-scale", "5"});
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "  !  UPS: online -> on battery\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "follow ended with 0\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "  !  UPS: on battery, 100 %\n")) << run.out;
}

TEST(RunWatch, GoesOnWhenNothingCanBePushed) {
    const Outcome run =
        on_zav("rm /dev/zavevent0; " +
               watched("--push",
                       "zavsim act volume 1-2 fills 95%; until grep -q driver err; do sleep 1; "
                       "done; zavsim act volume 1-2 fills 20%",
                       "full -> normal"));
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "zavctl: volume 1-2 was not pushed: there is no event driver"))
        << run.out;
}

TEST(RunWatch, ARoundWhoseToolHangsCouldNotTellAndTheNextGoesOn) {
    const Outcome run = on_zav(
        watched("--timeout 20",
                "zavsim act tool smartctl hangs 100000s; until grep -q 'disk 1: found -> unknown' "
                "out; do sleep 1; done; zavsim act tool smartctl works again",
                "disk 1: unknown -> found"));
    EXPECT_EQ(run.status, 0) << run.out;
}

TEST(RunWatch, EndsWhenNobodyReads) {
    const Outcome run = on_zav("zavctl watch --interval 1 | head -n 1; echo ${PIPESTATUS[0]}");
    EXPECT_TRUE(run.out.ends_with("\n3\n")) << run.out;
}

TEST(RunWatch, OnATerminalTheOtherScreenIsEnteredAndLeft) {
    const Outcome run = on_zav(
        "TERM=xterm script -qec 'zavctl watch --rounds 1 --interval 1' /dev/null </dev/null");
    EXPECT_EQ(run.status, 0);
    EXPECT_NE(run.out.find("\033[?1049h"), std::string::npos);
    EXPECT_NE(run.out.find("\033[H"), std::string::npos);
    EXPECT_TRUE(run.out.ends_with("\033[?25h\033[?1049l"));
}
