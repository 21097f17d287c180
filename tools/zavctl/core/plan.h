// What a change of the machine will do, step by step, or why it is not begun.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct PlanStep {
    std::string does; // stable word: "take_out", "detach", ...
    std::string text; // in words
    int array = 0;    // number of the array that it is about, 0 for none
    std::optional<bool> redundant_after = std::nullopt; // whether that can lose another disk then
    Severity severity = Severity::ok;                   // how much it costs
};

// A reason not to begin. One with an option is the user's to decide.
struct Refusal {
    std::string text;
    std::string option{}; // "--recreate": given, this is no refusal
};

struct Plan {
    std::string command; // "disk remove"
    std::string heading; // "Disk 3 (/dev/sata/disk3) is taken out of service."
    std::vector<PlanStep> steps;
    std::vector<std::string> warnings;
    std::vector<Refusal> refusals;
    int seconds = 0; // for about this long the library blocks

    bool refused() const { return !refusals.empty(); }
};

// How the run of a plan ended.
struct Outcome {
    // done, incomplete, failed, refused, not_confirmed, dry_run, none
    std::string word = "none";
    std::vector<Finding> findings;   // what is not as it should be now
    std::vector<std::string> advice; // what to do about it
    std::string well;                // what is well
    std::optional<Failure> failure;  // what the library returned
};

// The plan as it is told before it is run.
std::string plan_text(const Plan &plan, const Style &style);

// The sections of the answer: the plan, shown unless it has been told already, and its outcome.
Answer change_answer(const Plan &plan, const Outcome &outcome);

Outcome refused(const Plan &plan);
Outcome only_planned(const Plan &plan);
Outcome not_confirmed();

} // namespace zavctl
