// What the library says about the load of the appliance's own computer, judged and shown.
#pragma once

#include "answer.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

enum class LoadKind { processor, memory, swap, file_system };

struct LoadProbe {
    LoadKind kind;
    const char *path; // of a file system, else ""
    int file_system;  // the library's number of it, else 0
    bool judged;      // it has limits
    double warning;   // percent, above it
    double critical;  // likewise
};

// In the order in which they are shown. The limits are the library's own.
const std::vector<LoadProbe> &all_load_probes();

// How the processor spent the time, in percent.
struct ProcessorShares {
    double user = 0;
    double nice = 0;
    double system = 0;
    double idle = 0;
};

struct LoadReport {
    const LoadProbe *probe = nullptr;
    std::optional<double> used;            // percent; none: not told
    std::optional<ProcessorShares> shares; // of the processor
    bool mounted = true;                   // a file system
    bool expected = false;                 // a file system that is to be mounted
    std::optional<Failure> failure;
};

// "normal", "warning", "critical", "unknown", "not mounted"; "" for what has no limits.
std::string load_state_word(const LoadReport &report);
Severity severity(const LoadReport &report);
std::string load_name(const LoadReport &report); // "processor", "/var"
std::string load_note(const LoadReport &report);

Json load_json(const LoadReport &report);
Section load_section(const std::vector<LoadReport> &reports);

// Without rows for what need not be mounted, for a screen that shows more than the load.
Section load_overview_section(const std::vector<LoadReport> &reports);

// True if the table of file systems (fstab(5)) has the directory mounted when the machine starts.
bool is_in_fstab(const std::string &fstab, const std::string &directory);

} // namespace zavctl
