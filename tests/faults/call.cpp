#include "call.h"

#include "harness.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <dirent.h>
#include <fcntl.h>
#include <sys/sem.h>
#include <sys/syscall.h>
#include <sys/wait.h>

namespace faults {

namespace {

std::atomic<int> running = -1;
std::atomic<int> inside = 0; // threads that are in the library
thread_local int depth = 0;

// Names in a directory, by the kernel's own call: the library's stand-ins are not to be asked.
std::vector<std::string> names_in(const char *directory) {
    std::vector<std::string> names;
    DIR *open = opendir(directory);
    if (open == nullptr)
        return names;
    while (const dirent *entry = readdir(open))
        names.push_back(std::string(directory) + "/" + entry->d_name);
    closedir(open);
    return names;
}

int descriptors() {
    return static_cast<int>(names_in("/proc/self/fd").size());
}

bool other_threads() {
    return names_in("/proc/self/task").size() > 3; // with "." and ".."
}

std::vector<std::string> files() {
    std::vector<std::string> all;
    for (const char *directory : {"/tmp", "/etc/Kiru/zav"})
        for (const std::string &name : names_in(directory))
            all.push_back(name);
    return all;
}

// Files of these names stay after a call, whatever happens in it: they are told in the description.
bool may_stay(const std::string &path) {
    constexpr const char *kept[] = {"/tmp/progress.outfile", "/tmp/dvd.outfile", "/tmp/cd.outfile"};
    return path.starts_with("/etc/Kiru/zav/") ||
           std::find(std::begin(kept), std::end(kept), path) != std::end(kept);
}

constexpr int kKeys[] = {0x6911, 0x6912, 0x3231};

int semaphore(int key) {
    const int id = static_cast<int>(syscall(SYS_semget, key, 1, 0));
    return id < 0 ? -1 : static_cast<int>(syscall(SYS_semctl, id, 0, GETVAL));
}

std::vector<int> semaphores() {
    std::vector<int> values;
    for (const int key : kKeys)
        values.push_back(semaphore(key));
    return values;
}

// The query of a volume group releases its lock once more for each device that it does not find.
bool may_be(int key, int value) {
    return value == 1 || value == -1 || (key == 0x6911 && value > 1);
}

bool is_semaphore_function(const Function &function) {
    return std::strstr(function.name, "sem") != nullptr;
}

} // namespace

int running_function() {
    return running;
}

void ended_by_library() {
    constexpr const char *may[] = {"zavQueryDisc",    "zavCDBurn",  "zavCDBurnEx", "zavCDBurnFile",
                                   "zavCDBurnFileEx", "zavCDBlank", "zavCDFormat", "wait_cmd"};
    const char *name = functions()[static_cast<std::size_t>(running_function())].name;
    if (std::none_of(std::begin(may), std::end(may),
                     [name](const char *other) { return std::strcmp(name, other) == 0; }))
        complain("%s: ends the process, which is not described", name);
}

Watch::Watch(const Function &function) : function_(function), outermost_(depth++ == 0) {
    if (!outermost_ || board == nullptr)
        return;
    other_threads_ = other_threads();
    descriptors_ = descriptors();
    files_ = files();
    semaphores_ = semaphores();
    if (inside++ > 0)
        board->overlapping = true;
    board->called[function.number] = true;
    begin_call();
    running = function.number;
}

Watch::~Watch() {
    --depth;
    if (!outermost_ || board == nullptr)
        return;
    running = -1;
    --inside;
    if (board->overlapping)
        return;
    look();
    if (!board->fired)
        return;
    board->finished = true;
    _exit(0); // the test itself need not know what to do with a failed call
}

void Watch::look() const {
    // A thread of the test's own comes and goes with descriptors.
    if (const int now = descriptors(); now != descriptors_ && !other_threads_ && !other_threads())
        complain("%s: %d descriptors open, %d before", function_.name, now, descriptors_);
    siginfo_t child = {};
    if (waitid(P_ALL, 0, &child, WEXITED | WNOHANG | WNOWAIT) != -1 || errno != ECHILD)
        complain("%s: a child is left", function_.name);
    if (const int held = blocks_held(); held != 0)
        complain("%s: %d heap blocks are left", function_.name, held);
    for (const std::string &path : files())
        if (!may_stay(path) && std::find(files_.begin(), files_.end(), path) == files_.end())
            complain("%s: %s is left", function_.name, path.c_str());
    const std::vector<int> now = semaphores();
    for (std::size_t i = 0; i < now.size(); ++i)
        if (now[i] != semaphores_[i] && !may_be(kKeys[i], now[i]) &&
            !is_semaphore_function(function_) && !harness::record().semop_fails)
            complain("%s: semaphore 0x%x is %d", function_.name, kKeys[i], now[i]);
}

void Watch::answered(long code) const {
    if (!outermost_ || function_.codes.empty())
        return;
    if (std::find(function_.codes.begin(), function_.codes.end(), code) == function_.codes.end())
        complain("%s: answers %ld, which is not described", function_.name, code);
}

void Watch::overrun(bool intact) const {
    if (outermost_ && !intact)
        complain("%s: writes outside of a record", function_.name);
}

} // namespace faults
