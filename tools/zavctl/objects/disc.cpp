#include "../core/disc_report.h"
#include "../system/run.h"
#include "asking.h"
#include "disc_verbs.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr VerbHelp info_help = {
    "The drive, the disc in it, its room, and what can be done with it",
    "Shown: what the drive writes, as the kernel says; type and state of the disc:\n"
    "  blank       nothing on it\n"
    "  appendable  more can be added\n"
    "  complete    closed; a DVD+RW and a DVD-RW for restricted overwrite take more all the same\n"
    "  unknown     the media tools do not tell                             could not tell\n"
    "              (of a DVD-ROM and a DVD-RAM, which no burn is for, that is well)\n"
    "its room (of these two not known), the sessions that 'disc burn' would burn on it, and "
    "whether\n"
    "it can be erased and formatted. No disc, and no drive, are well.\n"
    "Could not tell: the drive or its tools give no answer. It takes some ten seconds after a\n"
    "disc was put in.",
    "  zavctl disc info\n"
    "  zavctl disc info --json | jq .disc.free_kib",
};

constexpr VerbHelp progress_help = {
    "How far the running job of the burner is",
    "Shown, once: percent, and the tools that run with their process numbers. The percentage is\n"
    "what the tool has read of the source; erasing has a simulated one, formatting none.\n"
    "When none runs that is said, and what the last job left. It is always well.",
    "  zavctl disc progress\n"
    "  zavctl disc progress --json | jq .progress.percent",
};

constexpr VerbHelp cancel_help = {
    "Stops the running job of the burner",
    "Every growisofs, cdrecord, mkisofs, dvd+rw-mediainfo and dvd+rw-format of the machine is\n"
    "told to end, whoever started it. A disc that was being written is as the tool leaves it: one\n"
    "that is written once may be of no use any more. With --wait zavctl waits until none runs,\n"
    "for however long that takes; Ctrl-C ends the waiting. Formatting is not stopped.\n"
    "Said: which tools ran, and which still run. Critical: killall is missing.",
    "  zavctl disc cancel\n"
    "  zavctl disc cancel --wait",
};

constexpr VerbHelp eject_help = {
    "Opens the tray",
    "The drive is told to; nothing tells whether it did.\n"
    "Critical: there is no drive, cdrecord is missing, or the burner is at work.",
    "  zavctl disc eject",
};

Failure failure(const std::string &why) {
    return {-1, "", why};
}

std::optional<Failure> no_eject() {
    const DriveFacts drive = read_drive();
    const std::vector<RunningTool> running = running_tools();
    if (!drive.scd0)
        return failure("there is no /dev/scd0");
    if (find_tool("cdrecord").empty())
        return failure("cdrecord is not on the PATH");
    if (!running.empty())
        return failure("the burner is at work: " + tools_words(running));
    return std::nullopt;
}

Answer eject() {
    const std::optional<Failure> failure = no_eject();
    if (!failure)
        library::eject_disc();
    return {"disc eject", "", {action_section(eject_report(failure))}};
}

// Those of them that still run. The stopped job may ask the drive by then, with a tool of the same
// name.
std::vector<RunningTool> left_of(const std::vector<RunningTool> &before) {
    std::vector<RunningTool> left;
    for (const RunningTool &tool : running_tools())
        if (std::any_of(before.begin(), before.end(),
                        [&tool](const RunningTool &other) { return other.pid == tool.pid; }))
            left.push_back(tool);
    return left;
}

Answer cancel(bool wait) {
    CancelReport report;
    report.waited = wait;
    report.before = running_tools();
    if (find_tool("killall").empty())
        report.failure = failure("killall is not on the PATH");
    else if (wait)
        library::cancel_job_and_wait();
    else
        library::cancel_job();
    report.after = left_of(report.before);
    return {"disc cancel", "", {cancel_section(report)}};
}

Answer progress() {
    ProgressReport report;
    report.percent = library::disc_progress();
    report.running = running_tools();
    return {"disc progress", "", {progress_section(report)}};
}

void add_info(Command disc, Session &session) {
    add_verb(disc, session, "info", info_help).callback([&session] {
        session.action = [&session] {
            return Answer{"disc info", "", {disc_section(ask_drive(session))}};
        };
    });
}

void add_progress(Command disc, Session &session) {
    add_verb(disc, session, "progress", progress_help).callback([&session] {
        session.action = progress;
    });
}

void add_cancel(Command disc, Session &session) {
    const auto wait = std::make_shared<bool>(false);
    const Command verb = add_verb(disc, session, "cancel", cancel_help);
    verb.add_flag("--wait", *wait, "Wait until no tool runs any more");
    verb.callback([&session, wait] { session.action = [wait] { return cancel(*wait); }; });
}

void add_eject(Command disc, Session &session) {
    add_verb(disc, session, "eject", eject_help).callback([&session] { session.action = eject; });
}

} // namespace

DiscReport ask_drive(Session &session, const std::vector<Question> &further) {
    const auto reports = no_reports<DiscReport>();
    const std::chrono::seconds limit(session.options.timeout);
    DiscReport begin;
    begin.drive = kind_of_drive(read_drive());
    begin.failure = no_answer(session);
    std::vector<Question> questions = further;
    questions.push_back(question("the optical drive", begin, reports,
                                 [limit](const DiscReport &) { return query_disc(limit); }));
    session.ask(questions);
    return reports->front();
}

void add_disc(Command root, Session &session) {
    const Command disc = add_object(
        root, "disc",
        "Discs in the optical drive: info, burn, blank, format, progress, cancel, eject");
    add_info(disc, session);
    add_disc_burn(disc, session);
    add_disc_blank(disc, session);
    add_disc_format(disc, session);
    add_progress(disc, session);
    add_cancel(disc, session);
    add_eject(disc, session);
}

} // namespace zavctl
