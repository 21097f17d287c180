// The device nodes and links that a state has under /dev and in sysfs.
#pragma once

#include "model/state.hpp"

#include <cstdint>
#include <string>
#include <vector>

namespace zavsim {

struct Node {
    std::string path;
    std::string target;      // of a link; empty for a node
    std::uint64_t bytes = 0; // of a node
    int serial = 0;          // of the disk that it belongs to; 0 for an array
};

std::vector<Node> device_nodes(const State &state);

// The link below /dev that the appliance's rules give an array; none for numbers from the top.
std::string array_link(int minor);

// The name by which device-mapper knows a volume.
std::string mapper_path(const Group &group, const Volume &volume);

} // namespace zavsim
