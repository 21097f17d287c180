#include "streams.h"

#include "files.h"

#include <sys/ioctl.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <poll.h>
#include <string_view>
#include <unistd.h>

namespace zavctl {

namespace {

// A closed descriptor below 3 would be taken by the next file that anybody opens.
void occupy(int descriptor) {
    if (fcntl(descriptor, F_GETFD) >= 0)
        return;
    const int null = open("/dev/null", O_RDWR);
    if (null >= 0 && null != descriptor) {
        dup2(null, descriptor);
        close(null);
    }
}

int private_copy(int descriptor) {
    return fcntl(descriptor, F_DUPFD_CLOEXEC, 3);
}

// Ignored in zavctl alone: a handler, unlike SIG_IGN, is not handed on to the tools.
void survive_closed_pipes() {
    struct sigaction action {};
    action.sa_handler = [](int) {};
    action.sa_flags = SA_RESTART;
    sigaction(SIGPIPE, &action, nullptr);
}

bool environment_says(const char *name) {
    const char *value = std::getenv(name);
    return value != nullptr && *value != '\0';
}

bool terminal_is_dumb() {
    const char *term = std::getenv("TERM");
    return term == nullptr || std::string_view(term) == "dumb";
}

// Columns and rows; 0 of what is no terminal.
winsize terminal_size(int descriptor) {
    winsize size{};
    if (ioctl(descriptor, TIOCGWINSZ, &size) != 0)
        return {};
    return size;
}

// By the name of the locale alone: it may not be installed, and still be what the terminal shows.
bool characters_are_utf8() {
    for (const char *name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        const char *value = std::getenv(name);
        if (value != nullptr && *value != '\0')
            return strcasestr(value, "utf-8") != nullptr || strcasestr(value, "utf8") != nullptr;
    }
    return false;
}

// 0, or errno of the failure.
int write_all(int descriptor, std::string_view rest) {
    while (!rest.empty()) {
        const ssize_t done = ::write(descriptor, rest.data(), rest.size());
        if (done < 0 && errno != EINTR)
            return errno;
        rest.remove_prefix(done < 0 ? 0 : static_cast<std::size_t>(done));
    }
    return 0;
}

} // namespace

Streams::Streams() {
    out_ = private_copy(STDOUT_FILENO); // -1 when the caller closed it: writing then fails
    in_ = private_copy(STDIN_FILENO);
    for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
        occupy(descriptor);
    err_ = private_copy(STDERR_FILENO);
    dup2(STDERR_FILENO, STDOUT_FILENO);
    const int null = open("/dev/null", O_RDONLY | O_CLOEXEC);
    if (null >= 0) {
        dup2(null, STDIN_FILENO);
        close(null);
    }
    survive_closed_pipes();
}

int Streams::write(const std::string &text) const {
    return write_all(out_, text);
}

bool Streams::reader_gone() const {
    pollfd watched{out_, 0, 0};
    return poll(&watched, 1, 0) > 0 && (watched.revents & (POLLERR | POLLHUP | POLLNVAL)) != 0;
}

std::size_t Streams::height() const {
    return out_is_terminal() ? terminal_size(out_).ws_row : 0;
}

void Streams::say(const std::string &text) const {
    write_all(err_, text); // nobody could be told of a failure
}

bool Streams::confirm(const std::string &question) const {
    say(question + " [y/N] ");
    std::string line;
    char c = 0;
    while (::read(in_, &c, 1) == 1 && c != '\n')
        line += c;
    line = trimmed(line);
    return line == "y" || line == "Y" || line == "yes" || line == "Yes";
}

FileFact Streams::read_input() const {
    return read_descriptor(in_);
}

bool Streams::can_ask() const {
    return isatty(in_) == 1 && err_is_terminal();
}

bool Streams::out_is_terminal() const {
    return isatty(out_) == 1;
}

bool Streams::err_is_terminal() const {
    return isatty(err_) == 1;
}

Style Streams::style(const std::string &when) const {
    Style style;
    const bool wanted = out_is_terminal() && !environment_says("NO_COLOR") && !terminal_is_dumb();
    style.colour = when == "always" || (when == "auto" && wanted);
    style.width = out_is_terminal() ? terminal_size(out_).ws_col : 0;
    style.unicode = characters_are_utf8();
    return style;
}

Style Streams::message_style() const {
    Style style;
    style.colour = err_is_terminal() && !environment_says("NO_COLOR") && !terminal_is_dumb();
    style.width = err_is_terminal() ? terminal_size(err_).ws_col : 0;
    return style;
}

} // namespace zavctl
