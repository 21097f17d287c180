#include "model/factory.hpp"

#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/driver_events.hpp"
#include "model/enclosures.hpp"
#include "model/load.hpp"
#include "model/network.hpp"
#include "model/sensors.hpp"
#include "model/ups.hpp"
#include "model/volumes.hpp"

#include <array>
#include <fmt/format.h>
#include <map>
#include <stdexcept>

namespace zavsim {

namespace {

const std::map<std::string, Identity> identities = {
    {"2740", {"SV-2740H", 1}},  {"2740-2", {"SV-2740H", 2}}, {"2740-4", {"SV-2740H", 4}},
    {"2860-2", {"SV-2860", 2}}, {"2860-4", {"SV-2860", 4}},  {"2980", {"SV-2980", 0}},
};

struct Level {
    const char *name;
    int number; // in the raidtype file
    int least_disks;
};

constexpr std::array<Level, 6> levels = {{{"raid0", 0, 2},
                                          {"raid1", 1, 2},
                                          {"linear", 9, 2},
                                          {"raid5", 5, 3},
                                          {"raid6", 6, 4},
                                          {"raid10", 10, 4}}};

const Level &level_of(const std::string &name) {
    for (const Level &level : levels)
        if (name == level.name)
            return level;
    throw std::invalid_argument("unknown level " + name);
}

// Partition sizes of a 512 MiB disk; the arrays of each lose their superblocks' share.
constexpr std::array<std::uint64_t, 3> partition_kib = {98304, 327680, 97280};
constexpr std::array<std::uint64_t, 3> component_kib = {97280, 326656, 96256};
constexpr std::uint64_t striped_component_kib = 325632; // whole chunks
constexpr double data_rebuild_seconds = 240;

std::uint64_t component_of(int partition, const std::string &level) {
    const bool mirrored = level == "raid1" || level == "linear";
    return partition == 2 && !mirrored ? striped_component_kib
                                       : component_kib.at(static_cast<std::size_t>(partition - 1));
}

Array new_array(const State &state, int partition, const std::string &level) {
    Array array;
    array.minor = partition - 1;
    array.name = fmt::format("MD{}", array.minor);
    array.level = level;
    array.raid_devices = static_cast<int>(state.disks.size());
    array.chunk_kib = level == "raid1" || level == "linear" ? 0 : 512;
    array.component_kib = component_of(partition, level);
    array.uuid = fmt::format("953d5f5{}:dc5d34c8:027751d9:b410e1a{}", partition, partition);
    array.created = -86400.0 * 100 + array.minor;
    array.events = level == "raid0" || level == "linear" ? 0 : 20;
    return array;
}

// Assembly by the current tools adds the first member last, and the kernel lists the latest first.
std::vector<int> member_order(int count, bool current_tools) {
    std::vector<int> order = {0};
    for (int i = 1; i < count; ++i)
        order.push_back(current_tools ? count - i : i);
    return order;
}

void build_array(State &state, int partition, const std::string &level) {
    Array array = new_array(state, partition, level);
    for (int index : member_order(array.raid_devices, state.current_tools)) {
        Disk &disk = state.disks.at(static_cast<std::size_t>(index));
        array.members.push_back(member_on(disk, partition, index, Role::in_sync));
        array.members.back().raid_device = index;
        find_partition(disk, partition)->superblock = Superblock{array.uuid, index};
    }
    state.arrays.insert(state.arrays.begin(), array);
}

Disk new_disk(State &state, int slot) {
    Disk disk = blank_disk(state, slot);
    disk.label_id = 0x3c920000U + static_cast<std::uint32_t>(slot << 16) + disk_mark;
    std::uint64_t start = 2048;
    for (int number = 1; number <= 3; ++number) {
        const std::uint64_t kib = partition_kib.at(static_cast<std::size_t>(number - 1));
        disk.partitions.push_back({number, start, kib, std::nullopt});
        start += kib * 2;
    }
    return disk;
}

struct FactoryVolume {
    const char *name;
    int extents;
};
struct FactoryGroup {
    const char *name;
    int array;
    std::array<FactoryVolume, 2> volumes;
};

// The data group's come first under device-mapper.
constexpr std::array<FactoryGroup, 2> factory_groups = {
    {{"DataVG1", 1, {{{"LogVol1", 32}, {"LogVol2", 16}}}},
     {"PrimaryOSVG", 0, {{{"LogVol1", 8}, {"LogVol2", 4}}}}}};

void build_group(State &state, const FactoryGroup &plan) {
    const Place place = place_of_array(*find_array(state, plan.array));
    create_pv(state, place, place.node);
    create_group(state, plan.name, *find_pv(state, place.ground), place.node);
    Group &group = *find_group(state, plan.name);
    for (const FactoryVolume &volume : plan.volumes) {
        create_volume(state, group, volume.name, volume.extents);
        Volume &made = group.volumes.back();
        made.created = find_array(state, plan.array)->created + 60;
        make_file_system(made);
        made.mount_point = usual_mount_point(plan.name, volume.name);
    }
}

void build_storage(State &state, const std::string &data_level) {
    build_array(state, 1, "raid1");
    build_array(state, 2, data_level);
    build_array(state, 3, "raid1");
    for (const FactoryGroup &group : factory_groups)
        build_group(state, group);
}

} // namespace

std::vector<std::string> model_names() {
    std::vector<std::string> names;
    names.reserve(identities.size());
    for (const auto &[name, identity] : identities)
        names.push_back(name);
    return names;
}

std::vector<std::string> level_names() {
    std::vector<std::string> names;
    names.reserve(levels.size());
    for (const Level &level : levels)
        names.emplace_back(level.name);
    return names;
}

Identity identity_of(const std::string &model) {
    return identities.at(model);
}

bool has_controller(const std::string &model) {
    return model == "2980";
}

std::string usual_level(const std::string &model) {
    const int disks = identity_of(model).disks;
    return disks >= 4 ? "raid5" : disks == 2 ? "raid1" : "linear";
}

std::string level_problem(const std::string &model, const std::string &level) {
    const int disks = identity_of(model).disks;
    if (level.empty() || disks >= level_of(level).least_disks)
        return {};
    if (disks < 2)
        return fmt::format("model {} has no software array, --level does not apply", model);
    return fmt::format("{} needs {} disks, model {} has {}", level, level_of(level).least_disks,
                       model, disks);
}

std::string raidtype_line(const std::string &model, const std::string &level) {
    const std::string data_level = level.empty() ? usual_level(model) : level;
    const Identity identity = identity_of(model);
    const int number = identity.disks == 0 ? 5 : level_of(data_level).number;
    return fmt::format("raidtype={};0;{}", number, identity.disks);
}

State new_appliance(const Wishes &wishes) {
    State state;
    state.model = wishes.model;
    state.current_tools = wishes.current_tools;
    state.time_scale = wishes.time_scale;
    state.hosts_below_ata = wishes.hosts_below_ata;
    state.sensors = new_sensors();
    state.registers = new_registers();
    state.load = new_load();
    state.ups = new_ups();
    state.network = new_network(wishes.nics);
    const int disks = identity_of(wishes.model).disks;
    for (int slot = 1; slot <= disks; ++slot)
        state.disks.push_back(new_disk(state, slot));
    for (const Disk &disk : state.disks)
        state.scsi_hosts.push_back(disk.host);
    state.scsi_hosts.push_back(optical_host);
    const std::string level = wishes.level.empty() ? usual_level(wishes.model) : wishes.level;
    state.data_level = level;
    state.rebuild_kib_per_second =
        static_cast<double>(component_of(2, level)) / data_rebuild_seconds;
    if (has_controller(wishes.model))
        state.controller = new_controller(state, wishes.units);
    if (disks > 1)
        build_storage(state, level);
    know_everything(state);
    return state;
}

} // namespace zavsim
