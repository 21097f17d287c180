#include "model/contents.hpp"

#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/volumes.hpp"

#include <algorithm>

namespace zavsim {

namespace {

constexpr Stretch label_of_disk = {440, 4};
constexpr Stretch table_of_disk = {446, 66};
constexpr Stretch label_of_volume = {512, 512};
constexpr Stretch superblock_of_member = {4096, 4096};

// Seconds for which a current udev has taken the partitions' nodes away.
constexpr double settling_seconds = 1;

bool overlap(Stretch one, Stretch other) {
    return one.offset < other.offset + other.length && other.offset < one.offset + one.length;
}

bool covers(Stretch one, Stretch other) {
    return one.offset <= other.offset && one.offset + one.length >= other.offset + other.length;
}

// The part of a stretch that lies in a partition, from the partition's beginning.
Stretch within(Stretch stretch, const Partition &partition) {
    const std::uint64_t start = partition.start * 512;
    const std::uint64_t end = stretch.offset + stretch.length;
    if (end <= start)
        return {};
    const std::uint64_t from = std::max(stretch.offset, start);
    return {from - start, end - from};
}

bool has_superblock(const State &state, const std::string &uuid) {
    for (const Disk &disk : state.disks)
        for (const Partition &partition : disk.partitions)
            if (disk.inserted && partition.superblock && partition.superblock->uuid == uuid)
                return true;
    return false;
}

bool can_return(const State &state, const Ground &ground) {
    if (!ground.array.empty())
        return std::any_of(state.arrays.begin(), state.arrays.end(),
                           [&](const Array &array) { return array.uuid == ground.array; }) ||
               std::any_of(state.stopped.begin(), state.stopped.end(),
                           [&](const Array &array) { return array.uuid == ground.array; });
    return std::any_of(state.disks.begin(), state.disks.end(), [&](const Disk &disk) {
        return disk.inserted && disk.serial == ground.serial &&
               (ground.partition == 0 || find_partition(disk, ground.partition) != nullptr);
    });
}

// Volumes that are active keep their group known, whatever they lie on.
bool is_lost(const State &state, const Group &group) {
    const auto pvs = pvs_of(state, group.name);
    const bool active = std::any_of(group.volumes.begin(), group.volumes.end(),
                                    [](const Volume &volume) { return volume.active; });
    return !active && std::none_of(pvs.begin(), pvs.end(), [&state](const PhysicalVolume *pv) {
        return can_return(state, pv->ground);
    });
}

template <typename List, typename Condition>
void drop(List &list, const Condition &condition) {
    list.erase(std::remove_if(list.begin(), list.end(), condition), list.end());
}

bool same_place(const Partition &one, const Partition &other) {
    return one.start == other.start && one.kib == other.kib;
}

// Labels of volumes on parts of the disk that the new table no longer has.
void drop_labels(State &state, const Disk &disk, const std::vector<Partition> &kept) {
    drop(state.physical_volumes, [&](const PhysicalVolume &pv) {
        return pv.ground.array.empty() && pv.ground.serial == disk.serial &&
               std::none_of(kept.begin(), kept.end(), [&pv](const Partition &partition) {
                   return partition.number == pv.ground.partition;
               });
    });
}

} // namespace

void forget_lost(State &state) {
    drop(state.stopped,
         [&state](const Array &array) { return !has_superblock(state, array.uuid); });
    std::vector<std::string> lost;
    for (const Group &group : state.groups)
        if (is_lost(state, group))
            lost.push_back(group.name);
    for (const std::string &name : lost)
        remove_group(state, name);
    drop(state.physical_volumes, [&state](const PhysicalVolume &pv) {
        return pv.group.empty() && !can_return(state, pv.ground);
    });
}

void partition_was_written(State &state, Disk &disk, Partition &partition, Stretch stretch) {
    if (overlap(stretch, superblock_of_member))
        partition.superblock.reset();
    if (overlap(stretch, label_of_volume))
        remove_pv(state, {"", disk.serial, partition.number});
    forget_lost(state);
}

void disk_was_written(State &state, Disk &disk, Stretch stretch, std::uint32_t label_id) {
    if (covers(stretch, table_of_disk))
        disk.table_wiped = true;
    else if (overlap(stretch, label_of_disk) && state.current_tools)
        disk.settles = state.now + settling_seconds;
    if (overlap(stretch, label_of_disk))
        disk.label_id = label_id;
    if (overlap(stretch, label_of_volume))
        remove_pv(state, {"", disk.serial, 0});
    for (Partition &partition : disk.partitions)
        if (const Stretch part = within(stretch, partition); part.length > 0)
            partition_was_written(state, disk, partition, part);
    forget_lost(state);
}

void array_was_written(State &state, const Array &array, Stretch stretch) {
    if (overlap(stretch, label_of_volume))
        remove_pv(state, {array.uuid, 0, 0});
    forget_lost(state);
}

bool is_in_use(const State &state, const Disk &disk) {
    const bool by_array =
        std::any_of(state.arrays.begin(), state.arrays.end(), [&disk](const Array &array) {
            return std::any_of(
                array.members.begin(), array.members.end(),
                [&disk](const Member &member) { return member.serial == disk.serial; });
        });
    const bool by_volume = std::any_of(
        disk.partitions.begin(), disk.partitions.end(), [&](const Partition &partition) {
            return is_in_use(state, Ground{"", disk.serial, partition.number});
        });
    return by_array || by_volume || is_in_use(state, Ground{"", disk.serial, 0});
}

void set_table(State &state, Disk &disk, const Table &table) {
    std::vector<Partition> fresh = table.partitions;
    std::vector<Partition> kept;
    for (Partition &partition : fresh)
        for (const Partition &old : disk.partitions)
            if (same_place(partition, old)) {
                partition.superblock = old.superblock;
                if (old.number == partition.number)
                    kept.push_back(partition);
            }
    drop_labels(state, disk, kept);
    disk.partitions = fresh;
    disk.label_id = table.label_id;
    disk.table_wiped = false;
    forget_lost(state);
}

} // namespace zavsim
