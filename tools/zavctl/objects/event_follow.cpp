#include "event_verbs.h"

#include "../core/event_report.h"
#include "../core/times.h"
#include "../system/event_queue.h"
#include "../system/interrupt.h"
#include "../system/library.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstring>
#include <memory>

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "Every event as it comes, until interrupted",
    "Shown: one line per event with the time at which it was taken, or one JSON object per line\n"
    "(--json, --jsonl). Each is written at once. The queue is looked at once a second, and the\n"
    "driver's device is free in between.\n"
    "While another program has the device open it is tried again; that is told on standard error\n"
    "once when it lasts. Ctrl-C and SIGTERM end it with exit status 0, everything taken having "
    "been\n"
    "written; it ends, too, when nobody reads its output any more. Exit status 3: there is no\n"
    "event driver, it refuses, or the output cannot be written.",
    "  zavctl event follow\n"
    "  zavctl event follow --jsonl | jq --unbuffered -r 'select(.severity != \"ok\") | .text'",
};

constexpr int could_not_tell = 3;

std::string path_of(const zavDevice &device) {
    return library::address_of(device).path;
}

// Says once that the device stays busy, and again once it was free in between.
class Busy {
  public:
    explicit Busy(const Streams &streams) : streams_(streams) {}

    void note() {
        constexpr int lasting = 5;
        if (++times_ == lasting)
            streams_.say("zavctl: another program keeps the event device open; trying on\n");
    }
    void over() { times_ = 0; }

  private:
    const Streams &streams_;
    int times_ = 0;
};

class Follower {
  public:
    Follower(const Session &session, bool is_private)
        : session_(session), busy_(session.streams), is_private_(is_private),
          style_(session.streams.style(session.options.colour)) {}

    int run() {
        constexpr std::chrono::seconds step{1};
        std::optional<int> status;
        while (!status && !stop_asked()) {
            status = look();
            if (!status && result_ != ZAV_RC_OK)
                stop_within(step);
        }
        return status.value_or(0);
    }

  private:
    // The exit status if there is no going on.
    std::optional<int> look() {
        if (session_.streams.reader_gone())
            return could_not_tell;
        const library::EventAnswer answer =
            is_private_ ? library::poll_private_event() : library::poll_event();
        result_ = answer.result;
        if (result_ == ZAV_RC_ERR_EACCES)
            return refused();
        busy_.over();
        if (result_ == library::no_event_pending)
            return std::nullopt;
        return result_ == ZAV_RC_OK ? show(answer.event) : told(library::event_failure(result_));
    }

    std::optional<int> refused() {
        const std::string trouble = library::event_device_trouble();
        if (!trouble.empty())
            return told(trouble);
        busy_.note();
        return std::nullopt;
    }

    std::optional<int> told(const std::string &trouble) const {
        session_.streams.say("zavctl: " + trouble + "\n");
        return could_not_tell;
    }

    std::optional<int> show(const zavSystemEvent &event) const {
        const ReceivedEvent received{event, rfc3339(std::time(nullptr))};
        const bool json = session_.options.json || session_.options.jsonl;
        const int error = session_.streams.write(json ? event_json_line(received, path_of)
                                                      : event_line(received, style_));
        if (error == 0)
            return std::nullopt;
        if (error != EPIPE)
            return told(fmt::format("cannot write the events: {}", std::strerror(error)));
        return could_not_tell;
    }

    const Session &session_;
    Busy busy_;
    bool is_private_;
    Style style_;
    int result_ = ZAV_RC_OK;
};

} // namespace

void add_event_follow(Command event, Session &session) {
    const auto is_private = std::make_shared<bool>(false);
    const Command verb = add_verb(event, session, "follow", help);
    add_private(verb, *is_private);
    verb.callback([&session, is_private] {
        session.program = [&session, is_private] {
            const StopGuard until_stopped;
            return Follower(session, *is_private).run();
        };
    });
}

} // namespace zavctl
