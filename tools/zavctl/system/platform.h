// The facts that doctor judges, gathered from the running system.
#pragma once

#include "../core/doctor.h"

namespace zavctl {

PlatformFacts read_platform(const ModelReport &model);

} // namespace zavctl
