#include "session.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr const char *exit_statuses = "Exit status:\n"
                                      "  0 all well   1 warning   2 critical   3 could not tell   "
                                      "64 wrong usage\n"
                                      "  The worst decides: critical before could not tell before "
                                      "warning.";

} // namespace

void Session::ask(const std::vector<Question> &questions) {
    Patience patience;
    patience.limit = std::chrono::seconds(options.timeout);
    patience.repeated = repeated;
    if (!ask_all(questions, patience, streams))
        abandoned = true;
}

Failure no_answer(const Session &session) {
    return {-1, "", fmt::format("no answer within {} s", session.options.timeout)};
}

void add_output_options(CLI::App &app, Session &session) {
    app.add_flag("--json", session.options.json, "Print one JSON object");
    app.add_flag("--jsonl", session.options.jsonl, "Print one JSON record per line");
    app.add_option("--color", session.options.colour,
                   "auto: on a terminal unless NO_COLOR is set; always; never")
        ->type_name("WHEN")
        ->check(CLI::IsMember({"auto", "always", "never"}));
    app.add_option("--timeout", session.options.timeout,
                   "Wait at most this long for the library and its tools; 60 if not given")
        ->type_name("SECONDS")
        ->check(CLI::Range(1, 86400));
}

CLI::App *add_object(CLI::App &root, const std::string &name, const std::string &summary) {
    CLI::App *object = root.add_subcommand(name, summary);
    object->require_subcommand(1);
    object->formatter(std::make_shared<CLI::Formatter>());
    object->get_formatter()->label("SUBCOMMAND", "VERB");
    object->group("Objects");
    object->footer(
        fmt::format("'zavctl {} VERB --help' tells what a verb shows.\n\n{}", name, exit_statuses));
    return object;
}

CLI::App *add_verb(CLI::App &object, Session &session, const std::string &name,
                   const VerbHelp &help) {
    CLI::App *verb = object.add_subcommand(name, help.summary);
    verb->group(object.get_parent() == nullptr ? "Objects" : "Verbs");
    add_output_options(*verb, session);
    verb->footer(
        fmt::format("{}\n\n{}\n\nExamples:\n{}", help.shown, exit_statuses, help.examples));
    return verb;
}

} // namespace zavctl
