// The verbs of `zavctl vg` that change the machine.
#pragma once

#include "session.h"

namespace zavctl {

void add_vg_add(CLI::App &vg, Session &session);
void add_vg_remove(CLI::App &vg, Session &session);

} // namespace zavctl
