// The whole appliance in one answer, for whatever shows, watches, measures or judges all of it.
#pragma once

#include "objects.h"

#include <string>

namespace zavctl {

// Asks everything, side by side, and returns the model's section and those of the table in
// appliance.cpp, in its order; each has the key of its records. Nothing is kept between calls: it
// can be called again and again. The use of the processor is measured over ten seconds, for those
// who wait that long.
enum class Processor { left_out, measured };
Answer ask_appliance(Session &session, const std::string &command,
                     Processor processor = Processor::left_out);

} // namespace zavctl
