// Disks of the model: finding, naming, inserting, removing.
#pragma once

#include "model/state.hpp"

#include <string>

namespace zavsim {

Disk *find_disk(State &state, int slot);
const Disk *find_disk(const State &state, int slot);
Partition *find_partition(Disk &disk, int number);
const Partition *find_partition(const Disk &disk, int number);

// Low half of the label's identifier, by which the appliance knows its own disks.
constexpr std::uint32_t disk_mark = 0x104d;

// A disk with nothing on it, in that slot, under the first free kernel name.
Disk blank_disk(State &state, int slot);

// The port behind the disks' has the optical drive.
constexpr int optical_host = 4;

// The kernel takes notice of a disk, or forgets it; what arrays hold of it stays.
void attach(State &state, Disk &disk);
void detach(State &state, Disk &disk);

struct DeviceNumber {
    int major;
    int minor;
};
DeviceNumber device_number(const std::string &letter, int partition);

// What a path names: a whole disk (partition 0) or a partition of one that is attached.
struct DevicePlace {
    std::string letter;
    int partition = 0;
};
// From a kernel name such as "sdb2".
std::optional<DevicePlace> parse_kernel_name(const std::string &name);
const Disk *attached_disk(const State &state, const std::string &letter);
Disk *attached_disk(State &state, const std::string &letter);

} // namespace zavsim
