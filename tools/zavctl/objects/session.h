// One run of zavctl: what the command line asked for, and how it reaches the world.
#pragma once

#include "../core/answer.h"
#include "../system/ask.h"
#include "../system/streams.h"

#include <functional>
#include <stdexcept>
#include <string>

namespace zavctl {

struct Options {
    bool json = false;
    bool jsonl = false;
    std::string colour = "auto";
    int timeout = 60; // seconds for all questions together
};

struct Session {
    const Streams &streams;
    Options options;
    std::function<Answer()> action; // set by the verb that was chosen
    std::function<int()> program;   // in place of an action: writes by itself, exit status
    bool repeated = false;          // the same is asked again and again, see Patience
    bool abandoned = false;         // a thread still waits for a tool

    explicit Session(const Streams &own_streams) : streams(own_streams) {}

    // Asks side by side; the reports of what did not answer in time keep their default.
    void ask(const std::vector<Question> &questions);
};

// The command line was understood, but is refused as it stands; exit status 64.
class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// The default of a report: no answer within the time limit.
Failure no_answer(const Session &session);

} // namespace zavctl
