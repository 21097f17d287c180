// What the volume tools do to the model.
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <map>
#include <set>

namespace zavsim {

namespace {

const Array *array_of(const State &state, const Ground &ground) {
    for (const Array &array : state.arrays)
        if (!ground.array.empty() && array.uuid == ground.array)
            return &array;
    return nullptr;
}

std::uint64_t stripe_kib(const Array &array) {
    return static_cast<std::uint64_t>(array.chunk_kib) *
           (array.component_kib == 0 ? 0 : array_kib(array) / array.component_kib);
}

// One MiB, or more where a stripe ends later.
std::uint64_t first_sector(const State &state, const Ground &ground) {
    constexpr std::uint64_t usual = 2048;
    const Array *array = array_of(state, ground);
    const std::uint64_t stripe = array == nullptr ? 0 : stripe_kib(*array) * 2;
    return stripe <= usual ? usual : stripe;
}

// Metadata cannot be written where a redundant array has lost too much, or a part of the group is
// gone.
std::string write_problem(const State &state, const Group &group) {
    if (is_partial(state, group))
        return fmt::format("  Cannot change VG {} while PVs are missing.\n"
                           "  Consider vgreduce --removemissing.\n"
                           "  Cannot process volume group {}\n",
                           group.name, group.name);
    for (const PhysicalVolume *pv : pvs_of(state, group.name)) {
        const Array *array = array_of(state, pv->ground);
        if (array != nullptr && is_redundant(*array) && is_broken(*array))
            return fmt::format("  Error writing device /dev/md{} at 4096 length 4096.\n"
                               "  Failed to write metadata to /dev/md{} fd -1\n"
                               "  Failed to write VG {}.\n",
                               array->minor, array->minor, group.name);
    }
    return {};
}

std::string in_group_problem(const PhysicalVolume &pv, const std::string &shown_name) {
    return fmt::format("  Can't initialize physical volume \"{}\" of volume group \"{}\" without "
                       "-ff\n  {}: physical volume not initialized.\n",
                       shown_name, pv.group, shown_name);
}

bool is_array_member(const State &state, const Ground &ground) {
    const bool held =
        std::any_of(state.arrays.begin(), state.arrays.end(), [&ground](const Array &array) {
            return std::any_of(
                array.members.begin(), array.members.end(), [&ground](const Member &member) {
                    return member.serial == ground.serial && member.partition == ground.partition;
                });
        });
    for (const Disk &disk : state.disks)
        if (disk.serial == ground.serial)
            if (const Partition *partition = find_partition(disk, ground.partition))
                return held || partition->superblock.has_value();
    return held;
}

bool is_partitioned(const State &state, const Ground &ground) {
    return std::any_of(state.disks.begin(), state.disks.end(), [&ground](const Disk &disk) {
        return disk.serial == ground.serial && ground.partition == 0 && !disk.partitions.empty();
    });
}

std::string ground_problem(const State &state, const Place &place, const std::string &shown_name) {
    if (!place.ground.array.empty())
        return {};
    if (is_partitioned(state, place.ground))
        return fmt::format("  Cannot use {}: device is partitioned\n", shown_name);
    if (is_array_member(state, place.ground))
        return fmt::format("  Cannot use {}: device is an md component\n", shown_name);
    return {};
}

// The free stretches of a physical volume, by their first extents.
std::map<int, int> free_stretches(const Group &group, const PhysicalVolume &pv) {
    std::map<int, int> used;
    for (const Volume &volume : group.volumes)
        for (const Segment &segment : volume.segments)
            if (segment.pv == pv.id)
                used[segment.first] = segment.extents;
    used[pv.extents] = 0;
    std::map<int, int> free;
    int at = 0;
    for (const auto &[first, extents] : used) {
        if (first > at)
            free[at] = first - at;
        at = first + extents;
    }
    return free;
}

int free_minor(const State &state) {
    std::set<int> taken;
    for (const Group &group : state.groups)
        for (const Volume &volume : group.volumes)
            taken.insert(volume.minor);
    int minor = 0;
    while (taken.count(minor) != 0)
        ++minor;
    return minor;
}

// Takes stretches in order until there is enough.
std::vector<Segment> allocate(const State &state, const Group &group, int extents) {
    std::vector<Segment> segments;
    for (const PhysicalVolume *pv : pvs_of(state, group.name))
        for (const auto &[first, length] : free_stretches(group, *pv)) {
            const int taken = std::min(length, extents);
            if (taken > 0)
                segments.push_back({pv->id, first, taken});
            extents -= taken;
        }
    return segments;
}

int free_extents(const State &state, const Group &group) {
    int free = 0;
    for (const PhysicalVolume *pv : pvs_of(state, group.name))
        free += pv->extents - used_extents(state, *pv);
    return free;
}

std::string take_in(State &state, PhysicalVolume &pv, const std::string &group,
                    const std::string &shown_name) {
    if (!pv.group.empty())
        return fmt::format("  Physical volume '{}' is already in volume group '{}'\n"
                           "  Unable to add physical volume '{}' to volume group '{}'\n",
                           shown_name, pv.group, shown_name, group);
    pv.group = group;
    // A group lists its volumes in the order in which it got them.
    const PhysicalVolume copy = pv;
    auto &list = state.physical_volumes;
    list.erase(list.begin() + (&pv - list.data()));
    list.push_back(copy);
    return {};
}

} // namespace

std::string create_pv(State &state, const Place &place, const std::string &shown_name) {
    const PhysicalVolume *present = find_pv(state, place.ground);
    if (present != nullptr && !present->group.empty())
        return in_group_problem(*present, shown_name);
    if (std::string problem = ground_problem(state, place, shown_name); !problem.empty())
        return problem;
    remove_pv(state, place.ground);
    PhysicalVolume pv;
    pv.id = new_volume_id(state);
    pv.ground = place.ground;
    pv.sectors = place.size_kib * 2;
    pv.first_sector = first_sector(state, place.ground);
    pv.extents =
        static_cast<int>((pv.sectors - std::min(pv.sectors, pv.first_sector)) / extent_sectors);
    state.physical_volumes.push_back(pv);
    return {};
}

std::string create_group(State &state, const std::string &name, PhysicalVolume &volume,
                         const std::string &shown_name) {
    const Group *present = find_group(state, name);
    if (present != nullptr && is_visible(state, *present))
        return fmt::format("  A volume group called {} already exists.\n", name);
    if (std::string problem = take_in(state, volume, name, shown_name); !problem.empty())
        return problem;
    const Ground ground = state.physical_volumes.back().ground;
    if (present != nullptr) // what could not be seen is forgotten, but not what was just taken in
        remove_group(state, name);
    find_pv(state, ground)->group = name;
    state.groups.push_back({name, new_volume_id(state), 1, {}});
    return {};
}

std::string extend_group(State &state, Group &group, PhysicalVolume &volume,
                         const std::string &shown_name) {
    if (std::string problem = write_problem(state, group); !problem.empty())
        return problem;
    ++group.seqno;
    return take_in(state, volume, group.name, shown_name);
}

std::string create_volume(State &state, Group &group, const std::string &name, int extents) {
    if (std::string problem = write_problem(state, group); !problem.empty())
        return problem;
    if (find_volume(group, name) != nullptr)
        return fmt::format("  Logical Volume \"{}\" already exists in volume group \"{}\"\n", name,
                           group.name);
    const int free = free_extents(state, group);
    if (extents > free)
        return fmt::format("  Volume group \"{}\" has insufficient free space ({} extents): {} "
                           "required.\n",
                           group.name, free, extents);
    Volume volume;
    volume.name = name;
    volume.id = new_volume_id(state);
    volume.created = state.now;
    volume.segments = allocate(state, group, extents);
    volume.active = true;
    volume.minor = free_minor(state);
    group.volumes.push_back(volume);
    ++group.seqno;
    return {};
}

std::string remove_volume(State &state, Group &group, const std::string &name) {
    const Volume *volume = find_volume(group, name);
    if (std::string problem = write_problem(state, group); !problem.empty())
        return problem;
    if (!volume->mount_point.empty() && !state.current_tools)
        return fmt::format("  LV {}/{} in use: device is busy\n", group.name, name);
    if (!volume->mount_point.empty())
        return fmt::format("  Logical volume {}/{} contains a filesystem in use.\n", group.name,
                           name);
    group.volumes.erase(group.volumes.begin() + (volume - group.volumes.data()));
    ++group.seqno;
    return {};
}

void remove_group(State &state, const std::string &name) {
    for (PhysicalVolume &pv : state.physical_volumes)
        if (pv.group == name)
            pv.group.clear();
    auto &groups = state.groups;
    groups.erase(std::remove_if(groups.begin(), groups.end(),
                                [&name](const Group &group) { return group.name == name; }),
                 groups.end());
}

void remove_pv(State &state, const Ground &ground) {
    if (const PhysicalVolume *pv = find_pv(state, ground))
        state.physical_volumes.erase(state.physical_volumes.begin() +
                                     (pv - state.physical_volumes.data()));
}

std::string activate(State &state, Volume &volume) {
    for (const Segment &segment : volume.segments)
        if (const PhysicalVolume *pv = pv_of_id(state, segment.pv))
            if (place_of(state, *pv).size_kib == 0)
                return "  Refusing activation of partial LV. Use '--activationmode partial' to "
                       "override.\n";
    if (!volume.active)
        volume.minor = free_minor(state);
    volume.active = true;
    return {};
}

std::string deactivate(const Group &group, Volume &volume) {
    if (!volume.mount_point.empty())
        return fmt::format("  Logical volume {}/{} contains a filesystem in use.\n", group.name,
                           volume.name);
    volume.active = false;
    volume.minor = -1;
    return {};
}

// What mke2fs leaves of a small volume: measured where it was, else about a tenth less.
void make_file_system(Volume &volume) {
    static const std::map<std::uint64_t, std::uint64_t> measured = {
        {16384, 14073}, {32768, 25844}, {65536, 56037}, {131072, 117203}};
    const std::uint64_t whole = static_cast<std::uint64_t>(extents_of(volume)) * extent_kib;
    const auto known = measured.find(whole);
    FileSystem system;
    system.kib = known == measured.end() ? whole - whole / 10 : known->second;
    system.reserved_kib = whole / 20 + std::min<std::uint64_t>(whole / 50, 4096);
    system.used_kib = 14;
    volume.file_system = system;
}

std::uint64_t available_kib(const FileSystem &system) {
    return system.kib - std::min(system.kib, system.used_kib + system.reserved_kib);
}

// The percentage of blocks that ordinary users cannot write any more.
void fill_file_system(FileSystem &system, int percent) {
    const std::uint64_t wanted = (system.kib * static_cast<std::uint64_t>(percent) + 99) / 100;
    system.used_kib = wanted > system.reserved_kib + 14 ? wanted - system.reserved_kib : 14;
}

} // namespace zavsim
