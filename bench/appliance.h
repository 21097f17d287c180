// The benchmark's appliance: a healthy four-disk model whose tools do nothing but print.
#pragma once

#include <string>

namespace bench {

// Lays down files, device names and tools. False, with a word to the user, outside a private root:
// the files belong to the system there.
bool set_up_appliance();

// A file with its directories. A link of that name goes first: it leads to the system's own file.
void put(const std::string &path, const std::string &text);

// A tool that prints this, see tool.c.
void put_tool(const std::string &path, const std::string &answer);

// Which model it is from now on.
constexpr const char *kSoftwareRaid = "SV-2860\n";
constexpr const char *kHardwareRaid = "SV-2980\n";
void become(const char *product);

// The directory of the built programs and libraries.
std::string build_directory();

} // namespace bench
