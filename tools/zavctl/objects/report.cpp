#include "../core/report_check.h"
#include "../system/files.h"
#include "asking.h"
#include "cascade.h"

#include <fmt/format.h>

#include <cstring>

namespace zavctl {

namespace {

constexpr VerbHelp check_help = {
    "Reads a RAID controller's report and says what the library takes from it",
    "FILE is a report, - is standard input; without it the appliance's own report is read,\n"
    "/etc/Kiru/zav/.raidinfo. Works on any machine. The library's own parser is asked.\n"
    "Shown: every line with what is taken from it for which enclosure, or why it is ignored; then\n"
    "what the library answers about each enclosure.\n"
    "Warning: a line is not taken as it stands, such as a volume number that lands elsewhere, a\n"
    "field or line that is too long, a section without an end or a monitor line.\n"
    "Critical: a section without a RAID set, or no section of the controller.\n"
    "Could not tell: the file cannot be read. The turn that the controller's agent and the\n"
    "library take at the report is not waited for: one that is being written may be cut off.",
    "  zavctl report check\n"
    "  zavctl report check raidinfo.txt\n"
    "  zavctl report check - --jsonl <raidinfo.txt | jq 'select(.kind == \"enclosure\")'",
};

Answer unreadable(const std::string &file, const std::string &why) {
    Section section;
    section.key = "report";
    section.records = nullptr;
    section.findings = {{Severity::unknown, fmt::format("{}: {}", printable(file), why)}};
    return {"report check", "", {std::move(section)}};
}

Answer check(const Session &session, const std::string &file) {
    const FileFact report = file == "-" ? session.streams.read_input() : read_file(file);
    const std::string name = file == "-" ? "standard input" : file;
    if (report.error != 0)
        return unreadable(name, std::strerror(report.error));
    if (report.text.size() >= largest_file)
        return unreadable(name, "larger than a megabyte, no report of a RAID controller");
    return {"report check", "", report_sections(check_report(name, report.text))};
}

} // namespace

void add_report(Command root, Session &session) {
    const Command report = add_object(root, "report", "The RAID controller's report: check");
    const auto file = std::make_shared<std::string>(controller_report);
    const Command verb = add_verb(report, session, "check", check_help);
    verb.add_option("FILE", *file, "The report, or - for standard input");
    verb.callback(
        [&session, file] { session.action = [&session, file] { return check(session, *file); }; });
}

} // namespace zavctl
