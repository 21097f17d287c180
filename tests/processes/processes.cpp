// Runs on the simulated appliance: eight processes ask the library, and change what may be changed,
// all at once; one of them is killed now and then, and another takes its place. Nobody may wait for
// ever, no lock may stay held, and no answer may be another than the one that a process alone was
// given. usage: processes SECONDS
#include "zav_api.h"

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

using Clock = std::chrono::steady_clock;
using std::chrono::seconds;

constexpr int kProcesses = 8;
constexpr seconds kPatience{120}; // for the last calls to come back

// What an answer is worth, byte by byte; equal if the answers are.
template <class Record>
std::string bytes_of(int rc, const Record &record) {
    return std::to_string(rc) + ":" +
           std::string(reinterpret_cast<const char *>(&record), sizeof record);
}

template <class Record>
std::string answer(int (*ask)(zavDevice *, Record *), zavDevice device) {
    Record record;
    std::memset(&record, 0, sizeof record);
    const int rc = ask(&device, &record);
    return bytes_of(rc, record);
}

// How full a mounted file system is changes by itself.
std::string group_answer(int number) {
    zavDevice device = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0};
    zavLVMState state;
    std::memset(&state, 0, sizeof state);
    const int rc = zavGetStateLVM(&device, &state);
    for (lvmLV &volume : state.dev.lvmvgdev.lvdev)
        volume.usage = 0;
    return bytes_of(rc, state);
}

std::string monitor_answer(int unit) {
    float value = 0;
    const int rc = zavGetRBODHwMon(unit, 0, &value);
    return bytes_of(rc, value);
}

std::string unit_answer(int unit) {
    sRBODMap map = {};
    map.rbodid = unit;
    const int rc = zavGetRBODSN(&map);
    return bytes_of(rc, map);
}

struct Question {
    const char *name;
    std::function<std::string()> ask;
};

std::vector<Question> questions() {
    const zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 2, 0};
    const zavDevice array = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
    const zavDevice pv = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1};
    const zavDevice unit_disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 2 << 8 | 1, 0};
    const zavDevice card_volume = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0};
    return {
        {"disk", [=] { return answer(zavGetStateDisk, disk); }},
        {"array", [=] { return answer(zavGetStateRaid, array); }},
        {"system group", [] { return group_answer(0); }},
        {"data group", [] { return group_answer(1); }},
        {"physical volume", [=] { return answer(zavGetStateLVM, pv); }},
        {"unit's disk", [=] { return answer(zavGetStateDisk, unit_disk); }},
        {"controller's volume", [=] { return answer(zavGetStateRaid, card_volume); }},
        {"unit's monitor", [] { return monitor_answer(2); }},
        {"unit's identity", [] { return unit_answer(1); }},
    };
}

// What may be changed without an answer above becoming another.
int change(int number) {
    zavSystemEvent event = {};
    event.type = ZAV_EVENT_FAN;
    switch (number) {
    case 0:
        return zavSetLED(1, ZAV_LED_ON);
    case 1:
        return zavSetLED(1, ZAV_LED_OFF);
    case 2:
        return zavPushEvent(&event);
    case 3:
        return zavPollEvent(&event);
    default:
        return zavResetThermal(1);
    }
}

struct Shared {
    volatile bool stop;
    long asked[16];
    long different[16];
    long changes;
};

void work(Shared &shared, const std::vector<Question> &all, const std::vector<std::string> &right,
          unsigned seed) {
    std::minstd_rand random(seed);
    while (!shared.stop) {
        const std::size_t i = random() % all.size();
        if (all[i].ask() != right[i])
            __atomic_add_fetch(&shared.different[i], 1, __ATOMIC_RELAXED);
        __atomic_add_fetch(&shared.asked[i], 1, __ATOMIC_RELAXED);
        change(static_cast<int>(random() % 5));
        __atomic_add_fetch(&shared.changes, 1, __ATOMIC_RELAXED);
    }
}

pid_t begin(Shared &shared, const std::vector<Question> &all, const std::vector<std::string> &right,
            unsigned seed) {
    const pid_t child = fork();
    if (child == 0) {
        work(shared, all, right, seed);
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
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
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
    std::vector<Question> all;
    std::vector<std::string> right;
    for (const Question &question : questions()) {
        const std::string answer = question.ask();
        if (!answer.starts_with("0:"))
            continue; // not on this model
        all.push_back(question);
        right.push_back(answer);
    }

    std::minstd_rand random(4711);
    std::vector<pid_t> processes;
    for (int i = 0; i < kProcesses; ++i)
        processes.push_back(begin(*shared, all, right, static_cast<unsigned>(random())));
    long killed = 0;
    for (const auto end = Clock::now() + seconds(length); Clock::now() < end; ++killed) {
        std::this_thread::sleep_for(std::chrono::milliseconds(50 + random() % 450));
        pid_t &victim = processes[random() % processes.size()];
        kill(victim, SIGKILL);
        waitpid(victim, nullptr, 0);
        victim = begin(*shared, all, right, static_cast<unsigned>(random()));
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
