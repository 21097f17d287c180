// The drive's names on a tool's command line.
#pragma once

#include "model/optical.hpp"

#include <cerrno>
#include <cstring>
#include <string>

namespace zavsim {

inline bool is_drive_name(const std::string &name) {
    return name == "/dev/scd0" || name == "/dev/sr0" || name == "/dev/cdrom";
}

// Why it cannot be opened, or 0. Whoever works on the disc has the drive to himself.
inline int device_error(const std::string &name, const OpticalDrive &drive) {
    if (!is_drive_name(name) || !drive_answers(drive))
        return ENOENT;
    return drive.job ? EBUSY : 0;
}

// Of the DVD tools, for what ends them before they have begun.
constexpr int fatal_status(int error) {
    return 0x80 | error;
}

} // namespace zavsim
