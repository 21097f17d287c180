// What the library says about the RAID controller's enclosure and the expansion units behind it.
#pragma once

#include "answer.h"
#include "enclosure_report.h"

#include "zav_rbod.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// Temperature or voltage of a unit's processor.
struct UnitSensor {
    double value = 0;
    int state = 0;                          // ZAV_RBOD_*
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;
    std::string doubt; // why the answer cannot be trusted, "" if it can
};

struct UnitReport {
    int number = 0;
    bool present = false;
    bool asked_for = false; // by its number
    int linked_from = -1;   // of one that is not present: the unit whose link leads to it
    std::string sas_address;
    std::string serial; // "" if the report does not tell
    std::string model;  // likewise
    int parent = -1;    // numbers of the neighbours; 0 is the controller, -1 none
    int upper_child = -1;
    int lower_child = -1;
    UnitSensor temperature;
    UnitSensor voltage;
    EnclosureReport enclosure;
    std::optional<Failure> failure; // nothing is known of it
    std::string doubt;              // why it is not known whether it is there, "" if it is
};

// All that hangs behind the controller.
struct CascadeReport {
    EnclosureReport controller;
    std::vector<UnitReport> units;  // those present, and those that a link leads to
    std::optional<Failure> failure; // the list of units is not complete, or not known at all
    std::string doubt;              // why the list cannot be trusted, "" if it can

    const UnitReport *find(int number) const;
};

// The units of a record, present ones and missing ones; neither sensors nor report were asked.
std::vector<UnitReport> units_of(const sRBODSet &set);

// "normal", "warning", "alarm", "failed", "unknown".
std::string sensor_state_word(const UnitSensor &sensor);
Severity severity(const UnitSensor &sensor);

// What a reading of 0, or one that is no number, means. To be called with every answer.
void doubt_reading(UnitSensor &sensor);

// "present", "missing", "unknown".
std::string unit_state_word(const UnitReport &unit);
Severity severity(const UnitReport &unit);
std::string unit_note(const UnitReport &unit);
std::string sensor_text(const UnitSensor &sensor, const char *format);

// What is not well with a unit: more than one thing may be.
std::vector<Finding> unit_findings(const UnitReport &unit);

// What keeps the units from being listed, said once; nothing if they are.
std::vector<Finding> cascade_findings(const CascadeReport &cascade);

Json unit_json(const UnitReport &unit);
Json controller_json(const CascadeReport &cascade);

} // namespace zavctl
