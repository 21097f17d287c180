// Reading UTF-8 that may be broken.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace zavctl {

struct Utf8Char {
    bool valid = false;
    std::size_t length = 1; // bytes; 1 for a byte that begins no valid character
    std::uint32_t code = 0;
};

// The first character of a text that is not empty.
Utf8Char first_char(std::string_view text);

// Control characters, and those that reverse the direction of what follows.
bool disturbs_terminal(std::uint32_t code);

} // namespace zavctl
