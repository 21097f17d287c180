#include "command.h"

#include "session.h"

#include <CLI/CLI.hpp>
#include <fmt/format.h>

#include <optional>

namespace zavctl {

namespace {

constexpr const char *exit_statuses = "Exit status:\n"
                                      "  0 all well   1 warning   2 critical   3 could not tell   "
                                      "64 wrong usage\n"
                                      "  The worst decides: critical before could not tell before "
                                      "warning.";

} // namespace

const CommandOption &CommandOption::required() const {
    option_->required();
    return *this;
}

const CommandOption &CommandOption::type_name(const std::string &name) const {
    option_->type_name(name);
    return *this;
}

const CommandOption &CommandOption::within(int lowest, int highest) const {
    option_->check(CLI::Range(lowest, highest));
    return *this;
}

const CommandOption &CommandOption::not_negative() const {
    option_->check(CLI::NonNegativeNumber);
    return *this;
}

const CommandOption &CommandOption::one_of(const std::vector<std::string> &words) const {
    option_->check(CLI::IsMember(words));
    return *this;
}

template <class Value>
CommandOption Command::add_option(const std::string &name, Value &value,
                                  const std::string &meaning) const {
    return CommandOption(app_->add_option(name, value, meaning));
}

template CommandOption Command::add_option(const std::string &, int &, const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::string &,
                                           const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::optional<int> &,
                                           const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::optional<double> &,
                                           const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::optional<std::string> &,
                                           const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::vector<int> &,
                                           const std::string &) const;
template CommandOption Command::add_option(const std::string &, std::vector<std::string> &,
                                           const std::string &) const;

void Command::add_flag(const std::string &name, bool &value, const std::string &meaning) const {
    app_->add_flag(name, value, meaning);
}

void Command::callback(std::function<void()> chosen) const {
    app_->callback(std::move(chosen));
}

bool Command::was_given(const std::string &option) const {
    for (const CLI::App *at = app_; at != nullptr; at = at->get_parent())
        if (const CLI::Option *found = at->get_option_no_throw(option))
            if (found->count() > 0)
                return true;
    return false;
}

void add_output_options(Command command, Session &session) {
    command.add_flag("--json", session.options.json, "Print one JSON object");
    command.add_flag("--jsonl", session.options.jsonl, "Print one JSON record per line");
    command
        .add_option("--color", session.options.colour,
                    "auto: on a terminal unless NO_COLOR is set; always; never")
        .type_name("WHEN")
        .one_of({"auto", "always", "never"});
    command
        .add_option("--timeout", session.options.timeout,
                    "Wait at most this long for the library and its tools; 60 if not given")
        .type_name("SECONDS")
        .within(1, 86400);
}

Command add_object(Command root, const std::string &name, const std::string &summary) {
    CLI::App *object = root.app().add_subcommand(name, summary);
    object->require_subcommand(1);
    object->formatter(std::make_shared<CLI::Formatter>());
    object->get_formatter()->label("SUBCOMMAND", "VERB");
    object->group("Objects");
    object->footer(
        fmt::format("'zavctl {} VERB --help' tells what a verb shows.\n\n{}", name, exit_statuses));
    return Command(object);
}

Command add_verb(Command object, Session &session, const std::string &name, const VerbHelp &help) {
    CLI::App *verb = object.app().add_subcommand(name, help.summary);
    verb->group(object.app().get_parent() == nullptr ? "Objects" : "Verbs");
    add_output_options(Command(verb), session);
    verb->footer(
        fmt::format("{}\n\n{}\n\nExamples:\n{}", help.shown, exit_statuses, help.examples));
    return Command(verb);
}

} // namespace zavctl
