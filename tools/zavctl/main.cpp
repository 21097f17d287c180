// zavctl: the state of a storage appliance at the command line.

#include "command_line.h"
#include "system/interrupt.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace zavctl {

namespace {

constexpr int could_not_write = 3;

// Writes the answer; a failure is told, and is the exit status. When the reader is gone there is
// nobody to tell, as with any filter: the status alone says so.
int written(const Streams &streams, const std::string &text, int status) {
    stay_if_ending();
    const int error = streams.write(text);
    if (error == 0)
        return status;
    if (error != EPIPE)
        streams.say(fmt::format("zavctl: cannot write the answer: {}\n", std::strerror(error)));
    return could_not_write;
}

std::string rendered(const Answer &answer, const Session &session) {
    if (session.options.jsonl)
        return to_jsonl(answer);
    if (session.options.json)
        return to_json(answer);
    return to_text(answer, session.streams.style(session.options.colour));
}

int run_action(const Streams &streams, const Session &session) {
    if (session.program)
        return session.program();
    const Answer answer = session.action();
    return written(streams, rendered(answer, session), exit_status(severity(answer)));
}

int run(const Streams &streams, Session &session, const std::vector<std::string> &words) {
    const Parsed parsed = parse(session, words);
    streams.say(parsed.message);
    if (!parsed.run)
        return written(streams, parsed.out, parsed.status);
    try {
        return run_action(streams, session);
    } catch (const UsageError &error) {
        streams.say(fmt::format("zavctl: {}\n", error.what()));
        return exit_usage;
    }
}

int guarded_run(const Streams &streams, Session &session, const std::vector<std::string> &words) {
    try {
        return run(streams, session, words);
    } catch (const std::exception &error) {
        streams.say(fmt::format("zavctl: {}\n", error.what()));
        return could_not_write;
    }
}

} // namespace

} // namespace zavctl

int main(int argc, char **argv) {
    zavctl::end_on_interrupt();
    const zavctl::Streams streams;
    zavctl::Session session(streams);
    const int status = zavctl::guarded_run(
        streams, session, std::vector<std::string>(argv + (argc > 0 ? 1 : 0), argv + argc));
    if (session.abandoned)
        std::_Exit(status); // a thread that still waits for a tool must not meet the end of main
    return status;
}
