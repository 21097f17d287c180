#include "model/controller_actions.hpp"

#include "model/enclosures.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr std::size_t temperature_reading = 0;
constexpr std::size_t voltage_reading = 4;

using Kind = Action::Kind;

// "unit 2 disk 3", "disk 3"
std::string disk_name(const Enclosure &enclosure, int number) {
    return enclosure.number == 0 ? fmt::format("disk {}", number)
                                 : fmt::format("unit {} disk {}", enclosure.number, number);
}

std::string act_on_bay(State &state, Enclosure &enclosure, const Action &action) {
    Bay &bay = *find_bay(enclosure, action.number);
    const std::string name = disk_name(enclosure, bay.number);
    const bool absent = bay.state == BayState::absent;
    if (action.kind == Kind::disk_appears) {
        if (!absent)
            return name + " is in its slot";
        insert_disk(enclosure, bay, state.next_serial++);
        return {};
    }
    if (action.kind != Kind::disk_fails && action.kind != Kind::disk_vanishes)
        return "the RAID controller takes disks in by itself: they fail, vanish and appear";
    if (absent)
        return fmt::format("there is no {}", name);
    lose_disk(enclosure, bay,
              action.kind == Kind::disk_fails ? BayState::failed : BayState::absent);
    return {};
}

std::string act_on_volume(Enclosure &enclosure, const Action &action) {
    RaidVolume &volume = *find_raid_volume(enclosure, action.number);
    set_volume(enclosure, volume,
               action.kind == Kind::raid_volume_degrades   ? RaidVolumeState::degraded
               : action.kind == Kind::raid_volume_fails    ? RaidVolumeState::failed
               : action.kind == Kind::raid_volume_rebuilds ? RaidVolumeState::rebuilding
                                                           : RaidVolumeState::normal);
    return {};
}

std::string unit_vanishes(Enclosure &unit) {
    if (!unit.present)
        return fmt::format("there is no unit {}", unit.number);
    unit.present = false;
    return {};
}

std::string unit_appears(Enclosure &unit) {
    if (unit.present)
        return fmt::format("unit {} is in its place", unit.number);
    unit.present = unit.linked = true;
    return {};
}

std::string act_on_enclosure(State &state, Enclosure &enclosure, const Action &action) {
    switch (action.kind) {
    case Kind::unit_loses_link:
    case Kind::unit_finds_link:
        enclosure.linked = action.kind == Kind::unit_finds_link;
        return {};
    case Kind::temperature_changes:
        enclosure.readings.at(temperature_reading) = action.value;
        return {};
    case Kind::voltage_changes:
        enclosure.readings.at(voltage_reading) = action.value;
        return {};
    case Kind::raid_volume_degrades:
    case Kind::raid_volume_fails:
    case Kind::raid_volume_rebuilds:
    case Kind::raid_volume_recovers:
        return act_on_volume(enclosure, action);
    default:
        return act_on_bay(state, enclosure, action);
    }
}

std::string act_on_report(Controller &controller, const Action &action) {
    if (action.kind == Kind::report_rewrites) {
        if (controller.report_fault == ReportFault::missing)
            return "there is no report";
        ++controller.slow_rewrites;
        controller.rewrite_seconds = action.seconds;
        return {};
    }
    controller.report_fault = action.kind == Kind::report_is_missing     ? ReportFault::missing
                              : action.kind == Kind::report_is_truncated ? ReportFault::truncated
                              : action.kind == Kind::report_is_garbled   ? ReportFault::garbled
                                                                         : ReportFault::none;
    return {};
}

} // namespace

std::string act_on_controller(State &state, const Action &action) {
    if (!state.controller)
        return "this model has no RAID controller";
    Controller &controller = *state.controller;
    if (action.kind >= Kind::report_is_missing)
        return act_on_report(controller, action);
    Enclosure &enclosure = controller.enclosures.at(static_cast<std::size_t>(action.unit));
    // A unit's own cable can be pulled and plugged while the units before it are gone.
    if (action.kind == Kind::unit_vanishes)
        return unit_vanishes(enclosure);
    if (action.kind == Kind::unit_appears)
        return unit_appears(enclosure);
    if (!is_reached(controller, action.unit))
        return fmt::format("there is no unit {}", action.unit);
    return act_on_enclosure(state, enclosure, action);
}

} // namespace zavsim
