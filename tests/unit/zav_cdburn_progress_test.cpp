// Progress and cancellation.
#include "cdburn.h"

#include <filesystem>

namespace {

using namespace cdburn;

class BurnProgress : public Drive {
  protected:
    static int of(const std::string &file) {
        record().shell->first("cat /tmp/progress.outfile", prints(file));
        return checked(zavCDProgress);
    }
    static std::string line(const std::string &percentage) {
        return percentage + "% done, estimate finish Sat Nov 21 04:10:10 2026\n";
    }
};

TEST_F(BurnProgress, IsReadThroughAPipe) {
    EXPECT_EQ(of(""), 0);
    EXPECT_EQ(record().commands, Lines{"cat /tmp/progress.outfile"});
}

TEST_F(BurnProgress, BeginsAtZeroAndEndsAtAHundred) {
    EXPECT_EQ(of("0\n"), 0);
    EXPECT_EQ(of("100"), 100);
    record().shell->first("cat", no_start());
    EXPECT_EQ(zavCDProgress(), 0);
}

TEST_F(BurnProgress, CountsFromTheFirstLine) {
    EXPECT_EQ(of(line(" 20.00") + line(" 60.00")), 50);
    EXPECT_EQ(of(line(" 20.00")), 0);
    EXPECT_EQ(of(line(" 33.90") + line(" 66.90")), 49); // 33 * 100 / 67
    EXPECT_EQ(of(line(" 50.00") + line(" 25.00")), -50);
}

TEST_F(BurnProgress, OfARealImageIsItsLastLine) {
    EXPECT_EQ(of(harness::data("captures/mkisofs/progress.txt")), (97 - 16) * 100 / (100 - 16));
}

TEST_F(BurnProgress, OfASimulatorIsItsOwn) {
    EXPECT_EQ(of("0% done, estimate finish\n35% done, estimate finish\n"), 35);
}

TEST_F(BurnProgress, IsDoneWhereItBeginsWithAHundred) {
    EXPECT_EQ(of(line("100.00")), 100);
    EXPECT_EQ(of(" " + line("100.00")), 100);
    EXPECT_EQ(of(" " + line("100.00") + line(" 20.00")), 100);
}

TEST_F(BurnProgress, IsWhatTheLastLineSays) {
    EXPECT_EQ(of("100\n" + line("0") + line("40")), 40);
    EXPECT_EQ(of(line("0") + line("40") + "100"), 100);
    EXPECT_EQ(of(line("0") + line("40") + "nothing\n10\n"), 40);
    EXPECT_EQ(of("1005 extents\n"), 1005);
}

TEST_F(BurnProgress, IsTheWholePartBeforeAPointOrPercentSign) {
    EXPECT_EQ(of(line("0") + line("  7.99")), 7);
    EXPECT_EQ(of(line("0") + line("..7")), 7);
    EXPECT_EQ(of(line("0") + "done, estimate finish\n"), 0);
    EXPECT_EQ(of(line("0") + line("x 7")), 0);
}

TEST_F(BurnProgress, IsReadInPiecesOf79Characters) {
    EXPECT_EQ(of(line("0") + std::string(79, ' ') + line("7")), 7);
    EXPECT_EQ(of(line("0") + std::string(70, ' ') + line("7")), 0);
}

TEST_F(BurnProgress, OfUpdatesOnOneLineIsTheFirstOfAPiece) {
    std::string updates;
    for (const char *percentage : {" 10.00", " 20.00", " 30.00", " 40.00"})
        updates += std::string(percentage) + "% done, estimate finish\r";
    ASSERT_EQ(updates.size(), 120U); // the second piece begins within the third update
    EXPECT_EQ(of(line("0") + updates), 0);
    EXPECT_EQ(of(line("0") + updates.substr(0, 79)), 10);
}

TEST_F(BurnProgress, SurvivesNumbersOfAnySize) {
    EXPECT_EQ(of(line("99") + line("99999999999")), 2147483647);
    EXPECT_EQ(of(line("99") + line("-99999999999")), -2147483647 - 1);
    EXPECT_EQ(of(line("-99999999999") + line("99999999999")), 199);
}

class Simulator : public BurnProgress {
  protected:
    // The updates of a course, each as the file was during the pause after it.
    static Lines course(void (*simulate)(), unsigned pause) {
        Lines updates;
        record().during_sleep = [&updates](size_t) {
            updates.push_back(get("/tmp/progress.outfile"));
            put("/tmp/progress.outfile", "100"); // as a job that ends meanwhile
        };
        checked([simulate] { return simulate(), 0; });
        for (const unsigned seconds : record().sleeps)
            EXPECT_EQ(seconds, pause);
        return updates;
    }
    static Lines expected(int updates, int step) {
        Lines lines;
        for (int i = 0; i < updates; ++i)
            lines.push_back("0% done, estimate finish\n" + std::to_string(i * step) +
                            "% done, estimate finish\n");
        return lines;
    }
};

TEST_F(Simulator, RunsTheCourseOfACd) {
    EXPECT_EQ(course(setCDBlankProgress, 1), expected(24, 4));
}

TEST_F(Simulator, RunsTheCourseOfAFormat) {
    EXPECT_EQ(course(setDVDBlankProgress, 10), expected(96, 1));
}

TEST_F(Simulator, RunsTheCourseOfAnEmptyFileSystem) {
    EXPECT_EQ(course(setDVDEmptyProgress, 1), expected(9, 10));
}

TEST_F(Simulator, GoesOnWithoutItsFile) {
    std::filesystem::create_directories("/tmp/progress.outfile/in the way");
    checked([] { return setDVDEmptyProgress(), 0; });
    EXPECT_EQ(record().sleeps.size(), 9U);
}

TEST_F(Simulator, DoesNotWriteThroughALink) {
    put("/scratch/precious", "kept");
    std::filesystem::create_symlink("/scratch/precious", "/tmp/progress.outfile");
    setDVDEmptyProgress();
    EXPECT_EQ(get("/scratch/precious"), "kept");
}

class Cancellation : public Drive {
  protected:
    Cancellation() { forget_processes(); }
    ~Cancellation() override { forget_processes(); }

    static void process(int number, const std::string &status) {
        put("/proc/" + std::to_string(number) + "/status", status);
    }
    static void forget_processes() {
        for (int number = 900001; number <= 900009; ++number)
            remove("/proc/" + std::to_string(number));
    }
    static constexpr const char *kKill =
        "killall growisofs cdrecord mkisofs dvd+rw-mediainfo dvd+rw-format &>/dev/null";
};

TEST_F(Cancellation, KillsTheTools) {
    fails("killall");
    EXPECT_EQ(zavCDBurnCancel(), ZAV_RC_OK);
    EXPECT_EQ(record().steps, Lines{kKill});
}

TEST_F(Cancellation, IsOverAtOnceWhenNoToolRuns) {
    EXPECT_EQ(checked(zavCDBurnSyncCancel), ZAV_RC_OK);
    EXPECT_EQ(record().steps, Lines{kKill});
}

TEST_F(Cancellation, WaitsForEveryTool) {
    const Lines tools = {"growisofs", "cdrecord", "mkisofs", "dvd+rw-format"};
    for (const std::string &tool : tools) {
        record().steps.clear();
        record().sleeps.clear();
        process(900001, "Name:\t" + tool + "\n");
        record().during_sleep = [](size_t sleeps) {
            if (sleeps == 2)
                remove("/proc/900001");
        };
        EXPECT_EQ(checked(zavCDBurnSyncCancel), ZAV_RC_OK);
        EXPECT_EQ(record().steps, (Lines{kKill, "sleep 3", "sleep 3"})) << tool;
    }
}

TEST_F(Cancellation, FindsAProcessByItsName) {
    process(900001, "Name:\tgrowisofs\nPid:\t900001\n");
    EXPECT_EQ(checked([] { return PIDOF("growisofs", 1); }), 900001U);
    EXPECT_EQ(PIDOF("growisofs", 2), 1U);
    EXPECT_EQ(PIDOF("growiso", 1), 1U);
    EXPECT_EQ(PIDOF("growisofs2", 1), 1U);
    EXPECT_EQ(PIDOF("", 1), 1U);
}

TEST_F(Cancellation, FindsSeveralProcessesOfOneName) {
    process(900001, "Name:\tmkisofs\n");
    process(900002, "Name:\tcdrecord\n");
    process(900003, "Name:\tmkisofs\n");
    const unsigned long first = PIDOF("mkisofs", 1);
    const unsigned long second = PIDOF("mkisofs", 2);
    EXPECT_EQ(first + second, 900001U + 900003U);
    EXPECT_NE(first, second);
    EXPECT_EQ(PIDOF("mkisofs", 3), 1U);
}

TEST_F(Cancellation, ReadsTheFirstLineThatIsAName) {
    process(900001, "State:\tR\nnAmE: \t tool x\nName:\tother\n");
    EXPECT_EQ(PIDOF("tool x", 1), 900001U);
    EXPECT_EQ(PIDOF("other", 1), 1U);
    process(900001, "NoName:\ttool\n Name:\ttool\n");
    EXPECT_EQ(PIDOF("tool", 1), 1U);
}

TEST_F(Cancellation, SkipsLinesWithoutAnEnd) {
    process(900001, "Name:\ttool");
    EXPECT_EQ(PIDOF("tool", 1), 1U);
    process(900001, "Name:\t" + std::string(193, 'x') + "\nName:\ttool\n");
    EXPECT_EQ(PIDOF("tool", 1), 900001U);
    process(900001, "Name:\t" + std::string(192, 'x') + "\nName:\ttool\n");
    EXPECT_EQ(PIDOF(std::string(192, 'x').c_str(), 1), 900001U);
}

TEST_F(Cancellation, SkipsWhatIsNoProcess) {
    put("/proc/tool1/status", "Name:\ttool\n");
    put("/proc/1tool/status", "Name:\ttool\n");
    std::filesystem::create_directories("/proc/900001");
    EXPECT_EQ(PIDOF("tool", 1), 1U);
    remove("/proc/tool1");
    remove("/proc/1tool");
}

TEST_F(Cancellation, RefusesNoNameAndNoSequence) {
    EXPECT_EQ(PIDOF(nullptr, 1), 22U);
    EXPECT_EQ(PIDOF("tool", 0), 22U);
}

TEST_F(Cancellation, CleansUpTheWorkDirectories) {
    cleanUp();
    EXPECT_EQ(record().steps, Lines{kCleanUp});
}

} // namespace
