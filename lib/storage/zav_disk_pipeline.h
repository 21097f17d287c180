// The shell pipelines that attach and detach the disk of a slot.
#pragma once

#include <cstddef>

namespace zav {

enum class HostAction { kDetach, kAttach };

constexpr size_t kLongestPipeline = 256;

// False, and nothing written, for a slot other than 1 to 4.
bool host_pipeline(char (&command)[kLongestPipeline], HostAction action, int slot);

} // namespace zav
