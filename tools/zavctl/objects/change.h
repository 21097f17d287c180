// A change of the machine: said first, asked for, run, judged by what the machine shows then.
#pragma once

#include "../core/plan.h"
#include "../system/change.h"
#include "command.h"
#include "session.h"

#include <functional>
#include <memory>
#include <string>

namespace zavctl {

// What every verb that changes the machine takes.
struct ChangeOptions {
    bool yes = false;
    bool dry_run = false;
};

std::shared_ptr<ChangeOptions> add_change_options(Command verb);

// Tells the plan and lets `act` run it, unless it is refused, only wanted to be seen, or the answer
// to the question is no.
Answer carry_out(Session &session, const Plan &plan, const ChangeOptions &options,
                 const std::string &question, const std::function<Outcome()> &act);

} // namespace zavctl
