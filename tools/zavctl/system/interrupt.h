// Ctrl-C while a tool runs.
#pragma once

namespace zavctl {

// From here on an interrupt or a request to end ends this process with the tools that it has
// started. Without this the library's calls ignore an interrupt while their tool runs, the tool
// alone dies of it, and its end would be taken for an answer. Call before any thread is started.
void end_on_interrupt();

} // namespace zavctl
