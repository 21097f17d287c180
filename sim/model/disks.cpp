#include "model/disks.hpp"

#include <algorithm>
#include <set>

namespace zavsim {

namespace {

constexpr std::uint64_t disk_kib = 524288;

// A name stays taken while an array still holds a member that had it.
std::string free_letter(const State &state) {
    std::set<std::string> taken;
    for (const Disk &disk : state.disks)
        if (disk.attached)
            taken.insert(disk.letter);
    for (const Array &array : state.arrays)
        for (const Member &member : array.members)
            taken.insert(member.letter);
    for (char letter = 'a'; letter <= 'z'; ++letter)
        if (taken.count(std::string(1, letter)) == 0)
            return std::string(1, letter);
    return "aa";
}

template <typename Disks>
auto *disk_in_slot(Disks &disks, int slot) {
    const auto found = std::find_if(disks.begin(), disks.end(),
                                    [slot](const Disk &disk) { return disk.slot == slot; });
    return found == disks.end() ? nullptr : &*found;
}

template <typename Partitions>
auto *partition_of(Partitions &partitions, int number) {
    const auto found =
        std::find_if(partitions.begin(), partitions.end(),
                     [number](const Partition &partition) { return partition.number == number; });
    return found == partitions.end() ? nullptr : &*found;
}

template <typename Disks>
auto *disk_named(Disks &disks, const std::string &letter) {
    const auto found = std::find_if(disks.begin(), disks.end(), [&letter](const Disk &disk) {
        return disk.attached && disk.letter == letter;
    });
    return found == disks.end() ? nullptr : &*found;
}

void detach_host(State &state, int host) {
    auto &hosts = state.scsi_hosts;
    hosts.erase(std::remove(hosts.begin(), hosts.end(), host), hosts.end());
}

} // namespace

Disk *find_disk(State &state, int slot) {
    return disk_in_slot(state.disks, slot);
}
const Disk *find_disk(const State &state, int slot) {
    return disk_in_slot(state.disks, slot);
}

Partition *find_partition(Disk &disk, int number) {
    return partition_of(disk.partitions, number);
}
const Partition *find_partition(const Disk &disk, int number) {
    return partition_of(disk.partitions, number);
}

const Disk *attached_disk(const State &state, const std::string &letter) {
    return disk_named(state.disks, letter);
}
Disk *attached_disk(State &state, const std::string &letter) {
    return disk_named(state.disks, letter);
}

Disk blank_disk(State &state, int slot) {
    Disk disk;
    disk.slot = slot;
    disk.host = slot - 1;
    disk.letter = free_letter(state);
    disk.serial = state.next_serial++;
    disk.inserted = disk.attached = true;
    disk.kib = disk_kib;
    return disk;
}

void attach(State &state, Disk &disk) {
    if (!disk.attached) {
        disk.letter = free_letter(state);
        if (disk.table_wiped)
            disk.partitions.clear();
        disk.table_wiped = false;
    }
    disk.attached = true;
    detach_host(state, disk.host);
    state.scsi_hosts.push_back(disk.host);
}

void detach(State &state, Disk &disk) {
    disk.attached = false;
    detach_host(state, disk.host);
}

DeviceNumber device_number(const std::string &letter, int partition) {
    int index = 0;
    for (char c : letter)
        index = index * 26 + (c - 'a' + 1);
    return {8, (index - 1) * 16 + partition};
}

std::optional<DevicePlace> parse_kernel_name(const std::string &name) {
    if (name.rfind("sd", 0) != 0)
        return std::nullopt;
    const std::size_t digits = std::min(name.find_first_of("0123456789"), name.size());
    DevicePlace place{name.substr(2, digits - 2), 0};
    const std::string number = name.substr(digits);
    const bool letters = !place.letter.empty() && place.letter.size() <= 2 &&
                         std::all_of(place.letter.begin(), place.letter.end(),
                                     [](char c) { return c >= 'a' && c <= 'z'; });
    if (!letters || number.size() > 2 ||
        number.find_first_not_of("0123456789") != std::string::npos)
        return std::nullopt;
    place.partition = number.empty() ? 0 : std::stoi(number);
    return place;
}

} // namespace zavsim
