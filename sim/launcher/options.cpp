#include "launcher/options.hpp"

#include "model/enclosures.hpp"
#include "model/factory.hpp"
#include "model/network.hpp"
#include "model/sentences.hpp"

#include <CLI/CLI.hpp>
#include <cstdint>
#include <fmt/format.h>
#include <fstream>
#include <iterator>
#include <sstream>

namespace zavsim {

namespace {

constexpr const char *description =
    "Runs a program on a simulated storage appliance: a private root with the appliance's\n"
    "files, devices and tools over one model of its disks and arrays. Nothing of it stays\n"
    "behind. The exit status is that of COMMAND (128 + signal when a signal ended it),\n"
    "64 for wrong usage, 71 when the machine cannot provide the private root.";

constexpr const char *footer =
    "Inside, the same program acts on the model and shows it:\n"
    "  zavsim act SENTENCE...   e.g. zavsim act disk 3 fails\n"
    "  zavsim state             the model as JSON\n\n"
    "Sentences (a scenario file holds lines \"at 10s SENTENCE\"):\n"
    "  disk N fails | vanishes | appears | joins | detaches | attaches\n"
    "  array N checks | repairs | stops\n"
    "  volume G-N fills 95% | is active | is inactive | is busy | is idle\n"
    "  controller volume N degrades | fails | rebuilds | recovers\n"
    "  controller temperature 61.5\n"
    "  unit U vanishes | appears | loses its link | finds its link\n"
    "  unit U disk N fails | vanishes | appears\n"
    "  unit U volume degrades | fails | rebuilds | recovers\n"
    "  unit U temperature 88 | voltage 1.1\n"
    "  report is missing | is truncated | is garbled | rewrites 5s | works again\n"
    "  temperature N is 78 | latches | faults | recovers\n"
    "  sensor N is missing | works again\n"
    "  voltage N is 5.6 | latches | faults | recovers\n"
    "  fan N slows 700 | stops | recovers\n"
    "  input is 3F\n"
    "  file system PATH fills 96%\n"
    "  processor load 97%\n"
    "  swap use 12%\n"
    "  power fails | returns\n"
    "  ups is silent | works again\n"
    "  port N loses its link | gets its link | runs at 100\n"
    "  bond fails over\n"
    "  event fan N | thermal N | voltage N | ups | disk N | array N | port N\n"
    "  drive gets blank | appendable | complete | unknown MEDIUM [with N MB used]\n"
    "  drive loses its disc | is a combo | is a burner | writes at N | vanishes | appears\n"
    "  tool NAME hangs 30s | prints \"TEXT\" | exits N | is missing | works again";

class HelpPage : public CLI::Formatter {
  public:
    std::string make_usage(const CLI::App *, std::string) const override {
        return "Usage: zavsim [OPTIONS] -- COMMAND [ARG...]\n";
    }
};

[[noreturn]] void fail_usage(const std::string &message) {
    fmt::print(stderr, "zavsim: {}\n", message);
    std::exit(exit_usage);
}

void declare(CLI::App &app, Options &options) {
    app.add_option("--model", options.model, "Appliance: model and number of disks")
        ->check(CLI::IsMember(model_names()))
        ->capture_default_str();
    app.add_option("--level", options.level,
                   "Level of the data array (default raid5 with four disks, raid1 with two)")
        ->check(CLI::IsMember(level_names()));
    app.add_option("--units", options.units, "Expansion units of a 2980")
        ->check(CLI::Range(0, most_units))
        ->capture_default_str();
    app.add_option("--product", options.product, "Product name in the BIOS (default: the model's)");
    app.add_option("--serial", options.serial, "Serial number in the BIOS");
    app.add_option("--raidtype", options.raidtype, "Line of /etc/Kiru/raidtype");
    app.add_option("--tools", options.tools,
                   "Whose texts the tools print: the appliance's own, or a current Linux's")
        ->check(CLI::IsMember({"appliance", "current"}))
        ->capture_default_str();
    app.add_option("--hosts", options.hosts,
                   "Where sysfs has the disk controller's hosts: in its directory, or below ataN")
        ->check(CLI::IsMember({"direct", "ata"}))
        ->capture_default_str();
    app.add_option("--nics", options.nics, "Ethernet ports: none, two, or two in a bond")
        ->check(CLI::IsMember(network_kinds()))
        ->capture_default_str();
    app.add_option("--time-scale", options.time_scale, "Appliance seconds per real second")
        ->check(CLI::Range(0.01, 100000.0))
        ->capture_default_str();
    app.add_option("--scenario", options.scenario_file, "File of things that happen at times");
    app.add_option("--shell", options.shell, "What /bin/sh is (the appliance's is bash)")
        ->check(CLI::IsMember({"bash", "dash"}))
        ->capture_default_str();
    app.add_flag("--bare", options.bare, "The private root alone: no model, tools or shim");
}

std::string read_scenario(const std::string &file) {
    std::ifstream in(file);
    if (!in)
        fail_usage(fmt::format("{}: cannot be read", file));
    std::string text{std::istreambuf_iterator<char>(in), {}};
    const Scenario scenario = parse_scenario(text, file);
    for (const std::string &error : scenario.errors)
        fmt::print(stderr, "{}\n", error);
    if (!scenario.errors.empty())
        std::exit(exit_usage);
    return text;
}

// A level that the number of disks cannot carry is a mistake, not an appliance.
void check_level(const Options &options) {
    const std::string reason = level_problem(options.model, options.level);
    if (!reason.empty())
        fail_usage(reason);
}

} // namespace

std::string to_word(const Options &options) {
    std::string word;
    for (const std::uint8_t byte : nlohmann::json::to_msgpack(options))
        word += fmt::format("{:02x}", byte);
    return word;
}

Options options_of(const std::string &word) {
    std::vector<std::uint8_t> bytes;
    for (std::size_t i = 0; i + 1 < word.size(); i += 2)
        bytes.push_back(static_cast<std::uint8_t>(std::stoi(word.substr(i, 2), nullptr, 16)));
    return nlohmann::json::from_msgpack(bytes).get<Options>();
}

Options parse_command_line(int argc, char **argv) {
    Options options;
    const auto words = std::vector<std::string>(argv + 1, argv + argc);
    const auto dashes = std::find(words.begin(), words.end(), "--");
    CLI::App app{description, "zavsim"};
    app.formatter(std::make_shared<HelpPage>());
    app.footer(footer);
    declare(app, options);
    // CLI11 takes its words last first.
    std::vector<std::string> own(std::make_reverse_iterator(dashes), words.rend());
    try {
        app.parse(own);
    } catch (const CLI::ParseError &error) {
        std::exit(app.exit(error) == 0 ? 0 : exit_usage);
    }
    if (dashes == words.end() || dashes + 1 == words.end())
        fail_usage("no command given: zavsim [OPTIONS] -- COMMAND [ARG...]");
    options.command.assign(dashes + 1, words.end());
    check_level(options);
    if (app.count("--units") != 0 && !has_controller(options.model))
        fail_usage(
            fmt::format("model {} has no expansion units, --units does not apply", options.model));
    if (!options.scenario_file.empty())
        options.scenario = read_scenario(options.scenario_file);
    return options;
}

} // namespace zavsim
