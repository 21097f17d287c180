#include "../core/raid_set.h"
#include "../system/files.h"
#include "../system/library.h"
#include "../system/library_health.h"
#include "asking.h"
#include "health_objects.h"
#include "health_surveys.h"

namespace zavctl {

namespace {

constexpr std::chrono::seconds sample{10};

constexpr VerbHelp help = {
    "Processor, memory, swap and file systems of the machine",
    "Shown: one line for each with the percentage in use:\n"
    "  processor    measured over 10 seconds; above 90 % warning, above 95 % critical\n"
    "  memory       has no limits: buffers and caches of the kernel count as used\n"
    "  swap         above 0 % warning, above 10 % critical\n"
    "  /, /var, /tmp, /mnt/buffer   above 90 % warning, above 95 % critical\n"
    "  /etc/Kiru    has no limits\n"
    "A directory that is no file system of its own is 'not mounted', and well unless /etc/fstab\n"
    "has it mounted when the machine starts: then that is a warning.\n"
    "Could not tell: the kernel's files or a file system give no answer.\n"
    "All are asked at the same time; --no-processor saves the 10 seconds.",
    "  zavctl load\n"
    "  zavctl load --no-processor\n"
    "  zavctl load --json | jq '.load[] | select(.path == \"/var\").used_percent'",
};

Failure load_failure(const LoadProbe &probe, int result) {
    Failure failure = *library::failure_of(result);
    if (result == ZAV_RC_ERR_EACCES && probe.kind == LoadKind::processor)
        failure.meaning = "/proc/stat cannot be read";
    else if (result == ZAV_RC_ERR_EACCES)
        failure.meaning = probe.kind == LoadKind::file_system ? "/etc/mtab cannot be read"
                                                              : "/proc/meminfo cannot be read";
    else if (result == ZAV_RC_ERR)
        failure.meaning = "the file system does not tell its size";
    else if (result == ZAV_RC_ERR_ENODEV)
        failure.meaning = "/etc/mtab does not list it"; // the root is always mounted
    else if (result == ZAV_RC_ERR_ENOMEM)
        failure.meaning = "no memory";
    return failure;
}

library::UsageAnswer usage_of(LoadReport &report) {
    const LoadProbe &probe = *report.probe;
    if (probe.kind == LoadKind::file_system)
        return library::file_system_usage(probe.file_system);
    if (probe.kind != LoadKind::processor)
        return probe.kind == LoadKind::memory ? library::memory_usage() : library::swap_usage();
    const library::ProcessorAnswer answer = library::processor_usage(sample);
    const CpuInfo &info = answer.info;
    report.shares =
        ProcessorShares{as_written(info.user).value_or(0), as_written(info.nice).value_or(0),
                        as_written(info.system).value_or(0), as_written(info.idle).value_or(0)};
    if (answer.result != ZAV_RC_OK)
        report.shares.reset();
    return {answer.result, 100.0F - info.idle};
}

LoadReport asked(LoadReport report) {
    const LoadProbe &probe = *report.probe;
    const library::UsageAnswer answer = usage_of(report);
    const std::string path = probe.path;
    report.failure.reset();
    report.used = as_written(answer.percent);
    report.mounted = answer.result != ZAV_RC_ERR_ENODEV || path == "/";
    if (probe.kind == LoadKind::file_system)
        report.expected = is_in_fstab(read_file("/etc/fstab").text, path);
    if (answer.result != ZAV_RC_OK && report.mounted)
        report.failure = load_failure(probe, answer.result);
    return report;
}

Answer load(Session &session, bool processor) {
    const auto reports = no_reports<LoadReport>();
    session.ask(ask_load(processor, session, reports));
    return {"load", "", {load_section(*reports)}};
}

std::string waited_for(const LoadReport &report) {
    if (report.probe->kind == LoadKind::processor)
        return "the processor, which is measured over 10 s";
    return "the use of " + load_name(report);
}

} // namespace

std::vector<Question> ask_load(bool processor, const Session &session,
                               const Shared<LoadReport> &reports) {
    std::vector<Question> questions;
    for (const LoadProbe &probe : all_load_probes()) {
        if (probe.kind == LoadKind::processor && !processor)
            continue;
        LoadReport begin;
        begin.probe = &probe;
        begin.failure = no_answer(session);
        questions.push_back(question(waited_for(begin), begin, reports, asked));
    }
    return questions;
}

void add_load(Command root, Session &session) {
    const auto no_processor = std::make_shared<bool>(false);
    const Command verb = add_verb(root, session, "load", help);
    verb.add_flag("--no-processor", *no_processor, "Do not measure the processor");
    verb.callback([&session, no_processor] {
        session.action = [&session, no_processor] { return load(session, !*no_processor); };
    });
}

} // namespace zavctl
