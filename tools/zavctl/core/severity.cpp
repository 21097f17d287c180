#include "severity.h"

#include "text.h"

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

Finding finding_about(Severity severity, const std::string &noun, const std::string &name,
                      const std::string &is, const std::string &are) {
    return {severity, noun + " " + name + " " + is, noun, name, is, are};
}

std::vector<std::string> told_together(const std::vector<Finding> &findings) {
    std::vector<std::string> sentences;
    for (std::size_t i = 0; i < findings.size(); ++i) {
        const Finding &first = findings[i];
        std::vector<std::string> names;
        bool told_before = false;
        for (std::size_t j = 0; j < findings.size(); ++j)
            if (!first.noun.empty() && findings[j].noun == first.noun &&
                findings[j].is == first.is) {
                names.push_back(findings[j].name);
                told_before = told_before || j < i;
            }
        if (names.size() < 2)
            sentences.push_back(first.text);
        else if (!told_before)
            sentences.push_back(first.noun + "s " + listed(names) + " " + first.are);
    }
    return sentences;
}

Severity worse(Severity a, Severity b) {
    return std::max(a, b);
}

} // namespace zavctl
