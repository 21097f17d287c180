// A checked report on the screen and in JSON.
#include "raid_set.h"
#include "report_check.h"
#include "verdict.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

constexpr std::size_t no_state = 2; // the table has no column of states

Json remark_json(const ReportRemark &remark) {
    Json json;
    json["unit"] = remark.unit ? Json(*remark.unit) : Json(nullptr);
    json["severity"] = word(remark.severity);
    json["text"] = remark.text;
    return json;
}

Json remarks_json(const std::vector<ReportRemark> &remarks) {
    Json list = Json::array();
    for (const ReportRemark &remark : remarks)
        list.push_back(remark_json(remark));
    return list;
}

std::string text_of(const ReportRemark &remark) {
    return remark.unit ? fmt::format("{}: {}", enclosure_words(*remark.unit), remark.text)
                       : remark.text;
}

void add_lines(const CheckedLine &line, Section &section) {
    section.table.add(Severity::ok, {fmt::format("{}", line.number), printable(line.text)});
    for (const ReportRemark &remark : line.remarks)
        section.table.add(remark.severity, {"", "-> " + text_of(remark)});
    Json json;
    json["kind"] = "report_line";
    json["line"] = line.number;
    json["text"] = line.text;
    json["remarks"] = remarks_json(line.remarks);
    section.records.push_back(json);
}

Section head_section(const ReportCheck &check) {
    Section section;
    section.key = "report";
    section.records = {{"kind", "report"},
                       {"file", check.file},
                       {"bytes", check.bytes},
                       {"lines", check.lines.size()}};
    section.findings = report_findings(check);
    section.well = fmt::format("{} lines, {}", check.lines.size(),
                               counted(check.enclosures.size(), "enclosure", "told"));
    return section;
}

Section lines_section(const ReportCheck &check) {
    Section section;
    section.key = "lines";
    if (check.lines.empty())
        return section;
    section.title = "What is read";
    section.table = Table({"LINE", "TEXT, AND WHAT IS TAKEN FROM IT"}, no_state);
    for (const CheckedLine &line : check.lines)
        add_lines(line, section);
    return section;
}

Details details_of(const CheckedEnclosure &enclosure) {
    Details details;
    details.add("Enclosure", enclosure_words(enclosure.unit));
    if (enclosure.unit != controller) {
        details.add("Model", enclosure.model.empty() ? "-" : printable(enclosure.model));
        details.add("Serial number", enclosure.serial.empty() ? "-" : printable(enclosure.serial));
    }
    add_enclosure(details, enclosure.report, enclosure.unit != controller);
    for (const ReportRemark &remark : enclosure.remarks)
        details.add("Note", remark.text, remark.severity);
    return details;
}

Json enclosure_json(const CheckedEnclosure &enclosure) {
    Json json;
    json["kind"] = "enclosure";
    json["unit"] = enclosure.unit;
    json["model"] = enclosure.model.empty() ? Json(nullptr) : Json(enclosure.model);
    json["serial"] = enclosure.serial.empty() ? Json(nullptr) : Json(enclosure.serial);
    add_enclosure(json, enclosure.report);
    json["remarks"] = remarks_json(enclosure.remarks);
    return json;
}

Section enclosures_section(const ReportCheck &check) {
    Section section;
    section.title = check.enclosures.empty() ? "" : "What the library answers";
    section.key = "enclosures";
    add_details(section, check.enclosures, details_of);
    for (const CheckedEnclosure &enclosure : check.enclosures)
        section.records.push_back(enclosure_json(enclosure));
    return section;
}

} // namespace

std::vector<Section> report_sections(const ReportCheck &check) {
    return {head_section(check), lines_section(check), enclosures_section(check)};
}

} // namespace zavctl
