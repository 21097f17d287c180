// Burning: done, refused, watched, stopped.
#include "run.h"

namespace {

// A directory of some two megabytes to burn, and a disc to burn it to.
std::string with_disc(const std::string &disc) {
    return "mkdir -p src/sub; head -c 2000000 /dev/zero >src/data; echo hello >src/sub/note; "
           "zavsim act drive gets " +
           disc + "; ";
}

const std::string slowly = "zavsim act drive writes at 1; "; // KiB a second

nlohmann::json answer_of(const Outcome &run) {
    return parsed(run.out.substr(run.out.find('{')));
}

// Burns with a disc in the drive and returns the answer.
nlohmann::json burned(const std::string &disc, const std::string &words, int status = 0) {
    const Outcome run = on_zav(with_disc(disc) + "zavctl disc burn " + words + " --yes --json");
    EXPECT_EQ(run.status, status) << run.out << run.err;
    return answer_of(run);
}

// A burn that is refused: the reason. The disc is as it was.
std::string refusal(const std::string &before, const std::string &words,
                    const std::string &afterwards = "") {
    const Outcome run =
        on_zav(before + "zavctl disc info --json >a; zavctl disc burn " + words +
               " --yes --json; status=$?; " + afterwards +
               "zavctl disc info --json >b; cmp a b >&2 || status=99; exit $status");
    EXPECT_EQ(run.status, 2) << run.out << run.err;
    const nlohmann::json answer = answer_of(run);
    EXPECT_EQ(answer["outcome"]["outcome"], "refused");
    const nlohmann::json &refusals = answer["plan"]["refusals"];
    return refusals.empty() ? "" : refusals[0]["text"].get<std::string>();
}

// What runs once the burn in the background, whose number is in $pid, has written a part.
Outcome beside_a_burn(const std::string &disc, const std::string &script) {
    return on_zav(with_disc(disc) + slowly +
                  "env --default-signal=INT zavctl disc burn src --yes >out 2>err & pid=$!; "
                  "until grep -qs writing err || ! kill -0 $pid; do sleep 5; done; " +
                  script);
}

} // namespace

TEST(RunBurn, AnOpenSessionTakesMoreLater) {
    const nlohmann::json answer = burned("blank DVD+R", "src");
    EXPECT_EQ(answer["outcome"]["outcome"], "done");
    EXPECT_EQ(answer["disc"]["state"], "appendable");
    EXPECT_EQ(answer["room"]["session"], "open");
    EXPECT_EQ(answer["room"]["counts"], "free");
    EXPECT_LT(answer["disc"]["free_kib"], answer["room"]["free_kib"]);
}

TEST(RunBurn, AClosedDiscIsComplete) {
    for (const char *disc : {"blank DVD-R", "blank CD-R"}) {
        const nlohmann::json answer = burned(disc, "src --session close");
        EXPECT_EQ(answer["disc"]["state"], "complete") << answer;
        EXPECT_EQ(answer["plan"]["steps"].back()["does"], "close");
    }
}

TEST(RunBurn, AFurtherSessionIsAdded) {
    for (const char *disc : {"blank CD-RW", "blank DVD+R"}) {
        const Outcome run = on_zav(with_disc(disc) + "zavctl disc burn src --to one --yes "
                                                     ">/dev/null && zavctl disc burn src --to two "
                                                     "--yes --json");
        EXPECT_EQ(run.status, 0) << run.out << run.err;
        EXPECT_EQ(answer_of(run)["plan"]["steps"].back()["does"], "append");
        EXPECT_EQ(answer_of(run)["disc"]["state"], "appendable");
    }
}

TEST(RunBurn, ARewritableDvdIsOverwritten) {
    const nlohmann::json answer =
        burned("complete DVD+RW with 3000 MB used", "src --session overwrite");
    EXPECT_EQ(answer["plan"]["steps"].back()["does"], "overwrite");
    EXPECT_EQ(answer["outcome"]["outcome"], "done");
}

TEST(RunBurn, AFileIsBurned) {
    EXPECT_EQ(burned("blank CD-R", "src/data")["disc"]["state"], "appendable");
    EXPECT_EQ(burned("blank DVD+R", "src/data --to logs")["disc"]["state"], "appendable");
}

TEST(RunBurn, TheProgressIsToldOnStandardError) {
    const Outcome run = on_zav(with_disc("blank DVD+R") + "zavsim act drive writes at 20; zavctl "
                                                          "disc burn src --yes --json");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(holds(run.err, " s  starting\n")) << run.err;
    EXPECT_TRUE(holds(run.err, " s  done; the drive is asked what the disc is now\n")) << run.err;
    EXPECT_TRUE(run.out.starts_with("{")) << run.out;
}

TEST(RunBurn, AtATerminalThereIsABar) {
    const Outcome run = on_zav(with_disc("blank DVD+R") + slowly +
                               "zavsim act drive writes at 20; echo y | TERM=xterm script -qec "
                               "'zavctl disc burn src' /dev/null");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(holds(run.out, "Burn it? [y/N]")) << run.out;
    EXPECT_TRUE(holds(run.out, "%  starting, 0:00")) << run.out;
    EXPECT_TRUE(holds(run.out, "burned; the disc is DVD+R, appendable now")) << run.out;
}

TEST(RunBurn, WithoutATerminalNothingIsDoneUnlessYes) {
    const Outcome run = on_zav(with_disc("blank CD-R") +
                               "echo y | zavctl disc burn src; status=$?; zavctl disc info; "
                               "exit $status");
    EXPECT_EQ(run.status, 64) << run.err;
    EXPECT_TRUE(holds(run.out, "OK: CD-R, blank")) << run.out;
}

TEST(RunBurn, ADryRunBurnsNothing) {
    const Outcome run =
        on_zav(with_disc("blank CD-R") + "zavctl disc burn src --dry-run && zavctl disc info");
    EXPECT_EQ(run.status, 1) << run.err; // a write-once disc is warned of
    const Outcome info =
        on_zav(with_disc("blank CD-RW") + "zavctl disc burn src --dry-run && zavctl disc info");
    EXPECT_EQ(info.status, 0) << info.err;
    EXPECT_TRUE(holds(info.out, "OK: CD-RW, blank")) << info.out;
}

TEST(RunBurn, ASourceThatDoesNotFitIsRefused) {
    EXPECT_TRUE(
        holds(refusal(with_disc("blank CD-R") + "head -c 730M /dev/zero >src/large; ", "src"),
              "free, which is what counts here"));
}

TEST(RunBurn, ACompleteDiscIsRefused) {
    EXPECT_EQ(refusal(with_disc("complete DVD+R with 100 MB used"), "src"),
              "this disc takes no burn: DVD+R, complete");
}

TEST(RunBurn, AComboDriveIsRefused) {
    EXPECT_EQ(refusal(with_disc("complete DVD+RW") + "zavsim act drive is a combo; ", "src"),
              "this is a combo drive, which does not write a DVD+RW");
}

TEST(RunBurn, AnEmptyDriveIsRefused) {
    EXPECT_EQ(refusal(with_disc("blank CD-R") + "zavsim act drive loses its disc; ", "src"),
              "there is no disc in the drive");
}

TEST(RunBurn, AMissingToolIsRefusedByItsName) {
    EXPECT_TRUE(
        holds(refusal(with_disc("blank DVD+R") + "zavsim act tool growisofs is missing; ", "src"),
              "not on the PATH: growisofs"));
    EXPECT_TRUE(holds(refusal(with_disc("blank CD-R") + "zavsim act tool du is missing; ", "src"),
                      "du does not measure the source"));
}

TEST(RunBurn, WhatIsNoSourceIsWrongUsage) {
    const auto status = [](const std::string &words) {
        return on_zav(with_disc("blank CD-R") +
                      "mkdir /tmp/burnDir; ln -s . src/link; zavctl disc "
                      "burn " +
                      words + " --yes")
            .status;
    };
    EXPECT_EQ(status("src/data --session close"), 64);
    EXPECT_EQ(status("src/none"), 64);
    EXPECT_EQ(status("/dev/null"), 64);
    EXPECT_EQ(status("src --to a/b"), 64);
    EXPECT_EQ(status("src --to .."), 64);
    EXPECT_EQ(status("/tmp/burnDir"), 64);
    EXPECT_EQ(status("/tmp --to all"), 64);
    EXPECT_EQ(status("src --session fast"), 64);
}

TEST(RunBurn, ProgressIsToldToOtherProcesses) {
    const Outcome run = beside_a_burn("blank DVD+R", "zavctl disc progress --json; zavctl disc "
                                                     "burn src --yes >second; echo $?; "
                                                     "cat second >&2; kill -TERM $pid; wait");
    const nlohmann::json progress = parsed(run.out.substr(0, run.out.rfind('}') + 1))["progress"];
    EXPECT_EQ(progress["running"], true) << run.out;
    EXPECT_GT(progress["percent"], 0);
    EXPECT_EQ(progress["tools"][0]["tool"], "growisofs");
    EXPECT_TRUE(run.out.ends_with("}\n2\n")) << run.out;
    EXPECT_TRUE(holds(run.err, "the burner is at work: growisofs (")) << run.err;
}

TEST(RunBurn, ABurnIsCancelledFromElsewhere) {
    for (const char *disc : {"blank DVD+R", "blank CD-R"}) {
        const Outcome run = beside_a_burn(disc, "zavctl disc cancel --wait --json >cancelled; wait "
                                                "$pid; status=$?; cat out >&2; cat cancelled; "
                                                "exit $status");
        EXPECT_EQ(run.status, 2) << run.err;
        EXPECT_TRUE(holds(run.err, "the burn failed")) << run.err;
        const nlohmann::json cancelled = answer_of(run)["cancel"];
        EXPECT_GE(cancelled["tools"].size(), 1U);
        EXPECT_EQ(cancelled["still_running"].size(), 0U);
    }
}

TEST(RunBurn, AnInterruptStopsTheBurnAndTellsTheDisc) {
    for (const char *signal : {"INT", "TERM"}) {
        const Outcome run = beside_a_burn(
            "blank DVD+R", std::string("kill -") + signal + " $pid; kill -" + signal +
                               " $pid; wait $pid; status=$?; cat out; cat err >&2; zavctl disc "
                               "progress; exit $status");
        EXPECT_EQ(run.status, 2) << signal << run.out << run.err;
        EXPECT_TRUE(holds(run.out, "the burn was stopped; the disc is DVD+R, ")) << run.out;
        EXPECT_TRUE(holds(run.out, "OK: no tool of the burner runs")) << run.out;
        EXPECT_TRUE(holds(run.err, "interrupted: the job is being stopped")) << run.err;
    }
}

// The terminal sends it to every process of zavctl's group: it is to reach zavctl alone.
TEST(RunBurn, CtrlCAtTheTerminalStopsTheBurnInOrder) {
    const Outcome run =
        on_zav(with_disc("blank DVD+R") + slowly +
               "mkfifo keys; TERM=xterm env --default-signal=INT script -qec 'zavctl disc burn src "
               "--yes' /dev/null <keys >out & pid=$!; exec 3>keys; until zavctl disc progress | "
               "grep -q growisofs || ! kill -0 $pid; do sleep 5; done; printf '\\003' >&3; wait "
               "$pid; status=$?; cat out; exit $status");
    EXPECT_EQ(run.status, 2) << run.out << run.err;
    EXPECT_TRUE(holds(run.out, "interrupted: the job is being stopped")) << run.out;
    EXPECT_TRUE(holds(run.out, "the burn was stopped; the disc is DVD+R, ")) << run.out;
}

TEST(RunBurn, AToolThatFailsIsTold) {
    for (const char *tool : {"growisofs", "mkisofs"}) {
        const bool dvd = std::string(tool) == "growisofs";
        const Outcome run =
            on_zav(with_disc(dvd ? "blank DVD+R" : "blank CD-R") + "zavsim act tool " + tool +
                   " exits 5; zavctl disc burn src --session close --yes --json");
        EXPECT_EQ(run.status, 2) << run.out;
        EXPECT_EQ(answer_of(run)["outcome"]["outcome"], "failed") << run.out;
        EXPECT_EQ(answer_of(run)["outcome"]["error"]["code"], dvd ? 0x2100 : 0x2101);
    }
}

// Of the pipe to cdrecord the shell tells the last status alone, which the library takes for
// success.
TEST(RunBurn, AnImageThatEndsEarlyIsNoSuccess) {
    const Outcome run = on_zav(with_disc("blank CD-R") +
                               "zavsim act tool mkisofs fails at 40%; zavctl disc burn src --yes "
                               "--json");
    EXPECT_EQ(run.status, 2) << run.out;
    EXPECT_EQ(answer_of(run)["outcome"]["outcome"], "incomplete");
    EXPECT_TRUE(holds(run.out, "mkisofs ended early, files are missing")) << run.out;
}

TEST(RunBurn, AToolThatFailsHalfWayIsTold) {
    const Outcome run = on_zav(with_disc("blank DVD-R") +
                               "zavsim act tool growisofs fails at 40%; zavctl disc burn src --yes "
                               "--json");
    EXPECT_EQ(run.status, 2) << run.out;
    EXPECT_EQ(answer_of(run)["outcome"]["error"]["code"], 0x2100);
    EXPECT_EQ(answer_of(run)["disc"]["state"], "appendable");
}

TEST(RunBurn, TheNameIsADirectoryOfTheDisc) {
    const std::string left_over = "mkdir /tmp/burnDir; ln -s /etc /tmp/burnDir/old; ";
    const auto root = [&left_over](const std::string &words) {
        return on_zav(with_disc("blank DVD+R") + left_over + "zavctl disc burn " + words +
                      " --yes >/dev/null && ls /media/cdrom; ls /tmp/burnDir /tmp/linkDir")
            .out;
    };
    EXPECT_EQ(root("src"), "data\nsub\n");
    EXPECT_EQ(root("src --to two"), "two\n");
    EXPECT_EQ(root("src/data --to logs"), "logs\n");
    EXPECT_EQ(root("./src/../src/data"), "data\n");
}

// The disc that is there at first is a CD when the library asks for itself, and the drive's node
// takes no packet command.
TEST(RunBurn, ALibraryThatEndsItsProcessIsTold) {
    const Outcome run = on_zav(
        "mkdir bin src; touch /dev/scd0 /dev/cdrom; for t in cdrecord mkisofs growisofs "
        "dvd+rw-format cdrwtool pktsetup mkudffs; do ln -s /bin/true bin/$t; done; "
        "printf '#!/bin/sh\\necho 12 src\\n' >bin/du; "
        "printf '#!/bin/sh\\n[ -e ran ] && { echo \":-( non-DVD media mounted, exiting...\"; exit "
        "239; }\\ntouch ran\\necho \" Mounted Media:         1Bh, DVD+R\"\\necho \" Disc "
        "status:           blank\"\\necho \"READ CAPACITY: 0*2048=0\"\\n' >bin/dvd+rw-mediainfo; "
        "chmod +x bin/du bin/dvd+rw-mediainfo; PATH=$PWD/bin:$PATH; "
        "zavctl disc burn src --yes --json",
        {"--bare"});
    EXPECT_EQ(run.status, 3) << run.out << run.err;
    EXPECT_EQ(answer_of(run)["outcome"]["outcome"], "no_answer");
    EXPECT_TRUE(holds(run.out, "the drive gave no answer: the library ended its process (exit "
                               "status 1)"))
        << run.out;
}
