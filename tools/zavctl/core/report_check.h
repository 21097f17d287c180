// A report of the RAID controller, line by line: what the library takes from it.
#pragma once

#include "answer.h"
#include "report_trace.h"

#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

struct CheckedLine {
    std::size_t number = 0; // from 1
    std::string text;
    std::vector<ReportRemark> remarks;
};

struct CheckedEnclosure {
    int unit = 0; // 0: the controller
    std::string model;
    std::string serial;
    EnclosureReport report;
    std::vector<ReportRemark> remarks; // about the section as a whole
    bool borrows_readings = false;     // of the next section that has some
};

struct ReportCheck {
    std::string file;
    std::size_t bytes = 0;
    std::vector<CheckedLine> lines;
    std::vector<CheckedEnclosure> enclosures; // whose section begins somewhere
};

ReportCheck check_report(const std::string &file, std::string_view text);

std::vector<Finding> report_findings(const ReportCheck &check);

// The report, its lines, its enclosures.
std::vector<Section> report_sections(const ReportCheck &check);

} // namespace zavctl
