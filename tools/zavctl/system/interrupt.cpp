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
        if (sigwait(&set, &number) == 0)
            end_by(number);
    }).detach();
}

void stay_if_ending() {
    while (ending)
        pause();
}

} // namespace zavctl
