// The library itself: its size, what loading it takes, and how much memory a query needs.
#pragma once

namespace bench {

void report_footprint();

} // namespace bench
