#include "root/optical_files.hpp"

#include "launcher/sandbox.hpp"
#include "model/disks.hpp"
#include "model/texts_optical.hpp"
#include "root/files.hpp"

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <fmt/format.h>
#include <fstream>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

const std::string listing_file = place::run + "/disc-files";

// Newer kernels have a directory of this name alone.
fs::path sysfs_entry(const State &state) {
    const fs::path device = "/sys/block/sr0/device";
    return state.hosts_below_ata ? device / fmt::format("scsi_device/{}:0:0:0", optical_host)
                                 : device / fmt::format("scsi_device:{}:0:0:0", optical_host);
}

void publish_sysfs(const State &state) {
    if (drive_answers(state.drive))
        fs::create_directories(sysfs_entry(state));
    else
        fs::remove_all("/sys/block/sr0");
}

std::string listing(const State &state) {
    std::string text;
    if (disc_mount_text(state).empty())
        return text;
    for (const DiscFile &file : visible_files(*state.drive.medium))
        text += fmt::format("{} {}\n", file.bytes, file.path);
    return text;
}

void show_file(const DiscFile &file) {
    const fs::path path = fs::path(disc_mount_point) / file.path;
    std::error_code error;
    if (file.path.back() == '/') {
        fs::create_directories(path, error);
        return;
    }
    fs::create_directories(path.parent_path(), error);
    make_sparse(path, file.bytes);
}

// Files of the right names and sizes, filled with zeros: what a disc holds is not kept. A
// program's own files in an empty mount point stay.
void publish_disc_files(const State &state) {
    fs::create_directories(disc_mount_point);
    const std::string wanted = listing(state);
    const std::string present = read_text(listing_file).value_or("");
    if (wanted == present)
        return;
    for (const auto &entry : fs::directory_iterator(disc_mount_point))
        fs::remove_all(entry.path());
    if (!wanted.empty())
        for (const DiscFile &file : visible_files(*state.drive.medium))
            show_file(file);
    write_text(listing_file, wanted);
}

// A process that nobody has waited for yet has ended as well.
bool has_ended(int process) {
    if (kill(process, 0) != 0 && errno == ESRCH)
        return true;
    std::ifstream in(fmt::format("{}/{}/stat", place::real_proc, process));
    std::string text;
    std::getline(in, text);
    const std::size_t name_end = text.rfind(") ");
    return name_end != std::string::npos && text[name_end + 2] == 'Z';
}

} // namespace

void publish_drive(const State &state) {
    publish_sysfs(state);
    publish_disc_files(state);
    write_text("/proc/sys/dev/cdrom/info", cdrom_info_text(state));
    write_text(place::run + "/disc-information", disc_information(state));
}

void notice_ended_job(State &state) {
    if (state.drive.job && has_ended(state.drive.job->process))
        break_job(state);
}

} // namespace zavsim
