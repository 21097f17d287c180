// One run of zavctl: what the command line asked for, and how it reaches the world.
#pragma once

#include "../core/answer.h"
#include "../system/ask.h"
#include "../system/streams.h"

#include <CLI/CLI.hpp>

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

// What a verb's help says besides its options.
struct VerbHelp {
    const char *summary;  // one line
    const char *shown;    // what the screen shows, and what each exit status means here
    const char *examples; // command lines, one per line, indented
};

// Adds a verb with the output options that every verb has.
CLI::App *add_verb(CLI::App &object, Session &session, const std::string &name,
                   const VerbHelp &help);

// Adds an object, which has verbs.
CLI::App *add_object(CLI::App &root, const std::string &name, const std::string &summary);

void add_output_options(CLI::App &app, Session &session);

} // namespace zavctl
