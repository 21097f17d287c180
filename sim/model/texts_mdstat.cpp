#include "model/arrays.hpp"
#include "model/texts.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

std::string member_word(const Array &array, const Member &member) {
    const char *mark = member.role == Role::faulty                    ? "(F)"
                       : array.inactive || member.role == Role::spare ? "(S)"
                                                                      : "";
    return fmt::format(" sd{}{}[{}]{}", member.letter, member.partition, member.number, mark);
}

std::string array_line(const Array &array) {
    std::string line =
        fmt::format("md{} : {}", array.minor, array.inactive ? "inactive" : "active");
    if (!array.inactive)
        line += fmt::format("{} {}", array.auto_read_only ? " (auto-read-only)" : "", array.level);
    for (const Member &member : array.members)
        line += member_word(array, member);
    return line + "\n";
}

// "[4/3] [UUU_]"
std::string device_pattern(const Array &array) {
    std::string pattern;
    for (int place = 0; place < array.raid_devices; ++place) {
        const Member *member = member_at(array, place);
        pattern += member != nullptr && member->role == Role::in_sync ? 'U' : '_';
    }
    return fmt::format("[{}/{}] [{}]", array.raid_devices, count_members(array, Role::in_sync),
                       pattern);
}

std::string level_words(const Array &array) {
    const std::string &level = array.level;
    const int chunk = array.chunk_kib;
    if (level == "raid5" || level == "raid6")
        return fmt::format(" level {}, {}k chunk, algorithm 2 {}", level.back(), chunk,
                           device_pattern(array));
    if (level == "raid10")
        return fmt::format(" {}K chunks 2 near-copies {}", chunk, device_pattern(array));
    if (level == "raid0")
        return fmt::format(" {}k chunks", chunk);
    if (level == "linear")
        return " 0k rounding";
    return " " + device_pattern(array);
}

std::string status_line(const Array &array) {
    const std::string super = array.metadata == "0.90" ? "" : " super " + array.metadata;
    const std::uint64_t kib =
        array.inactive ? array.component_kib * array.members.size() : array_kib(array);
    return fmt::format("      {} blocks{}{}\n", kib, super,
                       array.inactive ? "" : level_words(array));
}

const char *sync_word(SyncKind kind) {
    return kind == SyncKind::recovery ? "recovery" : kind == SyncKind::check ? "check" : "resync";
}

// The kernel's own arithmetic, in sectors and whole seconds, so that finish= and speed= agree
// with each other as they do there.
std::string sync_line(const Array &array, double now) {
    const std::uint64_t done = sync_done_kib(array) * 2;
    const std::uint64_t whole = array.component_kib * 2;
    const std::uint64_t per_mille = (done >> 10) * 1000 / ((whole >> 10) + 1);
    const auto elapsed = static_cast<std::uint64_t>(std::max(0.0, now - array.sync.started));
    const std::uint64_t seconds = std::max<std::uint64_t>(elapsed, 1);
    const std::uint64_t left = (whole - done) / (done / 32 + 1) * seconds >> 5;
    const std::uint64_t bar = per_mille / 50;
    return fmt::format("      [{}>{}]  {} ={:3}.{}% ({}/{}) finish={}.{}min speed={}K/sec\n",
                       std::string(bar, '='), std::string(20 - bar, '.'),
                       sync_word(array.sync.kind), per_mille / 10, per_mille % 10, done / 2,
                       whole / 2, left / 60, left % 60 / 6, done / 2 / seconds);
}

std::string progress_lines(const Array &array, double now) {
    if (array.sync.pending)
        return "      \tresync=PENDING\n";
    if (array.sync.kind == SyncKind::none)
        return {};
    return array.sync.running ? sync_line(array, now) : "      \tresync=DELAYED\n";
}

// What ends a block: blanks that the kernel leaves on the line it would write a bitmap to.
std::string last_line(const Array &array) {
    if (array.inactive)
        return "       \n";
    return array.bitmap ? "      bitmap: 1/1 pages [4KB], 65536KB chunk\n\n" : "      \n";
}

} // namespace

std::string mdstat_text(const State &state) {
    std::string text = state.current_tools
                           ? "Personalities : [raid0] [raid1] [raid6] [raid5] [raid4] [raid10] "
                             "[linear] \n"
                           : "Personalities : [linear] [raid0] [raid1] [raid10] [raid6] [raid5] "
                             "[raid4] \n";
    for (const Array &array : state.arrays)
        text += array_line(array) + status_line(array) + progress_lines(array, state.now) +
                last_line(array);
    return text + "unused devices: <none>\n";
}

} // namespace zavsim
