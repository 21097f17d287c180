#include "asking.h"
#include "cascade.h"
#include "unit_verbs.h"

#include "../core/raid_set.h"
#include "../core/unit_tree.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The expansion units behind the RAID controller, as a tree",
    "Shown: one line per unit below the one that it hangs on, the upper one first, with model,\n"
    "serial number, state, temperature and voltage of its processor:\n"
    "  normal   the reading is within its limits                        ok\n"
    "  warning  from 75 C on; 1.08 V or less, 1.32 V or more            warning\n"
    "  alarm    from 85 C on; 0.96 V or less, 1.44 V or more            critical\n"
    "  missing  a unit's link leads there, but no unit answers          critical\n"
    "  unknown  no answer to trust: a reading of 0, a report or script that is missing\n"
    "                                                                   could not tell\n"
    "The cascade is what /usr/bin/query_sas.sh tells, the rest stands in the controller's report,\n"
    "/etc/Kiru/zav/.raidinfo. Every unit is asked at the same time.",
    "  zavctl unit list\n"
    "  zavctl unit list --json | jq -r '.units[] | \"\\(.unit) \\(.temperature.value)\"'",
};

constexpr VerbHelp show_help = {
    "One expansion unit, or several, in detail",
    "Shown: SAS address, neighbours, readings, RAID set, volumes, disks. A unit that is not there\n"
    "is critical; states and exit status else are those of 'zavctl unit list'.",
    "  zavctl unit show 2\n"
    "  zavctl unit show 1 2 --json",
};

Answer answer_of(const char *command, const CascadeReport &cascade, Section section) {
    Section own;
    own.key = "controller";
    own.records = controller_json(cascade);
    return {command, "", {std::move(own), std::move(section)}};
}

Answer list(Session &session) {
    const Machine machine = read_machine();
    if (!may_have_units(machine))
        return unknown_model("unit list", machine);
    const SharedCascade cascade = asked_cascade(session, machine);
    session.ask(ask_sensors(session, cascade));
    return answer_of("unit list", *cascade, unit_list_section(*cascade));
}

UnitReport unit_asked_for(const CascadeReport &cascade, int number) {
    UnitReport unit;
    if (const UnitReport *known = cascade.find(number))
        unit = *known;
    unit.number = number;
    unit.asked_for = true;
    if (!unit.present) {
        unit.failure = cascade.failure;
        unit.doubt = cascade.doubt;
    }
    return unit;
}

Answer show(Session &session, const std::vector<int> &numbers) {
    const Machine machine = read_machine();
    if (!may_have_units(machine))
        return unknown_model("unit show", machine);
    const SharedCascade cascade = asked_cascade(session, machine);
    std::vector<UnitReport> wanted;
    wanted.reserve(numbers.size());
    for (const int number : numbers)
        wanted.push_back(unit_asked_for(*cascade, number));
    cascade->units = std::move(wanted);
    session.ask(ask_sensors(session, cascade));
    return answer_of("unit show", *cascade, unit_show_section(*cascade));
}

} // namespace

bool may_have_units(const Machine &machine) {
    if (machine.model.known() && !machine.model.hardware_raid())
        throw UsageError(fmt::format("this model ({}) has no expansion units: they hang behind "
                                     "the RAID controller of model 2980",
                                     model_name(machine.model)));
    return machine.model.known();
}

Answer unknown_model(const char *command, const Machine &machine) {
    Section section;
    section.key = "units";
    section.findings = model_findings(machine.model);
    return {command, "", {std::move(section)}};
}

void add_unit(Command root, Session &session) {
    const Command unit = add_object(root, "unit", "The expansion units: list, show, check, mark");
    add_list(unit, session, list_help, list);
    add_show<int>(unit, session, show_help, {"N", "Number of the unit, 1 to 7"}, show)
        .within(1, last_unit);
    add_unit_check(unit, session);
    add_unit_mark(unit, session);
}

} // namespace zavctl
