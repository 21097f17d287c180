// Is a device's node there? With the grace that a device just inserted needs.
#pragma once

namespace zav {

struct NodeProbe {
    enum class Result { kPresent, kMissing, kInaccessible } result;
    int error; // errno of the last attempt, 0 when present
};

// Looks for `path` up to three times, 10 seconds apart. Attempts that fail for another reason than
// a missing node are logged under the name `reporter`.
NodeProbe probe_node(const char *reporter, const char *path);

// Can the node be opened for reading?
bool node_opens(const char *path);

// The log line of a node that stayed missing; `kind` is "Device" or "md".
void log_missing_node(const char *reporter, const char *kind, const char *path, int error);

} // namespace zav
