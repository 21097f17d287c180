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

// Whether a name in that directory is the model's to make and to remove.
bool belongs_to_model(const std::string &directory, const std::string &name);

} // namespace zavsim
