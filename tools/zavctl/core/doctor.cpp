#include "doctor.h"

#include "mdstat.h"

#include <fmt/format.h>

#include <cstring>

namespace zavctl {

namespace {

using Checks = std::vector<Check>;

constexpr int smartctl_cannot_open = 2;
constexpr int nvram_size = 114;
constexpr const char *controller = "/sys/devices/pci0000:00/0000:00:1f.2";

Check well(std::string name, std::string found) {
    return {Severity::ok, std::move(name), std::move(found), ""};
}

std::string why(int error) {
    return std::strerror(error);
}

bool exited_with(const RunResult &run, int status) {
    return run.end == RunResult::End::exited && run.status == status;
}

void check_shell(const PlatformFacts &facts, Checks &checks) {
    const std::string leads_to = facts.shell_path.empty() ? "missing" : facts.shell_path;
    const std::string found = fmt::format("/bin/sh is {}", printable(leads_to));
    const std::string doubt = shell_doubt(facts.shell_false);
    if (doubt.empty())
        checks.push_back(well("shell", found + ", a failed command is reported"));
    else
        checks.push_back({Severity::critical, "shell", found, doubt});
}

void check_tools(const PlatformFacts &facts, Checks &checks) {
    for (const ToolFact &tool : facts.tools) {
        const std::string name = tool.name.substr(tool.name.rfind('/') + 1);
        if (!tool.found.empty())
            checks.push_back(well(name, printable(tool.found) + ", for " + tool.purpose));
        else
            checks.push_back({tool.missing, name,
                              tool.name.starts_with("/")
                                  ? tool.name + " is missing or not executable"
                                  : "not on the PATH",
                              tool.without});
    }
}

bool has_tool(const PlatformFacts &facts, const std::string &name) {
    for (const ToolFact &tool : facts.tools)
        if (tool.name == name)
            return !tool.found.empty();
    return false;
}

void check_smartctl_answers(const PlatformFacts &facts, Checks &checks) {
    if (!has_tool(facts, "smartctl"))
        return;
    const RunResult &run = facts.smartctl_no_device;
    if (exited_with(run, smartctl_cannot_open))
        checks.push_back(well("smartctl-status", "a missing device gives exit status 2"));
    else if (run.end == RunResult::End::timed_out)
        checks.push_back({Severity::critical, "smartctl-status", how_it_ended(run),
                          "the query of a disk blocks until smartctl ends"});
    else
        checks.push_back({Severity::critical, "smartctl-status",
                          "a missing device gives " + how_it_ended(run) + " instead of 2",
                          "a disk is judged by this status: healthy, absent and failed cannot be "
                          "told apart"});
}

void check_model(const PlatformFacts &facts, Checks &checks) {
    const ModelReport &model = facts.model;
    if (model.known())
        checks.push_back(well("model", model_heading(model)));
    else
        checks.push_back(
            {Severity::critical, "model",
             model.product_name
                 ? fmt::format("product name '{}'", printable(trimmed(*model.product_name)))
                 : "the product name in /sys/class/dmi/id cannot be read",
             "no known model: every query of disks and arrays is refused. The product "
             "name must hold 2740, 2860 or 2980, and the raidtype file a disk count "
             "that this model comes with"});
}

void check_raidtype(const PlatformFacts &facts, Checks &checks) {
    const std::string line = printable(trimmed(facts.raidtype.text));
    if (facts.raidtype.error != 0)
        checks.push_back({Severity::warning, "raidtype",
                          "/etc/Kiru/raidtype: " + why(facts.raidtype.error),
                          "the number of disks counts as 0: a four-disk machine is taken for its "
                          "smallest model, and the type of the data array is not known"});
    else if (facts.model.data_raid_type < 0)
        checks.push_back({Severity::warning, "raidtype", "/etc/Kiru/raidtype holds '" + line + "'",
                          "no RAID type in its first field: a failed data array cannot be made "
                          "anew"});
    else if (!facts.model.known())
        checks.push_back({Severity::critical, "raidtype", "/etc/Kiru/raidtype holds '" + line + "'",
                          "its third field, the number of disks, is to be one that the model "
                          "comes with: 0, 1 (2740 alone), 2 or 4"});
    else
        checks.push_back(well("raidtype", line));
}

void check_mdstat(const PlatformFacts &facts, Checks &checks) {
    if (facts.mdstat.error != 0) {
        checks.push_back({Severity::critical, "mdstat", "/proc/mdstat: " + why(facts.mdstat.error),
                          "the state of no software array can be told"});
        return;
    }
    const std::vector<MdstatProblem> problems = mdstat_problems(facts.mdstat.text);
    if (problems.empty())
        checks.push_back(well("mdstat", "/proc/mdstat is readable, its arrays as expected"));
    for (const MdstatProblem &problem : problems)
        checks.push_back({Severity::warning, "mdstat", problem.kernel_name + ": " + problem.reason,
                          "the state of this array cannot be told, or is that of another"});
}

void check_level_words(const PlatformFacts &facts, Checks &checks) {
    if (facts.examined.empty() || !has_tool(facts, "/sbin/mdadm"))
        return;
    const std::string about = "mdadm about " + facts.examined;
    const bool level_word = facts.examine.output.find("level=") != std::string::npos;
    if (level_word)
        checks.push_back(well("mdadm-level", about + " tells the level of its array"));
    else if (facts.examine.output.find("ARRAY") == std::string::npos)
        checks.push_back(
            {Severity::warning, "mdadm-level",
             fmt::format("{}: no array named ({})", about, how_it_ended(facts.examine)),
             "the replacement of a disk skips this partition"});
    else
        checks.push_back({Severity::warning, "mdadm-level", about + " tells no level word",
                          "the replacement of a disk skips every partition: a removed disk is "
                          "still a member, an added one joins nothing"});
}

void check_nodes(const PlatformFacts &facts, Checks &checks) {
    if (!facts.sata_nodes.empty())
        checks.push_back(
            well("disk-nodes", fmt::format("/dev/sata holds {} names", facts.sata_nodes.size())));
    else
        checks.push_back(
            {Severity::critical, "disk-nodes", "/dev/sata is missing or empty",
             "the appliance's device names are not set up: every disk reads as absent, "
             "each after about 20 seconds"});
    if (!facts.swraid_nodes.empty())
        checks.push_back(well(
            "array-nodes", fmt::format("/dev/swraid holds {} names", facts.swraid_nodes.size())));
    else
        checks.push_back({Severity::critical, "array-nodes", "/dev/swraid is missing or empty",
                          "the appliance's device names are not set up: every array reads as not "
                          "existing, each after about 20 seconds"});
}

void check_scsi(const PlatformFacts &facts, Checks &checks) {
    if (facts.scsi.error == 0)
        checks.push_back(well("scsi", "/proc/scsi/scsi is readable"));
    else
        checks.push_back({Severity::warning, "scsi", "/proc/scsi/scsi: " + why(facts.scsi.error),
                          "no disk is counted, and none can be detached or attached while the "
                          "machine runs (the kernel needs CONFIG_SCSI_PROC_FS)"});
}

void check_hosts(const PlatformFacts &facts, Checks &checks) {
    constexpr const char *danger = "the command that detaches a disk would reach host 0, the first "
                                   "disk, whichever slot was meant";
    if (!facts.sata_hosts.empty())
        checks.push_back(well(
            "sata-hosts", fmt::format("{} hosts of the SATA controller", facts.sata_hosts.size())));
    else if (facts.sata_controller.error != 0)
        checks.push_back({Severity::warning, "sata-hosts",
                          fmt::format("{}: {}", controller, why(facts.sata_controller.error)),
                          danger});
    else if (!facts.nested_hosts.empty())
        checks.push_back({Severity::warning, "sata-hosts",
                          fmt::format("the hosts of {} are one level deeper ({})", controller,
                                      printable(facts.nested_hosts.front())),
                          danger});
    else
        checks.push_back(
            {Severity::warning, "sata-hosts", fmt::format("no host in {}", controller), danger});
}

void check_nvram(const PlatformFacts &facts, Checks &checks) {
    constexpr const char *meaning = "BIOS settings cannot be saved: the image would be all zeros";
    if (facts.nvram_error != 0)
        checks.push_back(
            {Severity::warning, "nvram",
             fmt::format("/dev/nvram: {}{}", why(facts.nvram_error),
                         facts.nvram_error == EIO ? " (the CMOS checksum is not set)" : ""),
             meaning});
    else if (facts.nvram_bytes < nvram_size)
        checks.push_back(
            {Severity::warning, "nvram",
             fmt::format("/dev/nvram gives {} of {} bytes", facts.nvram_bytes, nvram_size),
             "the rest of a saved image is zeros"});
    else
        checks.push_back(well("nvram", "/dev/nvram is readable"));
}

void check_locale(const PlatformFacts &facts, Checks &checks) {
    std::string found = facts.locale.empty() ? "none set: C" : printable(facts.locale);
    if (!facts.locale_known)
        found += ", not installed here: C is used";
    checks.push_back(well("locale", fmt::format("{}, decimal point '{}' (numbers are read alike "
                                                "under any)",
                                                found, printable(facts.decimal_point))));
}

void check_semaphores(const PlatformFacts &facts, Checks &checks) {
    if (facts.semaphore_error == 0)
        checks.push_back(well("semaphores", "System V semaphores work"));
    else
        checks.push_back({Severity::critical, "semaphores", why(facts.semaphore_error),
                          "the library's locks between processes fail: volume groups and the RAID "
                          "controller's report cannot be read"});
}

void check_volume_files(const PlatformFacts &facts, Checks &checks) {
    if (facts.volume_files_error == 0)
        checks.push_back(well("volume-files", "/etc/Kiru/zav takes files"));
    else
        checks.push_back({Severity::critical, "volume-files",
                          "/etc/Kiru/zav: " + why(facts.volume_files_error),
                          facts.model.hardware_raid()
                              ? "the list of expansion units is kept there: the units cannot be "
                                "told, nor can volume groups"
                              : "the queries of volume groups keep the tools' words there: every "
                                "group reads as not existing"});
}

// Only that it is there: 'zavctl report check' reads it line by line.
void check_controller_report(const PlatformFacts &facts, Checks &checks) {
    constexpr const char *file = "/etc/Kiru/zav/.raidinfo";
    if (!facts.model.hardware_raid())
        return;
    const FileFact &report = facts.controller_report;
    if (report.error != 0)
        checks.push_back({Severity::critical, "raid-report",
                          fmt::format("{}: {}", file, why(report.error)),
                          "the RAID controller's agent has not written it: no disk, no volume and "
                          "no reading can be told"});
    else if (report.text.find("PCI") == std::string::npos)
        checks.push_back({Severity::critical, "raid-report",
                          fmt::format("{} has no section of the controller", file),
                          "the controller's disks read as absent, its volumes as not existing"});
    else
        checks.push_back(well("raid-report", fmt::format("{} is readable", file)));
}

void check_log(const PlatformFacts &facts, Checks &checks) {
    if (facts.log_socket)
        checks.push_back(well("syslog", "/dev/log is there"));
    else
        checks.push_back({Severity::warning, "syslog", "/dev/log is missing or no socket",
                          "answers are right, but the reasons of failures are lost"});
}

// What concerns the SATA ports and software arrays, which the hardware-RAID model has none of.
void check_software_raid(const PlatformFacts &facts, Checks &checks) {
    if (facts.model.hardware_raid()) {
        checks.push_back(well("software-raid", "not this model's: SATA ports and software arrays "
                                               "are not checked"));
        return;
    }
    check_smartctl_answers(facts, checks);
    check_nodes(facts, checks);
    check_mdstat(facts, checks);
    check_level_words(facts, checks);
    check_scsi(facts, checks);
    check_hosts(facts, checks);
}

} // namespace

std::string how_it_ended(const RunResult &run) {
    switch (run.end) {
    case RunResult::End::exited:
        return fmt::format("exit status {}", run.status);
    case RunResult::End::timed_out:
        return "no answer in time";
    case RunResult::End::signalled:
        return fmt::format("ended by signal {}", run.status);
    case RunResult::End::not_started:
        break;
    }
    return "not started";
}

std::string shell_doubt(const RunResult &shell_false) {
    if (shell_false.end != RunResult::End::exited)
        return "/bin/sh does not run: no tool can be asked";
    if (shell_false.status == 0)
        return "it is not bash and reports success for a command whose output is thrown away, "
               "so that every disk reads as found";
    if (shell_false.status != 1)
        return fmt::format("/bin/sh gives exit status {} for a command that gives 1: the states of "
                           "disks cannot be told",
                           shell_false.status);
    return "";
}

std::string smartctl_doubt(const std::string &found_path) {
    return found_path.empty() ? "smartctl is not on the PATH: every disk reads as failed" : "";
}

Checks platform_checks(const PlatformFacts &facts) {
    Checks checks;
    check_shell(facts, checks);
    check_model(facts, checks);
    check_raidtype(facts, checks);
    check_tools(facts, checks);
    check_software_raid(facts, checks);
    check_nvram(facts, checks);
    check_semaphores(facts, checks);
    check_volume_files(facts, checks);
    check_controller_report(facts, checks);
    check_log(facts, checks);
    check_locale(facts, checks);
    return checks;
}

Section doctor_section(const Checks &checks) {
    Section section;
    section.key = "checks";
    section.table = Table({"CHECK", "STATE", "FOUND"}, 1);
    for (const Check &check : checks) {
        const std::string text =
            check.means.empty() ? check.found : check.found + ": " + check.means;
        section.table.add(check.severity, {check.name, word(check.severity), text});
        section.records.push_back(
            {{"kind", "check"},
             {"check", check.name},
             {"severity", word(check.severity)},
             {"found", check.found},
             {"means", check.means.empty() ? Json(nullptr) : Json(check.means)}});
        if (check.severity != Severity::ok)
            section.findings.push_back({check.severity, check.name + ": " + check.found});
    }
    section.well = fmt::format("{} checks passed", checks.size());
    return section;
}

} // namespace zavctl
