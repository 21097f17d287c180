#include "report_check.h"

#include "raid_set.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstring>

namespace zavctl {

namespace {

constexpr std::size_t lines_named = 8; // in the last line of the screen

std::vector<std::string_view> lines_of(std::string_view text) {
    std::vector<std::string_view> lines;
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size() - 1) + 1;
        lines.push_back(text.substr(0, end));
        text.remove_prefix(end);
    }
    return lines;
}

// Why nobody takes anything from a line.
ReportRemark ignored(std::string_view line, const std::vector<EnclosureTrace> &traces) {
    const auto any = [&traces](bool (EnclosureTrace::*is)() const) {
        return std::any_of(traces.begin(), traces.end(),
                           [is](const EnclosureTrace &trace) { return (trace.*is)(); });
    };
    const std::string piece = pieces_of(line, zav::kReportPiece).front();
    const Severity severity = is_data(piece) ? Severity::warning : Severity::ok;
    if (trimmed(line).empty())
        return {Severity::ok, std::nullopt, "ignored: empty"};
    if (!any(&EnclosureTrace::started))
        return {severity, std::nullopt, "ignored: no section has begun"};
    if (!any(&EnclosureTrace::is_open))
        return {severity, std::nullopt, "ignored: the section has ended"};
    return {severity, std::nullopt, "ignored: nothing that the library reads begins like this"};
}

void add_remarks_of_form(std::string_view line, std::vector<ReportRemark> &remarks) {
    const std::vector<std::string> pieces = pieces_of(line, zav::kReportPiece);
    if (pieces.size() > 2 || (pieces.size() == 2 && pieces[1] != "\n"))
        remarks.push_back({Severity::warning, std::nullopt,
                           fmt::format("line of more than {} characters: read in pieces",
                                       zav::kReportPiece - 1)});
    if (line.find('\0') != std::string_view::npos)
        remarks.push_back({Severity::warning, std::nullopt,
                           "a NUL character hides what follows it in its piece"});
}

CheckedLine checked_line(std::size_t number, const LineContext &context,
                         std::vector<EnclosureTrace> &traces) {
    CheckedLine line{number, trimmed(context.line), {}};
    add_remarks_of_form(context.line, line.remarks);
    bool taken = false;
    for (EnclosureTrace &trace : traces)
        for (const ReportRemark &remark : trace.take(context)) {
            line.remarks.push_back(remark);
            taken = true;
        }
    if (!taken)
        line.remarks.push_back(ignored(context.line, traces));
    return line;
}

CheckedEnclosure checked_enclosure(const EnclosureTrace &trace) {
    CheckedEnclosure enclosure;
    enclosure.unit = trace.unit();
    enclosure.model = trace.identity().model;
    enclosure.serial = trace.identity().sn;
    enclosure.report = trace.report();
    enclosure.remarks = trace.remarks_at_end();
    enclosure.borrows_readings = trace.borrows_readings();
    return enclosure;
}

Severity worst(const std::vector<ReportRemark> &remarks) {
    Severity severity = Severity::ok;
    for (const ReportRemark &remark : remarks)
        severity = worse(severity, remark.severity);
    return severity;
}

// The lines that are not taken as they stand, in one sentence: a damaged report has hundreds.
void add_odd_lines(const ReportCheck &check, std::vector<Finding> &findings) {
    std::vector<std::string> odd;
    for (const CheckedLine &line : check.lines)
        if (worst(line.remarks) != Severity::ok)
            odd.push_back(fmt::format("{}", line.number));
    if (odd.empty())
        return;
    const std::size_t count = odd.size();
    if (count > lines_named) {
        odd.resize(lines_named);
        odd.push_back(fmt::format("{} more", count - lines_named));
    }
    findings.push_back({Severity::warning, fmt::format("line{} {} {} odd", count == 1 ? "" : "s",
                                                       listed(odd), count == 1 ? "is" : "are")});
}

} // namespace

ReportCheck check_report(const std::string &file, std::string_view text) {
    ReportCheck check;
    check.file = file;
    check.bytes = text.size();
    std::vector<EnclosureTrace> traces;
    for (int unit = controller; unit <= last_unit; ++unit)
        traces.emplace_back(unit);
    std::optional<int> owner;
    for (const std::string_view line : lines_of(text)) {
        const std::optional<int> marker = marker_of(line);
        owner = marker ? marker : owner;
        check.lines.push_back(
            checked_line(check.lines.size() + 1, {line, owner, marker.has_value()}, traces));
    }
    for (const EnclosureTrace &trace : traces)
        if (trace.started())
            check.enclosures.push_back(checked_enclosure(trace));
    return check;
}

std::vector<Finding> report_findings(const ReportCheck &check) {
    std::vector<Finding> findings;
    if (check.enclosures.empty() || check.enclosures.front().unit != controller)
        findings.push_back({Severity::critical, "there is no section of the controller"});
    for (const CheckedEnclosure &enclosure : check.enclosures)
        for (const ReportRemark &remark : enclosure.remarks)
            findings.push_back(
                {remark.severity, fmt::format("the section of {} {}",
                                              enclosure_words(enclosure.unit), remark.text)});
    add_odd_lines(check, findings);
    return findings;
}

} // namespace zavctl
