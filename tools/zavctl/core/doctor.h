// The preconditions of the platform: facts in, checks out. Nothing here touches the system.
#pragma once

#include "answer.h"
#include "model_report.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// The end of a command that was given a limited time.
struct RunResult {
    enum class End { exited, not_started, timed_out, signalled };
    End end = End::not_started;
    int status = 0;     // exit status, or the signal
    std::string output; // standard output and standard error
};

// A file that was read, or why it was not.
struct FileFact {
    int error = 0; // errno, 0: read
    std::string text;
};

struct ToolFact {
    std::string name;    // "smartctl", or a path
    std::string found;   // where it is, "" if nowhere
    std::string purpose; // "health of disks"
    std::string without; // what its absence does to the answers
    Severity missing = Severity::critical;
};

// What doctor found out about the machine; gathered in one go, judged afterwards.
struct PlatformFacts {
    ModelReport model;
    std::string shell_path; // what /bin/sh leads to, "" if nothing
    RunResult shell_false;  // `false &>/dev/null` by /bin/sh
    std::vector<ToolFact> tools;
    RunResult smartctl_no_device; // smartctl asked about a device that does not exist
    RunResult examine;            // mdadm's words about one member partition
    std::string examined;         // that partition, "" if there is none
    FileFact mdstat;
    FileFact scsi;
    FileFact raidtype;
    FileFact controller_report; // of the RAID controller's agent
    int nvram_error = 0;        // errno of reading, 0: read
    int nvram_bytes = 0;
    std::vector<std::string> sata_nodes;   // names in /dev/sata
    std::vector<std::string> swraid_nodes; // names in /dev/swraid
    FileFact sata_controller;              // its directory
    std::vector<std::string> sata_hosts;   // hostN in it
    std::vector<std::string> nested_hosts; // hostM found one level below it instead
    std::string locale;                    // LC_ALL, LC_NUMERIC or LANG, whichever decides
    bool locale_known = false;             // the C library has it
    std::string decimal_point;
    int semaphore_error = 0; // errno of creating, using and removing one
    bool log_socket = false;
    int volume_files_error = 0; // errno of making a file where the queries of groups keep theirs
};

// "exit status 3", "no answer in time", "ended by signal 9", "not started".
std::string how_it_ended(const RunResult &run);

struct Check {
    Severity severity = Severity::ok;
    std::string name;  // stable word: "shell"
    std::string found; // what is there
    std::string means; // what that does to the answers, "" if all is well
};

std::vector<Check> platform_checks(const PlatformFacts &facts);

// Why disk and array answers cannot be trusted, "" if they can: the checks that queries make
// before they believe what they hear.
std::string shell_doubt(const RunResult &shell_false);
std::string smartctl_doubt(const std::string &found_path);

Section doctor_section(const std::vector<Check> &checks);

} // namespace zavctl
