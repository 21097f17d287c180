// Putting events into the driver's queue, whose device one program at a time can have open.
#pragma once

#include "zav_event.h"

namespace zavctl {

// Tries again for some seconds while another program has the device open, unless an interrupt is
// noted. The library's code.
int push_patiently(const zavSystemEvent &event);

} // namespace zavctl
