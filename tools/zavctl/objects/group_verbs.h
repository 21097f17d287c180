// The verbs of `zavctl vg` that change the machine.
#pragma once

#include "command.h"
#include "session.h"

namespace zavctl {

void add_vg_add(Command vg, Session &session);
void add_vg_remove(Command vg, Session &session);

} // namespace zavctl
