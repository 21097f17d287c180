// The unit tests' appliance: a private root that each test fills with scripted answers, and a
// record of what the library asked of the system.
#pragma once

#include "zav_api.h"

#include <functional>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <sys/vfs.h>
#include <utility>
#include <vector>

namespace harness {

struct LogRow {
    std::string ident;
    int options;
    int facility;
    int priority;
    std::string text;

    bool operator==(const LogRow &) const = default;
};

// A row as the library writes all of its rows.
LogRow row(const std::string &ident, int priority, const std::string &text);

std::ostream &operator<<(std::ostream &out, const LogRow &row);

// What a command that is not run does.
struct Answer {
    std::string output; // to a pipe
    int status = 0;     // the exit status
    int error = 0;      // the errno that system() leaves behind
    bool starts = true; // or neither pipe nor shell can be had
};

Answer prints(const std::string &output);
Answer exits(int status, int error = 0);
Answer no_start();

// Answers of commands by a part of them, the first that fits. Others succeed and print nothing.
class ScriptedShell {
  public:
    using Row = std::pair<std::string, Answer>;
    ScriptedShell(std::initializer_list<Row> rows) : rows_(rows) {}

    void first(const std::string &part, const Answer &answer) {
        rows_.insert(rows_.begin(), {part, answer});
    }
    Answer answer(const std::string &command) const;

  private:
    std::vector<Row> rows_;
};

// What the library did since the test began.
struct Record {
    std::vector<std::string> commands;  // run by system or popen, in order
    std::vector<std::string> steps;     // the commands and, as "sleep 2" or "usleep 200", the waits
    std::optional<ScriptedShell> shell; // stands in for the shell
    std::function<void(const std::string &)> before_command;
    std::vector<LogRow> log;
    bool log_is_open = false;
    std::vector<unsigned> sleeps;             // seconds
    std::vector<unsigned> short_sleeps;       // microseconds
    std::function<void(size_t)> during_sleep; // told how many sleeps there were, this one included
    std::function<void()> during_short_sleep;
    std::optional<int> system_status; // what system() answers instead of running the command
    bool popen_fails = false;
    int pcloses = 0; // pipes closed as pipes
    std::vector<int> semget_flags;
    bool semget_fails = false;
    std::function<bool(short)> semop_fails; // told the operation: -1 takes, 1 releases
    std::vector<time_t> times;              // what time() answers, the last for ever; -1 fails
    std::optional<struct statfs> file_system;
    std::string measured;          // the path given to statfs
    std::vector<int> driver_flags; // with which a driver's device was opened
    std::vector<unsigned long> requests;
    std::function<int(unsigned long, void *)> driver; // answers requests; without it they fail
    std::function<int(unsigned long, void *)> drive;  // the same for the optical drive
    std::optional<int> thread_code; // what pthread_create answers instead of starting a thread
    std::vector<void *(*)(void *)> threads; // that were to be started
    bool calloc_fails = false;
    bool fprintf_fails = false;
    bool munmap_fails = false;
    bool close_fails = false;
    std::optional<int> access_error; // with which access() fails
    bool files_are_devices = false;  // to fstat(): of no size
};

Record &record();

// Set by a program that lets single calls of the library fail: every stand-in for a function of the
// C library asks it, with the function's name and where it is called from, before it does anything.
extern bool (*call_fails)(const char *function, const void *caller);
// What a command has printed, to its pipe or into the file that its output was sent to, and how it
// ended, as wait(2) tells it. Set by a program that has tools answer wrongly: may change both.
struct Outcome {
    std::string output;
    int status = 0;
};
extern void (*distort)(Outcome &outcome, const void *caller);
// Told of memory that a stand-in has given out.
extern void (*allocated)(void *memory, const void *caller);

// A fresh appliance for each test: nothing of an earlier test is left in the root.
class Appliance : public ::testing::Test {
  protected:
    Appliance();

    // A file with its directories.
    static void put(const std::string &path, const std::string &text);
    // An executable that prints `output` and ends with `status`.
    static void tool(const std::string &path, const std::string &output, int status = 0);
    static void script(const std::string &path, const std::string &body);
    static void remove(const std::string &path);
    static std::string get(const std::string &path);
    static bool exists(const std::string &path);

    // BIOS product name and raidtype line, as they stand in their files.
    static void model(const std::string &product, const std::string &raidtype);
    static void four_disk_model() { model("SV-2860\n", "raidtype=5;0;4\n"); }
    static void two_disk_model() { model("SV-2740\n", "raidtype=1;0;2\n"); }

    // The value of the semaphore with that key; -1 if there is none.
    static int semaphore_value(int key);

    // What a call of the library answers. It must leave no descriptor open and no child behind.
    template <class Call>
    static auto checked(const Call &call) {
        const size_t open_before = open_descriptors();
        const auto answer = call();
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        return answer;
    }

    // Number of descriptors that the process has open.
    static size_t open_descriptors();
    // Is there a child that was not waited for?
    static bool has_children();
};

// A text of tests/data.
std::string data(const std::string &path);

} // namespace harness

inline bool operator==(const zavDevice &a, const zavDevice &b) {
    return a.type == b.type && a.minor_type == b.minor_type && a.disk == b.disk && a.part == b.part;
}

std::ostream &operator<<(std::ostream &out, const zavDevice &dev);
