// Writes an image that comes through a pipe to the disc, as fast as the drive does.
#pragma once

#include "model/disc_image.hpp"
#include "tools/disc_job.hpp"

#include <functional>

namespace zavsim {

struct WriteOrder {
    std::string tool;
    int input = 0;
    DiscJobKind kind = DiscJobKind::write;
    bool closes = false;
    std::uint64_t start = 0;
    std::uint64_t room = 0;                  // sectors
    std::uint64_t told = 0;                  // sectors that the caller announced; 0: none
    bool whole_image = false;                // an image that ends early is a failure
    std::uint64_t multiple = 1;              // to which the session is filled up
    std::function<void(std::uint64_t)> show; // sectors written, now and then
};

struct Written {
    JobEnd end = JobEnd::done;
    std::uint64_t sectors = 0; // that came, or would have to
    bool begun = false;        // something has been done to the disc
};

Written write_disc(const WriteOrder &order);

// KiB a second.
int writing_speed(const OpticalDrive &drive, const MediumKind &kind);

} // namespace zavsim
