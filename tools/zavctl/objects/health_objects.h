// The objects about the machine besides its storage.
#pragma once

#include "session.h"

namespace zavctl {

void add_sensor(CLI::App &root, Session &session);
void add_nic(CLI::App &root, Session &session);
void add_ups(CLI::App &root, Session &session);
void add_load(CLI::App &root, Session &session);
void add_port(CLI::App &root, Session &session);
void add_led(CLI::App &root, Session &session);
void add_uart(CLI::App &root, Session &session);
void add_sync(CLI::App &root, Session &session);

} // namespace zavctl
