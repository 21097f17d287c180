#include "asking.h"
#include "event_verbs.h"
#include "pushing.h"

#include "../core/event_push.h"
#include "../core/event_report.h"
#include "../core/times.h"
#include "../system/event_queue.h"
#include "../system/interrupt.h"
#include "../system/library.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr VerbHelp poll_help = {
    "The next event, if there is one",
    "Shown: the event that is taken from the driver's queue, in words; \"no event is pending\" if\n"
    "there is none. Whoever else reads the queue does not get it any more.\n"
    "The exit status tells whether the driver answered, not what has happened: 0 also for an\n"
    "event that is critical; 3 if the driver is missing or another program has its device open.",
    "  zavctl event poll\n"
    "  zavctl event poll --all --jsonl > events.jsonl\n"
    "  zavctl event poll --private",
};

constexpr VerbHelp wait_help = {
    "The next event, waiting until there is one",
    "Shown: the event, as by 'zavctl event poll'. It is looked for once a second, and the "
    "driver's\n"
    "device is free in between, so that others are not locked out. Without --timeout it is waited\n"
    "for without limit. Exit status 1: none came in time, or the wait was interrupted; 3: there "
    "is\n"
    "no event driver.",
    "  zavctl event wait\n"
    "  zavctl event wait --timeout 30 --json",
};

constexpr VerbHelp push_help = {
    "Puts an event into the driver's queue",
    "The event is made of words:\n"
    "  fan|thermal|volt N --value NUMBER --state normal|warning|critical|unknown\n"
    "  ups --charge PERCENT --state online|on-battery|other\n"
    "  disk N|UNIT-N --state found|absent|failed\n"
    "  array N|UNIT-N --state normal|degraded|resync|failed|not-exist [--progress PERCENT]\n"
    "  vg N, pv GROUP-N, lv GROUP-N --state normal|degraded|failed|not-exist|full|inactive\n"
    "  nic ethN|bondN --state up|down|not-exist|unknown [--speed MBIT]\n"
    "  load processor|swap|PATH --value PERCENT --state normal|warning|critical|unknown\n"
    "  unit N [temperature|voltage] --state normal|warning|alarm|failed|missing|present\n"
    "  init NUMBER\n"
    "States of disks, arrays and volumes combine: degraded,resync. Or it is read: '-' takes the\n"
    "JSON that poll, wait and follow print, one object or many lines, from standard input.\n"
    "While another program has the driver's device open it is tried again for some seconds.\n"
    "Exit status 2: an event was not put, and why.",
    "  zavctl event push fan 2 --value 0 --state critical\n"
    "  zavctl event push array 2 --state degraded,resync --progress 37.5\n"
    "  zavctl event push - < events.jsonl",
};

std::string path_of(const zavDevice &device) {
    return library::address_of(device).path;
}

library::EventAnswer taken(bool is_private) {
    return is_private ? library::poll_private_event() : library::poll_event();
}

Answer poll(bool all, bool is_private) {
    std::vector<ReceivedEvent> events;
    int result = ZAV_RC_OK;
    do {
        const library::EventAnswer answer = taken(is_private);
        result = answer.result;
        if (result == ZAV_RC_OK)
            events.push_back({answer.event, rfc3339(std::time(nullptr))});
    } while (all && result == ZAV_RC_OK && !stop_asked());
    Section section = taken_section(events, path_of);
    if (result != ZAV_RC_OK && result != library::no_event_pending)
        section.findings.push_back({Severity::unknown, library::event_failure(result)});
    return {"event poll", "", {std::move(section)}};
}

struct Wait {
    bool is_private = false;
    std::optional<int> seconds; // none: without limit
};

// Nothing if there still is none; a device that somebody else has open is free again later.
std::optional<Section> looked_for(const Wait &wait) {
    const library::EventAnswer answer = taken(wait.is_private);
    if (answer.result == library::no_event_pending)
        return std::nullopt;
    if (answer.result == ZAV_RC_OK)
        return taken_section({{answer.event, rfc3339(std::time(nullptr))}}, path_of);
    if (answer.result == ZAV_RC_ERR_EACCES && library::event_device_trouble().empty())
        return std::nullopt;
    Section section = taken_section({}, path_of);
    section.findings = {{Severity::unknown, library::event_failure(answer.result)}};
    return section;
}

Answer wait(const Wait &wait) {
    using Clock = std::chrono::steady_clock;
    constexpr std::chrono::seconds step{1};
    const StopGuard until_stopped;
    const Clock::time_point end = Clock::now() + std::chrono::seconds(wait.seconds.value_or(0));
    do {
        if (const std::optional<Section> section = looked_for(wait))
            return {"event wait", "", {*section}};
    } while (!stop_within(step) && (!wait.seconds || Clock::now() < end));
    Section section = taken_section({}, path_of);
    const std::string why = stop_asked() ? "no event came before the interrupt"
                                         : fmt::format("no event came within {} s", *wait.seconds);
    section.findings = {{Severity::warning, why}};
    return {"event wait", "", {std::move(section)}};
}

std::vector<zavSystemEvent> events_given(Session &session, const EventWords &given) {
    try {
        if (given.words == std::vector<std::string>{"-"})
            return events_of_text(session.streams.read_input().text);
        return {event_of_words(given, read_model().hardware_raid())};
    } catch (const NoEvent &problem) {
        throw UsageError(problem.what());
    }
}

Answer push(Session &session, const EventWords &given) {
    std::vector<PushedEvent> pushed;
    for (const zavSystemEvent &event : events_given(session, given)) {
        const int result = push_patiently(event);
        pushed.push_back({event, result == ZAV_RC_OK ? "" : library::event_failure(result)});
    }
    return {"event push", "", {pushed_section(pushed, path_of)}};
}

void add_poll(Command event, Session &session) {
    const auto all = std::make_shared<bool>(false);
    const auto is_private = std::make_shared<bool>(false);
    const Command verb = add_verb(event, session, "poll", poll_help);
    verb.add_flag("--all", *all, "Take every event that is there");
    add_private(verb, *is_private);
    verb.callback([&session, all, is_private] {
        session.action = [all, is_private] { return poll(*all, *is_private); };
    });
}

void add_wait(Command event, Session &session) {
    const auto waiting = std::make_shared<Wait>();
    const Command verb = add_verb(event, session, "wait", wait_help);
    add_private(verb, waiting->is_private);
    verb.callback([verb, &session, waiting] {
        if (verb.was_given("--timeout"))
            waiting->seconds = session.options.timeout;
        session.action = [waiting] { return wait(*waiting); };
    });
}

void add_push(Command event, Session &session) {
    const auto given = std::make_shared<EventWords>();
    const Command verb = add_verb(event, session, "push", push_help);
    verb.add_option("WORD", given->words, "What the event is about, or '-'").required();
    verb.add_option("--state", given->state, "State in words").type_name("STATE");
    verb.add_option("--value", given->value, "Reading, or use in percent").type_name("NUMBER");
    verb.add_option("--charge", given->charge, "Charge of the battery").type_name("PERCENT");
    verb.add_option("--progress", given->progress, "Progress of a rebuild").type_name("PERCENT");
    verb.add_option("--speed", given->speed, "Speed of a link").type_name("MBIT");
    verb.callback([&session, given] {
        session.action = [&session, given] { return push(session, *given); };
    });
}

} // namespace

void add_private(Command verb, bool &is_private) {
    verb.add_flag("--private", is_private, "The driver's private queue");
}

void add_event(Command root, Session &session) {
    const Command event =
        add_object(root, "event", "The event driver's queue: poll, wait, follow, push");
    add_poll(event, session);
    add_wait(event, session);
    add_event_follow(event, session);
    add_push(event, session);
}

} // namespace zavctl
