// Events on the simulated appliance's driver.
#include "run.h"

namespace {

std::string pushed(const std::string &words) {
    return "zavctl event push " + words + " >/dev/null; ";
}

} // namespace

TEST(RunEvent, NoEventPendingIsWell) {
    const Outcome run = on_zav("zavctl event poll");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "OK: no event is pending\n");
}

TEST(RunEvent, WhatIsPushedIsPolledOnce) {
    const Outcome run =
        on_zav(pushed("fan 2 --value 0 --state critical") + "zavctl event poll; zavctl event poll");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, " X  fan 2: critical, 0 rpm\n\nOK: 1 event taken\n"
                       "OK: no event is pending\n");
}

TEST(RunEvent, AllAreTakenInTheirOrder) {
    const Outcome run = on_zav(pushed("init 1") + pushed("disk 3 --state failed") +
                               "zavctl event poll --all --json");
    const nlohmann::json events = parsed(run.out)["events"];
    ASSERT_EQ(events.size(), 2U);
    EXPECT_EQ(events[0]["type"], "init");
    EXPECT_EQ(events[1]["subject"], "disk 3");
    EXPECT_EQ(events[1]["address"]["path"], "/dev/sata/disk3");
}

TEST(RunEvent, WhatFollowPrintsIsPushedAgain) {
    const Outcome run =
        on_zav(pushed("ups --charge 55 --state on-battery") +
               pushed("array 2 --state degraded,resync --progress 37.5") +
               "zavctl event poll --all --jsonl >a; zavctl event push - <a >/dev/null; "
               "zavctl event poll --all --jsonl >b; "
               "for f in a b; do sed 's/\"received\":\"[^\"]*\",//' $f >$f.untimed; done; "
               "cmp a.untimed b.untimed && wc -l <a");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "2\n");
}

TEST(RunEvent, AFullQueueIsTold) {
    const Outcome run =
        on_zav("for i in {1..64}; do echo '{\"type\":\"init\",\"state\":1}'; done | "
               "zavctl event push - >/dev/null; echo $?; zavctl event push init 7");
    EXPECT_EQ(run.status, 2);
    EXPECT_TRUE(run.out.starts_with("0\n")) << run.out;
    EXPECT_TRUE(holds(run.out, "CRITICAL: initialisation was not pushed: the driver")) << run.out;
    EXPECT_TRUE(holds(run.out, "full")) << run.out;
}

TEST(RunEvent, WaitGivesUpAfterItsTime) {
    const Outcome run = on_zav("zavctl event wait --timeout 1");
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.out, "WARNING: no event came within 1 s\n");
}

TEST(RunEvent, WaitIsEndedByTheEventThatComes) {
    const Outcome run = on_zav("zavctl event wait >out & sleep 10; " +
                               pushed("nic eth0 --state down --speed 1000") + "wait $!; cat out");
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "eth0: down, 1000 Mbit/s")) << run.out;
}

TEST(RunEvent, AMissingDriverIsTold) {
    for (const char *verb : {"poll", "wait", "follow"}) {
        const Outcome run = on_zav("rm /dev/zavevent0; zavctl event " + std::string(verb));
        EXPECT_EQ(run.status, 3) << verb;
        EXPECT_TRUE(holds(run.out + run.err, "there is no event driver: /dev/zavevent0 is missing"))
            << run.out << run.err;
    }
}

TEST(RunEvent, AWordThatIsNoneIsWrongUsage) {
    const Outcome run = on_zav("zavctl event push toaster 1 --state hot");
    EXPECT_EQ(run.status, 64);
    EXPECT_TRUE(holds(run.err, "'toaster' is no kind of event")) << run.err;
}

// A shell's background ignores SIGINT; what timeout runs does not, and gets every signal.
// Follows until the script has seen what it waits for in the file "out".
constexpr const char *until = "until grep -q \"$1\" out; do sleep 1; done; ";

TEST(RunEventFollow, PrintsEachEventAtOnceAndEndsWell) {
    for (const char *signal : {"INT", "TERM"}) {
        const Outcome run = on_zav("timeout --foreground 600 zavctl event follow >out & pid=$!; " +
                                   pushed("fan 2 --value 0 --state critical") +
                                   "set -- 'fan 2: critical, 0 rpm'; " + until + "kill -" + signal +
                                   " $pid; wait $pid");
        EXPECT_EQ(run.status, 0) << signal;
        EXPECT_EQ(run.err, "");
    }
}

TEST(RunEventFollow, PrintsJsonLines) {
    const Outcome run = on_zav("zavctl event follow --jsonl >out & pid=$!; " + pushed("init 5") +
                               "set -- init; " + until + "kill $pid; wait $pid; cat out");
    const nlohmann::json event = parsed(run.out);
    EXPECT_EQ(event["type"], "init");
    EXPECT_EQ(event["state"], 5);
    EXPECT_TRUE(event["received"].is_string());
}

TEST(RunEventFollow, TellsOnceThatTheDeviceIsBusyAndGoesOn) {
    const Outcome run =
        on_zav("exec 9<>/dev/zavevent0; flock 9; zavctl event follow >out 2>err 9>&- & pid=$!; "
               "until grep -q keeps err; do sleep 1; done; exec 9>&-; " +
               pushed("init 7") + "set -- 'state 7'; " + until + "kill $pid; wait $pid && cat err");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "zavctl: another program keeps the event device open; trying on\n");
}

TEST(RunEvent, APushWaitsForTheDeviceToBeFree) {
    const Outcome run = on_zav("exec 9<>/dev/zavevent0; flock 9; "
                               "zavctl event push init 7 >out 9>&- & "
                               "exec 9>&-; wait; zavctl event poll");
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.out, "state 7")) << run.out;
}

TEST(RunEvent, ADeviceThatStaysBusyIsTold) {
    const Outcome run = on_zav(
        "exec 9<>/dev/zavevent0; flock 9; zavctl event push init 7 9>&-; zavctl event poll 9>&-");
    EXPECT_EQ(run.status, 3);
    EXPECT_TRUE(holds(run.out, "was not pushed: another program has the event device open"))
        << run.out;
    EXPECT_TRUE(holds(run.out, "COULD NOT TELL: another program has the event device open"))
        << run.out;
}

TEST(RunEventFollow, EndsWhenNobodyReads) {
    const Outcome run =
        on_zav(pushed("init 7") + "zavctl event follow | head -n 1; echo ended ${PIPESTATUS[0]}");
    EXPECT_TRUE(run.out.ends_with("state 7\nended 3\n")) << run.out;
}
