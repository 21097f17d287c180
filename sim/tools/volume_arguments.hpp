// What the words of the volume tools name, and what these tools complain of.
#pragma once

#include "model/volumes.hpp"
#include "tools/arguments.hpp"

#include <optional>

namespace zavsim {

// The tools' statuses.
constexpr int lvm_failed = 5;
constexpr int lvm_usage = 3;

// What a physical volume may lie on, behind a path; nothing when there is no such node.
std::optional<Place> place_behind(const State &state, const std::string &path);

// "/dev/VG/LV", "VG/LV", "VG" or a node; `volume` empty for a whole group.
struct VolumeName {
    std::string group;
    std::string volume;
};
VolumeName volume_name_of(State &state, const std::string &word);

// A volume by the path of its node, for tools that know nodes only.
VolumePlace volume_behind(State &state, const std::string &path);

// Whether the tools can read the group; says why not when `name` was asked for.
const Group *readable_group(const State &state, const std::string &name);
std::vector<const Group *> readable_groups(const State &state);

// What the tools find wrong with the devices they scan.
void complain_of_devices(const State &state);

// Prints to standard error; answers `lvm_failed`.
int lvm_problem(const std::string &text);

bool is_valid_name(const std::string &name);

} // namespace zavsim
