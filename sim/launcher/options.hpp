// What the user asked zavsim for, and its way into the private root.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace zavsim {

// Exit statuses of <sysexits.h>, so that a script can tell its own mistake from the machine's
// refusal.
constexpr int exit_usage = 64;
constexpr int exit_os_error = 71;

struct Options {
    std::string model = "2860-4";
    std::string product;
    std::string serial;
    std::string raidtype;
    std::string level;
    std::string tools = "appliance";
    std::string hosts = "direct";
    std::string shell = "bash";
    std::string nics = "bond";
    std::string scenario;      // text of the scenario file, already checked
    std::string scenario_file; // its name, for messages
    double time_scale = 1.0;
    int units = 2;
    bool bare = false;
    bool has_shim = false;
    std::string directory;         // where COMMAND starts
    std::string program_directory; // where zavsim was found; its neighbours are on PATH
    std::vector<std::string> command;
};

NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Options, model, product, serial, raidtype, level, tools, hosts,
                                   shell, nics, scenario, scenario_file, time_scale, units, bare,
                                   has_shim, directory, program_directory, command)

// The options as one word of a command line, and back. Their texts are bytes, not characters.
std::string to_word(const Options &options);
Options options_of(const std::string &word);

// Reads the command line; on wrong usage or --help prints and ends the process.
Options parse_command_line(int argc, char **argv);

} // namespace zavsim
