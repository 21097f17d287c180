// The image of a disc's session as it passes from the tool that makes it to the one that writes
// it: a volume descriptor, a list of the files, the files' bytes, and padding.
#pragma once

#include "model/optical.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace zavsim {

constexpr std::uint64_t disc_sector = 2048;

constexpr std::uint64_t sectors_of(std::uint64_t bytes) {
    return (bytes + disc_sector - 1) / disc_sector;
}

struct DiscImage {
    std::uint64_t sectors = 0; // of all of it; 0: it does not tell
    std::uint64_t head = 0;    // sectors before the first file's
    bool merges = false;       // with the session before it
    std::vector<DiscFile> files;
};

DiscImage image_of(const std::vector<DiscFile> &files, bool merges);
std::string image_head(const DiscImage &image);

// Reads a head, whole or in part; nothing while more of it is to come. An image of another make
// has no list.
std::optional<DiscImage> read_image_head(const std::string &bytes);

// The files that are there when only so many sectors came.
std::vector<DiscFile> files_within(const DiscImage &image, std::uint64_t sectors);

} // namespace zavsim
