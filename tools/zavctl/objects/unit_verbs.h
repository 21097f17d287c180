// The verbs of `zavctl unit` about the mark of the chassis.
#pragma once

#include "objects.h"

namespace zavctl {

// False for a model that is not known, which may have units or not. Refuses other models.
bool may_have_units(const Machine &machine);

// What is said of the units of a model that is not known.
Answer unknown_model(const char *command, const Machine &machine);

void add_unit_mark(Command unit, Session &session);
void add_unit_check(Command unit, Session &session);

} // namespace zavctl
