#include "plan.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

Json step_json(const PlanStep &step) {
    Json json;
    json["does"] = step.does;
    json["text"] = step.text;
    json["array"] = step.array == 0 ? Json(nullptr) : Json(step.array);
    json["redundant_after"] = step.redundant_after ? Json(*step.redundant_after) : Json(nullptr);
    json["severity"] = word(step.severity);
    return json;
}

Json refusal_json(const Refusal &refusal) {
    return {{"text", refusal.text},
            {"option", refusal.option.empty() ? Json(nullptr) : Json(refusal.option)}};
}

Json plan_json(const Plan &plan) {
    Json json;
    json["kind"] = "plan";
    json["change"] = plan.heading;
    json["steps"] = Json::array();
    for (const PlanStep &step : plan.steps)
        json["steps"].push_back(step_json(step));
    json["warnings"] = plan.warnings;
    json["refusals"] = Json::array();
    for (const Refusal &refusal : plan.refusals)
        json["refusals"].push_back(refusal_json(refusal));
    json["seconds"] = plan.seconds;
    return json;
}

Json outcome_json(const Outcome &outcome) {
    Json json;
    json["kind"] = "outcome";
    json["outcome"] = outcome.word;
    json["advice"] = outcome.advice;
    json["error"] = to_json(outcome.failure);
    return json;
}

Table steps_table(const Plan &plan) {
    Table table({"STEP", "WHAT HAPPENS"}, 0);
    int number = 0;
    for (const PlanStep &step : plan.steps)
        table.add(step.severity, {fmt::format("{}", ++number), step.text});
    return table;
}

void show(const Plan &plan, Section &section) {
    section.title = plan.heading;
    if (!plan.refused())
        section.table = steps_table(plan);
    for (const Refusal &refusal : plan.refusals)
        section.lines.push_back(" X  " + refusal.text);
    for (const std::string &warning : plan.warnings)
        section.lines.push_back(" !  " + warning);
    if (!plan.refused() && plan.seconds > 0)
        section.lines.push_back(fmt::format("    It takes about {} seconds.", plan.seconds));
}

Section plan_section(const Plan &plan, bool shown) {
    Section section;
    section.key = "plan";
    section.records = plan_json(plan);
    if (shown)
        show(plan, section);
    return section;
}

Section outcome_section(const Outcome &outcome) {
    Section section;
    section.key = "outcome";
    section.records = outcome_json(outcome);
    section.findings = outcome.findings;
    section.well = outcome.well;
    for (const std::string &advice : outcome.advice)
        section.lines.push_back("    " + advice);
    return section;
}

} // namespace

std::string plan_text(const Plan &plan, const Style &style) {
    return section_text(plan_section(plan, true), style) + "\n";
}

Answer change_answer(const Plan &plan, const Outcome &outcome) {
    const bool told = outcome.word != "refused" && outcome.word != "dry_run";
    return {plan.command, "", {plan_section(plan, !told), outcome_section(outcome)}};
}

Outcome refused(const Plan &plan) {
    Outcome outcome;
    outcome.word = "refused";
    const std::string why =
        plan.refusals.size() == 1 ? "" : fmt::format(", for {} reasons", plan.refusals.size());
    outcome.findings = {
        {Severity::critical, plan.command + " is refused" + why + "; nothing was changed"}};
    return outcome;
}

Outcome only_planned(const Plan &plan) {
    Outcome outcome;
    outcome.word = "dry_run";
    outcome.well = "this is what would happen; nothing was changed";
    for (const std::string &warning : plan.warnings)
        outcome.findings.push_back({Severity::warning, warning});
    return outcome;
}

Outcome not_confirmed() {
    Outcome outcome;
    outcome.word = "not_confirmed";
    outcome.findings.push_back({Severity::warning, "not confirmed, nothing was changed"});
    return outcome;
}

} // namespace zavctl
