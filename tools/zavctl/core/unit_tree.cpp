#include "unit_tree.h"

#include "raid_set.h"
#include "verdict.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *degrees = "{:.1f} C";
constexpr const char *volts = "{:.2f} V";
// A child's number is always greater than its parent's: what is not hangs on the controller, and
// links that lead in a circle end.
std::vector<const UnitReport *> children_of(const CascadeReport &cascade, int parent) {
    std::vector<const UnitReport *> children;
    for (const UnitReport &unit : cascade.units) {
        const bool hangs = unit.parent < unit.number && cascade.find(unit.parent) != nullptr;
        if ((hangs ? unit.parent : controller) == parent)
            children.push_back(&unit);
    }
    return children;
}

void place_children(const CascadeReport &cascade, int parent, const std::vector<Branch> &above,
                    std::vector<UnitPlace> &places) {
    const std::vector<const UnitReport *> children = children_of(cascade, parent);
    for (const UnitReport *child : children) {
        const bool last = child == children.back();
        std::vector<Branch> branches = above;
        branches.push_back(last ? Branch::to_last_row : Branch::to_row);
        places.push_back({child, branches});
        branches.back() = last ? Branch::ended : Branch::past;
        place_children(cascade, child->number, branches, places);
    }
}

std::string or_dash(const std::string &text) {
    return text.empty() ? "-" : printable(text);
}

// The card's readings have no names: they are told as they come, if they come.
std::string controller_note(const EnclosureReport &enclosure) {
    const bool told = std::any_of(enclosure.readings.begin(), enclosure.readings.end(),
                                  [](const std::optional<double> &each) { return each; });
    return told ? "readings " + readings_text(enclosure) : "";
}

std::vector<std::string> cells_of(const UnitReport &unit) {
    const bool told = unit.present;
    return {fmt::format("unit {}", unit.number),
            or_dash(unit.model),
            or_dash(unit.serial),
            unit_state_word(unit),
            told ? sensor_text(unit.temperature, degrees) : "-",
            told ? sensor_text(unit.voltage, volts) : "-",
            unit_note(unit)};
}

Section common_section(const CascadeReport &cascade) {
    Section section;
    section.key = "units";
    section.findings = cascade_findings(cascade);
    for (const UnitReport &unit : cascade.units) {
        section.records.push_back(unit_json(unit));
        for (const UnitSensor *sensor : {&unit.temperature, &unit.voltage})
            if (sensor->record)
                section.events.push_back(*sensor->record);
        const std::vector<Finding> findings = unit_findings(unit);
        section.findings.insert(section.findings.end(), findings.begin(), findings.end());
    }
    const auto present = std::count_if(cascade.units.begin(), cascade.units.end(),
                                       [](const UnitReport &unit) { return unit.present; });
    section.well = counted(static_cast<std::size_t>(present), "expansion unit", "present");
    return section;
}

std::string neighbour_text(int number) {
    if (number < 0)
        return "none";
    return number == controller ? "the controller" : fmt::format("unit {}", number);
}

Details unit_details(const UnitReport &unit) {
    Details details;
    details.add("Unit", fmt::format("{}", unit.number));
    details.add("State", unit_state_word(unit), severity(unit));
    if (unit.present) {
        details.add("Model", or_dash(unit.model));
        details.add("Serial number", or_dash(unit.serial));
        details.add("SAS address", or_dash(unit.sas_address));
        details.add("Hangs on", neighbour_text(unit.parent));
        details.add("Upper child", neighbour_text(unit.upper_child));
        details.add("Lower child", neighbour_text(unit.lower_child));
        details.add("Temperature", sensor_text(unit.temperature, degrees),
                    severity(unit.temperature));
        details.add("Voltage", sensor_text(unit.voltage, volts), severity(unit.voltage));
        add_enclosure(details, unit.enclosure, true);
    }
    add_verdict(details, unit_note(unit), "");
    return details;
}

} // namespace

std::vector<UnitPlace> unit_places(const CascadeReport &cascade) {
    std::vector<UnitPlace> places;
    place_children(cascade, controller, {}, places);
    return places;
}

Section unit_list_section(const CascadeReport &cascade) {
    Section section = common_section(cascade);
    section.table =
        Table({"UNIT", "MODEL", "SERIAL", "STATE", "TEMPERATURE", "VOLTAGE", "NOTE"}, 3);
    section.table.add(Severity::ok, {"RAID controller", "-", "-", "-", "-", "-",
                                     controller_note(cascade.controller)});
    for (const UnitPlace &place : unit_places(cascade))
        section.table.add_branch(severity(*place.unit), place.branches, cells_of(*place.unit));
    return section;
}

Section unit_show_section(const CascadeReport &cascade) {
    Section section = common_section(cascade);
    add_details(section, cascade.units, unit_details);
    return section;
}

} // namespace zavctl
