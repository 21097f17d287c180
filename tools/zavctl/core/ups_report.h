// What the library says about the UPS, judged and shown.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct UpsReport {
    bool present = false;         // its daemon or the appliance's hook has left a file
    bool from_hook = false;       // told by the hook's file, not by the daemon's
    int state = 0;                // ZAV_UPS_*, or the hook's number
    std::optional<double> charge; // percent; none: not told, or no number
    std::optional<Failure> failure;
    std::string doubt; // why the answer cannot be trusted, "" if it can
};

// What a charge is worth that no battery has. To be called with every answer.
void doubt_charge(UpsReport &ups);

// "online", "on battery", "other", "unknown", "none".
std::string ups_state_word(const UpsReport &ups);
Severity severity(const UpsReport &ups);
std::string ups_note(const UpsReport &ups);

Json ups_json(const UpsReport &ups);
Section ups_section(const UpsReport &ups);

// One line, for a screen that shows more than the UPS; without a UPS nothing.
Section ups_overview_section(const UpsReport &ups);

} // namespace zavctl
