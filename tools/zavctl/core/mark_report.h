// The mark by which an expansion unit is known to belong to this chassis: checked, and written.
#pragma once

#include "plan.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct MarkReport {
    int unit = 1;
    int state = 0; // ZAV_IRBOD_*
    std::optional<Failure> failure;
};

// "same", "unmarked", "other", "unknown".
std::string mark_word(const MarkReport &report);
Severity severity(const MarkReport &report);
Json mark_json(const MarkReport &report);
Section mark_section(const std::vector<MarkReport> &reports);

// Refused for a unit whose mark cannot be read.
Plan mark_plan(const MarkReport &before);

// Whether the plan is to be asked for: another chassis may still count on its mark.
bool overwrites_another(const MarkReport &before);

Outcome mark_outcome(const MarkReport &after, const std::optional<Failure> &failure);

} // namespace zavctl
