#include "../core/watch.h"
#include "../system/interrupt.h"
#include "../system/library.h"
#include "disc_verbs.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds look_interval{500};
constexpr std::chrono::seconds patience{60}; // for a job to be stopped in order

constexpr const char *reminder = "\nzavctl: the job is being stopped, which takes some seconds; an "
                                 "interrupt after a minute ends zavctl with all tools\n";

// A line that is written over at a terminal; elsewhere a line for each thing that is new.
class JobScreen {
  public:
    JobScreen(const Streams &streams, const DiscWork &work)
        : streams_(streams), course_(work.doing, work.has_progress) {}

    void show(int percent) {
        if (streams_.err_is_terminal())
            over(cut(course_.line(percent, elapsed()), streams_.message_style().width));
        else if (const std::string news = course_.news(percent); !news.empty())
            streams_.say(seen_line(elapsed(), news));
    }

    void say(const std::string &text) {
        over("");
        streams_.say(seen_line(elapsed(), text));
    }

  private:
    std::chrono::seconds elapsed() const {
        return std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - begin_);
    }

    void over(const std::string &line) const {
        if (streams_.err_is_terminal())
            streams_.say("\r\033[K" + line);
    }

    const Streams &streams_;
    JobCourse course_;
    Clock::time_point begin_ = Clock::now();
};

// The library goes on from tool to tool, and one that begins between two looks is missed: so again,
// until it has returned. Its cancelling does not know the tools that format.
void stop(Job &job, DiscJob kind) {
    do {
        library::cancel_job_and_wait();
        if (kind == DiscJob::format)
            job.terminate();
    } while (!job.wait(look_interval));
}

// True if it was stopped by an interrupt.
bool watch(Job &job, const DiscWork &work, JobScreen &screen) {
    screen.show(0);
    while (!job.wait(look_interval)) {
        if (stop_asked()) {
            screen.say("interrupted: the job is being stopped");
            stop(job, work.job);
            return true;
        }
        screen.show(work.has_progress ? library::disc_progress().value_or(0) : 0);
    }
    return false;
}

std::optional<Failure> failure_in(const Job &job) {
    std::optional<Failure> failure = library::failure_of(library::code_in(job.result()));
    if (failure)
        failure->meaning = job_failure_meaning(failure->code);
    return failure;
}

std::string ending(const JobFacts &facts) {
    if (facts.end.how == ChildEnd::How::answered && !facts.failure)
        return "done";
    return facts.cancelled ? "stopped" : "failed";
}

} // namespace

// The progress file's last word is not asked for: a simulated progress may still have been written
// when the job was over, and what the job returned is known.
JobFacts run_disc_job(const Session &session, const DiscWork &work, const DiscReport &before) {
    const StopGuard guard(session.streams.err(), "", patience, reminder);
    JobFacts facts;
    facts.job = work.job;
    facts.session = work.session;
    facts.before = before;
    facts.image_kib = work.image_kib;
    JobScreen screen(session.streams, work);
    Job job(work.call);
    facts.cancelled = watch(job, work, screen);
    facts.end = job.end();
    if (facts.end.how == ChildEnd::How::answered)
        facts.failure = failure_in(job);
    screen.say(ending(facts) + "; the drive is asked what the disc is now");
    if (facts.end.how == ChildEnd::How::answered)
        session.streams.say(tool_lines(facts.end.printed));
    facts.after = query_disc(std::chrono::seconds(session.options.timeout));
    return facts;
}

Answer carry_out_job(Session &session, const Plan &plan, const ChangeOptions &options,
                     const std::string &question, const DiscWork &work, const DiscReport &disc) {
    Section now;
    now.records = disc_json(disc);
    const auto run = [&] {
        const JobFacts facts = run_disc_job(session, work, disc);
        now.records = disc_json(facts.after);
        now.details = disc_section(facts.after).details;
        return job_outcome(facts);
    };
    Answer answer = carry_out(session, plan, options, question, run);
    now.key = "disc";
    answer.sections.push_back(now);
    return answer;
}

} // namespace zavctl
