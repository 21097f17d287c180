#include "model/optical.hpp"

#include "model/state.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr std::uint64_t sector = 2048;
constexpr std::uint64_t cd_sectors = 359849;
constexpr std::uint64_t dvd_minus_sectors = 2298496;
constexpr std::uint64_t dvd_plus_sectors = 2295104;

// clang-format off
constexpr std::array<MediumKind, 11> kinds = {{
    {MediumType::cd_rom,  "CD-ROM", 0x08, "CD-ROM", cd_sectors, 2400, true, true, false, false},
    {MediumType::cd_r,    "CD-R",   0x09, "CD-R",   cd_sectors, 2400, true, false, true, false},
    {MediumType::cd_rw,   "CD-RW",  0x0A, "CD-RW",  cd_sectors, 1500, true, false, false, false},
    {MediumType::dvd_rom, "DVD-ROM", 0x10, "DVD-ROM",
     dvd_plus_sectors, 11080, false, true, false, false},
    {MediumType::dvd_minus_r, "DVD-R", 0x11, "DVD-R Sequential",
     dvd_minus_sectors, 11080, false, false, true, false},
    {MediumType::dvd_ram, "DVD-RAM", 0x12, "DVD-RAM", 2236704, 2770, false, false, false, false},
    {MediumType::dvd_minus_rw_restricted, "DVD-RW restricted", 0x13, "DVD-RW Restricted Overwrite",
     dvd_minus_sectors, 5540, false, false, false, true},
    {MediumType::dvd_minus_rw_sequential, "DVD-RW sequential", 0x14, "DVD-RW Sequential",
     dvd_minus_sectors, 5540, false, false, false, false},
    {MediumType::dvd_plus_rw, "DVD+RW", 0x1A, "DVD+RW",
     dvd_plus_sectors, 5540, false, false, false, true},
    {MediumType::dvd_plus_r, "DVD+R", 0x1B, "DVD+R",
     dvd_plus_sectors, 11080, false, false, true, false},
    {MediumType::dvd_plus_r_double, "DVD+R double", 0x2B, "DVD+R Double Layer",
     4173824, 5540, false, false, true, false}}};
// clang-format on

void show(std::vector<DiscFile> &files, const DiscFile &file) {
    const auto same = std::find_if(files.begin(), files.end(), [&file](const DiscFile &other) {
        return other.path == file.path;
    });
    if (same == files.end())
        files.push_back(file);
    else
        *same = file;
}

double fraction_done(const State &state, const DiscJob &job) {
    return job.seconds <= 0 ? 1 : std::clamp((state.now - job.started) / job.seconds, 0.0, 1.0);
}

// Written from the start, or behind the file system that is there and stays the valid one until
// the end.
void finish_overwriting(Medium &medium, const DiscJob &job) {
    if (!job.session.merges)
        medium.sessions.clear();
    medium.sessions.push_back(job.session);
    medium.state = DiscState::complete;
}

void finish_writing(Medium &medium, const DiscJob &job) {
    medium.sessions.push_back(job.session);
    medium.state = job.closes ? DiscState::complete : DiscState::appendable;
}

void break_writing(Medium &medium, const DiscJob &job, double fraction) {
    DiscSession session = job.session;
    session.sectors = static_cast<std::uint64_t>(static_cast<double>(session.sectors) * fraction);
    session.complete = false;
    session.files.clear();
    if (job.kind == DiscJobKind::overwrite && session.merges)
        return;
    if (job.kind == DiscJobKind::overwrite)
        medium.sessions.clear();
    medium.sessions.push_back(session);
    medium.state = job.kind == DiscJobKind::overwrite ? DiscState::complete : DiscState::appendable;
}

} // namespace

const MediumKind &kind_of(MediumType type) {
    return *std::find_if(kinds.begin(), kinds.end(),
                         [type](const MediumKind &kind) { return kind.type == type; });
}

const MediumKind *kind_named(const std::string &name) {
    const auto found = std::find_if(kinds.begin(), kinds.end(),
                                    [&name](const MediumKind &kind) { return name == kind.name; });
    return found == kinds.end() ? nullptr : &*found;
}

std::vector<std::string> medium_names() {
    std::vector<std::string> names;
    names.reserve(kinds.size());
    for (const MediumKind &kind : kinds)
        names.emplace_back(kind.name);
    return names;
}

bool drive_answers(const OpticalDrive &drive) {
    return drive.present && drive.attached;
}

const Medium *medium_in(const OpticalDrive &drive) {
    return drive_answers(drive) && drive.medium ? &*drive.medium : nullptr;
}

std::uint64_t used_sectors(const Medium &medium) {
    return medium.sessions.empty() ? 0
                                   : medium.sessions.back().start + medium.sessions.back().sectors;
}

std::uint64_t next_session(const Medium &medium) {
    constexpr std::uint64_t after_first = 11400; // lead-out, lead-in and gap
    constexpr std::uint64_t after_others = 6900;
    const std::size_t sessions = medium.sessions.size();
    if (sessions == 0)
        return 0;
    if (kind_of(medium.type).cd)
        return used_sectors(medium) + (sessions == 1 ? after_first : after_others);
    return (used_sectors(medium) + 15) / 16 * 16;
}

std::uint64_t free_sectors(const Medium &medium) {
    const MediumKind &kind = kind_of(medium.type);
    if (kind.read_only || (medium.state == DiscState::complete && !kind.overwritable))
        return 0;
    return kind.sectors - std::min(kind.sectors, next_session(medium));
}

bool last_session_is_complete(const Medium &medium) {
    return medium.sessions.empty() || medium.sessions.back().complete;
}

std::vector<DiscFile> visible_files(const Medium &medium) {
    std::vector<DiscFile> files;
    for (const DiscSession &session : medium.sessions) {
        if (!session.merges)
            files.clear();
        for (const DiscFile &file : session.files)
            show(files, file);
    }
    return files;
}

bool is_mountable(const Medium &medium) {
    return !medium.sessions.empty() && last_session_is_complete(medium);
}

std::uint64_t used_kib(const Medium &medium) {
    constexpr std::uint64_t block = 512;
    std::uint64_t blocks = sector / block; // of the root directory
    for (const DiscFile &file : visible_files(medium))
        blocks += file.path.back() == '/' ? sector / block : (file.bytes + block - 1) / block;
    return (blocks + 1) / 2;
}

double job_percent(const State &state) {
    return state.drive.job ? fraction_done(state, *state.drive.job) * 100 : 0;
}

void finish_job(OpticalDrive &drive) {
    if (!drive.job || !drive.medium)
        return;
    const DiscJob job = *drive.job;
    Medium &medium = *drive.medium;
    drive.job.reset();
    if (job.kind == DiscJobKind::write)
        return finish_writing(medium, job);
    if (job.kind == DiscJobKind::overwrite)
        return finish_overwriting(medium, job);
    medium.sessions.clear();
    if (job.kind == DiscJobKind::empty)
        medium.sessions.push_back(job.session);
    if (medium.type == MediumType::dvd_minus_rw_sequential)
        medium.type = MediumType::dvd_minus_rw_restricted;
    medium.state = job.kind == DiscJobKind::erase ? DiscState::blank : DiscState::complete;
}

void break_job(State &state) {
    OpticalDrive &drive = state.drive;
    if (!drive.job || !drive.medium)
        return;
    const DiscJob job = *drive.job;
    const double fraction = fraction_done(state, job);
    drive.job.reset();
    if (job.kind == DiscJobKind::write || job.kind == DiscJobKind::overwrite)
        return break_writing(*drive.medium, job, fraction);
    drive.medium->sessions.clear();
    drive.medium->state = DiscState::unknown;
}

} // namespace zavsim
