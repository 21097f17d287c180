#include "run.h"

#include <fmt/format.h>

#include <sys/wait.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <poll.h>
#include <spawn.h>
#include <sstream>
#include <unistd.h>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;
namespace fs = std::filesystem;

constexpr std::size_t output_limit = 65536;

// The spawn attributes of a command that leads a process group of its own.
class SpawnSetup {
  public:
    explicit SpawnSetup(int output) {
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_adddup2(&actions, output, STDOUT_FILENO);
        posix_spawn_file_actions_adddup2(&actions, output, STDERR_FILENO);
        posix_spawnattr_init(&attributes);
        posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);
    }
    ~SpawnSetup() {
        posix_spawn_file_actions_destroy(&actions);
        posix_spawnattr_destroy(&attributes);
    }
    SpawnSetup(const SpawnSetup &) = delete;
    SpawnSetup &operator=(const SpawnSetup &) = delete;

    posix_spawn_file_actions_t actions{};
    posix_spawnattr_t attributes{};
};

int remaining(Clock::time_point end) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(end - Clock::now());
    return static_cast<int>(std::max<std::int64_t>(0, left.count()));
}

// Reads until the other side closes; false when the time was over first.
bool read_all(int descriptor, Clock::time_point end, std::string &output) {
    std::array<char, 4096> piece{};
    pollfd waiting{descriptor, POLLIN, 0};
    while (true) {
        const int ready = poll(&waiting, 1, remaining(end));
        if (ready == 0)
            return false;
        const ssize_t got = ready < 0 ? -1 : read(descriptor, piece.data(), piece.size());
        if (got == 0 || (got < 0 && errno != EINTR))
            return true;
        if (got > 0 && output.size() < output_limit)
            output.append(piece.data(), static_cast<std::size_t>(got));
    }
}

// Waits for the end of a command that has closed its output; false when the time was over first.
bool wait_until(pid_t child, Clock::time_point end, int &status) {
    while (waitpid(child, &status, WNOHANG) == 0) {
        if (remaining(end) == 0)
            return false;
        usleep(1000);
    }
    return true;
}

RunResult ended(int status, std::string output) {
    if (WIFSIGNALED(status))
        return {RunResult::End::signalled, WTERMSIG(status), std::move(output)};
    return {RunResult::End::exited, WEXITSTATUS(status), std::move(output)};
}

RunResult collect(pid_t child, int descriptor, std::chrono::milliseconds limit) {
    const Clock::time_point end = Clock::now() + limit;
    std::string output;
    int status = 0;
    if (read_all(descriptor, end, output) && wait_until(child, end, status))
        return ended(status, std::move(output));
    kill(-child, SIGKILL);
    waitpid(child, &status, 0);
    return {RunResult::End::timed_out, 0, std::move(output)};
}

std::vector<char *> arguments(std::vector<std::string> &command) {
    std::vector<char *> pointers;
    pointers.reserve(command.size() + 1);
    for (std::string &word : command)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    return pointers;
}

bool executable(const std::string &path) {
    std::error_code error;
    return fs::is_regular_file(path, error) && access(path.c_str(), X_OK) == 0;
}

// The processes that each thread of `process` has started.
std::vector<pid_t> children_of(pid_t process) {
    std::vector<pid_t> children;
    std::error_code error;
    for (const auto &task : fs::directory_iterator(fmt::format("/proc/{}/task", process), error)) {
        std::ifstream list(task.path() / "children");
        for (pid_t child = 0; list >> child;)
            children.push_back(child);
    }
    return children;
}

void kill_with_children(pid_t process) {
    for (const pid_t child : children_of(process))
        kill_with_children(child);
    kill(process, SIGKILL);
}

} // namespace

RunResult run(const std::vector<std::string> &command, std::chrono::milliseconds limit) {
    int ends[2] = {-1, -1};
    if (pipe2(ends, O_CLOEXEC) != 0)
        return {};
    std::vector<std::string> words = command;
    pid_t child = 0;
    const SpawnSetup setup(ends[1]);
    const int error = posix_spawnp(&child, words[0].c_str(), &setup.actions, &setup.attributes,
                                   arguments(words).data(), environ);
    close(ends[1]);
    RunResult result;
    if (error == 0)
        result = collect(child, ends[0], limit);
    close(ends[0]);
    return result;
}

std::string find_tool(const std::string &name) {
    if (name.find('/') != std::string::npos)
        return executable(name) ? name : "";
    const char *path = std::getenv("PATH");
    std::istringstream directories(path == nullptr ? "/usr/bin:/bin" : path);
    for (std::string directory; std::getline(directories, directory, ':');) {
        std::string file = (directory.empty() ? "." : directory) + "/" + name;
        if (executable(file))
            return file;
    }
    return "";
}

void kill_descendants() {
    for (const pid_t child : children_of(getpid()))
        kill_with_children(child);
}

} // namespace zavctl
