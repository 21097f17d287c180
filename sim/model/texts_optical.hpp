// What the optical drive's tools and the kernel say of it and of its disc.
#pragma once

#include "model/state.hpp"

#include <string>

namespace zavsim {

// dvd+rw-mediainfo of a DVD.
std::string mediainfo_text(const State &state, const Medium &medium);
// The beginning of it, all that there is without a DVD.
std::string mediainfo_head();

// cdrecord's report of the drive, and -atip's of a CD behind it.
std::string recorder_text(const State &state);
std::string atip_text(const Medium &medium);
std::string no_disc_text();

// "0,11702"; empty when no session can follow.
std::string session_offsets(const Medium &medium);

// The whole of /proc/sys/dev/cdrom/info.
std::string cdrom_info_text(const State &state);

// The drive's answer to READ DISC INFORMATION; empty without a disc.
std::string disc_information(const State &state);

// A line of the table of mounts; empty when nothing is mounted.
std::string disc_mount_text(const State &state);

constexpr const char *disc_mount_point = "/media/cdrom";

} // namespace zavsim
