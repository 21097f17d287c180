#include "interrupt.h"

#include "run.h"

#include <atomic>
#include <condition_variable>
#include <csignal>
#include <cstring>
#include <initializer_list>
#include <mutex>
#include <thread>
#include <unistd.h>

namespace zavctl {

namespace {

std::atomic<bool> ending = false;
std::atomic<bool> changing = false;
std::atomic<int> told = -1; // where to tell that a change is finished first

// What a running program is told of an interrupt. Never destroyed: the thread that waits for
// signals outlives main.
struct Stop {
    std::mutex mutex;
    std::condition_variable noted;
    bool running = false; // a StopGuard lives
    bool asked = false;
    int descriptor = -1;
    const char *farewell = "";
    std::chrono::seconds patience{0};
    const char *reminder = "";
    std::chrono::steady_clock::time_point asked_at;
};
Stop &stop() {
    static Stop *const one = new Stop;
    return *one;
}

bool is_ignored(int number) {
    struct sigaction action {};
    return sigaction(number, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

void say_farewell() {
    const std::lock_guard lock(stop().mutex);
    if (stop().running) [[maybe_unused]]
        const auto done = write(stop().descriptor, stop().farewell, std::strlen(stop().farewell));
}

// Ends like a program that has no handler for the signal, so that a calling shell stops too.
[[noreturn]] void end_by(int number) {
    ending = true;
    say_farewell();
    kill_descendants();
    if (isatty(STDERR_FILENO) == 1) {
        constexpr char erase_line[] = "\r\033[K";
        [[maybe_unused]] const auto done = write(STDERR_FILENO, erase_line, sizeof erase_line - 1);
    }
    signal(number, SIG_DFL);
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, number);
    pthread_sigmask(SIG_UNBLOCK, &set, nullptr);
    raise(number);
    _exit(128 + number); // another thread's system() has just had the signal ignored again
}

// True if a change is under way: the signal is told of and has no other effect.
bool change_goes_on() {
    constexpr char message[] = "\nzavctl: the change is finished first; stopped halfway it would "
                               "leave the disks in between\n";
    if (!changing)
        return false;
    [[maybe_unused]] const auto done = write(told, message, sizeof message - 1);
    return true;
}

// Whether what the first interrupt began is given its time.
bool is_patient() {
    if (std::chrono::steady_clock::now() - stop().asked_at >= stop().patience)
        return false;
    [[maybe_unused]] const auto done =
        write(stop().descriptor, stop().reminder, std::strlen(stop().reminder));
    return true;
}

// True if a program runs until it is asked to stop, and this is the first time, or still under way.
bool stops_by_itself() {
    const std::lock_guard lock(stop().mutex);
    if (!stop().running)
        return false;
    if (stop().asked)
        return is_patient();
    stop().asked = true;
    stop().asked_at = std::chrono::steady_clock::now();
    stop().noted.notify_all();
    return true;
}

} // namespace

void end_on_interrupt() {
    sigset_t set;
    sigemptyset(&set);
    for (const int number : {SIGINT, SIGTERM, SIGHUP})
        if (!is_ignored(number)) // by nohup, or by a shell for its background
            sigaddset(&set, number);
    pthread_sigmask(SIG_BLOCK, &set, nullptr);
    std::thread([set] {
        int number = 0;
        while (sigwait(&set, &number) == 0)
            if (!change_goes_on() && !stops_by_itself())
                end_by(number);
    }).detach();
}

void stay_if_ending() {
    while (ending)
        pause();
}

ChangeGuard::ChangeGuard(int tell) {
    told = tell;
    changing = true;
}

ChangeGuard::~ChangeGuard() {
    changing = false;
}

StopGuard::StopGuard(int descriptor, const char *farewell, std::chrono::seconds patience,
                     const char *reminder) {
    const std::lock_guard lock(stop().mutex);
    stop().running = true;
    stop().descriptor = descriptor;
    stop().farewell = farewell;
    stop().patience = patience;
    stop().reminder = reminder;
}

StopGuard::~StopGuard() {
    const std::lock_guard lock(stop().mutex);
    stop().running = false;
}

bool stop_asked() {
    const std::lock_guard lock(stop().mutex);
    return stop().asked;
}

bool stop_within(std::chrono::milliseconds time) {
    std::unique_lock lock(stop().mutex);
    return stop().noted.wait_for(lock, time, [] { return stop().asked; });
}

} // namespace zavctl
