#include "members.h"

#include "../core/mdstat.h"
#include "files.h"
#include "run.h"

#include <fmt/format.h>

#include <sys/stat.h>

#include <algorithm>
#include <array>
#include <fcntl.h>
#include <filesystem>
#include <unistd.h>

namespace zavctl {

namespace {

namespace fs = std::filesystem;

constexpr std::chrono::seconds tool_limit{20};
constexpr int last_partition = 15;
constexpr int listed_users = 3;
constexpr off_t mark_offset = 440;
constexpr std::array<char, 2> mark_bytes = {0x4D, 0x10};

bool exists(const std::string &path) {
    return access(path.c_str(), F_OK) == 0;
}

std::string kernel_name(const std::string &path) {
    std::error_code error;
    const fs::path target = fs::canonical(path, error);
    return error ? "" : target.filename().string();
}

std::string mdadm(const std::vector<std::string> &words) {
    std::vector<std::string> command = {"/sbin/mdadm"};
    command.insert(command.end(), words.begin(), words.end());
    return run(command, tool_limit).output;
}

// Two names of one device, whichever of them are links.
bool same_device(const std::string &a, const std::string &b) {
    struct stat first {};
    struct stat second {};
    if (stat(a.c_str(), &first) != 0 || stat(b.c_str(), &second) != 0)
        return false;
    if (S_ISBLK(first.st_mode) && S_ISBLK(second.st_mode))
        return first.st_rdev == second.st_rdev;
    return first.st_dev == second.st_dev && first.st_ino == second.st_ino;
}

int slot_of(const std::string &node, int slots) {
    for (int slot = 1; slot <= slots && !node.empty(); ++slot)
        for (const int partition : partitions_of(slot))
            if (same_device("/dev/" + node, disk_path(slot, partition)))
                return slot;
    return 0;
}

ArrayTable read_table(const std::string &name, const std::string &mdstat, int slots) {
    ArrayTable table = table_in_detail(mdadm({"--detail", "/dev/" + name}));
    add_nodes(table, mdstat_block(mdstat, name));
    for (ArrayMember &member : table.members)
        member.slot = slot_of(member.node, slots);
    return table;
}

PartitionFact read_partition(int source, int target, int number, int slots) {
    PartitionFact partition;
    const std::string path = disk_path(source, number);
    const std::string mdstat = read_file("/proc/mdstat").text;
    partition.number = number;
    partition.on_target = exists(disk_path(target, number));
    partition.scan = mdadm({"--query", "--examine", "--scan", path});
    partition.mismatch = mdadm({"--misc", "--query", path}).find("mismatch") != std::string::npos;
    const std::string array = words_of_scan(partition.scan).array;
    partition.leads_to = array.empty() ? "" : kernel_name(array);
    partition.holder = array_of_member(mdstat, kernel_name(path));
    if (!partition.holder.empty())
        partition.table = read_table(partition.holder, mdstat, slots);
    return partition;
}

bool has_mark(const std::string &path) {
    std::array<char, 2> bytes{};
    const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return false;
    const ssize_t got = pread(descriptor, bytes.data(), bytes.size(), mark_offset);
    close(descriptor);
    return got == static_cast<ssize_t>(bytes.size()) && bytes == mark_bytes;
}

// Of a device or a file; 0 if it cannot be told.
off_t size_of(const std::string &path) {
    const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return 0;
    const off_t end = lseek(descriptor, 0, SEEK_END);
    close(descriptor);
    return std::max<off_t>(0, end);
}

bool has_superblock(const std::string &path) {
    return mdadm({"--query", "--examine", "--scan", path}).find("ARRAY") != std::string::npos;
}

bool is_below(const std::string &path, const std::string &directory) {
    return path == directory || path.starts_with(directory + "/");
}

bool links_below(const fs::path &link, const std::string &directory) {
    std::error_code error;
    const fs::path target = fs::read_symlink(link, error);
    return !error && is_below(target.string(), directory);
}

bool uses(const fs::path &process, const std::string &directory) {
    for (const char *name : {"cwd", "root", "exe"})
        if (links_below(process / name, directory))
            return true;
    std::error_code error;
    for (const auto &entry : fs::directory_iterator(process / "fd", error))
        if (links_below(entry.path(), directory))
            return true;
    return false;
}

} // namespace

std::string disk_path(int slot, int partition) {
    const std::string disk = fmt::format("/dev/sata/disk{}", slot);
    return partition == 0 ? disk : fmt::format("{}p{}", disk, partition);
}

std::vector<int> partitions_of(int slot) {
    std::vector<int> numbers;
    for (int number = 1; number <= last_partition; ++number)
        if (exists(disk_path(slot, number)))
            numbers.push_back(number);
    return numbers;
}

void add_node_names(int slot, NodeNames &names) {
    for (const int number : partitions_of(slot))
        names[kernel_name(disk_path(slot, number))] = fmt::format("disk{}p{}", slot, number);
}

std::vector<Membership> memberships_of(int slot) {
    std::vector<Membership> memberships;
    const std::string mdstat = read_file("/proc/mdstat").text;
    for (const int number : partitions_of(slot))
        if (std::string array = array_of_member(mdstat, kernel_name(disk_path(slot, number)));
            !array.empty())
            memberships.push_back({number, std::move(array)});
    return memberships;
}

std::vector<PartitionFact> read_partitions(int source, int target, int slots) {
    std::vector<PartitionFact> partitions;
    for (const int number : partitions_of(source))
        partitions.push_back(read_partition(source, target, number, slots));
    return partitions;
}

int first_member_slot(int slots) {
    const ArrayTable table = read_table("md0", read_file("/proc/mdstat").text, slots);
    for (const ArrayMember &member : table.members)
        if (member.hold == ArrayMember::Hold::active)
            return member.slot;
    return 0;
}

TargetContent read_content(int source, int target) {
    TargetContent content;
    const std::string path = disk_path(target);
    content.partitions = partitions_of(target);
    content.marked = has_mark(path);
    content.smaller = exists(path) && size_of(path) < size_of(disk_path(source));
    content.superblocks = exists(path) && has_superblock(path);
    for (const int number : content.partitions)
        content.superblocks = content.superblocks || has_superblock(disk_path(target, number));
    return content;
}

std::string users_of(const std::string &directory) {
    std::vector<std::string> users;
    int error = 0;
    for (const std::string &name : names_in("/proc", error)) {
        if (name.find_first_not_of("0123456789") != std::string::npos)
            continue;
        if (uses("/proc/" + name, directory))
            users.push_back(
                fmt::format("{} ({})", trimmed(read_file("/proc/" + name + "/comm").text), name));
        if (users.size() == listed_users)
            break;
    }
    return listed(users);
}

} // namespace zavctl
