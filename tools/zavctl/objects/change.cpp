#include "change.h"

namespace zavctl {

namespace {

bool confirmed(const Session &session, const std::string &question) {
    if (!session.streams.can_ask())
        throw UsageError("nobody to ask here; --yes does it without asking, --dry-run tells what "
                         "would happen");
    return session.streams.confirm(question);
}

} // namespace

std::shared_ptr<ChangeOptions> add_change_options(Command verb) {
    auto options = std::make_shared<ChangeOptions>();
    verb.add_flag("-y,--yes", options->yes, "Do not ask");
    verb.add_flag("--dry-run", options->dry_run, "Tell what would happen, and change nothing");
    return options;
}

Answer carry_out(Session &session, const Plan &plan, const ChangeOptions &options,
                 const std::string &question, const std::function<Outcome()> &act) {
    if (plan.refused())
        return change_answer(plan, refused(plan));
    if (options.dry_run)
        return change_answer(plan, only_planned(plan));
    session.streams.say(plan_text(plan, session.streams.message_style()));
    if (!options.yes && !confirmed(session, question))
        return change_answer(plan, not_confirmed());
    return change_answer(plan, act());
}

} // namespace zavctl
