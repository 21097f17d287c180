// The cascade of expansion units on the screen.
#pragma once

#include "text.h"
#include "unit_report.h"

#include <vector>

namespace zavctl {

// A unit and the branches that lead to it from the controller, which is the root.
struct UnitPlace {
    const UnitReport *unit = nullptr;
    std::vector<Branch> branches;
};

// Every unit of the cascade once, each below its parent; one without a parent hangs on the root.
std::vector<UnitPlace> unit_places(const CascadeReport &cascade);

Section unit_list_section(const CascadeReport &cascade);

// Only the units of `cascade` that were asked for.
Section unit_show_section(const CascadeReport &cascade);

} // namespace zavctl
