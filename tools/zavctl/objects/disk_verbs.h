// The verbs of `zavctl disk` that change the machine.
#pragma once

#include "command.h"
#include "session.h"

namespace zavctl {

void add_disk_remove(Command disk, Session &session);
void add_disk_add(Command disk, Session &session);

} // namespace zavctl
