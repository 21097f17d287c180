#include "model/texts_controller.hpp"

#include "model/enclosures.hpp"

#include <algorithm>
#include <cstdint>
#include <fmt/format.h>

namespace zavsim {

namespace {

int level_number(const std::string &level) {
    return level == "raid5" ? 3 : level == "raid0" ? 0 : 1;
}

int state_number(RaidVolumeState state) {
    switch (state) {
    case RaidVolumeState::normal:
        return 1;
    case RaidVolumeState::degraded:
        return 2;
    case RaidVolumeState::rebuilding:
        return 4;
    default:
        return 8;
    }
}

int state_number(BayState state) {
    return state == BayState::found ? 1 : state == BayState::absent ? 2 : 4;
}

std::string disk_line(const Bay &bay) {
    const double gb = bay.state == BayState::absent ? 0 : bay.gb;
    return fmt::format("D:{}:{:.1f}:{}\n", bay.number, gb, state_number(bay.state));
}

std::string volume_line(const RaidVolume &volume) {
    return fmt::format("V:{}:{}:{}:{:.1f}:{}:{}\n", volume.number, volume.name,
                       level_number(volume.level), volume.gb, rebuild_percent(volume),
                       state_number(volume.state));
}

// The set is made of its disks as they were; what became of them is told by their own lines.
std::string set_line(const Enclosure &enclosure) {
    double gb = 0;
    std::string members;
    for (const Bay &bay : enclosure.bays) {
        gb += bay.gb;
        members += std::to_string(bay.number);
    }
    return fmt::format("R:1:{}:{:.1f}:{}:{}:0\n", enclosure.set_name, gb, enclosure.bays.size(),
                       members);
}

std::string section(const Enclosure &enclosure) {
    std::string text = enclosure.number == 0 ? "PCI\n" : fmt::format("RBOD#{}\n", enclosure.number);
    text += fmt::format("M:{}\nS:{}\nI:\n", enclosure.model, enclosure.serial);
    text += set_line(enclosure);
    for (const RaidVolume &volume : enclosure.volumes)
        text += volume_line(volume);
    for (const Bay &bay : enclosure.bays)
        text += disk_line(bay);
    const auto &readings = enclosure.readings;
    return text + fmt::format("H:{:.1f}:{:.0f}:{:.2f}:{:.2f}:{:.2f}\n", readings.at(0),
                              readings.at(1), readings.at(2), readings.at(3), readings.at(4));
}

// Bytes of every value, in lines short and far too long; the same each time.
std::string garbage() {
    std::string text;
    std::uint32_t value = 1;
    for (int i = 0; i < 2048; ++i) {
        value = value * 1664525U + 1013904223U;
        text += static_cast<char>(value >> 24U);
    }
    return text + '\0' + std::string(300, ':') + "\n" + std::string(300, 'V') + "\n";
}

constexpr const char *no_link = "0000000000000000:00";

std::string downstream(const Controller &controller, int unit, const char *phy) {
    if (unit > most_units || !is_reached(controller, unit))
        return no_link;
    return fmt::format("{}:{} exp t(SMP)",
                       controller.enclosures.at(static_cast<std::size_t>(unit)).address, phy);
}

std::string upstream(const Controller &controller, const Enclosure &unit) {
    if (!unit.linked)
        return no_link;
    const int parent = parent_of(unit.number);
    if (parent == 0)
        return "500605B000C7F540:02  i(SSP+STP+SMP)";
    return fmt::format("{}:03 exp t(SMP)",
                       controller.enclosures.at(static_cast<std::size_t>(parent)).address);
}

std::string phy_line(int phy, const std::string &routing, const std::string &attached) {
    const bool link = attached != no_link;
    return fmt::format("phy {:3}:{}:attached:[{}]{}\n", phy, routing, attached,
                       link ? "  6 Gbps" : "");
}

// Links are of two phys each, of which the first counts. Readers take the upper link (phy 10) for
// the last of an expander, so the lower one stands before it.
std::string expander(const Controller &controller, const Enclosure &unit) {
    const std::string up = upstream(controller, unit);
    const std::string lower = downstream(controller, 2 * unit.number + 1, "04");
    const std::string upper = downstream(controller, 2 * unit.number, "05");
    std::string text = fmt::format("Expander {}  phys: 18\n", unit.model);
    text += phy_line(0, "D", unit.address + "800:00  V i(SSP+SMP) t(SSP)");
    text += phy_line(4, "S", up) + phy_line(5, "S", up);
    text += phy_line(8, "S", lower) + phy_line(9, "S", lower);
    text += phy_line(10, "S", upper) + phy_line(11, "S", upper);
    for (const Bay &bay : unit.bays)
        text += phy_line(13 + bay.number, "T",
                         bay.state == BayState::found
                             ? fmt::format("5000C500A1{:06X}:00  t(SATA)", bay.serial)
                             : std::string(no_link));
    return text + "\n";
}

} // namespace

std::string report_text(const State &state) {
    std::string text;
    for (const Enclosure *enclosure : reached_enclosures(state))
        text += section(*enclosure);
    return text;
}

std::string first_half(const std::string &text) {
    std::size_t end = text.size() / 2;
    while (end > 0 && end < text.size() && (text[end - 1] == '\n' || text[end] == '\n'))
        ++end;
    return text.substr(0, end);
}

std::optional<std::string> report_file(const State &state) {
    if (!state.controller || state.controller->report_fault == ReportFault::missing)
        return std::nullopt;
    switch (state.controller->report_fault) {
    case ReportFault::truncated:
        return first_half(report_text(state));
    case ReportFault::garbled:
        return garbage();
    default:
        return report_text(state);
    }
}

std::string topology_text(const State &state) {
    std::vector<const Enclosure *> units = reached_enclosures(state);
    units.erase(std::remove_if(units.begin(), units.end(),
                               [](const Enclosure *each) { return each->number == 0; }),
                units.end());
    std::sort(units.begin(), units.end(), [](const Enclosure *one, const Enclosure *other) {
        return one->address < other->address;
    });
    std::string text = fmt::format("SAS topology, {} expanders\n\n", units.size());
    for (const Enclosure *unit : units)
        text += expander(*state.controller, *unit);
    return text;
}

} // namespace zavsim
