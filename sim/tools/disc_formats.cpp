// dvd+rw-format, pktsetup, mkudffs and cdrwtool: what makes a rewritable disc ready.
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/disc_device.hpp"
#include "tools/disc_job.hpp"

#include <cstdio>
#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr double full_format_seconds = 900;
constexpr double quick_format_seconds = 60;
constexpr double udf_seconds = 20;
constexpr double packet_setup_seconds = 400; // of a CD, with its blanking and formatting
constexpr std::uint64_t udf_sectors = 400;
constexpr const char *packet_node = "/dev/pktcdvd/pktcdvd0";

int complain(const std::string &text, int status) {
    fmt::print(stderr, "{}\n", text);
    return status;
}

struct Found {
    int error = 0;
    std::optional<Medium> medium;
};

Found find_medium(const std::string &device) {
    Turn turn;
    const OpticalDrive &drive = turn.state().drive;
    const Medium *medium = medium_in(drive);
    return {device_error(device, drive), medium == nullptr ? std::nullopt : std::optional(*medium)};
}

bool is_of(const Medium &medium, std::initializer_list<MediumType> types) {
    for (const MediumType type : types)
        if (medium.type == type)
            return true;
    return false;
}

// Ends with the signal that came, if one did.
bool has_succeeded(const DiscJob &job, const std::function<void(int)> &show) {
    const JobEnd end = run_fixed_job(job, show);
    if (end == JobEnd::signalled)
        end_by_signal();
    return end == JobEnd::done;
}

DiscJob empty_file_system(const char *tool, double seconds) {
    DiscJob job;
    job.tool = tool;
    job.kind = DiscJobKind::empty;
    job.seconds = seconds;
    job.session.sectors = udf_sectors;
    return job;
}

void show_formatting(int percent) {
    fmt::print(stderr, "\b\b\b\b\b\b{:5.1f}%", static_cast<double>(percent));
}

int format_dvd(const Medium &medium, bool full) {
    const bool plus = medium.type == MediumType::dvd_plus_rw;
    const bool sequential = medium.type == MediumType::dvd_minus_rw_sequential;
    fmt::print(stderr, "* 4.7GB DVD{}RW media{} detected.\n* formatting     .", plus ? "+" : "-",
               plus         ? ""
               : sequential ? " in Sequential mode"
                            : " in Restricted Overwrite mode");
    DiscJob job;
    job.tool = "dvd+rw-format";
    job.kind = DiscJobKind::format;
    job.seconds = full ? full_format_seconds : quick_format_seconds;
    if (has_succeeded(job, show_formatting))
        return complain("", 0);
    return complain("\n:-( unable to proceed with format: Input/output error", EIO);
}

int set_packet_device(const std::string &device) {
    Turn turn;
    OpticalDrive &drive = turn.state().drive;
    if (const int error = device_error(device, drive); error != 0)
        return complain(fmt::format("pktsetup: Error: Can't open cd-rom device '{}': {}", device,
                                    strerror(error)),
                        1);
    if (drive.packet_device)
        return complain(fmt::format("pktsetup: Error: Can't setup packet device 'pktcdvd0' for "
                                    "cd-rom device '{}': Device or resource busy",
                                    device),
                        1);
    drive.packet_device = true;
    turn.commit();
    return 0;
}

int take_packet_device_down() {
    Turn turn;
    OpticalDrive &drive = turn.state().drive;
    if (!drive.packet_device)
        return complain("pktsetup: Error: Can't tear down packet device 'pktcdvd0': No such device "
                        "or address",
                        1);
    drive.packet_device = false;
    turn.commit();
    return 0;
}

bool has_packet_device() {
    Turn turn;
    return turn.state().drive.packet_device;
}

} // namespace

int run_dvd_format(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-force", "-force=full"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "dvd+rw-format",
            arguments.unknown.empty() ? "anything but one device" : arguments.unknown, 1);
    note_signals();
    fmt::print(stderr, "* BD/DVD±RW/-RAM format utility by <appro@fy.chalmers.se>, version 7.1.\n");
    const std::string device = arguments.names.front();
    const Found found = find_medium(device);
    if (found.error != 0)
        return complain(
            fmt::format(":-( unable to open(\"{}\"): {}", device, strerror(found.error)),
            fatal_status(found.error));
    if (!found.medium ||
        !is_of(*found.medium, {MediumType::dvd_plus_rw, MediumType::dvd_minus_rw_restricted,
                               MediumType::dvd_minus_rw_sequential}))
        return complain(":-( mounted media doesn't appear to be DVD±RW, DVD-RAM or Blu-ray",
                        fatal_status(found.medium ? EMEDIUMTYPE : ENOMEDIUM));
    if (arguments.flags.empty() && found.medium->state != DiscState::blank)
        return complain("- media is already formatted\n- you have the option to re-run "
                        "dvd+rw-format with:\n  -force[=full] to enforce new format or mode "
                        "transition\n                and wipe the data;",
                        0);
    return format_dvd(*found.medium, arguments.has("-force=full"));
}

int run_pktsetup(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-d"});
    const bool takes_down = arguments.has("-d");
    if (!arguments.unknown.empty() || arguments.names.size() != (takes_down ? 1 : 2) ||
        arguments.names.front() != "pktcdvd0")
        return not_simulated("pktsetup", "anything but pktcdvd0 DEVICE and -d pktcdvd0", 1);
    if (fails_at("pktsetup"))
        return complain("pktsetup: Error: Can't load pktcdvd kernel module", 1);
    return takes_down ? take_packet_device_down() : set_packet_device(arguments.names[1]);
}

int run_mkudffs(const std::vector<std::string> &words) {
    if (words.size() != 1 || words.front() != packet_node)
        return not_simulated("mkudffs", std::string("anything but ") + packet_node, 1);
    note_signals();
    if (!has_packet_device())
        return complain(fmt::format("mkudffs: Error: Cannot open device '{}': No such file or "
                                    "directory",
                                    packet_node),
                        1);
    const Found found = find_medium("/dev/sr0");
    if (found.error != 0 || !found.medium || !kind_of(found.medium->type).overwritable)
        return complain(fmt::format("mkudffs: Error: Cannot open device '{}': {}", packet_node,
                                    strerror(found.medium ? EROFS : ENOMEDIUM)),
                        1);
    fmt::print("filename={}\nlabel=LinuxUDF\nblocksize=2048\nblocks={}\nudfrev=2.01\n", packet_node,
               kind_of(found.medium->type).sectors);
    if (has_succeeded(empty_file_system("mkudffs", udf_seconds), [](int) {}))
        return 0;
    return complain(
        fmt::format("mkudffs: Error: Cannot write to device '{}': Input/output error", packet_node),
        1);
}

int run_cdrwtool(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-q"}, {"-d"});
    if (!arguments.unknown.empty() || !arguments.has("-q") || arguments.values.count("-d") == 0)
        return not_simulated("cdrwtool", "anything but -d DEVICE -q", 1);
    note_signals();
    const std::string device = arguments.values.at("-d");
    const Found found = find_medium(device);
    if (found.error != 0 || !found.medium)
        return complain(fmt::format("open cdrom device: {}",
                                    strerror(found.error != 0 ? found.error : ENOMEDIUM)),
                        1);
    fmt::print("using device {}\nI'm going to do a quick setup of {}. The disc is going to be "
               "blanked and formatted with one big track. All data on the device will be lost!! "
               "Press CTRL-C to cancel now.\nENTER to continue.\n",
               device, device);
    fflush(stdout);
    std::getchar();
    if (found.medium->type != MediumType::cd_rw)
        return complain("blank disc: Input/output error", 1);
    fmt::print("Initiating quick disc blank\n");
    if (!has_succeeded(empty_file_system("cdrwtool", packet_setup_seconds), [](int) {}))
        return complain("format disc: Input/output error", 1);
    fmt::print("Quick setup complete!\n");
    return 0;
}

} // namespace zavsim
