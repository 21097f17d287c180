#include "load_report.h"

#include "verdict.h"

#include <fmt/format.h>

#include <sstream>

namespace zavctl {

namespace {

std::string used_text(const LoadReport &report) {
    return report.used && report.mounted && !report.failure ? fmt::format("{:.1f} %", *report.used)
                                                            : "-";
}

bool is_file_system(const LoadReport &report) {
    return report.probe->kind == LoadKind::file_system;
}

std::string probe_word(LoadKind kind) {
    switch (kind) {
    case LoadKind::processor:
        return "processor";
    case LoadKind::memory:
        return "memory";
    case LoadKind::swap:
        return "swap";
    case LoadKind::file_system:
        break;
    }
    return "file system";
}

Finding finding(const LoadReport &report) {
    const Severity bad = severity(report);
    const std::string noun = is_file_system(report) ? "file system" : "";
    const std::string name = load_name(report);
    if (bad == Severity::unknown && is_file_system(report))
        return finding_about(bad, noun, name, "gives no answer to trust",
                             "give no answer to trust");
    if (bad == Severity::unknown)
        return {bad, fmt::format("the use of the {} cannot be told", name)};
    if (!report.mounted)
        return finding_about(bad, noun, name, "is not mounted", "are not mounted");
    if (is_file_system(report))
        return {bad, fmt::format("file system {} is {} full", name, used_text(report))};
    return {bad, fmt::format("{} is {} in use", name, used_text(report))};
}

Json shares_json(const std::optional<ProcessorShares> &shares) {
    if (!shares)
        return nullptr;
    return {{"user", shares->user},
            {"nice", shares->nice},
            {"system", shares->system},
            {"idle", shares->idle}};
}

Section common_section(const std::vector<LoadReport> &reports) {
    Section section = section_of("load", reports, load_json, finding);
    section.table = Table({"WHAT", "USED", "STATE", "NOTE"}, 2);
    section.well = "load normal";
    return section;
}

void add_row(Table &table, const LoadReport &report) {
    const std::string state = load_state_word(report);
    table.add(severity(report), {load_name(report), used_text(report), state.empty() ? "-" : state,
                                 load_note(report)});
}

} // namespace

const std::vector<LoadProbe> &all_load_probes() {
    static const std::vector<LoadProbe> probes = {
        {LoadKind::processor, "", 0, true, 90, 95},
        {LoadKind::memory, "", 0, false, 0, 0},
        {LoadKind::swap, "", 0, true, 0, 10},
        {LoadKind::file_system, "/", 1, true, 90, 95},
        {LoadKind::file_system, "/etc/Kiru", 2, false, 0, 0},
        {LoadKind::file_system, "/var", 3, true, 90, 95},
        {LoadKind::file_system, "/tmp", 4, true, 90, 95},
        {LoadKind::file_system, "/mnt/buffer", 5, true, 90, 95},
    };
    return probes;
}

std::string load_state_word(const LoadReport &report) {
    if (report.failure)
        return "unknown";
    if (!report.mounted)
        return "not mounted";
    if (!report.used)
        return "unknown";
    if (!report.probe->judged)
        return "";
    if (*report.used > report.probe->critical)
        return "critical";
    return *report.used > report.probe->warning ? "warning" : "normal";
}

Severity severity(const LoadReport &report) {
    const std::string word = load_state_word(report);
    if (word == "unknown")
        return Severity::unknown;
    if (word == "not mounted")
        return report.expected ? Severity::warning : Severity::ok;
    if (word == "critical")
        return Severity::critical;
    return word == "warning" ? Severity::warning : Severity::ok;
}

std::string load_name(const LoadReport &report) {
    return is_file_system(report) ? report.probe->path : probe_word(report.probe->kind);
}

std::string load_note(const LoadReport &report) {
    if (report.failure)
        return in_words(*report.failure);
    if (!report.mounted)
        return report.expected ? "/etc/fstab has it mounted when the machine starts"
                               : "no file system of its own";
    if (!report.used)
        return "the use is no number";
    if (report.shares)
        return fmt::format("user {:.1f} %, nice {:.1f} %, system {:.1f} %, idle {:.1f} %",
                           report.shares->user, report.shares->nice, report.shares->system,
                           report.shares->idle);
    return report.probe->kind == LoadKind::memory ? "buffers and caches count as used" : "";
}

Json load_json(const LoadReport &report) {
    Json json;
    json["kind"] = "load";
    json["probe"] = probe_word(report.probe->kind);
    json["path"] = is_file_system(report) ? Json(report.probe->path) : Json(nullptr);
    json["used_percent"] =
        report.used && report.mounted && !report.failure ? Json(*report.used) : Json(nullptr);
    json["state"] = load_state_word(report);
    json["processor"] = shares_json(report.shares);
    add_verdict(json, severity(report), load_note(report), "", report.failure);
    return json;
}

Section load_section(const std::vector<LoadReport> &reports) {
    Section section = common_section(reports);
    for (const LoadReport &report : reports)
        add_row(section.table, report);
    return section;
}

Section load_overview_section(const std::vector<LoadReport> &reports) {
    Section section = common_section(reports);
    for (const LoadReport &report : reports)
        if (report.mounted || severity(report) != Severity::ok)
            add_row(section.table, report);
    return section;
}

bool is_in_fstab(const std::string &fstab, const std::string &directory) {
    std::istringstream lines(fstab);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream fields(line);
        std::string device;
        std::string mount_point;
        std::string type;
        std::string options;
        fields >> device >> mount_point >> type >> options;
        if (!device.starts_with("#") && mount_point == directory)
            return ("," + options + ",").find(",noauto,") == std::string::npos;
    }
    return false;
}

} // namespace zavctl
