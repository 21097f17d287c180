#include "disc_verbs.h"

namespace zavctl {

namespace {

constexpr VerbHelp blank_help = {
    "Erases a rewritable disc: EVERYTHING ON IT IS LOST",
    "A CD-RW is erased quickly, a DVD+RW by an empty file system, a DVD-RW by an empty file\n"
    "system or a full format of up to about 16 minutes. A blank disc is left alone.\n"
    "First said: what is lost and how long it takes. Then zavctl asks, or, without a terminal,\n"
    "refuses unless --yes is given. The progress is simulated by the library. In the end the disc\n"
    "is asked for anew. Ctrl-C and SIGTERM stop it as 'disc burn'.\n"
    "Refused, with nothing changed (critical): no disc, no drive, a disc that is written once, a\n"
    "tool is missing, the burner is at work. Critical too: erasing failed or was stopped.",
    "  zavctl disc blank --dry-run\n"
    "  zavctl disc blank --yes",
};

constexpr VerbHelp format_help = {
    "Formats a DVD+RW or CD-RW for packet writing: EVERYTHING ON IT IS LOST",
    "The disc gets an empty UDF file system through /dev/pktcdvd/pktcdvd0, which stays set up.\n"
    "First said: what is lost. Then zavctl asks, or, without a terminal, refuses unless --yes is\n"
    "given. It takes minutes, and there is no progress to tell but the time.\n"
    "Ctrl-C and SIGTERM stop it; the disc is of use once it has been erased or formatted anew.\n"
    "Refused, with nothing changed (critical): no disc, no drive, any other disc, a tool is\n"
    "missing, the burner is at work. Critical too: formatting failed or was stopped.",
    "  zavctl disc format --dry-run\n"
    "  zavctl disc format --yes",
};

// There is nothing to ask about, nor to run, for a disc that is blank already.
Answer left_alone(const Plan &plan, const ChangeOptions &options, const DiscReport &disc) {
    Outcome outcome = only_planned(plan);
    if (!options.dry_run) {
        outcome.word = "done";
        outcome.well = "the disc is blank already; nothing was done";
    }
    Answer answer = change_answer(plan, outcome);
    Section now;
    now.key = "disc";
    now.records = disc_json(disc);
    answer.sections.push_back(now);
    return answer;
}

Answer blank(Session &session, const ChangeOptions &options) {
    const DiscReport disc = ask_drive(session);
    const Plan plan = blank_plan(read_burner(disc));
    if (!plan.refused() && blank_way(disc) == BlankWay::nothing)
        return left_alone(plan, options, disc);
    DiscWork work;
    work.job = DiscJob::blank;
    work.doing = "erasing";
    work.call = library::blank_disc;
    return carry_out_job(session, plan, options, "Erase it?", work, disc);
}

Answer format(Session &session, const ChangeOptions &options) {
    const DiscReport disc = ask_drive(session);
    DiscWork work;
    work.job = DiscJob::format;
    work.doing = "formatting";
    work.has_progress = false;
    work.call = library::format_disc;
    return carry_out_job(session, format_plan(read_burner(disc)), options, "Format it?", work,
                         disc);
}

using Verb = Answer (*)(Session &session, const ChangeOptions &options);

void add_job(Command disc, Session &session, const char *name, const VerbHelp &help, Verb run) {
    const Command verb = add_verb(disc, session, name, help);
    const auto options = add_change_options(verb);
    verb.callback([&session, options, run] {
        session.action = [&session, options, run] { return run(session, *options); };
    });
}

} // namespace

void add_disc_blank(Command disc, Session &session) {
    add_job(disc, session, "blank", blank_help, blank);
}

void add_disc_format(Command disc, Session &session) {
    add_job(disc, session, "format", format_help, format);
}

} // namespace zavctl
