// The RAID controller and its expansion units as they leave the factory.
#include "model/enclosures.hpp"

#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr int bays = 4;
constexpr double controller_disk_gb = 500.1;
constexpr double unit_disk_gb = 1000.2;

// Two mirrored pairs, or what three of four hold.
double usable_gb(const std::string &level) {
    return unit_disk_gb * (level == "raid10" ? 2 : level == "raid5" ? 3 : 4);
}

// Expanders number themselves as they were built, not as they are connected: in the order of their
// addresses a unit may come before the one that it hangs on.
constexpr std::array<char, most_units> address_digits = {'3', '1', '6', '2', '7', '5', '4'};
constexpr std::array<const char *, most_units> unit_levels = {"raid5", "raid10", "raid5", "raid10",
                                                              "raid5", "raid10", "raid0"};

void fill_bays(State &state, Enclosure &enclosure, double gb) {
    for (int number = 1; number <= bays; ++number)
        enclosure.bays.push_back({number, state.next_serial++, BayState::found, gb});
}

void add_volume(State &state, Enclosure &enclosure, const std::string &name,
                const std::string &level, double gb) {
    RaidVolume volume;
    volume.number = static_cast<int>(enclosure.volumes.size()) + 1;
    volume.serial = state.next_serial++;
    volume.name = name;
    volume.level = level;
    volume.gb = gb;
    enclosure.volumes.push_back(volume);
}

Enclosure own_enclosure(State &state) {
    Enclosure enclosure;
    enclosure.model = "HBRC-R16";
    enclosure.serial = "HR25C01741";
    enclosure.set_name = "MAINSET";
    enclosure.readings = {52.0, 3300, 12.1, 5.05, 3.33};
    fill_bays(state, enclosure, controller_disk_gb);
    add_volume(state, enclosure, "SYSTEMDATA", "raid5", 1200.2);
    add_volume(state, enclosure, "ARCHIVE", "raid10", 200.0);
    return enclosure;
}

Enclosure new_unit(State &state, int number) {
    const auto index = static_cast<std::size_t>(number - 1);
    const std::string level = unit_levels.at(index);
    Enclosure unit;
    unit.number = number;
    unit.model = "HBQE-T500";
    unit.serial = fmt::format("HQ25U0030{}", number);
    unit.address = fmt::format("5001B4D5008FF0{}F", address_digits.at(index));
    unit.set_name = fmt::format("UNIT{}SET", number);
    unit.readings = {44.0 + number, 2700.0 + 10 * number, 12.05, 5.02, 1.2};
    fill_bays(state, unit, unit_disk_gb);
    add_volume(state, unit, fmt::format("UNIT{}VOL", number), level, usable_gb(level));
    return unit;
}

} // namespace

Controller new_controller(State &state, int units) {
    Controller controller;
    controller.enclosures.push_back(own_enclosure(state));
    for (int number = 1; number <= most_units; ++number) {
        controller.enclosures.push_back(new_unit(state, number));
        controller.enclosures.back().present = number <= units;
    }
    return controller;
}

} // namespace zavsim
