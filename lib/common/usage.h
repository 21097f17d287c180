// How full something is.
#pragma once

namespace zav {

// In percent. Of nothing, nothing is used.
inline float used_percent(long double free, long double all) {
    return all == 0 ? 0.0F : static_cast<float>((1.0L - free / all) * 100.0L);
}

} // namespace zav
