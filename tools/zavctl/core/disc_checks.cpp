#include "disc_checks.h"

#include <fmt/format.h>

#include <cstring>

namespace zavctl {

namespace {

Check node_check(const std::string &name, const std::string &node, bool there) {
    if (there)
        return {Severity::ok, name, node + " is there", ""};
    return {Severity::warning, name, node + " is missing",
            "no disc can be told, burned or erased: the library needs /dev/scd0 and /dev/cdrom"};
}

Check table_check(const BurnerPlatform &facts) {
    constexpr const char *table = "/proc/sys/dev/cdrom/info";
    const DriveKind kind = kind_of_drive(facts.drive);
    if (facts.table_error != 0)
        return {Severity::warning, "drive-table",
                fmt::format("{}: {}", table, std::strerror(facts.table_error)),
                "a drive that writes CDs alone is not told from others: it is handed DVDs as well"};
    if (kind == DriveKind::untold)
        return {Severity::warning, "drive-table",
                fmt::format("{} does not say what the drive writes", table),
                "a drive that writes CDs alone is not told from others: it is handed DVDs as well"};
    return {Severity::ok, "drive-table", drive_words(kind), ""};
}

Check tool_check(const ToolFact &tool) {
    if (!tool.found.empty())
        return {Severity::ok, tool.name, printable(tool.found) + ", for " + tool.purpose, ""};
    return {Severity::warning, tool.name, "not on the PATH", tool.without};
}

} // namespace

std::vector<Check> burner_checks(const BurnerPlatform &facts) {
    if (kind_of_drive(facts.drive) == DriveKind::none)
        return {{Severity::ok, "optical-drive", "none: nothing is needed for one", ""}};
    std::vector<Check> checks = {node_check("optical-drive", "/dev/scd0", facts.drive.scd0),
                                 node_check("drive-link", "/dev/cdrom", facts.drive.cdrom),
                                 table_check(facts)};
    for (const ToolFact &tool : facts.tools)
        checks.push_back(tool_check(tool));
    return checks;
}

} // namespace zavctl
