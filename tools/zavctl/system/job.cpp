#include "job.h"

#include <sys/mman.h>
#include <sys/wait.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <initializer_list>
#include <poll.h>
#include <unistd.h>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;

// zavctl takes these signals in a thread, which the new process does not have; and its tools
// inherit what is blocked, so that none of them could be told to end.
void take_signals_again() {
    sigset_t set;
    sigemptyset(&set);
    for (const int number : {SIGINT, SIGTERM, SIGHUP})
        sigaddset(&set, number);
    sigprocmask(SIG_UNBLOCK, &set, nullptr);
}

void hand_over(int pipe, const std::string &result) {
    std::size_t done = 0;
    while (done < result.size()) {
        const ssize_t written = write(pipe, result.data() + done, result.size() - done);
        if (written < 0 && errno != EINTR)
            return;
        done += written < 0 ? 0 : static_cast<std::size_t>(written);
    }
}

// The library may call exit instead of returning: the status then tells, and there is no result.
[[noreturn]] void work_in_child(const std::function<std::string()> &work, int pipe, int prints) {
    setpgid(0, 0);
    take_signals_again();
    if (prints >= 0) {
        dup2(prints, STDOUT_FILENO);
        dup2(prints, STDERR_FILENO);
    }
    hand_over(pipe, work());
    _exit(EXIT_SUCCESS); // with the threads that the library has left behind
}

int milliseconds_until(Clock::time_point end) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(end - Clock::now());
    return static_cast<int>(std::max<std::int64_t>(0, left.count()));
}

std::string text_of(int file) {
    std::string text;
    std::array<char, 4096> piece{};
    ssize_t got = 0;
    while (file >= 0 &&
           (got = pread(file, piece.data(), piece.size(), static_cast<off_t>(text.size()))) > 0)
        text.append(piece.data(), static_cast<std::size_t>(got));
    return text;
}

} // namespace

// The thread that waits for signals, and another that waits for this one, are all that may run
// beside: neither holds what the library needs in the new process.
Job::Job(const std::function<std::string()> &work) : prints_(memfd_create("zavctl", MFD_CLOEXEC)) {
    int ends[2] = {-1, -1};
    if (prints_ >= 0)
        fcntl(prints_, F_SETFL, O_APPEND); // its tools print side by side
    if (pipe2(ends, O_CLOEXEC) != 0)
        return;
    process_ = fork();
    if (process_ == 0)
        work_in_child(work, ends[1], prints_);
    if (process_ > 0)
        setpgid(process_, process_); // whoever is first
    close(ends[1]);
    pipe_ = ends[0];
}

Job::~Job() {
    if (process_ > 0 && !ended_) {
        kill(-process_, SIGKILL);
        reap();
    }
    for (const int descriptor : {pipe_, prints_})
        if (descriptor >= 0)
            close(descriptor);
}

void Job::reap() {
    while (waitpid(process_, &status_, 0) < 0 && errno == EINTR) {
    }
    ended_ = true;
}

// Only the process itself holds the other end, so that its end is the end of the result.
bool Job::wait(std::chrono::milliseconds limit) {
    const Clock::time_point end = Clock::now() + limit;
    if (process_ <= 0)
        return true;
    while (!ended_) {
        pollfd waiting{pipe_, POLLIN, 0};
        const int ready = poll(&waiting, 1, milliseconds_until(end));
        if (ready == 0)
            return false;
        if (ready > 0)
            read_result();
    }
    return true;
}

void Job::read_result() {
    std::array<char, 4096> piece{};
    const ssize_t got = read(pipe_, piece.data(), piece.size());
    if (got > 0)
        result_.append(piece.data(), static_cast<std::size_t>(got));
    else if (got == 0 || errno != EINTR)
        reap();
}

void Job::terminate() const {
    if (process_ > 0 && !ended_)
        kill(-process_, SIGTERM);
}

ChildEnd Job::end() const {
    if (process_ <= 0)
        return {ChildEnd::How::not_started, 0, ""};
    if (!ended_)
        return {ChildEnd::How::timed_out, 0, text_of(prints_)};
    if (WIFSIGNALED(status_))
        return {ChildEnd::How::signalled, WTERMSIG(status_), text_of(prints_)};
    if (result_.empty())
        return {ChildEnd::How::exited, WEXITSTATUS(status_), text_of(prints_)};
    return {ChildEnd::How::answered, 0, text_of(prints_)};
}

} // namespace zavctl
