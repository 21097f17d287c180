// The disc in the optical drive: what it is, and what can be done with it.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

enum class DriveKind { none, dvd_writer, combo, untold };

// The library's session types, by their numbers.
enum class SessionType { close = 0, open = 1, overwrite = 2 };

// How a disc is erased.
enum class BlankWay {
    none,    // it cannot be
    nothing, // it is blank already
    fast,    // a CD, its table of contents alone
    empty,   // an empty file system
    format,  // a full format, then an empty file system
};

struct DiscReport {
    DriveKind drive = DriveKind::none;
    zavMediaInfo media{};           // as the library filled it
    std::optional<Failure> failure; // it gave no answer
};

// What the nodes, the library and the kernel's table of drives tell of the drive.
struct DriveFacts {
    bool scd0 = false;  // /dev/scd0 is there
    bool cdrom = false; // /dev/cdrom is there
    int combo = 0;      // the library's answer: is it a combo drive?
    std::string table;  // /proc/sys/dev/cdrom/info
};
DriveKind kind_of_drive(const DriveFacts &facts);

// Why a query with that result has no answer.
std::string query_failure_meaning(int code, const DriveFacts &facts);

std::string medium_word(const DiscReport &report); // "DVD+R", "none"
std::string state_word(const DiscReport &report);  // "appendable"
std::string drive_words(DriveKind drive);
std::string session_word(SessionType session);
const std::vector<SessionType> &all_sessions();

bool is_write_once(int disc_type);
bool is_cd(int disc_type);
bool state_known(const DiscReport &report);
bool state_matters(const DiscReport &report); // it may take a burn in one of its states
bool drive_refuses(const DiscReport &report); // a combo drive, as far as the library asks
bool holds_disc(const DiscReport &report);

// What the library does with this disc. The burns are its own choice.
std::vector<SessionType> sessions_of(const DiscReport &report);
BlankWay blank_way(const DiscReport &report);
bool can_format(const DiscReport &report);

// Kilobytes of 1024 bytes; none where they are not told. The room is 0 where nothing fits.
std::optional<int> total_kib(const DiscReport &report);
std::optional<int> free_kib(const DiscReport &report);

// "4590000 KiB (4.4 GiB)".
std::string size_words(int kib);

// "DVD+R, appendable".
std::string disc_words(const DiscReport &report);

} // namespace zavctl
