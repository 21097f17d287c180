// The objects about the machine besides its storage.
#pragma once

#include "command.h"
#include "session.h"

namespace zavctl {

void add_sensor(Command root, Session &session);
void add_nic(Command root, Session &session);
void add_ups(Command root, Session &session);
void add_load(Command root, Session &session);
void add_port(Command root, Session &session);
void add_led(Command root, Session &session);
void add_uart(Command root, Session &session);
void add_sync(Command root, Session &session);
void add_disc(Command root, Session &session);

} // namespace zavctl
