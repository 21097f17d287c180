// The queries that read files only, beside reading the same files.
#pragma once

namespace bench {

void compare_reads();

} // namespace bench
