// Runs on the simulated appliance: eight processes ask the library, and change what may be changed,
// all at once; one of them is killed now and then, and another takes its place. Nobody may wait for
// ever, no lock may stay held, and no answer may be another than the one that a process alone was
// given. usage: processes SECONDS
#include "questions.h"

#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <random>
#include <string>
#include <sys/mman.h>
#include <sys/sem.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace {

using concurrency::Question;
using Clock = std::chrono::steady_clock;
using std::chrono::seconds;

constexpr int kProcesses = 8;
constexpr seconds kPatience{120}; // for the last calls to come back

struct Shared {
    volatile bool stop;
    long asked[16];
    long different[16];
    long changes;
};

void work(Shared &shared, const std::vector<Question> &all, unsigned seed) {
    std::minstd_rand random(seed);
    while (!shared.stop) {
        const std::size_t i = random() % all.size();
        if (all[i].ask() != all[i].right)
            __atomic_add_fetch(&shared.different[i], 1, __ATOMIC_RELAXED);
        __atomic_add_fetch(&shared.asked[i], 1, __ATOMIC_RELAXED);
        concurrency::change(static_cast<unsigned>(random()));
        __atomic_add_fetch(&shared.changes, 1, __ATOMIC_RELAXED);
    }
}

pid_t begin(Shared &shared, const std::vector<Question> &all, unsigned seed) {
    const pid_t child = fork();
    if (child == 0) {
        work(shared, all, seed);
        _exit(0);
    }
    return child;
}

bool all_end(std::vector<pid_t> &processes) {
    const auto last = Clock::now() + kPatience;
    bool ended = true;
    for (const pid_t process : processes) {
        int status = 0;
        while (waitpid(process, &status, WNOHANG) == 0 && Clock::now() < last)
            std::this_thread::sleep_for(std::chrono::milliseconds(200));
        if (kill(process, SIGKILL) == 0) {
            ended = false;
            waitpid(process, &status, 0);
        }
    }
    return ended;
}

int held_locks() {
    int held = 0;
    for (const int key : {0x6911, 0x6912, 0x3231}) {
        const int id = semget(key, 1, 0);
        held += id >= 0 && semctl(id, 0, GETVAL) < 1;
    }
    return held;
}

} // namespace

int main(int argc, char **argv) {
    const int length = argc > 1 ? std::atoi(argv[1]) : 20;
    auto *shared = static_cast<Shared *>(
        mmap(nullptr, sizeof(Shared), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
    std::FILE *report = fdopen(dup(STDOUT_FILENO), "w"); // the rest of what is printed are traces
    std::freopen("/dev/null", "w", stdout);
    std::freopen("/dev/null", "w", stderr);
    const std::vector<Question> all = concurrency::questions();

    std::minstd_rand random(4711);
    std::vector<pid_t> processes;
    for (int i = 0; i < kProcesses; ++i)
        processes.push_back(begin(*shared, all, static_cast<unsigned>(random())));
    long killed = 0;
    for (const auto end = Clock::now() + seconds(length); Clock::now() < end; ++killed) {
        // Of the appliance, which are shorter.
        std::this_thread::sleep_for(std::chrono::milliseconds(500 + random() % 4500));
        pid_t &victim = processes[random() % processes.size()];
        kill(victim, SIGKILL);
        waitpid(victim, nullptr, 0);
        victim = begin(*shared, all, static_cast<unsigned>(random()));
    }
    shared->stop = true;
    const bool ended = all_end(processes);

    long asked = 0;
    long different = 0;
    for (std::size_t i = 0; i < all.size(); ++i) {
        std::fprintf(report, "%-20s %6ld answers, %ld of them different\n", all[i].name,
                     shared->asked[i], shared->different[i]);
        asked += shared->asked[i];
        different += shared->different[i];
    }
    const int held = held_locks();
    std::fprintf(report,
                 "%d processes for %d s: %ld answers, %ld different; %ld changes; %ld killed; %s; "
                 "%d locks held\n",
                 kProcesses, length, asked, different, shared->changes, killed,
                 ended ? "all came back" : "SOME WAIT FOR EVER", held);
    return ended && held == 0 && different == 0 && asked > 0 ? 0 : 1;
}
