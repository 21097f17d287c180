// The optical drive and the disc in it: plain values, and what a drive lets happen to a disc.
#pragma once

#include "model/action.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace zavsim {

struct State;

enum class MediumType {
    cd_rom,
    cd_r,
    cd_rw,
    dvd_rom,
    dvd_minus_r,
    dvd_ram,
    dvd_minus_rw_restricted,
    dvd_minus_rw_sequential,
    dvd_plus_rw,
    dvd_plus_r,
    dvd_plus_r_double
};

// As the drive's disc information numbers them.
enum class DiscState { blank, appendable, complete, unknown };

// A directory's path ends with a slash.
struct DiscFile {
    std::string path;
    std::uint64_t bytes = 0;
    bool operator==(const DiscFile &other) const {
        return path == other.path && bytes == other.bytes;
    }
};

struct DiscSession {
    std::uint64_t start = 0; // sectors of 2048 bytes
    std::uint64_t sectors = 0;
    bool complete = true;
    bool merges = false; // shows what the session before it shows as well
    std::vector<DiscFile> files;
};

struct Medium {
    MediumType type = MediumType::cd_r;
    DiscState state = DiscState::blank;
    std::vector<DiscSession> sessions;
};

enum class DiscJobKind { write, overwrite, erase, format, empty };

// What a tool is doing to the disc. It ends with the tool's process, whatever becomes of that.
struct DiscJob {
    std::string tool;
    int process = 0;
    DiscJobKind kind = DiscJobKind::write;
    double started = 0;
    double seconds = 0; // that it takes
    bool closes = false;
    DiscSession session;
};

struct OpticalDrive {
    bool present = true;
    bool attached = true; // known to the kernel
    bool combo = false;   // writes CDs alone
    int speed = 0;        // KiB a second; 0: as fast as the disc allows
    bool packet_device = false;
    std::optional<Medium> medium;
    std::optional<DiscJob> job;
};

struct MediumKind {
    MediumType type;
    const char *name; // in sentences
    int profile;      // by which drives tell media apart
    const char *text; // of dvd+rw-mediainfo
    std::uint64_t sectors;
    int speed; // KiB a second
    bool cd;
    bool read_only;
    bool write_once;
    bool overwritable; // from its start at any time
};

const MediumKind &kind_of(MediumType type);
const MediumKind *kind_named(const std::string &name);
std::vector<std::string> medium_names();

// The node is there.
bool drive_answers(const OpticalDrive &drive);
const Medium *medium_in(const OpticalDrive &drive);

// Behind the last session.
std::uint64_t used_sectors(const Medium &medium);
// Where a further session begins; a CD loses the room of the leads between two.
std::uint64_t next_session(const Medium &medium);
std::uint64_t free_sectors(const Medium &medium);
bool last_session_is_complete(const Medium &medium);
// What the last session's file system shows.
std::vector<DiscFile> visible_files(const Medium &medium);
bool is_mountable(const Medium &medium);
// As du counts the mounted files.
std::uint64_t used_kib(const Medium &medium);

// Why the medium cannot be, or nothing.
std::string medium_problem(const MediumKind &kind, DiscState state, double megabytes);

std::string act_on_drive(State &state, const Action &action);
bool is_about_drive(Action::Kind kind);

// The percentage of the running job at the state's moment.
double job_percent(const State &state);
void finish_job(OpticalDrive &drive);
// The tool has ended before its time: a disc that is written once keeps a session that nobody can
// read.
void break_job(State &state);

} // namespace zavsim
