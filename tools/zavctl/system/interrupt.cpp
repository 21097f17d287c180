#include "interrupt.h"

#include "run.h"

#include <atomic>
#include <csignal>
#include <initializer_list>
#include <thread>
#include <unistd.h>

namespace zavctl {

namespace {

std::atomic<bool> ending = false;
std::atomic<bool> changing = false;
std::atomic<int> told = -1; // where to tell that a change is finished first

bool is_ignored(int number) {
    struct sigaction action {};
    return sigaction(number, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

// Ends like a program that has no handler for the signal, so that a calling shell stops too.
[[noreturn]] void end_by(int number) {
    ending = true;
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
            if (!change_goes_on())
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

} // namespace zavctl
