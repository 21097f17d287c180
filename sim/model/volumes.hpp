// Physical volumes, groups and volumes of the model: finding them, and what can be done to them.
#pragma once

#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

constexpr std::uint64_t extent_sectors = 8192;
constexpr std::uint64_t extent_kib = extent_sectors / 2;

// What a path names that a physical volume may lie on; `size_kib` 0 when there is nothing.
struct Place {
    Ground ground;
    std::uint64_t size_kib = 0;
    std::string node; // kernel's name with /dev in front
};
Place place_of_array(const Array &array);
Place place_on_disk(const Disk &disk, int partition);
// Where a physical volume lies at present; size 0 while that is gone or cannot be read.
Place place_of(const State &state, const PhysicalVolume &volume);

PhysicalVolume *find_pv(State &state, const Ground &ground);
const PhysicalVolume *find_pv(const State &state, const Ground &ground);
const PhysicalVolume *pv_of_id(const State &state, const std::string &id);
std::vector<const PhysicalVolume *> pvs_of(const State &state, const std::string &group);
int used_extents(const State &state, const PhysicalVolume &volume);

// A group whose physical volumes are all gone has nothing that would tell of it.
bool is_visible(const State &state, const Group &group);
bool is_partial(const State &state, const Group &group);
Group *find_group(State &state, const std::string &name);
const Group *find_group(const State &state, const std::string &name);
std::vector<const Group *> visible_groups(const State &state); // by name

Volume *find_volume(Group &group, const std::string &name);
const Volume *find_volume(const Group &group, const std::string &name);
int extents_of(const Volume &volume);

// By device, or by where it is mounted.
struct VolumePlace {
    Group *group = nullptr;
    Volume *volume = nullptr;
};
VolumePlace volume_of_minor(State &state, int minor);
VolumePlace volume_mounted_at(State &state, const std::string &directory);

// Whether volumes hold an array open, so that it cannot be stopped.
bool is_in_use(const State &state, const Ground &ground);

// What the volume tools do, without their checks of words. Each answers why it could not, in the
// tools' words, or nothing.
std::string create_pv(State &state, const Place &place, const std::string &shown_name);
std::string create_group(State &state, const std::string &name, PhysicalVolume &volume,
                         const std::string &shown_name);
std::string extend_group(State &state, Group &group, PhysicalVolume &volume,
                         const std::string &shown_name);
std::string create_volume(State &state, Group &group, const std::string &name, int extents);
std::string remove_volume(State &state, Group &group, const std::string &name);
void remove_group(State &state, const std::string &name);
void remove_pv(State &state, const Ground &ground);
std::string activate(State &state, Volume &volume);
std::string deactivate(const Group &group, Volume &volume);

void make_file_system(Volume &volume);
void fill_file_system(FileSystem &system, int percent);
std::uint64_t available_kib(const FileSystem &system);

// The appliance's place for a volume of a group by its name; empty where it has none.
std::string usual_mount_point(const std::string &group, const std::string &volume);

// An identifier as volumes have it.
std::string new_volume_id(State &state);

} // namespace zavsim
