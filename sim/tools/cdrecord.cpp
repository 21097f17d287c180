// cdrecord: the drive's and the disc's sheets, the tray, erasing and writing a CD.
#include "model/texts_optical.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_device.hpp"
#include "tools/disc_writer.hpp"

#include <fmt/format.h>
#include <unistd.h>

namespace zavsim {

namespace {

constexpr int failure = 255;

int refuse(const std::string &text) {
    fmt::print(stderr, "{}", text);
    return failure;
}

int show_atip(const State &state) {
    const Medium *medium = medium_in(state.drive);
    fmt::print("{}", recorder_text(state));
    fflush(stdout);
    if (medium == nullptr)
        return refuse(no_disc_text());
    fmt::print("{}", kind_of(medium->type).cd ? atip_text(*medium) : "");
    return 0;
}

int show_session_offsets(const State &state) {
    const Medium *medium = medium_in(state.drive);
    if (medium == nullptr)
        return refuse(no_disc_text());
    const std::string offsets = session_offsets(*medium);
    if (offsets.empty())
        return refuse("wodim: Cannot read first writable address\n");
    fmt::print("{}\n", offsets);
    return 0;
}

int eject() {
    Turn turn;
    fmt::print("{}", recorder_text(turn.state()));
    turn.state().drive.medium.reset();
    turn.commit();
    return 0;
}

std::string value_of(const std::vector<std::string> &words, const std::string &name) {
    for (const std::string &word : words)
        if (word.rfind(name, 0) == 0)
            return word.substr(name.size());
    return "";
}

bool has(const std::vector<std::string> &words, const std::string &wanted) {
    for (const std::string &word : words)
        if (word == wanted)
            return true;
    return false;
}

constexpr double fast_blanking_seconds = 22;

int erase(const std::string &how) {
    if (how != "fast")
        return not_simulated("cdrecord", "-blank=" + how, failure);
    Medium medium;
    {
        Turn turn;
        const Medium *found = medium_in(turn.state().drive);
        if (found == nullptr)
            return refuse(no_disc_text());
        medium = *found;
    }
    if (medium.type != MediumType::cd_rw)
        return refuse("wodim: Cannot blank disk, aborting.\n"
                      "wodim: Some drives do not support all blank types.\n");
    DiscJob job;
    job.tool = "cdrecord";
    job.kind = DiscJobKind::erase;
    job.seconds = fast_blanking_seconds;
    const JobEnd end = run_fixed_job(job, [](int) {});
    if (end == JobEnd::signalled)
        end_by_signal();
    return end == JobEnd::done ? 0
                               : refuse("wodim: Input/output error. blank unit: scsi sendcmd: no "
                                        "error\nwodim: Cannot blank disk, aborting.\n");
}

// "-tsize=30903s"; 0 without it.
std::uint64_t announced_sectors(const std::vector<std::string> &words) {
    const std::string text = value_of(words, "-tsize=");
    const std::string digits = text.substr(0, text.find_first_not_of("0123456789"));
    return digits.empty() || digits.size() > 9 ? 0 : std::stoull(digits);
}

bool takes_session(const Medium &medium) {
    return medium.state == DiscState::blank ||
           (medium.state == DiscState::appendable && last_session_is_complete(medium));
}

std::string write_problem(const Medium *medium) {
    if (medium == nullptr)
        return no_disc_text();
    if (!kind_of(medium->type).cd || kind_of(medium->type).read_only)
        return "wodim: Sorry, no CD/DVD-Recorder or unsupported CD/DVD-Recorder found on this "
               "target.\n";
    if (!takes_session(*medium))
        return "wodim: Cannot get next writable address for 'invisible' track.\n"
               "wodim: This means that we are checking recorded media.\n"
               "wodim: This media cannot be written in streaming mode anymore.\n"
               "wodim: If you like to write to 'preformatted' RW media, try to blank the media "
               "before.\n";
    return {};
}

int no_room(const Written &written, std::uint64_t room) {
    if (written.begun)
        return refuse("wodim: Input/output error. write_g1: scsi sendcmd: no error\n"
                      "write track data: error\n");
    fmt::print("Blocks total: {} Blocks current: {} Blocks remaining: {}\n", room, room,
               static_cast<std::int64_t>(room) - static_cast<std::int64_t>(written.sectors));
    return refuse("wodim: WARNING: Data may not fit on current disk.\n"
                  "wodim: Notice: Use -overburn option to write more than the official disk "
                  "capacity.\n");
}

int outcome(const Written &written, std::uint64_t room) {
    switch (written.end) {
    case JobEnd::done:
        fmt::print("\nTrack 01: Total bytes read/written: {}/{} ({} sectors).\nFixating...\n",
                   written.sectors * disc_sector, written.sectors * disc_sector, written.sectors);
        return 0;
    case JobEnd::full:
        return no_room(written, room);
    case JobEnd::cut_short:
        return refuse("wodim: Aborted by EOF on input.\n");
    case JobEnd::signalled:
        end_by_signal();
    default:
        return refuse("wodim: Input/output error. write_g1: scsi sendcmd: no error\n"
                      "CDB:  2A 00 00 00 00 00 00 00 1F 00\nstatus: 0x2 (CHECK CONDITION)\n"
                      "write track data: error\n");
    }
}

int write(const std::vector<std::string> &words) {
    WriteOrder order;
    order.tool = "cdrecord";
    order.input = STDIN_FILENO;
    order.closes = !has(words, "-multi");
    order.told = announced_sectors(words);
    {
        Turn turn;
        const Medium *medium = medium_in(turn.state().drive);
        if (const std::string problem = write_problem(medium); !problem.empty())
            return refuse(problem);
        order.start = next_session(*medium);
        order.room = free_sectors(*medium);
        fmt::print("{}", recorder_text(turn.state()));
    }
    if (order.told == 0 && has(words, "-dao"))
        return refuse("wodim: Track 1 has unknown length.\n"
                      "wodim: Use tsize= option in SAO mode to specify track size.\n");
    fmt::print("Starting to write CD/DVD at speed  16.0 in real {} mode for {} session.\n",
               has(words, "-dao") ? "SAO" : "TAO", order.closes ? "single" : "multi");
    order.show = [](std::uint64_t sectors) {
        fmt::print("\rTrack 01: {:4} MB written.", sectors / 512);
        fflush(stdout);
    };
    return outcome(write_disc(order), order.room);
}

} // namespace

int run_cdrecord(const std::vector<std::string> &words) {
    const std::string device = value_of(words, "dev=");
    if (const int error = device_error(device, Turn().state().drive); error != 0)
        return refuse(fmt::format("wodim: {}. Cannot open SCSI driver!\n", strerror(error)));
    if (has(words, "-atip"))
        return show_atip(Turn().state());
    if (has(words, "-msinfo"))
        return show_session_offsets(Turn().state());
    if (has(words, "-eject"))
        return eject();
    note_signals();
    const std::string blanking = value_of(words, "-blank=");
    if (!blanking.empty())
        return erase(blanking);
    if (!words.empty() && words.back() == "-")
        return write(words);
    return not_simulated("cdrecord", "that", failure);
}

} // namespace zavsim
