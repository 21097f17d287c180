#include "appliance.h"

#include "../core/monitoring.h"
#include "../system/run.h"

#include <fmt/format.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <exception>
#include <memory>
#include <mutex>
#include <thread>

namespace zavctl {

namespace {

constexpr VerbHelp help = {
    "The appliance as one line for a monitoring scheduler (Nagios and those like it)",
    "Shown: OK, WARNING, CRITICAL or UNKNOWN with the worst finding, and behind a bar the\n"
    "performance data: readings, use and charge with their limits; then a line for each further\n"
    "finding. Without an OBJECT everything is judged but the processor, which takes 10 s: that is\n"
    "part of 'check load'.\n"
    "Exit status 0 OK, 1 WARNING, 2 CRITICAL, 3 UNKNOWN, on this command for everything: wrong\n"
    "usage, an OBJECT that this appliance does not have, and no answer within --timeout are\n"
    "UNKNOWN, with one line on standard output that says so. --timeout is for all together.",
    "  zavctl check\n"
    "  zavctl check disk array --timeout 50",
};

// What the thread that asks and the one that waits share; it lives as long as the last of them.
struct Asking {
    std::mutex mutex;
    std::condition_variable done;
    std::optional<Answer> answer;
    std::exception_ptr failure; // what asking ended with instead

    bool over() const { return answer.has_value() || failure != nullptr; }
};

void ask_into(Asking &asking, Session &session, Processor processor) {
    std::optional<Answer> answer;
    std::exception_ptr failure;
    try {
        answer = ask_appliance(session, "check", processor);
    } catch (...) {
        failure = std::current_exception();
    }
    const std::lock_guard lock(asking.mutex);
    asking.answer = std::move(answer);
    asking.failure = failure;
    asking.done.notify_all();
}

// Each round of questions is given a second less, so that what has answered by then is told.
std::optional<Answer> asked_in_time(Session &session, Processor processor) {
    const std::chrono::seconds limit(session.options.timeout);
    session.options.timeout = std::max(1, session.options.timeout - 1);
    const auto asking = std::make_shared<Asking>();
    std::thread([asking, &session, processor] { ask_into(*asking, session, processor); }).detach();
    std::unique_lock lock(asking->mutex);
    asking->done.wait_for(lock, limit, [&asking] { return asking->over(); });
    if (asking->failure != nullptr)
        std::rethrow_exception(asking->failure);
    return asking->answer;
}

PluginResult check(Session &session, const std::vector<std::string> &objects) {
    const std::vector<std::string> known = checked_objects();
    for (const std::string &word : objects)
        if (std::find(known.begin(), known.end(), word) == known.end())
            return checked({}, {word});
    const int limit = session.options.timeout;
    // Schedulers expect an answer within ten seconds, unless they ask for what takes longer.
    const bool load = std::find(objects.begin(), objects.end(), "load") != objects.end();
    const std::optional<Answer> answer =
        asked_in_time(session, load ? Processor::measured : Processor::left_out);
    if (answer)
        return checked(*answer, objects);
    session.abandoned = true; // the thread that asks is left behind
    kill_descendants();
    return unknown_result(fmt::format("no answer within {} s", limit));
}

} // namespace

void add_check(Command root, Session &session) {
    const auto objects = std::make_shared<std::vector<std::string>>();
    const Command verb = add_verb(root, session, "check", help);
    verb.add_option("OBJECT", *objects,
                    "What to judge: disk, array, unit, vg, lv, pv, sensor, nic, ups, load");
    verb.callback([&session, objects] {
        session.program = [&session, objects] {
            const PluginResult result = check(session, *objects);
            return session.streams.write(result.output) == 0 ? result.status
                                                             : exit_status(Severity::unknown);
        };
    });
}

} // namespace zavctl
