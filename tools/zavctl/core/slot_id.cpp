#include "slot_id.h"

#include <fmt/format.h>

#include <charconv>

namespace zavctl {

namespace {

constexpr int most = 0xFF; // what an address has room for
constexpr unsigned unit_shift = 8;

std::optional<int> whole_number(std::string_view text) {
    int value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc() || end != text.data() + text.size() || value < 0)
        return std::nullopt;
    return value;
}

} // namespace

std::optional<SlotId> slot_id(std::string_view word) {
    const std::size_t dash = word.find('-');
    const auto number = whole_number(dash == std::string_view::npos ? word : word.substr(dash + 1));
    if (!number)
        return std::nullopt;
    if (dash == std::string_view::npos)
        return SlotId{0, *number};
    const auto unit = whole_number(word.substr(0, dash));
    if (!unit || *unit < 1 || *unit > most || *number > most)
        return std::nullopt;
    return SlotId{*unit, *number};
}

SlotId slot_id(const zavDevice &device) {
    if (device.minor_type != ZAV_MINDEV_HDD_SAS && device.minor_type != ZAV_MINDEV_RAID_SAS)
        return {0, device.disk};
    const auto both = static_cast<unsigned>(device.disk);
    return {static_cast<int>((both >> unit_shift) & most), static_cast<int>(both & most)};
}

int packed(const SlotId &id) {
    return static_cast<int>(static_cast<unsigned>(id.unit) << unit_shift |
                            static_cast<unsigned>(id.number));
}

std::string in_words(const SlotId &id) {
    return id.unit == 0 ? fmt::format("{}", id.number) : fmt::format("{}-{}", id.unit, id.number);
}

} // namespace zavctl
