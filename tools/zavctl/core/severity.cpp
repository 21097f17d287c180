#include "severity.h"

#include <algorithm>

namespace zavctl {

int exit_status(Severity severity) {
    switch (severity) {
    case Severity::ok:
        return 0;
    case Severity::warning:
        return 1;
    case Severity::critical:
        return 2;
    case Severity::unknown:
        break;
    }
    return 3;
}

std::string word(Severity severity) {
    switch (severity) {
    case Severity::ok:
        return "ok";
    case Severity::warning:
        return "warning";
    case Severity::critical:
        return "critical";
    case Severity::unknown:
        break;
    }
    return "unknown";
}

Severity worse(Severity a, Severity b) {
    return std::max(a, b);
}

} // namespace zavctl
