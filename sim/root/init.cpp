#include "root/init.hpp"

#include "launcher/sandbox.hpp"
#include "root/background.hpp"
#include "root/populate.hpp"
#include "root/process_links.hpp"
#include "root/store.hpp"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <fmt/format.h>
#include <fstream>
#include <sys/wait.h>
#include <unistd.h>

namespace zavsim {

namespace {

void report_started(int real_stderr, int started) {
    dup2(real_stderr, STDERR_FILENO);
    close(real_stderr);
    if (write(started, "R", 1) != 1)
        fmt::print(stderr, "zavsim: the launcher is gone\n");
    close(started);
}

// The simulated tools stand before the host's, the neighbours of zavsim (zavctl) behind them.
void set_environment(const Options &options) {
    const std::string path =
        "/usr/sbin:/usr/bin:/sbin:/bin:/usr/local/sbin:/usr/local/bin:" + options.program_directory;
    setenv("PATH", path.c_str(), 1);
    if (!options.has_shim)
        return;
    const char *sanitizer = getenv("ASAN_OPTIONS");
    const std::string old = sanitizer == nullptr ? "" : std::string(sanitizer) + ":";
    // The sanitizer wants to be loaded first and refuses to start behind a preloaded library.
    setenv("ASAN_OPTIONS", (old + "verify_asan_link_order=0").c_str(), 1);
    setenv("LD_PRELOAD", (place::run + "/$LIB/libzavsim-shim.so").c_str(), 1);
    setenv("ZAVSIM_TIME_SCALE", fmt::format("{}", options.time_scale).c_str(), 1);
}

void restore_signals() {
    signal(SIGINT, SIG_DFL);
    signal(SIGQUIT, SIG_DFL);
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
}

[[noreturn]] void exec_command(const Options &options) {
    restore_signals();
    if (chdir(options.directory.c_str()) != 0 && chdir("/") != 0)
        _exit(126);
    set_environment(options);
    std::vector<std::string> words = options.command;
    std::vector<char *> pointers;
    pointers.reserve(words.size() + 1);
    for (std::string &word : words)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    execvp(pointers[0], pointers.data());
    const int reason = errno;
    fmt::print(stderr, "zavsim: {}: {}\n", options.command.front(), strerror(reason));
    _exit(reason == ENOENT ? 127 : 126);
}

int exit_status(int status) {
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

// Waits for COMMAND alone; whatever else it left running ends with the private root.
int wait_for_command(pid_t command, ProcessLinks &links) {
    sigset_t child_ended;
    sigemptyset(&child_ended);
    sigaddset(&child_ended, SIGCHLD);
    for (int status = 0;;) {
        const pid_t ended = waitpid(command, &status, WNOHANG);
        if (ended == command)
            return exit_status(status);
        links.extend();
        const timespec pause = {0, 20'000'000};
        sigtimedwait(&child_ended, nullptr, &pause);
    }
}

void block_child_signal() {
    sigset_t child_ended;
    sigemptyset(&child_ended);
    sigaddset(&child_ended, SIGCHLD);
    sigprocmask(SIG_BLOCK, &child_ended, nullptr);
}

} // namespace

int run_inside(const std::string &real_stderr, const std::string &started,
               const std::string &options_word) {
    report_started(std::stoi(real_stderr), std::stoi(started));
    const Options options = options_of(options_word);
    block_child_signal();
    populate_root(options);
    ProcessLinks links;
    links.extend();
    if (!options.bare) {
        populate_appliance(options);
        start_model(options);
        start_background();
    }
    const pid_t command = fork();
    if (command < 0)
        throw std::system_error(errno, std::generic_category(), "fork");
    if (command == 0)
        exec_command(options);
    return wait_for_command(command, links);
}

} // namespace zavsim
