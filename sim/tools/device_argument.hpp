// What a path on a tool's command line means to the model.
#pragma once

#include "model/disks.hpp"
#include "model/state.hpp"

#include <optional>
#include <string>

namespace zavsim {

// The disk or partition behind a path: its node, a link to it, or a node made with mknod.
std::optional<DevicePlace> device_behind(const std::string &path);

// The number of the array behind a path.
std::optional<int> array_behind(const std::string &path);

// A simulated node holds its kind and numbers as text.
std::string node_text(char kind, int major, int minor);

} // namespace zavsim
