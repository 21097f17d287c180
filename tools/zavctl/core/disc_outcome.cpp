#include "disc_outcome.h"

#include "zav_api.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

std::string done_words(DiscJob job) {
    switch (job) {
    case DiscJob::burn:
        return "burned";
    case DiscJob::blank:
        return "erased";
    case DiscJob::format:
        break;
    }
    return "formatted";
}

std::string noun(DiscJob job) {
    switch (job) {
    case DiscJob::burn:
        return "burn";
    case DiscJob::blank:
        return "erasing";
    case DiscJob::format:
        break;
    }
    return "formatting";
}

std::string now_words(const DiscReport &disc) {
    if (disc.drive == DriveKind::none || disc.failure)
        return "what is in the drive now cannot be told: " + disc_note(disc);
    if (!holds_disc(disc))
        return "there is no disc in the drive now";
    const std::optional<int> room = free_kib(disc);
    return fmt::format("the disc is {} now{}", disc_words(disc),
                       room ? fmt::format(", {} free", *room > 0 ? size_words(*room) : "nothing")
                            : "");
}

// A CD's recorder takes an image that ends early for a whole one, and so does the library.
std::string what_is_missing(const JobFacts &facts) {
    constexpr int pre_gap = 300; // kilobytes that drives count differently
    const std::optional<int> written = written_to_cd(facts);
    if (!written || !facts.image_kib || *written + pre_gap >= *facts.image_kib)
        return "";
    return fmt::format("{} are on the disc of an image of {}: mkisofs ended early, files are "
                       "missing",
                       size_words(std::max(0, *written)), size_words(*facts.image_kib));
}

// What the disc shows that a job which was done does not leave; "" if nothing.
std::string contradiction(const JobFacts &facts) {
    const int state = facts.after.media.discState;
    if (!holds_disc(facts.after) || !state_known(facts.after))
        return "";
    if (facts.job == DiscJob::burn && state == ZAV_DISC_BLANK)
        return "the disc is still blank";
    if (facts.job == DiscJob::burn && facts.session == SessionType::close &&
        state == ZAV_DISC_APPENDABLE)
        return "the disc was not closed";
    if (facts.job == DiscJob::blank && facts.after.media.discType == ZAV_CD_RW &&
        state != ZAV_DISC_BLANK)
        return "the disc is not blank";
    return facts.job == DiscJob::burn ? what_is_missing(facts) : "";
}

void add(Outcome &outcome, Severity severity, const std::string &text) {
    outcome.findings.push_back({severity, text});
}

Outcome of_success(const JobFacts &facts) {
    Outcome outcome;
    const std::string wrong = contradiction(facts);
    if (!wrong.empty()) {
        outcome.word = "incomplete";
        add(outcome, Severity::critical, fmt::format("the library reports success, but {}", wrong));
        return outcome;
    }
    outcome.word = "done";
    outcome.well = fmt::format("{}; {}", done_words(facts.job), now_words(facts.after));
    if (severity(facts.after) != Severity::ok)
        add(outcome, severity(facts.after), outcome.well);
    return outcome;
}

void advise(const JobFacts &facts, Outcome &outcome) {
    const bool written = facts.job == DiscJob::burn && holds_disc(facts.after);
    if (written && is_write_once(facts.after.media.discType) &&
        facts.after.media.discState != facts.before.media.discState)
        outcome.advice.emplace_back("A write-once disc keeps what was written; use another one.");
    else if (blank_way(facts.after) == BlankWay::fast ||
             blank_way(facts.after) == BlankWay::empty ||
             blank_way(facts.after) == BlankWay::format)
        outcome.advice.emplace_back("'zavctl disc blank' makes the disc usable again.");
}

Outcome of_failure(const JobFacts &facts) {
    Outcome outcome;
    outcome.failure = facts.failure;
    outcome.word = "failed";
    add(outcome, Severity::critical,
        fmt::format("the {} failed: {}; {}", noun(facts.job), in_words(*facts.failure),
                    now_words(facts.after)));
    advise(facts, outcome);
    return outcome;
}

Outcome of_silence(const JobFacts &facts) {
    Outcome outcome;
    outcome.word = "no_answer";
    outcome.failure = Failure{-1, "", child_end_words(facts.end)};
    add(outcome, Severity::unknown,
        fmt::format("the drive gave no answer: {}; {}", child_end_words(facts.end),
                    now_words(facts.after)));
    advise(facts, outcome);
    return outcome;
}

Outcome of_interrupt(const JobFacts &facts) {
    Outcome outcome;
    outcome.word = "cancelled";
    outcome.failure = facts.failure;
    add(outcome, Severity::critical,
        fmt::format("the {} was stopped; {}", noun(facts.job), now_words(facts.after)));
    advise(facts, outcome);
    return outcome;
}

} // namespace

std::optional<int> written_to_cd(const JobFacts &facts) {
    constexpr int reserve = 13800;      // kilobytes that the library keeps of an appendable CD
    constexpr int first_border = 22800; // kilobytes of lead-out, lead-in and gap
    constexpr int border = 13800;
    const bool was_blank = facts.before.media.discState == ZAV_DISC_BLANK;
    if (!is_cd(facts.before.media.discType) || facts.session != SessionType::open ||
        !holds_disc(facts.after) || facts.after.media.discState != ZAV_DISC_APPENDABLE)
        return std::nullopt;
    return facts.before.media.discAvailableSize - facts.after.media.discAvailableSize -
           (was_blank ? reserve + first_border : border);
}

std::string child_end_words(const ChildEnd &end) {
    const std::string printed = printable(trimmed(end.printed));
    const std::string said = printed.empty() ? "" : ": " + printed;
    switch (end.how) {
    case ChildEnd::How::answered:
        return "";
    case ChildEnd::How::exited:
        return fmt::format("the library ended its process (exit status {}){}", end.status, said);
    case ChildEnd::How::signalled:
        return fmt::format("its process was ended by signal {}{}", end.status, said);
    case ChildEnd::How::timed_out:
        return "no answer in time";
    case ChildEnd::How::not_started:
        break;
    }
    return "no process could be started for it";
}

std::string job_failure_meaning(int code) {
    switch (code) {
    case ZAV_RC_ERR_ENOENT:
        return "the source cannot be opened, or a tool's report in /tmp";
    case ZAV_RC_ERR_EINVAL:
        return "the library refuses this session or name";
    case ZAV_RC_ERR_EFBIG:
        return "the source is too large for the disc";
    case ZAV_RC_ERR:
        return "/tmp/progress.outfile cannot be written, or the drive tells nothing";
    case ZAV_RC_ERR_BURNER:
        return "growisofs failed";
    case ZAV_RC_ERR_CDTOOL:
        return "cdrecord or mkisofs failed";
    case ZAV_RC_ERR_PKTSETUP:
        return "the packet device cannot be set up";
    case ZAV_RC_ERR_BLANK:
        return "a tool that erases failed";
    case ZAV_RC_ERR_FORMAT:
        return "mkudffs or cdrwtool failed";
    case ZAV_RC_ERR_BADDISC:
        return "the disc cannot take this";
    case ZAV_RC_ERR_NODISC:
        return "there is no disc";
    default:
        return "the library reports a failure";
    }
}

// A job that had ended before it could be stopped has ended as any other.
Outcome job_outcome(const JobFacts &facts) {
    const bool answered = facts.end.how == ChildEnd::How::answered;
    if (answered && !facts.failure)
        return of_success(facts);
    if (facts.cancelled)
        return of_interrupt(facts);
    return answered ? of_failure(facts) : of_silence(facts);
}

} // namespace zavctl
