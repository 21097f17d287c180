// The private root: bubblewrap makes it, the init step inside fills it.
#pragma once

#include "launcher/options.hpp"

#include <string>
#include <vector>

namespace zavsim {

// What both sides of the private root must agree on.
namespace place {
inline const std::string host_usr = "/run/host/usr";
inline const std::string host_etc = "/run/host/etc";
inline const std::string host_sys = "/run/host/sys";
inline const std::string run = "/run/zavsim";
inline const std::string real_proc = run + "/proc";
inline const std::string program = run + "/zavsim";
} // namespace place

constexpr const char *inside_word = "--inside-the-private-root";

// Runs the options' command in a private root; answers zavsim's exit status.
int run_in_private_root(Options options);

} // namespace zavsim
