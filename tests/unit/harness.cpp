#include "harness.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <dlfcn.h>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <pthread.h>
#include <sstream>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/sem.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace harness {

namespace {

#define CALL_FAILS(function)                                                                       \
    (harness::call_fails != nullptr && harness::call_fails(function, __builtin_return_address(0)))

bool record_is_ready = false; // memory is asked for before the record is made
std::string log_ident;
int log_options;
int log_facility;

template <typename Function>
Function *real(const char *name) {
    return reinterpret_cast<Function *>(dlsym(RTLD_NEXT, name));
}

// Several threads may be in the library. What a test sets before is read without it.
std::mutex notes;

void note_command(const char *command) {
    const std::lock_guard turn(notes);
    record().commands.emplace_back(command);
    record().steps.emplace_back(command);
}

} // namespace

bool (*call_fails)(const char *function, const void *caller) = nullptr;
void (*distort)(Outcome &outcome, const void *caller) = nullptr;
void (*allocated)(void *memory, const void *caller) = nullptr;

LogRow row(const std::string &ident, int priority, const std::string &text) {
    return {ident, LOG_CONS | LOG_PID, LOG_DAEMON, priority, text};
}

std::ostream &operator<<(std::ostream &out, const LogRow &row) {
    return out << row.ident << " options " << row.options << " facility " << row.facility
               << " priority " << row.priority << ": " << row.text;
}

Answer prints(const std::string &output) {
    Answer answer;
    answer.output = output;
    return answer;
}

Answer exits(int status, int error) {
    Answer answer;
    answer.status = status;
    answer.error = error;
    return answer;
}

Answer no_start() {
    Answer answer;
    answer.starts = false;
    return answer;
}

Answer ScriptedShell::answer(const std::string &command) const {
    for (const auto &[part, answer] : rows_)
        if (command.find(part) != std::string::npos)
            return answer;
    return {};
}

Record &record() {
    static Record the_record;
    return the_record;
}

bool is_drive_request(unsigned long request) {
    return (request & ~0xFFUL) == 0x5300;
}

// What tests put into the root. The bare root itself comes with the directories.
// The file that a command's output goes to; "" if it goes nowhere else.
std::string file_of(const std::string &command) {
    const size_t arrow = command.rfind('>');
    if (arrow == std::string::npos)
        return "";
    const size_t begin = command.find('/', arrow);
    const size_t end = command.find_first_of(" ;|", begin);
    const std::string file = begin == std::string::npos ? "" : command.substr(begin, end - begin);
    return fs::is_regular_file(file) ? file : "";
}

std::string content_of(const std::string &file) {
    std::ostringstream text;
    text << std::ifstream(file, std::ios::binary).rdbuf();
    return text.str();
}

int distorted(const char *command, int status, const void *caller) {
    const std::string file = file_of(command);
    Outcome outcome = {content_of(file), status};
    distort(outcome, caller);
    if (!file.empty())
        std::ofstream(file, std::ios::binary) << outcome.output;
    return outcome.status;
}

// A pipe that prints that, of a process that ends so.
FILE *pipe_of(const Outcome &outcome, const char *mode) {
    const auto real_popen = real<FILE *(const char *, const char *)>("popen");
    std::ofstream("/scratch/answer", std::ios::binary) << outcome.output;
    const std::string end = WIFSIGNALED(outcome.status)
                                ? "kill -" + std::to_string(WTERMSIG(outcome.status)) + " $$"
                                : "exit " + std::to_string(WEXITSTATUS(outcome.status));
    FILE *pipe = real_popen(("cat /scratch/answer; " + end).c_str(), mode);
    if (pipe != nullptr) { // the next answer may be written before this one is read
        const int first = fgetc(pipe);
        if (first != EOF)
            ungetc(first, pipe);
    }
    return pipe;
}

Outcome outcome_of(FILE *pipe) {
    Outcome outcome;
    char piece[4096];
    for (size_t got; (got = fread(piece, 1, sizeof piece, pipe)) > 0;)
        outcome.output.append(piece, got);
    outcome.status = real<int(FILE *)>("pclose")(pipe);
    return outcome;
}

constexpr const char *kWipedDirectories[] = {
    "/etc/Kiru",        "/proc/zav",      "/proc/scsi",        "/sys/class",   "/dev/sata",
    "/dev/swraid",      "/dev/iscsiraid", "/dev/hwraid",       "/dev/sasraid", "/dev/DataVG1",
    "/dev/PrimaryOSVG", "/sys/devices",   "/proc/net/bonding", "/scratch"};
constexpr const char *kWipedFiles[] = {"/proc/mdstat",
                                       "/dev/nvram",
                                       "/dev/mem",
                                       "/sbin/mdadm",
                                       "/bin/smartctl",
                                       "/etc/sysconfig/clock",
                                       "/etc/arecaTimeZone.list",
                                       "/usr/bin/syncConf.sh",
                                       "/usr/bin/query_sas.sh",
                                       "/dev/zavevent0",
                                       "/dev/zavledevent",
                                       "/var/log/apcupsd.status",
                                       "/var/log/zavapcupsd.event",
                                       "/sbin/ethtool",
                                       "/proc/stat",
                                       "/proc/meminfo",
                                       "/etc/mtab",
                                       "/proc/sys/dev/cdrom/info",
                                       "/dev/scd0",
                                       "/dev/cdrom",
                                       "/tmp/progress.outfile",
                                       "/tmp/dvd.outfile",
                                       "/tmp/cd.outfile",
                                       "/tmp/burnDir",
                                       "/tmp/linkDir"};

// The tests wipe directories of the system: never outside a private root.
void require_private_root() {
    static const bool private_root = fs::exists("/run/zavsim");
    if (!private_root) {
        fputs("unit_tests: run me as: zavsim --bare -- unit_tests\n", stderr);
        _exit(1);
    }
}

Appliance::Appliance() {
    require_private_root();
    record() = {};
    for (const char *path : kWipedDirectories) {
        fs::remove_all(path);
        fs::create_directories(path);
    }
    for (const char *path : kWipedFiles)
        fs::remove_all(path);
    for (const int key : {0x6911, 0x6912, 0x3231}) {
        const int id = semget(key, 1, 0);
        if (id >= 0)
            semctl(id, 0, IPC_RMID);
    }
    record() = {}; // that was no call of the library's
    record_is_ready = true;
}

void Appliance::put(const std::string &path, const std::string &text) {
    fs::create_directories(fs::path(path).parent_path());
    std::ofstream(path, std::ios::binary) << text;
}

void Appliance::script(const std::string &path, const std::string &body) {
    put(path, "#!/bin/bash\n" + body);
    fs::permissions(path, fs::perms::owner_all);
}

void Appliance::tool(const std::string &path, const std::string &output, int status) {
    put("/scratch/answer-of-" + fs::path(path).filename().string(), output);
    script(path, "cat /scratch/answer-of-${0##*/}; exit " + std::to_string(status) + "\n");
}

void Appliance::remove(const std::string &path) {
    fs::remove_all(path);
}

std::string Appliance::get(const std::string &path) {
    std::ostringstream text;
    text << std::ifstream(path, std::ios::binary).rdbuf();
    return text.str();
}

bool Appliance::exists(const std::string &path) {
    return fs::exists(path);
}

void Appliance::model(const std::string &product, const std::string &raidtype) {
    put("/sys/class/dmi/id/product_name", product);
    put("/etc/Kiru/raidtype", raidtype);
}

int Appliance::semaphore_value(int key) {
    const int id = real<int(key_t, int, int)>("semget")(key, 1, 0);
    return id < 0 ? -1 : semctl(id, 0, GETVAL);
}

size_t Appliance::open_descriptors() {
    size_t count = 0;
    for (const auto &entry : fs::directory_iterator("/proc/self/fd"))
        count += entry.path().empty() ? 0U : 1U;
    return count;
}

bool Appliance::has_children() {
    return waitpid(-1, nullptr, WNOHANG) != -1;
}

std::string data(const std::string &path) {
    std::ifstream file(std::string(ZAV_TEST_DATA) + "/" + path, std::ios::binary);
    EXPECT_TRUE(file) << path;
    std::ostringstream text;
    text << file.rdbuf();
    return text.str();
}

} // namespace harness

std::ostream &operator<<(std::ostream &out, const zavDevice &dev) {
    return out << "{" << dev.type << ", 0x" << std::hex << dev.minor_type << std::dec << ", "
               << dev.disk << ", " << dev.part << "}";
}

// The functions of the C library through which commands are run, time passes and lines are logged:
// the library's calls come here.
extern "C" {

int system(const char *command) {
    if (CALL_FAILS("system")) {
        errno = EAGAIN;
        return -1;
    }
    harness::note_command(command);
    if (harness::record().before_command)
        harness::record().before_command(command);
    int status = 0;
    if (harness::record().shell) {
        const harness::Answer answer = harness::record().shell->answer(command);
        errno = answer.error;
        status = answer.starts ? answer.status << 8 : -1;
    } else if (harness::record().system_status) {
        status = *harness::record().system_status;
    } else {
        status = harness::real<int(const char *)>("system")(command);
    }
    if (harness::distort == nullptr || status == -1)
        return status;
    return harness::distorted(command, status, __builtin_return_address(0));
}

FILE *popen(const char *command, const char *mode) {
    if (CALL_FAILS("popen")) {
        errno = EAGAIN;
        return nullptr;
    }
    harness::note_command(command);
    harness::Answer answer;
    if (harness::record().shell)
        answer = harness::record().shell->answer(command);
    if (harness::record().popen_fails || !answer.starts) {
        errno = EMFILE;
        return nullptr;
    }
    harness::Outcome outcome = {answer.output, answer.status << 8};
    if (!harness::record().shell) {
        FILE *pipe = harness::real<FILE *(const char *, const char *)>("popen")(command, mode);
        if (harness::distort == nullptr || pipe == nullptr)
            return pipe;
        outcome = harness::outcome_of(pipe);
    }
    if (harness::distort != nullptr)
        harness::distort(outcome, __builtin_return_address(0));
    return harness::pipe_of(outcome, mode);
}

int pclose(FILE *pipe) {
    {
        const std::lock_guard turn(harness::notes);
        ++harness::record().pcloses;
    }
    const int status = harness::real<int(FILE *)>("pclose")(pipe);
    return CALL_FAILS("pclose") ? -1 : status;
}

unsigned sleep(unsigned seconds) {
    harness::record().sleeps.push_back(seconds);
    harness::record().steps.push_back("sleep " + std::to_string(seconds));
    if (harness::record().during_sleep)
        harness::record().during_sleep(harness::record().sleeps.size());
    return 0;
}

int usleep(useconds_t microseconds) {
    harness::record().short_sleeps.push_back(microseconds);
    harness::record().steps.push_back("usleep " + std::to_string(microseconds));
    if (harness::record().during_short_sleep)
        harness::record().during_short_sleep();
    return 0;
}

int fprintf(FILE *file, const char *format, ...) {
    if (CALL_FAILS("fprintf") || harness::record().fprintf_fails) {
        errno = EIO;
        return -1;
    }
    va_list arguments;
    va_start(arguments, format);
    const int count = vfprintf(file, format, arguments);
    va_end(arguments);
    return count;
}

int munmap(void *address, size_t size) noexcept {
    const auto rc = static_cast<int>(syscall(SYS_munmap, address, size));
    return CALL_FAILS("munmap") || harness::record().munmap_fails ? -1 : rc;
}

int semget(key_t key, int semaphores, int flags) {
    {
        const std::lock_guard turn(harness::notes);
        harness::record().semget_flags.push_back(flags);
    }
    if (CALL_FAILS("semget") || harness::record().semget_fails) {
        errno = ENOSPC;
        return -1;
    }
    return harness::real<int(key_t, int, int)>("semget")(key, semaphores, flags);
}

int semop(int id, sembuf *operations, size_t count) {
    if (CALL_FAILS("semop")) { // such as a semaphore that somebody has removed
        if (operations[0].sem_op > 0)
            semctl(id, 0, IPC_RMID);
        errno = EIDRM;
        return -1;
    }
    if (harness::record().semop_fails && harness::record().semop_fails(operations[0].sem_op)) {
        errno = EIDRM;
        return -1;
    }
    return harness::real<int(int, sembuf *, size_t)>("semop")(id, operations, count);
}

// The library asks the appliance's drivers, by small numbers, and the optical drive, by those of
// CD-ROMs. Others are a test's own.
int ioctl(int descriptor, unsigned long request, ...) noexcept {
    if (CALL_FAILS("ioctl")) {
        errno = EIO;
        return -1;
    }
    va_list arguments;
    va_start(arguments, request);
    void *argument = va_arg(arguments, void *);
    va_end(arguments);
    if (harness::is_drive_request(request)) {
        harness::record().requests.push_back(request);
        errno = EIO;
        return harness::record().drive ? harness::record().drive(request, argument) : -1;
    }
    if (request > 0xFF)
        return static_cast<int>(syscall(SYS_ioctl, descriptor, request, argument));
    harness::record().requests.push_back(request);
    if (harness::record().driver)
        return harness::record().driver(request, argument);
    errno = EAGAIN;
    return -1;
}

int pthread_create(pthread_t *thread, const pthread_attr_t *attributes, void *(*body)(void *),
                   void *argument) noexcept {
    if (CALL_FAILS("pthread_create"))
        return EAGAIN;
    if (harness::record().thread_code) {
        EXPECT_EQ(attributes, nullptr);
        EXPECT_EQ(argument, nullptr);
        harness::record().threads.push_back(body);
        return *harness::record().thread_code;
    }
    return harness::real<int(pthread_t *, const pthread_attr_t *, void *(*)(void *), void *)>(
        "pthread_create")(thread, attributes, body, argument);
}

int open(const char *path, int flags, ...) {
    if (CALL_FAILS("open")) {
        errno = EMFILE;
        return -1;
    }
    va_list arguments;
    va_start(arguments, flags);
    const int mode = (flags & O_CREAT) != 0 ? va_arg(arguments, int) : 0;
    va_end(arguments);
    if (harness::record_is_ready && strncmp(path, "/dev/zav", 8) == 0)
        harness::record().driver_flags.push_back(flags);
    return static_cast<int>(syscall(SYS_openat, AT_FDCWD, path, flags, mode));
}

time_t time(time_t *result) noexcept {
    auto &times = harness::record().times;
    timespec now = {};
    clock_gettime(CLOCK_REALTIME, &now);
    time_t answer = CALL_FAILS("time") ? -1 : now.tv_sec;
    if (!times.empty()) {
        answer = times.front();
        if (times.size() > 1)
            times.erase(times.begin());
        if (answer == -1)
            errno = EFAULT;
    }
    if (result != nullptr)
        *result = answer;
    return answer;
}

int statfs(const char *path, struct statfs *answer) noexcept {
    harness::record().measured = path;
    if (CALL_FAILS("statfs") || !harness::record().file_system) {
        errno = EACCES;
        return -1;
    }
    *answer = *harness::record().file_system;
    return 0;
}

// Not in terms of the C library's own, which sanitized builds have replaced before anything else
// is ready.
void *calloc(size_t count, size_t size) noexcept {
    size_t bytes = 0;
    if (CALL_FAILS("calloc") || (harness::record_is_ready && harness::record().calloc_fails)) {
        errno = ENOMEM;
        return nullptr;
    }
    if (__builtin_mul_overflow(count, size, &bytes)) {
        errno = ENOMEM;
        return nullptr;
    }
    void *(*volatile allocate)(size_t) = malloc; // or the compiler makes a call of calloc of it
    void *memory = allocate(bytes);
    if (memory != nullptr)
        memset(memory, 0, bytes);
    if (harness::allocated != nullptr)
        harness::allocated(memory, __builtin_return_address(0));
    return memory;
}

void openlog(const char *ident, int options, int facility) {
    harness::record().log_is_open = true;
    harness::log_ident = ident;
    harness::log_options = options;
    harness::log_facility = facility;
}

void syslog(int priority, const char *format, ...) {
    char text[1024];
    va_list arguments;
    va_start(arguments, format);
    vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    harness::record().log.push_back(
        {harness::log_ident, harness::log_options, harness::log_facility, priority, text});
}

void closelog(void) {
    harness::record().log_is_open = false;
    harness::log_ident = "(the log is closed)";
}
}
