// zavsim as a program: usage, exit statuses, ends, and the machines it runs on.
#include "sim_runner.hpp"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

namespace fs = std::filesystem;

namespace {

TEST(Launcher, PassesTheExitStatusOn) {
    EXPECT_EQ(on_appliance("exit 0").status, 0);
    EXPECT_EQ(on_appliance("exit 7").status, 7);
    EXPECT_EQ(on_appliance("exit 71").status, 71);
    EXPECT_EQ(on_appliance("kill -TERM $$").status, 128 + SIGTERM);
    EXPECT_EQ(on_appliance("kill -KILL $$").status, 128 + SIGKILL);
}

TEST(Launcher, SaysWhichCommandIsNotThere) {
    const Outcome run = zavsim({"--", "no-such-program"});
    EXPECT_EQ(run.status, 127);
    EXPECT_EQ(run.err, "zavsim: no-such-program: No such file or directory\n");
}

TEST(Launcher, AnswersWrongUsageWith64) {
    EXPECT_EQ(zavsim({}).status, 64);
    EXPECT_EQ(zavsim({"--"}).status, 64);
    EXPECT_EQ(zavsim({"true"}).status, 64);
    EXPECT_EQ(zavsim({"--model", "9999", "--", "true"}).status, 64);
    EXPECT_EQ(zavsim({"--time-scale", "0", "--", "true"}).status, 64);
    EXPECT_EQ(zavsim({"--shell", "zsh", "--", "true"}).status, 64);
    EXPECT_EQ(zavsim({"--model", "2860-2", "--level", "raid5", "--", "true"}).status, 64);
    EXPECT_EQ(zavsim({"--scenario", "/no/such/file", "--", "true"}).status, 64);
    for (const char *units : {"8", "-1", "x", ""})
        EXPECT_EQ(zavsim({"--model", "2980", "--units", units, "--", "true"}).status, 64) << units;
}

TEST(Launcher, HasUnitsForTheModelThatTakesThem) {
    const Outcome run = zavsim({"--units", "2", "--", "true"});
    EXPECT_EQ(run.status, 64);
    EXPECT_EQ(run.err, "zavsim: model 2860-4 has no expansion units, --units does not apply\n");
}

TEST(Launcher, PassesTextsOnAsTheirBytes) {
    const std::string odd = "\xff 2860 'quoted' \x80";
    EXPECT_EQ(on_appliance("cat /sys/class/dmi/id/product_name", {"--product", odd}).out,
              odd + "\n");
    EXPECT_EQ(zavsim({"--", "printf", "%s", odd}).out, odd);
}

TEST(Launcher, HelpsWithEverything) {
    const Outcome run = zavsim({"--help"});
    EXPECT_EQ(run.status, 0);
    for (const char *word :
         {"--model", "--product", "--serial", "--raidtype", "--level", "--units", "--tools",
          "--time-scale", "--scenario", "--shell", "--bare", "zavsim act", "zavsim state", "hangs"})
        EXPECT_NE(run.out.find(word), std::string::npos) << word;
}

TEST(Launcher, ABadScenarioRunsNothing) {
    const ScratchFile scenario("at 1s disk 3 fails\nat noon disk 3 joins\nat 5s disk 9 fails\n");
    const Outcome run = on_appliance("echo ran", {"--scenario", scenario.path()});
    EXPECT_EQ(run.status, 64);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err, scenario.path() +
                           ":2: a line reads: at 10s SENTENCE (times in s, m or ms)\n" +
                           scenario.path() + ":3: disk wants a number from 1 to 4\n");
}

TEST(Launcher, KeepsTheDirectoryAndWhatIsWrittenThere) {
    const ScratchFile file("before\n");
    const Outcome run = execute({"sh", "-c",
                                 "cd " + file.directory() + " && " + ZAVSIM +
                                     " -- sh -c 'pwd; cat file; echo after > file'"});
    EXPECT_EQ(run.out, file.directory() + "\nbefore\n");
    EXPECT_EQ(execute({"cat", file.path()}).out, "after\n");
}

TEST(Launcher, RunsAProgramFromAnyDirectory) {
    const ScratchFile file("#!/bin/sh\necho here\n");
    fs::permissions(file.path(), fs::perms::owner_all);
    EXPECT_EQ(zavsim({"--", file.path()}).out, "here\n");
}

TEST(Launcher, TheShellCanBeDashToShowWhatComesOfIt) {
    const std::string script = "smartctl -H -d ata /dev/sata/disk9 &>/dev/null; echo $?";
    EXPECT_EQ(on_appliance(script).out, "2\n");
    const std::string dash = on_appliance(script, {"--shell", "dash"}).out;
    EXPECT_NE(dash.find("0\n"), std::string::npos) << dash;
}

TEST(Launcher, SaysInOneLineThatTheMachineCannotDoIt) {
    const Outcome run = execute({"env", "PATH=/nonexistent", ZAVSIM, "--", "true"});
    EXPECT_EQ(run.status, 71);
    EXPECT_EQ(run.err.rfind("zavsim: this machine cannot provide the private root: bwrap cannot be "
                            "run (No such file or directory).",
                            0),
              0U)
        << run.err;
    EXPECT_EQ(std::count(run.err.begin(), run.err.end(), '\n'), 1);
}

TEST(Launcher, PassesOnWhyTheKernelRefuses) {
    const ScratchFile bwrap("");
    fs::rename(bwrap.path(), bwrap.directory() + "/bwrap");
    fs::remove(bwrap.directory() + "/bwrap");
    ASSERT_EQ(
        execute({"sh", "-c",
                 "printf '#!/bin/sh\\necho bwrap: No permissions to create new namespace >&2\\n"
                 "exit 1\\n' > " +
                     bwrap.directory() + "/bwrap && chmod +x " + bwrap.directory() + "/bwrap"})
            .status,
        0);
    const Outcome run =
        execute({"env", "PATH=" + bwrap.directory() + ":/usr/bin:/bin", ZAVSIM, "--", "true"});
    EXPECT_EQ(run.status, 71);
    EXPECT_NE(run.err.find("No permissions to create new namespace"), std::string::npos);
    EXPECT_EQ(std::count(run.err.begin(), run.err.end(), '\n'), 1);
}

// As root the test takes another user's part; otherwise it is one already. That user may not be
// allowed into the build directory, so the program goes where everybody is.
TEST(Launcher, RunsForAnOrdinaryUser) {
    const ScratchFile place("");
    const std::string program = place.directory() + "/zavsim";
    fs::copy_file(ZAVSIM, program);
    fs::permissions(place.directory(), fs::perms(0755));
    std::vector<std::string> words = {
        "env", "-C", "/",  program,
        "--",  "sh", "-c", "id -u; mdadm --detail /dev/md0 | head -n 1; touch /etc/x"};
    if (geteuid() == 0)
        words.insert(words.begin(),
                     {"setpriv", "--reuid=65534", "--regid=65534", "--clear-groups"});
    const Outcome run = execute(words);
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "0\n/dev/md0:\n");
}

// The processes on this machine whose command line holds the mark.
std::string marked_processes(const std::string &mark) {
    std::string found;
    for (const auto &entry : fs::directory_iterator("/proc")) {
        const std::string path = entry.path() / "cmdline";
        const std::string line = execute({"cat", path}).out;
        if (line.find(mark) != std::string::npos)
            found += path + "\n";
    }
    return found;
}

bool becomes_true(const std::function<bool()> &condition) {
    for (int i = 0; i < 100; ++i) {
        if (condition())
            return true;
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    return false;
}

class EndOfZavsim : public testing::TestWithParam<int> {};

TEST_P(EndOfZavsim, TakesEverythingInsideWithIt) {
    const std::string mark = "60" + std::to_string(getpid());
    const pid_t child = fork();
    if (child == 0) {
        execl(ZAVSIM, "zavsim", "--", "sleep", mark.c_str(), nullptr);
        _exit(127);
    }
    const auto slept = [&mark] {
        return marked_processes(std::string("sleep") + '\0' + mark).size() > 0;
    };
    EXPECT_TRUE(becomes_true(slept));
    kill(child, GetParam());
    int status = 0;
    waitpid(child, &status, 0);
    EXPECT_TRUE(becomes_true([&mark] { return marked_processes(mark).empty(); }))
        << marked_processes(mark);
}

INSTANTIATE_TEST_SUITE_P(Signals, EndOfZavsim, testing::Values(SIGTERM, SIGKILL, SIGHUP));

TEST(Launcher, LeavesNoProcessBehindACommandThatEnds) {
    const std::string mark = "61" + std::to_string(getpid());
    ASSERT_EQ(on_appliance("sleep " + mark + " & exit 0").status, 0);
    EXPECT_TRUE(becomes_true([&mark] { return marked_processes(mark).empty(); }));
}

// The terminal sends its interrupt to all at once.
TEST(Launcher, AnInterruptIsTheCommandsToHandle) {
    const Outcome run =
        execute({"setsid", "--wait", "sh", "-c",
                 "trap : INT; " + std::string(ZAVSIM) +
                     " -- bash -c 'trap \"echo caught; exit 5\" INT; echo ready; "
                     "for i in $(seq 100); do sleep 0.1; done' & "
                     "p=$!; sleep 1; kill -INT -$$; wait $p; wait $p; echo status $?"});
    EXPECT_NE(run.out.find("ready\n"), std::string::npos) << run.out << run.err;
    EXPECT_NE(run.out.find("caught\n"), std::string::npos) << run.out << run.err;
    EXPECT_NE(run.out.find("status 5\n"), std::string::npos) << run.out << run.err;
}

} // namespace
