// What happens to the optical drive from outside.
#include "model/disks.hpp"
#include "model/optical.hpp"
#include "model/state.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr double bytes_per_megabyte = 1048576;
constexpr int usual_megabytes = 100; // on a disc that has something on it

bool can_be_blank(const MediumKind &kind) {
    return !kind.read_only;
}

bool can_be_appendable(const MediumKind &kind) {
    return !kind.read_only && kind.type != MediumType::dvd_ram;
}

// One file and the root directory take what is asked for.
DiscSession session_of(double megabytes) {
    constexpr std::uint64_t root_directory = 2048;
    const auto bytes = static_cast<std::uint64_t>(megabytes * bytes_per_megabyte);
    DiscSession session;
    session.sectors = (bytes + root_directory - 1) / root_directory;
    session.files = {{"DATA.BIN", bytes - std::min(bytes, root_directory)}};
    return session;
}

std::string insert(OpticalDrive &drive, const Action &action) {
    const MediumKind &kind = *kind_named(action.text);
    const auto state = static_cast<DiscState>(action.status);
    if (drive.medium)
        return "there is a disc in the drive";
    Medium medium{kind.type, state, {}};
    if (state != DiscState::blank)
        medium.sessions.push_back(session_of(action.value < 0 ? usual_megabytes : action.value));
    drive.medium = medium;
    return {};
}

std::string take_out(OpticalDrive &drive) {
    if (!drive.medium)
        return "there is no disc in the drive";
    drive.medium.reset();
    return {};
}

// A job that loses its drive is broken off, and its tool learns of it.
std::string vanish(State &state) {
    if (!state.drive.present)
        return "there is no drive";
    break_job(state);
    state.drive.present = false;
    state.drive.packet_device = false;
    auto &hosts = state.scsi_hosts;
    hosts.erase(std::remove(hosts.begin(), hosts.end(), optical_host), hosts.end());
    return {};
}

std::string appear(State &state) {
    if (state.drive.present)
        return "the drive is there";
    state.drive.present = state.drive.attached = true;
    state.scsi_hosts.push_back(optical_host);
    return {};
}

std::string act_on_present_drive(OpticalDrive &drive, const Action &action) {
    if (drive.job && action.kind != Kind::drive_writes)
        return "the drive is at work";
    switch (action.kind) {
    case Kind::drive_gets_disc:
        return insert(drive, action);
    case Kind::drive_loses_disc:
        return take_out(drive);
    case Kind::drive_is_combo:
    case Kind::drive_is_burner:
        drive.combo = action.kind == Kind::drive_is_combo;
        return {};
    default:
        drive.speed = action.number;
        return {};
    }
}

} // namespace

bool is_about_drive(Action::Kind kind) {
    return kind >= Kind::drive_gets_disc;
}

std::string act_on_drive(State &state, const Action &action) {
    if (action.kind == Kind::drive_vanishes)
        return vanish(state);
    if (action.kind == Kind::drive_appears)
        return appear(state);
    return state.drive.present ? act_on_present_drive(state.drive, action) : "there is no drive";
}

std::string medium_problem(const MediumKind &kind, DiscState state, double megabytes) {
    if (state == DiscState::blank && !can_be_blank(kind))
        return fmt::format("there is no blank {}", kind.name);
    if (state == DiscState::appendable && !can_be_appendable(kind))
        return fmt::format("there is no appendable {}", kind.name);
    if (state == DiscState::blank && megabytes >= 0)
        return "nothing is used on a blank disc";
    if (megabytes * bytes_per_megabyte > static_cast<double>(kind.sectors) * 2048)
        return fmt::format("a {} holds {} MB", kind.name, kind.sectors / 512);
    return {};
}

} // namespace zavsim
