// growisofs: lets mkisofs make an image and writes it to a DVD.
#include "model/texts_optical.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_device.hpp"
#include "tools/disc_writer.hpp"

#include <algorithm>
#include <fcntl.h>
#include <fmt/format.h>
#include <fmt/ranges.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

namespace zavsim {

namespace {

constexpr std::uint64_t unit = 16; // sectors that are written together
constexpr int cannot_be_a_name = 127;

struct Order {
    std::string device;
    bool appends = false;
    bool closes = false;
    bool needs_no_terminal = false;
    std::vector<std::string> image_words;
    std::string unknown;
};

void take_luke(Order &order, const std::string &word) {
    if (word == "dao" || word.rfind("dao:", 0) == 0)
        order.closes = true;
    else if (word == "tty")
        order.needs_no_terminal = true;
}

Order order_of(const std::vector<std::string> &words) {
    constexpr const char *luke = "-use-the-force-luke=";
    Order order;
    for (std::size_t i = 0; i < words.size(); ++i) {
        const std::string &word = words[i];
        const bool has_device = (word == "-Z" || word == "-M") && i + 1 < words.size();
        if (has_device && order.device.empty()) {
            order.appends = word == "-M";
            order.device = words[++i];
        } else if (word == "-dvd-compat") {
            order.closes = true;
        } else if (word.rfind(luke, 0) == 0) {
            take_luke(order, word.substr(std::string(luke).size()));
        } else if (word.rfind("-speed=", 0) != 0) {
            order.image_words.push_back(word);
        }
    }
    return order;
}

// What is to be said before the tool ends, and its status.
struct Refusal {
    std::string text;
    int status = 0;
};

Refusal refusal(const std::string &text, int error) {
    return {":-( " + text + "\n", fatal_status(error)};
}

bool has_terminal() {
    const Descriptor terminal(open("/dev/tty", O_RDWR | O_CLOEXEC));
    return terminal.get() >= 0 || isatty(STDIN_FILENO) != 0;
}

// A new session over a file system. Current tools write over it only for somebody at a terminal.
Refusal overwriting_refusal(const State &state, const Order &order) {
    if (order.needs_no_terminal || !is_mountable(*state.drive.medium))
        return {};
    if (state.current_tools && !has_terminal())
        return {fmt::format("FATAL: {} already carries isofs!\n", order.device),
                fatal_status(EBUSY)};
    return {fmt::format("WARNING: {} already carries isofs!\n", order.device), 0};
}

Refusal appending_refusal(const Medium &medium, const Order &order) {
    const MediumKind &kind = kind_of(medium.type);
    if (kind.overwritable)
        return is_mountable(medium) ? Refusal{}
                                    : refusal(order.device + " doesn't look like isofs...", EINVAL);
    if (medium.state != DiscState::appendable || !last_session_is_complete(medium))
        return refusal("media is not appendable", EINVAL);
    return {};
}

Refusal medium_refusal(const State &state, const Order &order) {
    if (const int error = device_error(order.device, state.drive); error != 0)
        return refusal(
            fmt::format("unable to open64(\"{}\",O_RDONLY): {}", order.device, strerror(error)),
            error);
    const Medium *medium = medium_in(state.drive);
    if (medium == nullptr)
        return refusal(order.device + ": No medium found", ENOMEDIUM);
    const MediumKind &kind = kind_of(medium->type);
    const bool recordable = !kind.cd && !kind.read_only && kind.type != MediumType::dvd_ram;
    if (!recordable || state.drive.combo)
        return refusal(fmt::format("{}: media is not recognized as recordable DVD: {:X}",
                                   order.device, kind.profile),
                       EMEDIUMTYPE);
    return order.appends ? appending_refusal(*medium, order) : overwriting_refusal(state, order);
}

// A disc that is written once takes its first session when it is blank alone.
bool takes_first_session(const Medium &medium) {
    return kind_of(medium.type).overwritable || medium.state == DiscState::blank;
}

std::vector<std::string> image_command(const Order &order, const Medium &medium) {
    std::vector<std::string> words = {"mkisofs"};
    if (order.appends) {
        words.insert(
            words.end(),
            {"-C", fmt::format("{},{}", medium.sessions.back().start + unit, next_session(medium)),
             "-M", order.device});
    }
    words.insert(words.end(), order.image_words.begin(), order.image_words.end());
    return words;
}

[[noreturn]] void exec_image_command(std::vector<std::string> words, int output) {
    std::vector<char *> pointers;
    pointers.reserve(words.size() + 1);
    for (std::string &word : words)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    dup2(output, STDOUT_FILENO);
    execvp(pointers[0], pointers.data());
    fmt::print(stderr, ":-( unable to execute mkisofs: {}\n", strerror(errno));
    _exit(cannot_be_a_name);
}

class ImageMaker {
  public:
    explicit ImageMaker(const std::vector<std::string> &words) {
        int ends[2] = {-1, -1};
        if (pipe2(ends, O_CLOEXEC) != 0)
            return;
        process_ = fork();
        if (process_ == 0)
            exec_image_command(words, ends[1]);
        close(ends[1]);
        output_ = ends[0];
    }
    ~ImageMaker() { end(); }
    ImageMaker(const ImageMaker &) = delete;
    ImageMaker &operator=(const ImageMaker &) = delete;

    int output() const { return output_; }

    // Nobody reads from it any more.
    int end() {
        if (output_ >= 0)
            close(std::exchange(output_, -1));
        int status = 0;
        while (process_ > 0 && waitpid(process_, &status, 0) < 0 && errno == EINTR) {
        }
        process_ = -1;
        return status;
    }

  private:
    pid_t process_ = -1;
    int output_ = -1;
};

WriteOrder write_order(const Order &order, const Medium &medium, int input) {
    const MediumKind &kind = kind_of(medium.type);
    WriteOrder write;
    write.tool = "growisofs";
    write.input = input;
    write.kind = kind.overwritable ? DiscJobKind::overwrite : DiscJobKind::write;
    write.closes = order.closes;
    write.start = order.appends ? next_session(medium) : 0;
    write.room = order.appends ? free_sectors(medium) : kind.sectors;
    write.whole_image = true;
    write.multiple = unit;
    return write;
}

int failed(const std::string &text, int error) {
    fmt::print(stderr, "{}:-( write failed: {}\n", text, strerror(error));
    return error;
}

int write_error(std::uint64_t sector, const char *sense, int error) {
    return failed(
        fmt::format(":-[ WRITE@LBA={:x}h failed with {}]: {}\n", sector, sense, strerror(error)),
        error);
}

int no_room(const Order &order, const WriteOrder &write, const Written &written) {
    if (written.begun)
        return write_error(write.start + written.sectors, "SK=5h/END OF USER AREA", ENOSPC);
    fmt::print(stderr, ":-( {}: {} blocks are free, {} to be written!\n", order.device, write.room,
               written.sectors);
    return fatal_status(ENOSPC);
}

int finished(const Order &order, const Written &written, bool overwrites) {
    fmt::print(stderr, "builtin_dd: {}*2KB out @ average 4.0x1352KBps\n{}: flushing cache\n",
               written.sectors, order.device);
    if (!overwrites)
        fmt::print(stderr, "{}: closing track\n{}: closing {}\n", order.device, order.device,
                   order.closes ? "disc" : "session");
    return 0;
}

int outcome(const Order &order, const WriteOrder &write, const Written &written) {
    switch (written.end) {
    case JobEnd::done:
        return finished(order, written, write.kind == DiscJobKind::overwrite);
    case JobEnd::full:
        return no_room(order, write, written);
    case JobEnd::cut_short:
        fmt::print(stderr, ":-( {}: no image came\n", order.device);
        return EIO;
    case JobEnd::drive_gone:
        return failed("", ENODEV);
    default:
        if (written.begun)
            return write_error(write.start + written.sectors, "SK=3h/ASC=0Ch/ACQ=00h", EIO);
        return refusal(order.device + ": unable to proceed with recording", EIO).status;
    }
}

int burn(const Order &order, const Medium &medium) {
    const std::vector<std::string> command = image_command(order, medium);
    fmt::print(stderr, "Executing '{} | builtin_dd of={} obs=32k seek={}'\n",
               fmt::join(command, " "), order.device,
               order.appends ? next_session(medium) / unit : 0);
    ImageMaker maker(command);
    const WriteOrder write = write_order(order, medium, maker.output());
    if (!order.appends && !takes_first_session(medium)) {
        maker.end();
        return write_error(0, "SK=5h/INVALID ADDRESS FOR WRITE", EINVAL);
    }
    const Written written = write_disc(write);
    const int made = maker.end();
    if (written.end == JobEnd::signalled)
        end_by_signal();
    // One that nobody reads from is ended by that.
    if (made != 0 && (written.end == JobEnd::done || written.end == JobEnd::cut_short)) {
        fmt::print(stderr, ":-( mkisofs has failed: {}\n",
                   WIFSIGNALED(made) ? WTERMSIG(made) : WEXITSTATUS(made));
        return EIO;
    }
    return outcome(order, write, written);
}

} // namespace

int run_growisofs(const std::vector<std::string> &words) {
    const Order order = order_of(words);
    if (order.device.empty())
        return not_simulated("growisofs", "anything but -Z DEVICE and -M DEVICE",
                             fatal_status(EINVAL));
    note_signals();
    std::optional<Medium> medium;
    Refusal refusal;
    {
        Turn turn;
        medium = turn.state().drive.medium;
        refusal = medium_refusal(turn.state(), order);
    }
    fmt::print(stderr, "{}", refusal.text);
    return refusal.status != 0 ? refusal.status : burn(order, *medium);
}

} // namespace zavsim
