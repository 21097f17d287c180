// What is said alike about everything that was asked: how bad it is, why, and why in doubt.
#pragma once

#include "answer.h"

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// The fields that end every record.
void add_verdict(Json &json, Severity severity, const std::string &note, const std::string &doubt,
                 const std::optional<Failure> &failure);

// The lines that end what `show` says.
void add_verdict(Details &details, const std::string &note, const std::string &doubt);

// "1 disk found", "4 disks found"; the plural of the noun has an s.
std::string counted(std::size_t count, const std::string &noun, const std::string &is);

// The records of the reports and what is not well with them. `finding` is asked about those alone.
template <class Report, class MakeRecord, class MakeFinding>
Section section_of(const std::string &key, const std::vector<Report> &reports,
                   const MakeRecord &record, const MakeFinding &finding) {
    Section section;
    section.key = key;
    for (const Report &report : reports) {
        section.records.push_back(record(report));
        if constexpr (requires { report.record; })
            if (report.record)
                section.events.push_back(*report.record);
        if (severity(report) != Severity::ok)
            section.findings.push_back(finding(report));
    }
    return section;
}

// What `show` says about each of the reports.
template <class Report, class MakeDetails>
void add_details(Section &section, const std::vector<Report> &reports, const MakeDetails &details) {
    for (const Report &report : reports)
        section.details.push_back(details(report));
}

template <class Report>
std::size_t count_well(const std::vector<Report> &reports) {
    return static_cast<std::size_t>(
        std::count_if(reports.begin(), reports.end(),
                      [](const Report &report) { return severity(report) == Severity::ok; }));
}

} // namespace zavctl
