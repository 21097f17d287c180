// sfdisk -d DISK, and sfdisk DISK with a dump on standard input.
#include "model/contents.hpp"
#include "model/disks.hpp"
#include "model/texts_volumes.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"

#include <algorithm>
#include <array>
#include <cstdio>
#include <fmt/format.h>
#include <iostream>
#include <iterator>
#include <optional>
#include <regex>
#include <sstream>

namespace zavsim {

namespace {

constexpr int failed = 1;

int complain(const std::string &text) {
    fmt::print(stderr, "sfdisk: {}\n", text);
    return failed;
}

Disk *disk_behind(State &state, const std::string &path) {
    const auto place = device_behind(path);
    return place && place->partition == 0 ? attached_disk(state, place->letter) : nullptr;
}

int dump(State &state, const std::string &path) {
    const Disk *disk = disk_behind(state, path);
    if (disk == nullptr)
        return complain(fmt::format("cannot open {}: No such file or directory", path));
    if (disk->partitions.empty() || disk->table_wiped)
        return complain(fmt::format("{}: does not contain a recognized partition table", path));
    fmt::print("{}", table_dump(*disk, path));
    return 0;
}

// Not above what any disk here has, so that a sum of two cannot run over.
std::optional<std::uint64_t> sectors(const std::string &digits) {
    return digits.size() > 10 ? std::nullopt : std::optional(std::stoull(digits));
}

// "/dev/sata/disk1p2 : start= 198656, size= 655360, type=fd"
std::optional<Partition> read_partition(const std::string &line) {
    static const std::regex form(
        R"(\S*?([0-9]+) *: *start= *([0-9]+) *, *size= *([0-9]+) *, *(?:type|Id)= *fd *)");
    std::smatch parts;
    if (!std::regex_match(line, parts, form) || parts[1].length() > 2)
        return std::nullopt;
    const auto start = sectors(parts[2]);
    const auto size = sectors(parts[3]);
    if (!start || !size || *start == 0 || *size < 2)
        return std::nullopt;
    return Partition{std::stoi(parts[1]), *start, *size / 2, std::nullopt};
}

std::optional<std::uint32_t> read_label_id(const std::string &line) {
    static const std::regex form("label-id: 0x([0-9a-f]{1,8})");
    std::smatch parts;
    if (!std::regex_match(line, parts, form))
        return std::nullopt;
    return static_cast<std::uint32_t>(std::stoul(parts[1], nullptr, 16));
}

bool is_header(const std::string &line) {
    static const std::array<const char *, 5> headers = {"label: dos", "device: ", "unit: sectors",
                                                        "sector-size: 512", "#"};
    return line.empty() || std::any_of(headers.begin(), headers.end(), [&line](const char *head) {
               return line.rfind(head, 0) == 0;
           });
}

struct ReadTable {
    Table table;
    std::string problem;
};

ReadTable read_table(const std::string &text) {
    ReadTable read;
    std::istringstream in(text);
    std::string line;
    for (int number = 1; std::getline(in, line); ++number) {
        const auto label_id = read_label_id(line);
        const auto partition = read_partition(line);
        if (label_id)
            read.table.label_id = *label_id;
        else if (partition)
            read.table.partitions.push_back(*partition);
        else if (!is_header(line))
            return {{}, fmt::format("line {}: unsupported command", number)};
    }
    if (read.table.partitions.empty())
        read.problem = "no partition in the table: an empty table is not simulated";
    return read;
}

std::string table_problem(const Disk &disk, std::vector<Partition> partitions) {
    std::sort(partitions.begin(), partitions.end(),
              [](const Partition &a, const Partition &b) { return a.start < b.start; });
    std::uint64_t free_from = 1;
    for (const Partition &partition : partitions) {
        const bool numbered = partition.number >= 1 && partition.number <= 15 &&
                              std::count_if(partitions.begin(), partitions.end(),
                                            [&partition](const Partition &other) {
                                                return other.number == partition.number;
                                            }) == 1;
        if (!numbered || partition.start < free_from)
            return fmt::format("failed to add #{} partition: Invalid argument", partition.number);
        free_from = partition.start + partition.kib * 2;
        if (free_from > disk.kib * 2)
            return fmt::format("failed to add #{} partition: Numerical result out of range",
                               partition.number);
    }
    return {};
}

void tell_new_table(const Disk &disk, const std::string &path) {
    fmt::print(">>> Created a new DOS (MBR) disklabel with disk identifier 0x{:08x}.\n",
               disk.label_id);
    const std::string between = isdigit(static_cast<unsigned char>(path.back())) != 0 ? "p" : "";
    for (const Partition &partition : disk.partitions)
        fmt::print("{}{}{}: Created a new partition {} of type 'Linux raid autodetect' and of size "
                   "{} MiB.\n",
                   path, between, partition.number, partition.number, partition.kib / 1024);
    fmt::print("\nThe partition table has been altered.\n"
               "Calling ioctl() to re-read partition table.\nSyncing disks.\n");
}

int make_table(const std::string &path, const std::string &text) {
    Turn turn;
    Disk *disk = disk_behind(turn.state(), path);
    if (disk == nullptr)
        return complain(fmt::format("cannot open {}: No such file or directory", path));
    if (is_in_use(turn.state(), *disk)) {
        fmt::print("Checking that no-one is using this disk right now ... FAILED\n\n");
        return complain("This disk is currently in use - repartitioning is probably a bad idea.");
    }
    ReadTable read = read_table(text);
    if (read.problem.empty())
        read.problem = table_problem(*disk, read.table.partitions);
    if (!read.problem.empty())
        return complain(read.problem);
    fmt::print("Checking that no-one is using this disk right now ... OK\n\n");
    set_table(turn.state(), *disk, read.table);
    tell_new_table(*disk, path);
    turn.commit();
    return 0;
}

} // namespace

int run_sfdisk(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-d", "--dump"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "sfdisk", arguments.unknown.empty() ? "anything but one disk" : arguments.unknown,
            failed);
    const std::string path = arguments.names.front();
    if (arguments.flags.empty())
        return make_table(path, std::string{std::istreambuf_iterator<char>(std::cin), {}});
    Turn turn;
    return dump(turn.state(), path);
}

} // namespace zavsim
