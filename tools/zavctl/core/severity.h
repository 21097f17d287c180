// How bad an answer is, and the exit status that says so.
#pragma once

#include <string>
#include <vector>

namespace zavctl {

// In order of badness. "Could not tell" is worse than a warning, since anything may hide behind
// it, and less than a critical state, which is certain.
enum class Severity { ok, warning, unknown, critical };

constexpr int exit_usage = 64; // wrong usage: nothing was asked, nothing was done

// 0 ok, 1 warning, 2 critical, 3 unknown.
int exit_status(Severity severity);

// "ok", "warning", "critical", "unknown": the words of the JSON form.
std::string word(Severity severity);

Severity worse(Severity a, Severity b);

// Something that is not well, and how bad it is: "disk 3 is absent". Findings of one kind are told
// together: "disks 3 and 4 are absent".
struct Finding {
    Severity severity = Severity::ok;
    std::string text{}; // the whole sentence, for a finding that stands alone
    std::string noun{}; // "disk"; its plural has an s
    std::string name{}; // "3"
    std::string is{};   // "is absent"
    std::string are{};  // "are absent"
};

Finding finding_about(Severity severity, const std::string &noun, const std::string &name,
                      const std::string &is, const std::string &are);

// One sentence per kind of finding, in the order of the first of each.
std::vector<std::string> told_together(const std::vector<Finding> &findings);

} // namespace zavctl
