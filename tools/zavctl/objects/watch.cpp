#include "appliance.h"
#include "pushing.h"
#include "watching.h"

#include "../core/event.h"

#include "../system/event_queue.h"
#include "../system/interrupt.h"
#include "../system/library.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <chrono>
#include <memory>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;

constexpr VerbHelp help = {
    "The whole appliance, live: what changes as it changes",
    "Shown on a terminal: the screen of 'zavctl status', again and again in place, with the time "
    "of\n"
    "the last round and the summary at the top, a star at each row that changed since the round\n"
    "before, and the last changes with their times at the bottom. In a window that is too small "
    "the\n"
    "rows that are well are left out.\n"
    "Elsewhere: the summary of the first round, then one line per change, each written at once;\n"
    "with --json or --jsonl one JSON object per change and nothing else.\n"
    "--push hands each change to the event driver, as the library's record of the thing. The "
    "first\n"
    "round is what changes are told from: it pushes nothing, nor does a thing that gives no "
    "answer.\n"
    "What cannot be pushed is told, and watching goes on.\n"
    "A round takes as long as the slowest answer: about 20 seconds with an empty slot; --timeout\n"
    "limits it, and what has not answered then could not be told.\n"
    "Ctrl-C and SIGTERM end it with exit status 0, whatever state the appliance is in; 3: the "
    "output\n"
    "cannot be written, or nobody reads it any more.",
    "  zavctl watch\n"
    "  zavctl watch --interval 60 --push >>/var/log/appliance-changes\n"
    "  zavctl watch --jsonl | jq --unbuffered -r .text",
};

struct WatchOptions {
    int interval = 5;
    int rounds = 0; // 0: until interrupted
    bool push = false;
    bool until_change = false;
};

// A unit that has come or gone has no record in the answer: the sensors' alone.
std::optional<zavSystemEvent> unit_event(const std::string &subject) {
    constexpr std::string_view unit = "unit ";
    int number = 0;
    const char *end = subject.data() + subject.size();
    if (!subject.starts_with(unit) ||
        std::from_chars(subject.data() + unit.size(), end, number).ptr != end)
        return std::nullopt;
    const library::UnitAnswer answer = library::unit_state(number, ZAV_RBOD_EXPANDER);
    return answered_event(answer.result, answer.state);
}

std::optional<zavSystemEvent> event_about(const std::string &subject,
                                          const std::vector<zavSystemEvent> &events) {
    const auto found =
        std::find_if(events.begin(), events.end(), [&subject](const zavSystemEvent &event) {
            return event_subject(event) == subject;
        });
    return found == events.end() ? unit_event(subject) : std::optional(*found);
}

class Watch {
  public:
    Watch(Session &session, const WatchOptions &options)
        : session_(session), options_(options), output_(make_watch_output(session)) {}

    int run() {
        session_.repeated = true;
        output_->begin();
        for (int round = 1; !ended_; ++round) {
            const Clock::time_point begin = Clock::now();
            once(round);
            ended_ = ended_ || output_->failed() || round == options_.rounds;
            wait_until(begin + std::chrono::seconds(options_.interval));
        }
        return output_->failed() ? exit_status(Severity::unknown) : 0;
    }

  private:
    void once(int round) {
        Answer answer = ask_appliance(session_, "watch");
        if (stop_asked()) { // its tools were ended: that is no answer
            ended_ = true;
            return;
        }
        const std::vector<Thing> things = things_of(answer);
        const Round told{std::time(nullptr), round, options_.interval,
                         round == 1 ? std::vector<Change>() : changes(things_, things)};
        const std::vector<zavSystemEvent> events = events_of(answer);
        things_ = things;
        output_->show(told, std::move(answer));
        if (options_.push)
            for (const Change &change : told.changes)
                push(change, events);
        ended_ = ended_ || (options_.until_change && !told.changes.empty());
    }

    void push(const Change &change, const std::vector<zavSystemEvent> &events) {
        if (stop_asked() || !change.after)
            return;
        const std::optional<zavSystemEvent> event = event_about(change.subject, events);
        if (!event)
            return;
        const int result = push_patiently(*event);
        if (result != ZAV_RC_OK)
            output_->note(fmt::format("{} was not pushed: {}", change.subject,
                                      library::event_failure(result)));
    }

    void wait_until(Clock::time_point end) {
        constexpr std::chrono::milliseconds step{250};
        while (!ended_ && Clock::now() < end) {
            const auto rest =
                std::chrono::duration_cast<std::chrono::milliseconds>(end - Clock::now());
            ended_ = stop_within(std::min(step, rest + std::chrono::milliseconds(1)));
            output_->refresh();
            ended_ = ended_ || output_->failed();
        }
    }

    Session &session_;
    WatchOptions options_;
    std::unique_ptr<WatchOutput> output_;
    std::vector<Thing> things_;
    bool ended_ = false;
};

} // namespace

void add_watch(Command root, Session &session) {
    const auto options = std::make_shared<WatchOptions>();
    const Command verb = add_verb(root, session, "watch", help);
    verb.add_option("--interval", options->interval,
                    "Seconds from the beginning of a round to that of the next; 5 if not given")
        .type_name("SECONDS")
        .within(1, 86400);
    verb.add_option("--rounds", options->rounds, "End after so many rounds")
        .type_name("N")
        .within(1, 1000000);
    verb.add_flag("--push", options->push, "Push every change to the event driver");
    verb.add_flag("--until-change", options->until_change,
                  "End after the first round in which something changed");
    verb.callback([&session, options] {
        session.program = [&session, options] { return Watch(session, *options).run(); };
    });
}

} // namespace zavctl
