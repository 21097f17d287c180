#include "mark_report.h"

#include "verdict.h"

#include "zav_rbod.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

std::string note_of(const MarkReport &report) {
    if (report.failure)
        return in_words(*report.failure);
    const std::string word = mark_word(report);
    if (word == "unmarked")
        return fmt::format("'zavctl unit mark {}' gives it the mark of this chassis", report.unit);
    return word == "other" ? "another chassis has set it up" : "";
}

Finding finding(const MarkReport &report) {
    const Severity bad = severity(report);
    const std::string number = fmt::format("{}", report.unit);
    const std::string word = mark_word(report);
    if (word == "other")
        return finding_about(bad, "unit", number, "carries the mark of another chassis",
                             "carry the mark of another chassis");
    if (word == "unmarked")
        return finding_about(bad, "unit", number, "carries no mark", "carry no mark");
    return finding_about(bad, "unit", number, "tells no mark", "tell no mark");
}

} // namespace

std::string mark_word(const MarkReport &report) {
    if (report.failure)
        return "unknown";
    switch (report.state) {
    case ZAV_IRBOD_SAME:
        return "same";
    case ZAV_IRBOD_UNMARKED:
        return "unmarked";
    case ZAV_IRBOD_OTHER:
        return "other";
    default:
        return "unknown";
    }
}

Severity severity(const MarkReport &report) {
    const std::string word = mark_word(report);
    if (word == "same")
        return Severity::ok;
    if (word == "unmarked")
        return Severity::warning;
    return word == "other" ? Severity::critical : Severity::unknown;
}

Json mark_json(const MarkReport &report) {
    Json json;
    json["kind"] = "mark";
    json["unit"] = report.unit;
    json["mark"] = mark_word(report);
    add_verdict(json, severity(report), note_of(report), "", report.failure);
    return json;
}

Section mark_section(const std::vector<MarkReport> &reports) {
    Section section = section_of("marks", reports, mark_json, finding);
    section.table = Table({"UNIT", "MARK", "NOTE"}, 1);
    for (const MarkReport &report : reports)
        section.table.add(severity(report),
                          {fmt::format("{}", report.unit), mark_word(report), note_of(report)});
    section.well = counted(reports.size(), "unit", "marked by this chassis");
    return section;
}

Plan mark_plan(const MarkReport &before) {
    Plan plan;
    plan.command = "unit mark";
    plan.heading = fmt::format("Unit {} gets the mark of this chassis.", before.unit);
    const std::string word = mark_word(before);
    if (word == "unknown") {
        plan.refusals = {{"the mark that it carries cannot be read: " + note_of(before)}};
        return plan;
    }
    if (word == "same") {
        plan.steps = {{"none", "nothing: it carries this mark already"}};
        return plan;
    }
    plan.steps = {{"mark", fmt::format("the mark is written to bytes 440 to 443 of "
                                       "/dev/sasraid/r{}disk1",
                                       before.unit)}};
    if (overwrites_another(before)) {
        plan.steps.front().severity = Severity::warning;
        plan.warnings = {"the mark of another chassis is overwritten, which takes the unit for a "
                         "foreign one then"};
    }
    return plan;
}

bool overwrites_another(const MarkReport &before) {
    return mark_word(before) == "other";
}

Outcome mark_outcome(const MarkReport &after, const std::optional<Failure> &failure) {
    const bool marked = mark_word(after) == "same";
    Outcome outcome;
    outcome.failure = failure;
    outcome.word = "done";
    outcome.well = fmt::format("unit {} carries the mark of this chassis", after.unit);
    if (!marked)
        outcome.word = failure ? "failed" : "incomplete";
    if (!marked)
        outcome.findings = {
            {Severity::critical,
             fmt::format("unit {} does not carry the mark of this chassis: {}", after.unit,
                         failure ? in_words(*failure) : mark_word(after))}};
    else if (failure)
        outcome.findings = {{Severity::warning, outcome.well + ", although the library reports: " +
                                                    in_words(*failure)}};
    return outcome;
}

} // namespace zavctl
