#include "command_line.h"

#include "core/monitoring.h"
#include "core/suggest.h"
#include "objects/objects.h"

#include <CLI/CLI.hpp>
#include <fmt/format.h>

#include <algorithm>
#include <memory>

#ifndef ZAVCTL_VERSION
#    error "ZAVCTL_VERSION is to be defined by the build"
#endif

namespace zavctl {

namespace {

constexpr const char *root_footer =
    "The options stand before or behind the object and verb. 'zavctl OBJECT VERB --help' tells "
    "what\n"
    "a command shows.\n\n"
    "Exit status, of every command:\n"
    "  0   all well\n"
    "  1   warning: an array is degraded or rebuilding, a volume is full or inactive\n"
    "  2   critical: a disk, an array or a volume has failed or is missing; a change failed,\n"
    "      was not complete, or is refused\n"
    "  3   could not tell: the library or a tool gave no answer to trust, or the output could\n"
    "      not be written\n"
    "  64  wrong usage: nothing was asked, nothing was done\n"
    "  The worst decides: critical before could not tell before warning.\n\n"
    "Examples:\n"
    "  zavctl status                      the whole appliance on one screen\n"
    "  zavctl disk list                   every disk\n"
    "  zavctl array show 2                one array in detail\n"
    "  zavctl lv list                     every volume, how full, and where it is mounted\n"
    "  zavctl disk remove 3 --dry-run     what taking a disk out would do\n"
    "  zavctl name /dev/sata/disk3p2      a path as an address\n"
    "  zavctl doctor                      is this system fit for the library?";

bool is_option(const std::string &word) {
    return word.size() > 1 && word[0] == '-';
}

// "zavctl", "zavctl disk", "zavctl disk list".
std::string path_of(const CLI::App &app) {
    if (app.get_parent() == nullptr)
        return app.get_name();
    return path_of(*app.get_parent()) + " " + app.get_name();
}

// CLI11 puts what it is given before the name of the app.
std::string help_of(const CLI::App &app) {
    const std::string path = path_of(app);
    const std::size_t before = path.size() - app.get_name().size();
    return app.help(before == 0 ? "" : path.substr(0, before - 1));
}

const CLI::App *verb_named(const CLI::App &app, const std::string &word) {
    for (const CLI::App *sub : app.get_subcommands([](const CLI::App *) { return true; }))
        if (sub->get_name() == word)
            return sub;
    return nullptr;
}

std::vector<std::string> verb_names(const CLI::App &app) {
    std::vector<std::string> names;
    for (const CLI::App *sub : app.get_subcommands([](const CLI::App *) { return true; }))
        names.push_back(sub->get_name());
    return names;
}

std::vector<std::string> option_names(const CLI::App &app) {
    std::vector<std::string> names;
    for (const CLI::Option *option : app.get_options())
        for (const std::string &name : option->get_lnames())
            names.push_back("--" + name);
    return names;
}

std::string hint(const std::string &typed, const std::vector<std::string> &words) {
    const std::string near = nearest_word(typed, words);
    return near.empty() ? "" : fmt::format(" Did you mean '{}'?", near);
}

// A monitoring scheduler reads standard output, and knows no exit status but four.
bool is_for_scheduler(const CLI::App &app) {
    return path_of(app) == "zavctl check";
}

Parsed wrong_usage(const CLI::App &app, const std::string &message) {
    if (is_for_scheduler(app)) {
        const PluginResult result = unknown_result(message);
        return {false, result.status, result.output, ""};
    }
    return {false, exit_usage, "",
            fmt::format("zavctl: {}\nTry '{} --help'.\n", message, path_of(app))};
}

// An option whose value is the next word: "--color never", but not "--color=never" or a flag.
bool takes_next_word(const CLI::App &app, const std::string &word) {
    const CLI::Option *option = app.get_option_no_throw(word);
    return option != nullptr && option->get_items_expected_max() > 0;
}

// Follows the words down to the verb. The deepest word that is known, and the first that is not.
struct Walk {
    const CLI::App *app = nullptr;
    std::string unknown;
};

Walk walk(const CLI::App &root, const std::vector<std::string> &words) {
    Walk at{&root, ""};
    for (std::size_t i = 0; i < words.size() && !verb_names(*at.app).empty(); ++i) {
        if (is_option(words[i])) {
            i += takes_next_word(*at.app, words[i]) ? 1U : 0U;
            continue;
        }
        const CLI::App *next = verb_named(*at.app, words[i]);
        if (next == nullptr)
            return {at.app, words[i]};
        at.app = next;
    }
    return at;
}

std::string unknown_word(const Walk &at) {
    const std::vector<std::string> names = verb_names(*at.app);
    const std::string what = at.app->get_parent() == nullptr ? "object" : "verb";
    const std::string near = hint(at.unknown, names);
    return fmt::format("unknown {} '{}'.{}", what, printable(at.unknown),
                       near.empty() ? " There are: " + listed(names) + "." : near);
}

std::string unknown_option(const CLI::App &app, const std::string &word) {
    const std::string name = word.substr(0, word.find('='));
    return fmt::format("unknown option '{}'.{}", printable(name), hint(name, option_names(app)));
}

Parsed extra_words(const CLI::App &root, const CLI::App &app) {
    const std::vector<std::string> extras = root.remaining(true);
    const std::string word = extras.empty() ? "" : extras.front();
    if (is_option(word))
        return wrong_usage(app, unknown_option(app, word));
    return wrong_usage(app, fmt::format("'{}' is one word too many", printable(word)));
}

// Half a command, such as "zavctl disk", is answered with its help; a wrong option is told.
bool has_unknown_option(const CLI::App &app, const std::vector<std::string> &words) {
    return std::any_of(words.begin(), words.end(), [&app](const std::string &word) {
        return is_option(word) &&
               app.get_option_no_throw(word.substr(0, word.find('='))) == nullptr;
    });
}

// "zavctl help disk" means "zavctl disk --help".
void help_as_option(std::vector<std::string> &words) {
    if (words.empty() || words.front() != "help")
        return;
    words.erase(words.begin());
    words.emplace_back("--help");
}

Parsed parse_words(CLI::App &root, const CLI::App &app, std::vector<std::string> words) {
    try {
        std::reverse(words.begin(), words.end()); // as CLI11 takes a vector
        root.parse(words);
        return {true, 0, "", ""};
    } catch (const CLI::CallForHelp &) {
        return {false, 0, root.help(), ""};
    } catch (const CLI::CallForVersion &version) {
        return {false, 0, std::string(version.what()) + "\n", ""};
    } catch (const CLI::ExtrasError &) {
        return extra_words(root, app);
    } catch (const CLI::ParseError &error) {
        return wrong_usage(app, error.what());
    }
}

std::unique_ptr<CLI::App> make_command_line(Session &session) {
    auto root =
        std::make_unique<CLI::App>("Tells and changes the state of a storage appliance.", "zavctl");
    root->require_subcommand(1);
    root->set_help_flag("-h,--help", "Print this help");
    root->set_version_flag("--version", "zavctl " ZAVCTL_VERSION);
    root->get_formatter()->label("SUBCOMMAND", "OBJECT [VERB]");
    add_output_options(Command(root.get()), session);
    root->footer(root_footer);
    for (const AddObject add : object_table())
        add(Command(root.get()), session);
    return root;
}

} // namespace

Parsed parse(Session &session, std::vector<std::string> words) {
    const auto root = make_command_line(session);
    help_as_option(words);
    const Walk at = walk(*root, words);
    if (!at.unknown.empty())
        return wrong_usage(*at.app, unknown_word(at));
    const bool asks_help = std::any_of(words.begin(), words.end(), [](const std::string &word) {
        return word == "--help" || word == "-h" || word == "--version";
    });
    if (!verb_names(*at.app).empty() && !asks_help && !has_unknown_option(*at.app, words))
        return {false, exit_usage, "", help_of(*at.app)};
    Parsed parsed = parse_words(*root, *at.app, std::move(words));
    if (parsed.run && session.options.json && session.options.jsonl)
        return wrong_usage(*at.app, "--json and --jsonl exclude each other");
    return parsed;
}

} // namespace zavctl
