// The verbs of the optical drive, and what they share.
#pragma once

#include "../core/disc_plan.h"
#include "../system/disc.h"
#include "change.h"

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// Asks the drive what is in it, and beside that the further questions. A waiting line is shown.
DiscReport ask_drive(Session &session, const std::vector<Question> &further = {});

// A job as it is run in a process of its own.
struct DiscWork {
    DiscJob job = DiscJob::burn;
    SessionType session = SessionType::open;
    std::string doing; // "writing", while the percentage grows
    bool has_progress = true;
    std::function<std::string()> call;
    std::optional<int> image_kib; // what it is to burn, if that is known
};

// Runs it, shows its progress, stops it in order on an interrupt, and asks the drive what the disc
// is then.
JobFacts run_disc_job(const Session &session, const DiscWork &work, const DiscReport &before);

// What a job has changed: the plan, told and asked for, its outcome and the disc then.
Answer carry_out_job(Session &session, const Plan &plan, const ChangeOptions &options,
                     const std::string &question, const DiscWork &work, const DiscReport &disc);

void add_disc_burn(Command disc, Session &session);
void add_disc_blank(Command disc, Session &session);
void add_disc_format(Command disc, Session &session);

} // namespace zavctl
