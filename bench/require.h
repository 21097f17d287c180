// A wrong answer is often a quick one: it must not be measured.
#pragma once

#include <stdexcept>
#include <string>

namespace bench {

inline void require(bool right, const std::string &what) {
    if (!right)
        throw std::runtime_error(what + " did not give the expected answer");
}

} // namespace bench
