#include "sim_runner.hpp"

#include <array>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

std::string content(int fd) {
    std::string text;
    std::array<char, 4096> part{};
    for (ssize_t length = 0;
         (length = pread(fd, part.data(), part.size(), static_cast<off_t>(text.size()))) > 0;)
        text.append(part.data(), static_cast<std::size_t>(length));
    return text;
}

[[noreturn]] void exec_words(const std::vector<std::string> &words, int out, int err) {
    dup2(open("/dev/null", O_RDONLY), STDIN_FILENO);
    dup2(out, STDOUT_FILENO);
    dup2(err, STDERR_FILENO);
    std::vector<std::string> copy = words;
    std::vector<char *> pointers;
    for (std::string &word : copy)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    execvp(pointers[0], pointers.data());
    _exit(127);
}

} // namespace

Outcome execute(const std::vector<std::string> &words) {
    const int out = memfd_create("out", MFD_CLOEXEC);
    const int err = memfd_create("err", MFD_CLOEXEC);
    const pid_t child = fork();
    if (child == 0)
        exec_words(words, out, err);
    int status = 0;
    waitpid(child, &status, 0);
    const Outcome result{WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status),
                         content(out), content(err)};
    close(out);
    close(err);
    return result;
}

Outcome zavsim(const std::vector<std::string> &words) {
    std::vector<std::string> all = {ZAVSIM};
    all.insert(all.end(), words.begin(), words.end());
    return execute(all);
}

Outcome on_appliance(const std::string &script, std::vector<std::string> options) {
    options.insert(options.end(), {"--", "sh", "-c", script});
    return zavsim(options);
}

ScratchFile::ScratchFile(const std::string &text) {
    std::string pattern = std::filesystem::temp_directory_path() / "sim-test-XXXXXX";
    directory_ = mkdtemp(pattern.data());
    path_ = directory_ + "/file";
    std::ofstream(path_) << text;
}

ScratchFile::~ScratchFile() {
    std::filesystem::remove_all(directory_);
}
