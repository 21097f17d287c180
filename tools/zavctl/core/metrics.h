// The whole appliance as metrics, in the text exposition format of Prometheus.
#pragma once

#include "answer.h"

#include <string>

namespace zavctl {

// Every family with its HELP and TYPE lines. `seconds`: how long it took to ask.
std::string metrics_text(const Answer &answer, double seconds);

} // namespace zavctl
