#include "root/background.hpp"

#include "root/files.hpp"
#include "root/report.hpp"
#include "root/store.hpp"

#include <array>
#include <csignal>
#include <ctime>
#include <fmt/format.h>
#include <fstream>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <system_error>
#include <unistd.h>

namespace zavsim {

namespace {

constexpr int tick_milliseconds = 50;
constexpr const char *log_file = "/var/log/messages";

int open_log_socket() {
    const int fd = socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::string("/dev/log").copy(address.sun_path, sizeof address.sun_path - 1);
    if (fd < 0 || bind(fd, reinterpret_cast<const sockaddr *>(&address), sizeof address) != 0)
        throw std::system_error(errno, std::generic_category(), "/dev/log");
    return fd;
}

void append_log(const std::string &line) {
    std::ofstream(log_file, std::ios::app) << line << '\n';
}

// Records come as "<30>Mar 14 08:00:00 ident[12]: text"; the priority is kept in front.
void drain_log(int log_socket) {
    std::array<char, 8192> record{};
    for (ssize_t length = 0; (length = recv(log_socket, record.data(), record.size(), 0)) > 0;) {
        std::string line(record.data(), static_cast<std::size_t>(length));
        while (!line.empty() && (line.back() == '\n' || line.back() == '\0'))
            line.pop_back();
        append_log(line);
    }
}

void write_notes(State &state) {
    for (const std::string &note : state.notes)
        append_log(fmt::format("<6>zavsim: at {:.1f}s: {}", state.now, note));
    state.notes.clear();
}

State play_turn() {
    Turn turn;
    write_notes(turn.state());
    turn.commit();
    return turn.state();
}

// Several rewrites that were asked for between two ticks are one. It is started when the turn is
// over, for it would keep the turn's lock.
void tick(int &rewrites_started) {
    const State state = play_turn();
    if (!state.controller || state.controller->slow_rewrites == rewrites_started)
        return;
    rewrites_started = state.controller->slow_rewrites;
    start_slow_rewrite(state);
}

[[noreturn]] void run_background(int log_socket) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    prctl(PR_SET_NAME, "zavsim-model");
    signal(SIGCHLD, SIG_IGN); // nobody waits for the processes that rewrite the report
    int rewrites_started = 0;
    for (;;) {
        pollfd log{log_socket, POLLIN, 0};
        poll(&log, 1, tick_milliseconds);
        drain_log(log_socket);
        try {
            tick(rewrites_started);
        } catch (const std::exception &error) {
            append_log(fmt::format("<3>zavsim: {}", error.what()));
        }
    }
}

} // namespace

void start_background() {
    const int log_socket = open_log_socket();
    const pid_t child = fork();
    if (child < 0)
        throw std::system_error(errno, std::generic_category(), "fork");
    if (child == 0)
        run_background(log_socket);
    close(log_socket);
}

} // namespace zavsim
