// What the library reads from outside, each as a function of some bytes. A target ends the program
// when something that must hold does not; what it reads out of bounds, the sanitizers find.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fuzz {

using Bytes = std::span<const std::uint8_t>;

struct Target {
    const char *name;
    void (*run)(Bytes bytes);
};

std::span<const Target> targets();
const Target *target_named(const char *name);

} // namespace fuzz
