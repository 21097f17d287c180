#include "launcher/sandbox.hpp"

#include <algorithm>
#include <array>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <fmt/format.h>
#include <set>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

using Words = std::vector<std::string>;

// Directories of / that the private root has of its own or takes apart.
const std::set<std::string> own_directories = {"bin", "sbin", "usr",  "proc", "sys",   "dev", "etc",
                                               "tmp", "run",  "boot", "mnt",  "media", "var"};

bool is_library_directory(const std::string &name) {
    return name.rfind("lib", 0) == 0;
}

void add(Words &words, std::initializer_list<std::string> more) {
    words.insert(words.end(), more.begin(), more.end());
}

// Everything of /usr but its programs is the host's; programs are linked one by one inside.
void bind_usr(Words &args, const std::string &directory) {
    static const std::set<std::string> farms = {"bin", "sbin"};
    std::error_code error;
    for (const auto &entry : fs::directory_iterator(directory, error)) {
        const std::string path = entry.path();
        if (farms.count(entry.path().filename()) != 0)
            continue;
        if (path == "/usr/local")
            bind_usr(args, path);
        else if (entry.is_symlink())
            add(args, {"--symlink", fs::read_symlink(path).string(), path});
        else
            add(args, {"--ro-bind-try", path, path});
    }
}

// Where the host keeps /lib apart from /usr/lib it is bound, else the same link is made.
void bind_libraries(Words &args) {
    for (const auto &entry : fs::directory_iterator("/")) {
        const std::string path = entry.path();
        if (!is_library_directory(entry.path().filename()))
            continue;
        if (entry.is_symlink())
            add(args, {"--symlink", fs::read_symlink(path).string(), path});
        else
            add(args, {"--ro-bind", path, path});
    }
    for (const char *name : {"/bin", "/sbin"})
        if (!fs::is_symlink(name))
            add(args, {"--ro-bind-try", name, "/run/host" + std::string(name)});
}

void bind_user_directories(Words &args) {
    for (const auto &entry : fs::directory_iterator("/")) {
        const std::string name = entry.path().filename();
        if (own_directories.count(name) != 0 || is_library_directory(name))
            continue;
        if (entry.is_symlink())
            add(args, {"--symlink", fs::read_symlink(entry.path()).string(), entry.path()});
        else if (entry.is_directory())
            add(args, {"--bind", entry.path(), entry.path()});
    }
}

// A directory below /tmp, /var and the like, which the private root otherwise has for itself.
bool needs_bind(const fs::path &directory) {
    static const std::set<std::string> parents = {"tmp", "run", "boot", "mnt", "media", "var"};
    auto part = directory.begin();
    if (directory.empty() || ++part == directory.end())
        return false;
    return parents.count(part->string()) != 0 && std::next(part) != directory.end();
}

void bind_program(Words &args, const fs::path &program) {
    if (needs_bind(program.parent_path()))
        add(args, {"--bind", program.parent_path(), program.parent_path()});
    else if (needs_bind(program))
        add(args, {"--ro-bind", program, program});
}

fs::path resolved_command(const std::string &word) {
    std::error_code error;
    return word.find('/') == std::string::npos ? fs::path() : fs::weakly_canonical(word, error);
}

// The shim for 32-bit programs is built beside the 64-bit one, or in the 32-bit tree beside this.
fs::path find_shim32(const fs::path &directory) {
    std::error_code unreadable;
    for (const fs::path &candidate : {directory / "libzavsim-shim32.so",
                                      directory.parent_path() / "build-m32/libzavsim-shim.so"})
        if (fs::exists(candidate, unreadable))
            return candidate;
    return {};
}

// The loader puts its own name for its word size in place of $LIB; all names in use are offered.
void bind_shims(Words &args, const fs::path &shim, const fs::path &shim32) {
    const auto offer = [&args](const fs::path &file, std::initializer_list<const char *> names) {
        for (const char *name : names)
            add(args, {"--ro-bind", file, place::run + "/" + name + "/libzavsim-shim.so"});
    };
    offer(shim, {"lib/x86_64-linux-gnu", "lib64"});
    if (!shim32.empty())
        offer(shim32, {"lib/i386-linux-gnu", "lib32", "lib"});
}

Words bubblewrap_arguments(const Options &options, const fs::path &self) {
    Words args = {"bwrap",         "--unshare-user",
                  "--uid",         "0",
                  "--gid",         "0",
                  "--unshare-ipc", "--unshare-pid",
                  "--unshare-uts", "--hostname",
                  "appliance",     "--die-with-parent",
                  "--ro-bind",     "/usr",
                  place::host_usr, "--ro-bind",
                  "/etc",          place::host_etc,
                  "--ro-bind",     "/sys",
                  place::host_sys};
    bind_usr(args, "/usr");
    bind_libraries(args);
    add(args, {"--symlink", "usr/bin", "/bin", "--symlink", "usr/sbin", "/sbin"});
    add(args, {"--dev", "/dev", "--proc", place::real_proc, "--tmpfs", "/tmp"});
    // The init step fills /proc, but a sanitized build of it looks at itself before it begins.
    add(args, {"--symlink", place::real_proc + "/self", "/proc/self"});
    bind_user_directories(args);
    bind_program(args, self);
    bind_program(args, resolved_command(options.command.front()));
    if (needs_bind(options.directory))
        add(args, {"--bind", options.directory, options.directory});
    add(args, {"--ro-bind", self, place::program});
    if (options.has_shim)
        bind_shims(args, self.parent_path() / "libzavsim-shim.so", find_shim32(self.parent_path()));
    return args;
}

std::vector<char *> exec_vector(Words &words) {
    std::vector<char *> pointers;
    pointers.reserve(words.size() + 1);
    for (std::string &word : words)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    return pointers;
}

// bubblewrap's own complaints go to a file of their own until the init step runs: a machine that
// cannot make the root is answered with one line, not with another program's messages.
struct Channel {
    int complaints = memfd_create("complaints", MFD_CLOEXEC);
    std::array<int, 2> started{-1, -1};
    int real_stderr = dup(STDERR_FILENO);
    Channel() {
        if (pipe(started.data()) != 0)
            started = {-1, -1};
    }
    ~Channel() {
        for (int fd : {complaints, started[0], started[1], real_stderr})
            close(fd);
    }
    Channel(const Channel &) = delete;
    Channel &operator=(const Channel &) = delete;
};

[[noreturn]] void exec_bubblewrap(Words args, const Channel &channel) {
    // The terminal's interrupt is COMMAND's: whoever stands between only waits for its end.
    signal(SIGINT, SIG_IGN);
    signal(SIGQUIT, SIG_IGN);
    dup2(channel.complaints, STDERR_FILENO);
    close(channel.started[0]);
    auto pointers = exec_vector(args);
    execvp("bwrap", pointers.data());
    const char *reason = strerror(errno);
    dprintf(STDERR_FILENO, "bwrap cannot be run (%s)", reason);
    _exit(127);
}

std::string first_line(int fd) {
    std::array<char, 256> text{};
    const ssize_t length = pread(fd, text.data(), text.size() - 1, 0);
    std::string line(text.data(), static_cast<std::size_t>(std::max<ssize_t>(length, 0)));
    return line.substr(0, line.find('\n'));
}

int report_no_root(const std::string &reason) {
    fmt::print(stderr,
               "zavsim: this machine cannot provide the private root: {}. Install bubblewrap and "
               "allow user namespaces (sysctl kernel.unprivileged_userns_clone=1, "
               "user.max_user_namespaces above 0).\n",
               reason);
    return exit_os_error;
}

int wait_for(pid_t child) {
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR) {
    }
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

} // namespace

int run_in_private_root(Options options) {
    const fs::path self = fs::read_symlink("/proc/self/exe");
    std::error_code error;
    options.directory = fs::current_path(error);
    options.program_directory = self.parent_path();
    options.has_shim = !options.bare && fs::exists(self.parent_path() / "libzavsim-shim.so", error);

    Channel channel;
    Words args = bubblewrap_arguments(options, self);
    add(args, {place::program, inside_word, std::to_string(channel.real_stderr),
               std::to_string(channel.started[1]), to_word(options)});

    const pid_t child = fork();
    if (child < 0)
        return report_no_root(strerror(errno));
    if (child == 0)
        exec_bubblewrap(args, channel);
    signal(SIGINT, SIG_IGN);
    signal(SIGQUIT, SIG_IGN);
    close(std::exchange(channel.started[1], -1));
    const int status = wait_for(child);
    char byte = 0;
    if (read(channel.started[0], &byte, 1) == 1)
        return status;
    return report_no_root(first_line(channel.complaints));
}

} // namespace zavsim
