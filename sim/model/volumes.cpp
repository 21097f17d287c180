#include "model/volumes.hpp"

#include "model/arrays.hpp"
#include "model/disks.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

bool same(const Ground &one, const Ground &other) {
    return one.array == other.array && one.serial == other.serial &&
           one.partition == other.partition;
}

template <typename List>
auto *pv_on(List &list, const Ground &ground) {
    const auto found = std::find_if(list.begin(), list.end(), [&ground](const auto &volume) {
        return same(volume.ground, ground);
    });
    return found == list.end() ? nullptr : &*found;
}

template <typename List>
auto *named(List &list, const std::string &name) {
    const auto found = std::find_if(list.begin(), list.end(),
                                    [&name](const auto &each) { return each.name == name; });
    return found == list.end() ? nullptr : &*found;
}

bool lies_on(const Volume &volume, const std::string &pv) {
    return std::any_of(volume.segments.begin(), volume.segments.end(),
                       [&pv](const Segment &segment) { return segment.pv == pv; });
}

const Disk *disk_of_serial(const State &state, int serial) {
    for (const Disk &disk : state.disks)
        if (disk.serial == serial)
            return &disk;
    return nullptr;
}

Place on_array(const State &state, const std::string &uuid) {
    for (const Array &array : state.arrays)
        if (array.uuid == uuid && beginning_is_readable(state, array))
            return place_of_array(array);
    return {};
}

template <typename Condition>
VolumePlace first_volume(State &state, const Condition &condition) {
    for (Group &group : state.groups)
        for (Volume &volume : group.volumes)
            if (condition(volume))
                return {&group, &volume};
    return {};
}

} // namespace

Place place_of_array(const Array &array) {
    return {{array.uuid, 0, 0}, array_kib(array), fmt::format("/dev/md{}", array.minor)};
}

Place place_on_disk(const Disk &disk, int partition) {
    const Partition *part = find_partition(disk, partition);
    if (partition != 0 && part == nullptr)
        return {};
    return {
        {"", disk.serial, partition},
        part == nullptr ? disk.kib : part->kib,
        fmt::format("/dev/sd{}{}", disk.letter, partition == 0 ? "" : std::to_string(partition))};
}

Place place_of(const State &state, const PhysicalVolume &volume) {
    if (!volume.ground.array.empty())
        return on_array(state, volume.ground.array);
    const Disk *disk = disk_of_serial(state, volume.ground.serial);
    return disk == nullptr || !disk->attached ? Place{}
                                              : place_on_disk(*disk, volume.ground.partition);
}

PhysicalVolume *find_pv(State &state, const Ground &ground) {
    return pv_on(state.physical_volumes, ground);
}
const PhysicalVolume *find_pv(const State &state, const Ground &ground) {
    return pv_on(state.physical_volumes, ground);
}

const PhysicalVolume *pv_of_id(const State &state, const std::string &id) {
    for (const PhysicalVolume &volume : state.physical_volumes)
        if (volume.id == id)
            return &volume;
    return nullptr;
}

std::vector<const PhysicalVolume *> pvs_of(const State &state, const std::string &group) {
    std::vector<const PhysicalVolume *> list;
    for (const PhysicalVolume &volume : state.physical_volumes)
        if (volume.group == group)
            list.push_back(&volume);
    return list;
}

int used_extents(const State &state, const PhysicalVolume &pv) {
    int used = 0;
    const Group *group = find_group(state, pv.group);
    if (group == nullptr)
        return 0;
    for (const Volume &volume : group->volumes)
        for (const Segment &segment : volume.segments)
            used += segment.pv == pv.id ? segment.extents : 0;
    return used;
}

bool is_visible(const State &state, const Group &group) {
    const auto pvs = pvs_of(state, group.name);
    return std::any_of(pvs.begin(), pvs.end(), [&state](const PhysicalVolume *pv) {
        return place_of(state, *pv).size_kib > 0;
    });
}

bool is_partial(const State &state, const Group &group) {
    const auto pvs = pvs_of(state, group.name);
    return std::any_of(pvs.begin(), pvs.end(), [&state](const PhysicalVolume *pv) {
        return place_of(state, *pv).size_kib == 0;
    });
}

Group *find_group(State &state, const std::string &name) {
    return named(state.groups, name);
}
const Group *find_group(const State &state, const std::string &name) {
    return named(state.groups, name);
}

std::vector<const Group *> visible_groups(const State &state) {
    std::vector<const Group *> list;
    for (const Group &group : state.groups)
        if (is_visible(state, group))
            list.push_back(&group);
    std::sort(list.begin(), list.end(),
              [](const Group *a, const Group *b) { return a->name < b->name; });
    return list;
}

Volume *find_volume(Group &group, const std::string &name) {
    return named(group.volumes, name);
}
const Volume *find_volume(const Group &group, const std::string &name) {
    return named(group.volumes, name);
}

int extents_of(const Volume &volume) {
    int extents = 0;
    for (const Segment &segment : volume.segments)
        extents += segment.extents;
    return extents;
}

VolumePlace volume_of_minor(State &state, int minor) {
    return first_volume(state, [minor](const Volume &volume) { return volume.minor == minor; });
}

VolumePlace volume_mounted_at(State &state, const std::string &directory) {
    return first_volume(state, [&directory](const Volume &volume) {
        return !volume.mount_point.empty() && volume.mount_point == directory;
    });
}

bool is_in_use(const State &state, const Ground &ground) {
    const PhysicalVolume *pv = find_pv(state, ground);
    const Group *group = pv == nullptr ? nullptr : find_group(state, pv->group);
    return group != nullptr &&
           std::any_of(group->volumes.begin(), group->volumes.end(), [pv](const Volume &volume) {
               return volume.active && lies_on(volume, pv->id);
           });
}

std::string usual_mount_point(const std::string &group, const std::string &volume) {
    const auto number_behind = [](const std::string &name, const std::string &beginning) {
        const std::string number =
            name.rfind(beginning, 0) == 0 ? name.substr(beginning.size()) : "";
        return number.find_first_not_of("0123456789") == std::string::npos ? number : "";
    };
    const std::string number = number_behind(volume, "LogVol");
    const std::string data_group = number_behind(group, "DataVG");
    if (group == "PrimaryOSVG" && !number.empty())
        return "/mnt/prios/disk1p" + number;
    if (!data_group.empty() && !number.empty())
        return fmt::format("/mnt/internal/data{}-{}", data_group, number);
    return {};
}

std::string new_volume_id(State &state) {
    return fmt::format("x3B5pD-HEag-lVgr-HbmD-aUIG-lXuP-I7{:04}", state.next_id++ % 10000);
}

} // namespace zavsim
