// Burning a directory or a file.
#include "cdburn.h"

#include <filesystem>

namespace {

using namespace cdburn;

namespace fs = std::filesystem;

class Burning : public Drive {
  protected:
    Burning() {
        for (const char *directory : {"/scratch/tree", "/tmp/burnDir", "/tmp/linkDir"})
            fs::create_directories(directory); // no command that is scripted makes one
        put("/scratch/file", "content");
        record().drive = [](unsigned long, void *) { return 0; };
        source_size("1000\t/scratch/tree\n");
    }

    static void source_size(const std::string &line) {
        record().shell->first("du -sL /scratch", prints(line));
        record().shell->first("du -sL /tmp", prints(line));
    }

    static int burn(const std::string &directory, int session) {
        record().steps.clear();
        std::string path = directory;
        return checked([&] { return zavCDBurn(path.data(), session); });
    }
    static int burn_as(const std::string &directory, const std::string &name, int session = 0) {
        record().steps.clear();
        std::string path = directory;
        std::string destination = name;
        return checked([&] { return zavCDBurnEx(path.data(), destination.data(), session); });
    }
    static int burn_file(const std::string &file) {
        record().steps.clear();
        std::string path = file;
        return checked([&] { return zavCDBurnFile(path.data()); });
    }
    static int burn_file_as(const std::string &file, const std::string &name) {
        record().steps.clear();
        std::string path = file;
        std::string destination = name;
        return checked([&] { return zavCDBurnFileEx(path.data(), destination.data()); });
    }

    // What a burn of this directory runs before the disc's own command.
    static Lines before(const std::string &directory, const Lines &cd = {}) {
        return joined(joined(joined({kBegin}, query()), cd), {"du -sL " + directory});
    }
    static Lines after() { return {kCleanUp, "sleep 2", "sleep 2"}; }
    static Lines burned(const std::string &command,
                        const std::string &directory = "/scratch/tree") {
        return joined(joined(before(directory), {command}), after());
    }

    static constexpr const char *kNew =
        "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -Z /dev/scd0 -R -J -f "
        "/scratch/tree &>/tmp/progress.outfile";
    static constexpr const char *kFromBurnDir =
        "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -Z /dev/scd0 -R -J -f "
        "/tmp/burnDir &>/tmp/progress.outfile";
    static constexpr const char *kFromLinkDir =
        "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -Z /dev/scd0 -R -J -f "
        "/tmp/linkDir &>/tmp/progress.outfile";
};

// ---- Commands by disc and session ----

TEST_F(Burning, OpensABlankDvd) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps, burned(kNew));
    EXPECT_EQ(get("/tmp/progress.outfile"), "100");
    EXPECT_EQ(record().requests, std::vector<unsigned long>{CDROMRESET});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Burning, ClosesABlankDvd) {
    dvd("11h, DVD-R Sequential", "blank");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              burned("growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -dvd-compat -Z "
                     "/dev/scd0 -R -J -f /scratch/tree &>/tmp/progress.outfile"));
}

TEST_F(Burning, AddsToAnAppendableDvd) {
    dvd("1Bh, DVD+R", "appendable");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              burned("growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -M /dev/scd0 "
                     "-R -J -f /scratch/tree &>/tmp/progress.outfile"));
}

TEST_F(Burning, WritesASequentialRewritableDvdAtOnce) {
    dvd("14h, DVD-RW Sequential", "blank");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              burned("growisofs -use-the-force-luke=4gms -use-the-force-luke=dao  "
                     "-use-the-force-luke=notray -Z /dev/scd0 -R -J -f /scratch/tree "
                     "&>/tmp/progress.outfile"));
}

TEST_F(Burning, WritesADoubleLayerDvdAtOnce) {
    dvd("2Bh, DVD+R Double Layer", "blank");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              burned("growisofs -use-the-force-luke=dao -use-the-force-luke=notray -Z /dev/scd0 -R "
                     "-J -f /scratch/tree &>/tmp/progress.outfile"));
}

TEST_F(Burning, ClosesABlankCd) {
    cd(0, std::string(kCdR) + "30903\n");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              joined(joined(before("/scratch/tree", {kAtip}),
                            {"mkisofs -R -J -f -q -print-size /scratch/tree &>/tmp/cd.outfile",
                             "mkisofs -R -J -f /scratch/tree 2>/tmp/progress.outfile | cdrecord "
                             "dev=/dev/scd0 -v -gracetime=3 -data -dao -tsize=30903s - "
                             "&>/dev/null"}),
                     after()));
}

TEST_F(Burning, ReadsTheRealSizeOfAnImage) {
    cd(0, kCdR + harness::data("captures/mkisofs/print-size-not-quiet.txt"));
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    EXPECT_NE(record().commands[7].find(" -tsize=30903s "), std::string::npos)
        << record().commands[7];
}

TEST_F(Burning, OpensABlankCd) {
    cd(0, kCdRw);
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              joined(joined(before("/scratch/tree", {kAtip}),
                            {"mkisofs -R -J -f /scratch/tree 2>/tmp/progress.outfile | cdrecord "
                             "dev=/dev/scd0 -multi -v -gracetime=3 -data - &>/dev/null"}),
                     after()));
}

TEST_F(Burning, AddsToAnAppendableCd) {
    cd(1, std::string(kCdR) + "0,11702\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              joined(joined(before("/scratch/tree", {kAtip, kMsinfo}),
                            {kMsinfo, "mkisofs -C 0,11702 -M /dev/scd0 -R -J -f /scratch/tree "
                                      "2>/tmp/progress.outfile | cdrecord dev=/dev/scd0 -multi -v "
                                      "-gracetime=3 -data - &>/dev/null"}),
                     after()));
}

TEST_F(Burning, RefusesWhatTheDiscDoesNotTake) {
    dvd("1Bh, DVD+R", "complete");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_BADDISC);
    EXPECT_EQ(record().steps, before("/scratch/tree"));
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn("/scratch/tree", 2), ZAV_RC_ERR_EINVAL);
    no_dvd(":-( no media mounted, exiting...");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_NODISC);
    EXPECT_EQ(get("/tmp/progress.outfile"), "");
}

// ---- Before the burn ----

TEST_F(Burning, RefusesNullPointers) {
    char name[] = "x";
    EXPECT_EQ(zavCDBurn(nullptr, 0), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavCDBurnEx(nullptr, name, 0), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavCDBurnEx(name, nullptr, 0), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
    EXPECT_EQ(zavCDBurnFile(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavCDBurnFileEx(nullptr, name), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavCDBurnFileEx(name, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().commands, (Lines{kCleanUp, kCleanUp, kCleanUp}));
}

TEST_F(Burning, NeedsADirectory) {
    EXPECT_EQ(burn("/scratch/nothing", 0), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(burn("/scratch/file", 0), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(burn_as("/scratch/file", "x"), ZAV_RC_ERR_ENOENT);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(Burning, NeedsTheProgressFile) {
    fails(kBegin);
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, Lines{kBegin});
}

TEST_F(Burning, NeedsToKnowTheDisc) {
    put("/tmp/dvd.outfile", "");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR);
    EXPECT_EQ(record().steps, joined({kBegin}, query()));
}

TEST_F(Burning, PassesOnlyTheWriteOnceDvdsToAComboDrive) {
    combo_drive();
    dvd("1Ah, DVD+RW", "blank");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_BADDISC);
    EXPECT_EQ(record().steps, joined(joined({kBegin}, query()), {kUsed}));
    dvd("11h, DVD-R Sequential", "blank");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
}

TEST_F(Burning, FitsExactlyWithTheRoomThatIsLeft) {
    dvd("1Bh, DVD+R", "appendable", "1000*2048=2048000");
    source_size("4583904\t/scratch/tree\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    source_size("4583905\t/scratch/tree\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_EFBIG);
    EXPECT_EQ(record().steps, before("/scratch/tree"));
}

TEST_F(Burning, FitsExactlyOnAWholeDisc) {
    dvd("1Bh, DVD+R", "blank");
    source_size("4590000\t/scratch/tree\n");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
    source_size("4590001\t/scratch/tree\n");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_EFBIG);
}

TEST_F(Burning, AsksForRoomAfterACdsPreparation) {
    cd(1, std::string(kCdR) + "0,11702\n");
    source_size("1000000\t/scratch/tree\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_EFBIG);
    EXPECT_EQ(record().steps, joined(before("/scratch/tree", {kAtip, kMsinfo}), {kMsinfo}));
}

TEST_F(Burning, TakesNoSizeForNoRoom) {
    dvd("1Bh, DVD+R", "blank");
    for (const char *line : {"", "\n", "du: cannot\n", "-5\t/scratch/tree\n"}) {
        source_size(line);
        EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_EFBIG) << line;
    }
}

TEST_F(Burning, GoesOnWhereNothingCanBeMeasured) {
    dvd("1Bh, DVD+R", "blank");
    record().shell->first("du -sL /scratch", no_start());
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_OK);
}

TEST_F(Burning, NeedsTheSizeOfACdsImage) {
    cd(0, std::string(kCdR) + "genisoimage: no size\n");
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_CDTOOL);
    cd(0, std::string(kCdR) + "30903\n");
    fails("-print-size", 2);
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_CDTOOL);
    EXPECT_EQ(record().steps.back(),
              "mkisofs -R -J -f -q -print-size /scratch/tree &>/tmp/cd.outfile");
}

TEST_F(Burning, NeedsTheSessionsOfACd) {
    cd(1, std::string(kCdR) + "0,11702\n\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_BADDISC); // the query does not know its state
    cd(1, std::string(kCdR) + "0,11702\n");
    int asked = 0;
    record().before_command = [&asked](const std::string &command) {
        if (command == kMsinfo && ++asked == 2)
            put("/tmp/cd.outfile", "0,11702\n\n");
    };
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_CDTOOL);
    EXPECT_EQ(asked, 2);
    record().before_command = nullptr;
    cd(1, std::string(kCdR) + "0,11702\n");
    fails("-msinfo"); // which leaves it appendable
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_CDTOOL);
    EXPECT_EQ(record().steps.back(), kMsinfo);
}

TEST_F(Burning, NeedsASessionReportThatIsNotEmpty) {
    cd(1, std::string(kCdR) + "0,11702\n");
    int asked = 0;
    record().before_command = [&asked](const std::string &command) {
        if (command == kMsinfo && ++asked == 2)
            put("/tmp/cd.outfile", "");
    };
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_CDTOOL);
    EXPECT_EQ(asked, 2);
    EXPECT_EQ(record().steps.back(), kMsinfo);
}

TEST_F(Burning, CleansUpWithoutACdsReport) {
    cd(0, kCdR);
    const auto answer = record().drive;
    record().drive = [answer](unsigned long request, void *argument) {
        remove("/tmp/cd.outfile");
        return answer(request, argument);
    };
    EXPECT_EQ(burn("/scratch/tree", 0), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps.back(), kCleanUp);
}

// ---- The burn ----

TEST_F(Burning, ReportsADvdThatFails) {
    dvd("1Bh, DVD+R", "blank");
    fails("growisofs", 5);
    put("/tmp/progress.outfile", " 10.00% done, estimate finish\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_BURNER);
    EXPECT_EQ(record().steps, joined(before("/scratch/tree"), {kNew}));
    EXPECT_EQ(record().log, std::vector{row("zavCDBurn", 1,
                                            std::string("[22] cmd[") + kNew +
                                                "] failed. err: 5, Input/output error.")});
    EXPECT_EQ(get("/tmp/progress.outfile"), " 10.00% done, estimate finish\n");
}

TEST_F(Burning, ReportsACdThatFails) {
    for (const char *report : {kCdR, kCdRw}) {
        cd(0, report);
        fails("-multi", 254);
        record().log.clear();
        EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_ERR_CDTOOL);
        ASSERT_EQ(record().log.size(), 1U);
        EXPECT_NE(record().log[0].text.find("failed. err: 254, Unknown error 254."),
                  std::string::npos);
    }
}

TEST_F(Burning, TakesADirectoryWhateverItIsCalled) {
    dvd("1Bh, DVD+R", "blank");
    record().shell->first("du -sL", prints("1\n"));
    fs::create_directories("/scratch/a b; touch ran");
    EXPECT_EQ(burn("/scratch/a b; touch ran", 1), ZAV_RC_OK);
    EXPECT_EQ(record().commands[5],
              "growisofs -use-the-force-luke=4gms -use-the-force-luke=notray -Z /dev/scd0 -R -J -f "
              "'/scratch/a b; touch ran' &>/tmp/progress.outfile");
}

// The commands as they were made for names that a shell would act upon, given to a shell.
TEST_F(Burning, RunsNothingThatANameHolds) {
    dvd("1Bh, DVD+R", "blank");
    record().shell->first("du -sL", prints("1\n"));
    for (const std::string name : {"$(touch ran)", "`touch ran`", "x; touch ran", "x\ntouch ran",
                                   "x|touch ran", "x&touch ran", "'\"; touch ran #"}) {
        std::string directory = "/scratch/" + name;
        std::string file = directory + "/" + name;
        std::string on_disc = name;
        put(file, "x");
        EXPECT_EQ(zavCDBurn(directory.data(), 1), ZAV_RC_OK) << name;
        EXPECT_EQ(zavCDBurnEx(directory.data(), on_disc.data(), 1), ZAV_RC_OK) << name;
        EXPECT_EQ(zavCDBurnFile(file.data()), ZAV_RC_OK) << name;
        EXPECT_EQ(zavCDBurnFileEx(file.data(), on_disc.data()), ZAV_RC_OK) << name;
    }
    const Lines commands = record().commands;
    record().shell.reset();
    for (const std::string &command : commands) {
        if (command.find("touch") == std::string::npos)
            continue;
        EXPECT_NE(system(("cd /scratch && " + command).c_str()), -1);
    }
    EXPECT_FALSE(exists("/scratch/ran"));
}

TEST_F(Burning, RunsNothingThatTheSessionsOfACdHold) {
    cd(1, std::string(kCdR) + "0,11702$(touch /scratch/ran)\n");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    std::string next_session;
    for (const std::string &command : record().commands)
        if (command.find("mkisofs -C") == 0)
            next_session = command;
    ASSERT_NE(next_session.find("'0,11702$(touch /scratch/ran)'"), std::string::npos);
    record().shell.reset();
    EXPECT_NE(system(next_session.c_str()), -1);
    EXPECT_FALSE(exists("/scratch/ran"));
}

TEST_F(Burning, TakesALongPath) {
    dvd("1Bh, DVD+R", "blank");
    record().shell->first("du -sL", prints("1\n"));
    std::string path = "/scratch";
    for (int i = 0; i < 15; ++i)
        path += "/" + std::string(250, 'x');
    fs::create_directories(path);
    EXPECT_EQ(burn(path, 1), ZAV_RC_OK);
    EXPECT_NE(record().commands[5].find(path), std::string::npos);
}

TEST_F(Burning, DoesNotWriteThroughALinkInPlaceOfTheProgress) {
    dvd("1Bh, DVD+R", "blank");
    put("/scratch/precious", "kept");
    fs::create_symlink("/scratch/precious", "/tmp/progress.outfile");
    EXPECT_EQ(burn("/scratch/tree", 1), ZAV_RC_OK);
    EXPECT_EQ(get("/scratch/precious"), "kept");
}

// ---- Under a name, and single files ----

TEST_F(Burning, GivesADirectoryItsNameThroughALink) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn_as("/scratch/tree", "my photos", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps,
              joined(joined({"mkdir -p /tmp/burnDir &>/dev/null",
                             "ln -s /scratch/tree /tmp/burnDir/'my photos' &>/dev/null"},
                            burned(kFromBurnDir, "/tmp/burnDir")),
                     {kCleanUp}));
}

TEST_F(Burning, BurnsToTheRootWithoutAName) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn_as("/scratch/tree", "", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps, joined(burned(kNew), {kCleanUp}));
}

TEST_F(Burning, RefusesANameThatIsAPath) {
    for (const char *name : {"a/b", "a\\b", "/"}) {
        EXPECT_EQ(burn_as("/scratch/tree", name), ZAV_RC_ERR_EINVAL);
        EXPECT_TRUE(record().steps.empty());
        EXPECT_EQ(burn_file_as("/scratch/file", name), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().steps, Lines{kCleanUp});
    }
}

TEST_F(Burning, RefusesANameWhoseLinkCannotBeMade) {
    fails("ln -s");
    EXPECT_EQ(burn_as("/scratch/tree", "x"), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().steps, (Lines{"mkdir -p /tmp/burnDir &>/dev/null",
                                     "ln -s /scratch/tree /tmp/burnDir/x &>/dev/null", kCleanUp}));
}

TEST_F(Burning, MakesNoLinkOutsideItsDirectory) {
    for (const char *name : {".", ".."}) {
        EXPECT_EQ(burn_as("/scratch/tree", name), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(record().steps, (Lines{"mkdir -p /tmp/burnDir &>/dev/null", kCleanUp}));
    }
}

TEST_F(Burning, TakesANameThatBeginsWithADash) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn_as("/scratch/tree", "-x", 1), ZAV_RC_OK);
    EXPECT_EQ(record().steps[1], "ln -s /scratch/tree /tmp/burnDir/-x &>/dev/null");
}

TEST_F(Burning, BurnsAFileThroughALink) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn_file("/scratch/file"), ZAV_RC_OK);
    EXPECT_EQ(record().steps, joined(joined({kCleanUp, "mkdir -p /tmp/linkDir",
                                             "ln -s /scratch/file /tmp/linkDir/file"},
                                            burned(kFromLinkDir, "/tmp/linkDir")),
                                     {kCleanUp}));
}

TEST_F(Burning, BurnsAFileWhoseLinkIsThereAlready) {
    dvd("1Bh, DVD+R", "blank");
    fails("ln -s");
    EXPECT_EQ(burn_file("/scratch/file"), ZAV_RC_OK);
}

TEST_F(Burning, NeedsAFileThatCanBeReadAndItsWholePath) {
    EXPECT_EQ(burn_file("/scratch/nothing"), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps, (Lines{kCleanUp, kCleanUp}));
    EXPECT_EQ(burn_file_as("/scratch/nothing", "x"), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps, (Lines{kCleanUp, kCleanUp}));
    const fs::path here = fs::current_path();
    fs::current_path("/scratch");
    EXPECT_EQ(burn_file("file"), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(record().steps, Lines{kCleanUp});
    fs::current_path(here);
}

TEST_F(Burning, BurnsAFileIntoADirectory) {
    dvd("1Bh, DVD+R", "blank");
    EXPECT_EQ(burn_file_as("/scratch/file", "docs"), ZAV_RC_OK);
    EXPECT_EQ(record().steps, joined(joined({kCleanUp, "mkdir -p /tmp/linkDir &>/dev/null",
                                             "ln -s /scratch/file /tmp/linkDir/file &>/dev/null",
                                             "mkdir -p /tmp/burnDir &>/dev/null",
                                             "ln -s /tmp/linkDir /tmp/burnDir/docs &>/dev/null"},
                                            burned(kFromBurnDir, "/tmp/burnDir")),
                                     {kCleanUp, kCleanUp}));
}

TEST_F(Burning, RefusesAFileWhoseLinkCannotBeMade) {
    fails("ln -s");
    EXPECT_EQ(burn_file_as("/scratch/file", "docs"), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().steps,
              (Lines{kCleanUp, "mkdir -p /tmp/linkDir &>/dev/null",
                     "ln -s /scratch/file /tmp/linkDir/file &>/dev/null", kCleanUp}));
}

} // namespace
