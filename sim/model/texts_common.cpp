#include "model/texts.hpp"

#include <array>
#include <ctime>
#include <fmt/format.h>

namespace zavsim {

namespace {

// mdadm's rounding: to the nearest hundredth, in integers.
std::string both_units(std::uint64_t bytes, int shift, std::uint64_t decimal, char letter) {
    const std::uint64_t binary = ((bytes * 200 >> shift) + 1) / 2;
    const std::uint64_t metric = (bytes / (decimal / 200) + 1) / 2;
    return fmt::format(" ({}.{:02} {}iB {}.{:02} {}B)", binary / 100, binary % 100, letter,
                       metric / 100, metric % 100, letter);
}

} // namespace

std::string human_size(std::uint64_t kib) {
    const std::uint64_t bytes = kib * 1024;
    if (bytes < 5000ULL * 1024)
        return {};
    if (bytes < 2ULL << 30)
        return both_units(bytes, 20, 1000000ULL, 'M');
    if (bytes < 2ULL << 40)
        return both_units(bytes, 30, 1000000000ULL, 'G');
    return both_units(bytes, 40, 1000000000000ULL, 'T');
}

std::string date_text(double appliance_time) {
    const auto seconds = static_cast<std::time_t>(start_of_time + appliance_time);
    std::tm parts{};
    gmtime_r(&seconds, &parts);
    std::array<char, 64> text{};
    std::strftime(text.data(), text.size(), "%a %b %e %H:%M:%S %Y", &parts);
    return text.data();
}

std::uint64_t sync_done_kib(const Array &array) {
    // The kernel moves in steps of 128 KiB; a sum of many small times may fall short of one by a
    // hair.
    return static_cast<std::uint64_t>(array.sync.done_kib + 1e-3) / 128 * 128;
}

int sync_percent(const Array &array) {
    return static_cast<int>(sync_done_kib(array) * 100 / array.component_kib);
}

} // namespace zavsim
