// Files, read whole.
#pragma once

#include "../core/doctor.h"

#include <cstddef>
#include <string>
#include <vector>

namespace zavctl {

constexpr std::size_t largest_file = 1U << 20U;

// At most that much of a file.
FileFact read_file(const std::string &path);
FileFact read_descriptor(int descriptor);

// The names in a directory, sorted; empty if it cannot be read (then `error` says why).
std::vector<std::string> names_in(const std::string &directory, int &error);

// Whether something is mounted at exactly this directory.
bool is_mounted(const std::string &directory);

// Where the device, whichever of its names it is mounted by, is mounted; "" if nowhere.
std::string mounted_at(const std::string &device);

} // namespace zavctl
