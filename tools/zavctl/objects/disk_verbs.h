// The verbs of `zavctl disk` that change the machine.
#pragma once

#include "session.h"

namespace zavctl {

void add_disk_remove(CLI::App &disk, Session &session);
void add_disk_add(CLI::App &disk, Session &session);

} // namespace zavctl
