// The objects and verbs of the command line, as those who add them see them. What reads the words
// is behind command.cpp: its header alone takes longer to compile than most objects.
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
} // namespace CLI

namespace zavctl {

struct Session;

// An option or operand that was just added.
class CommandOption {
  public:
    explicit CommandOption(CLI::Option *option) : option_(option) {}

    const CommandOption &required() const;
    const CommandOption &type_name(const std::string &name) const;
    const CommandOption &within(int lowest, int highest) const;
    const CommandOption &not_negative() const;
    const CommandOption &one_of(const std::vector<std::string> &words) const;

  private:
    CLI::Option *option_;
};

// An object or a verb; a handle, the command line owns what it stands for.
class Command {
  public:
    explicit Command(CLI::App *app) : app_(app) {}

    // The value is written when the command line is read, and must live as long as it: an int, a
    // text, a vector or an optional of either, or an optional double.
    template <class Value>
    CommandOption add_option(const std::string &name, Value &value,
                             const std::string &meaning) const;
    void add_flag(const std::string &name, bool &value, const std::string &meaning) const;

    // Called when this verb was chosen, once all values are written.
    void callback(std::function<void()> chosen) const;

    // Whether the option was given, to this verb or before its object.
    bool was_given(const std::string &option) const;

    CLI::App &app() const { return *app_; }

  private:
    CLI::App *app_;
};

// What a verb's help says besides its options.
struct VerbHelp {
    const char *summary;  // one line
    const char *shown;    // what the screen shows, and what each exit status means here
    const char *examples; // command lines, one per line, indented
};

// Adds a verb with the output options that every verb has.
Command add_verb(Command object, Session &session, const std::string &name, const VerbHelp &help);

// Adds an object, which has verbs.
Command add_object(Command root, const std::string &name, const std::string &summary);

void add_output_options(Command command, Session &session);

} // namespace zavctl
