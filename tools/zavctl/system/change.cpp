#include "change.h"

#include "files.h"
#include "interrupt.h"

#include <fmt/format.h>

#include <array>
#include <chrono>
#include <fcntl.h>
#include <future>
#include <sys/mman.h>
#include <unistd.h>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds look_interval{50};

// Descriptors 1 and 2 lead into memory for as long as this lives: unlike a pipe that takes
// everything at once, and no tool is ended by writing to it when this program is.
class Capture {
  public:
    Capture() : memory_(memfd_create("zavctl", MFD_CLOEXEC)) {
        if (memory_ < 0)
            return; // what is printed goes to standard error as it is
        fcntl(memory_, F_SETFL, O_APPEND);
        dup2(memory_, STDOUT_FILENO);
        dup2(memory_, STDERR_FILENO);
    }
    Capture(const Capture &) = delete;
    Capture &operator=(const Capture &) = delete;
    ~Capture() {
        if (memory_ >= 0)
            close(memory_);
    }

    void end(int real) const {
        dup2(real, STDOUT_FILENO);
        dup2(real, STDERR_FILENO);
    }

    // What came since the last time; whole lines only, unless all is wanted.
    std::string fresh(bool all) {
        std::array<char, 4096> piece{};
        ssize_t got = 0;
        while (memory_ >= 0 && (got = pread(memory_, piece.data(), piece.size(), offset_)) > 0) {
            text_.append(piece.data(), static_cast<std::size_t>(got));
            offset_ += got;
        }
        const std::size_t end = all ? text_.size() : text_.rfind('\n') + 1;
        std::string lines = text_.substr(0, end);
        text_.erase(0, end);
        return lines;
    }

  private:
    int memory_ = -1;
    off_t offset_ = 0;
    std::string text_;
};

// Tells what is different from one look to the next.
class Watcher {
  public:
    Watcher(const Streams &streams, const std::function<std::vector<Sight>()> &look)
        : streams_(streams), look_(look), before_(look()) {}

    void look(Capture &capture, bool last) {
        const std::string printed = tool_lines(capture.fresh(last));
        std::vector<Sight> now = look_();
        const auto elapsed =
            std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - begin_);
        for (const std::string &text : differences(before_, now))
            streams_.say(seen_line(elapsed, text));
        if (!printed.empty())
            streams_.say(printed);
        before_ = std::move(now);
    }

  private:
    const Streams &streams_;
    std::function<std::vector<Sight>()> look_;
    std::vector<Sight> before_;
    Clock::time_point begin_ = Clock::now();
};

} // namespace

int run_change(const Streams &streams, const std::function<int()> &call,
               const std::function<std::vector<Sight>()> &look) {
    const ChangeGuard guard(streams.err());
    Capture capture;
    Watcher watcher(streams, look);
    std::future<int> result = std::async(std::launch::async, call);
    while (result.wait_for(look_interval) != std::future_status::ready)
        watcher.look(capture, false);
    capture.end(streams.err());
    watcher.look(capture, true);
    return result.get();
}

std::vector<Sight> sights_of(const std::string &device, const NodeNames &names) {
    std::vector<Sight> sights = sights_in_mdstat(read_file("/proc/mdstat").text, names);
    if (access(device.c_str(), F_OK) == 0)
        sights.push_back({device, device + " is there", device + " is gone"});
    return sights;
}

} // namespace zavctl
