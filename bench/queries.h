// The queries that run a command, each with that command.
#pragma once

#include "paired.h"

#include <vector>

namespace bench {

const std::vector<Query> &queries();

} // namespace bench
