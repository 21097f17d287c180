#include "../core/mark_report.h"
#include "../core/raid_set.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "cascade.h"
#include "change.h"
#include "unit_verbs.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstring>

namespace zavctl {

namespace {

constexpr VerbHelp mark_help = {
    "Gives an expansion unit the mark of this chassis",
    "The mark, made of the serial number of the chassis, stands in the first volume of the unit,\n"
    "at the place of the disk signature; data is not touched. First said: what is written. Only\n"
    "when the unit carries the mark of another chassis zavctl asks, or, without a terminal,\n"
    "refuses unless --yes is given. In the end the mark is read back.\n"
    "Critical: it is not the one of this chassis, or refused, with nothing changed: the unit has\n"
    "no volume, or the mark that it carries cannot be read.",
    "  zavctl unit mark 2\n"
    "  zavctl unit mark 2 --yes",
};

constexpr VerbHelp check_help = {
    "Whether expansion units carry the mark of this chassis",
    "Shown: one line per unit; without N for every unit that is there:\n"
    "  same      the mark of this chassis                                ok\n"
    "  unmarked  none: 'zavctl unit mark N' writes it                    warning\n"
    "  other     the mark of another chassis                             critical\n"
    "  unknown   no volume, or it cannot be read; no serial number       could not tell",
    "  zavctl unit check\n"
    "  zavctl unit check 2 --json | jq -r '.marks[0].mark'",
};

std::optional<Failure> mark_failure(int unit, int result) {
    std::optional<Failure> failure = library::failure_of(result);
    if (!failure)
        return failure;
    if (result == ZAV_RC_ERR)
        failure->meaning = "the serial number of this chassis cannot be read";
    else if (result == ENOENT)
        failure->meaning = fmt::format("there is no volume /dev/sasraid/r{}disk1", unit);
    else
        failure->meaning = fmt::format("/dev/sasraid/r{}disk1: {}", unit, std::strerror(result));
    return failure;
}

MarkReport read_mark(MarkReport report) {
    const library::MarkAnswer answer = library::unit_mark(report.unit);
    report.failure = mark_failure(report.unit, answer.result);
    report.state = answer.state;
    return report;
}

std::vector<int> present_units(const CascadeReport &cascade) {
    std::vector<int> numbers;
    for (const UnitReport &unit : cascade.units)
        if (unit.present)
            numbers.push_back(unit.number);
    return numbers;
}

Answer check(Session &session, std::vector<int> numbers) {
    const Machine machine = read_machine();
    if (!may_have_units(machine))
        return unknown_model("unit check", machine);
    std::vector<Finding> findings;
    if (numbers.empty()) {
        const SharedCascade cascade = asked_cascade(session, machine);
        numbers = present_units(*cascade);
        findings = cascade_findings(*cascade);
    }
    const auto reports = no_reports<MarkReport>();
    session.ask(questions_of(numbers, [&](int number) {
        const MarkReport begin{number, 0, no_answer(session)};
        return question(fmt::format("unit {}", number), begin, reports, read_mark);
    }));
    Section section = mark_section(*reports);
    section.findings.insert(section.findings.begin(), findings.begin(), findings.end());
    return {"unit check", "", {std::move(section)}};
}

Outcome run_marking(const MarkReport &before) {
    if (mark_word(before) == "same")
        return mark_outcome(before, std::nullopt);
    const int result = library::mark_unit(before.unit);
    return mark_outcome(read_mark(before), mark_failure(before.unit, result));
}

Answer mark(Session &session, int number, ChangeOptions options) {
    const Machine machine = read_machine();
    if (!may_have_units(machine))
        return unknown_model("unit mark", machine);
    const MarkReport before = read_mark({number, 0, std::nullopt});
    options.yes = options.yes || !overwrites_another(before);
    return carry_out(session, mark_plan(before), options,
                     fmt::format("Overwrite the mark of unit {}?", number),
                     [&before] { return run_marking(before); });
}

} // namespace

void add_unit_mark(Command unit, Session &session) {
    const auto number = std::make_shared<int>(0);
    const Command verb = add_verb(unit, session, "mark", mark_help);
    verb.add_option("N", *number, "Number of the unit, 1 to 7").required().within(1, last_unit);
    const auto options = add_change_options(verb);
    verb.callback([&session, number, options] {
        session.action = [&session, number, options] { return mark(session, *number, *options); };
    });
}

void add_unit_check(Command unit, Session &session) {
    const auto numbers = std::make_shared<std::vector<int>>();
    const Command verb = add_verb(unit, session, "check", check_help);
    verb.add_option("N", *numbers, "Numbers of units, 1 to 7; all that are there without it")
        .within(1, last_unit);
    verb.callback([&session, numbers] {
        session.action = [&session, numbers] { return check(session, *numbers); };
    });
}

} // namespace zavctl
