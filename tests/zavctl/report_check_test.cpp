// What is said of a RAID controller's report.
#include "core/report_check.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

const std::string head = "PCI\nM:HBRC-R16\nS:HR25\nI:\n";
const std::string set = "R:1:MAINSET:2000.4:4:1234:0\n";
const std::string volume = "V:1:SYSTEMDATA:3:1200.2:0:1\n";
const std::string disks = "D:1:500.1:1\nD:2:500.1:1\nD:3:500.1:4\nD:4:0.0:2\n";
const std::string monitor = "H:52.0:3300:12.10:5.05:3.33\n";
const std::string own = head + set + volume + disks + monitor;

std::string unit_section(int number, const std::string &body) {
    return "RBOD#" + std::to_string(number) + "\nM:HBQE-T500\nS:HQ" + std::to_string(number) +
           "\nI:\n" + body;
}

const std::string unit_body = "R:1:UNITSET:4000.8:4:1234:0\nV:1:DATA:3:3000.6:0:1\n"
                              "D:1:1000.2:1\nD:2:1000.2:1\nD:3:1000.2:1\nD:4:1000.2:1\n"
                              "H:45.0:2710:12.05:5.02:1.20\n";

Answer answer(const std::string &text) {
    return {"report check", "", report_sections(check_report("report", text))};
}

std::string screen(const std::string &text) {
    return to_text(answer(text), {});
}

// The remarks on the line that begins like this, each on a line.
std::string remarks_on(const std::string &text, const std::string &begin) {
    std::string said;
    for (const CheckedLine &line : check_report("report", text).lines)
        if (line.text.starts_with(begin))
            for (const ReportRemark &remark : line.remarks)
                said += mark(remark.severity) + " " +
                        (remark.unit ? std::to_string(*remark.unit) : "-") + " " + remark.text +
                        "\n";
    return said;
}

int status_of(const std::string &text) {
    return exit_status(severity(answer(text)));
}

bool holds(const std::string &text, const std::string &part) {
    return text.find(part) != std::string::npos;
}

} // namespace

TEST(ReportCheck, AReportThatIsReadAsItStandsIsClean) {
    EXPECT_EQ(status_of(own + unit_section(1, unit_body)), 0) << screen(own);
    EXPECT_TRUE(holds(screen(own), "OK: 11 lines, 1 enclosure told\n")) << screen(own);
}

TEST(ReportCheck, EveryLineIsToldWithWhatIsTaken) {
    EXPECT_EQ(remarks_on(own, "PCI"), "  0 the section begins\n");
    EXPECT_EQ(remarks_on(own, "R:"), "  0 RAID set 1 \"MAINSET\" 2000.4, 4 disks (1234)\n");
    EXPECT_EQ(remarks_on(own, "V:"),
              "  0 volume 1 \"SYSTEMDATA\" RAID5 1200.2 status 1 (normal)\n");
    EXPECT_EQ(remarks_on(own, "D:3"), "  0 disk 3 500.1 status 4 (failed)\n");
    EXPECT_EQ(remarks_on(own, "D:4"), "  0 disk 4 no size: absent\n");
    EXPECT_EQ(remarks_on(own, "H:"), "  0 ends the section of the controller\n"
                                     "  0 readings 52.00, 3300.00, 12.10, 5.05\n");
}

TEST(ReportCheck, ModelAndSerialNumberAreAUnits) {
    const std::string text = own + unit_section(2, unit_body);
    EXPECT_EQ(remarks_on(text, "S:HQ2"), "  2 serial number \"HQ2\"\n");
    EXPECT_TRUE(holds(screen(text), "Serial number             HQ2")) << screen(text);
}

TEST(ReportCheck, LinesOutsideOfSectionsAreIgnored) {
    EXPECT_EQ(remarks_on("# written by hand\n" + own, "#"), "  - ignored: no section has begun\n");
    EXPECT_EQ(remarks_on("V:9:LOST:3:1:0:1\n" + own, "V:9"), "! - ignored: no section has begun\n");
    EXPECT_EQ(remarks_on(own + "D:9:1:1\n", "D:9"), "! - ignored: the section has ended\n");
}

TEST(ReportCheck, RowsBeyondTheReadersAreIgnored) {
    std::string volumes;
    for (int number = 1; number <= 7; ++number)
        volumes += "V:" + std::to_string(number) + ":DATA:3:1.0:0:1\n";
    EXPECT_EQ(remarks_on(head + set + volumes + disks + monitor, "V:7"),
              "! 0 ignored: a seventh volume\n");
    EXPECT_EQ(remarks_on(head + set + disks + "D:5:1.0:1\n" + monitor, "D:5"),
              "! 0 ignored: a fifth disk\n");
}

TEST(ReportCheck, ALongFieldRunsIntoTheNext) {
    const std::string text = head + set + "V:1:ABCDEFGHIJKLMNOPQR:3:1.0:0:1\n" + disks + monitor;
    EXPECT_TRUE(
        holds(remarks_on(text, "V:1"), "field of more than 15 characters runs into the next"))
        << remarks_on(text, "V:1");
    EXPECT_EQ(status_of(text), 1);
    const std::string fits = head + set + "V:1:ABCDEFGHIJKLMNO:3:1.0:0:1\n" + disks + monitor;
    EXPECT_EQ(status_of(fits), 0) << screen(fits);
}

TEST(ReportCheck, NumbersOutOfPlaceAreToldWithWhereTheyLand) {
    const auto on = [](const std::string &line) {
        return remarks_on(head + set + line + monitor, line.substr(0, 4));
    };
    EXPECT_EQ(on("V:0:ZERO:3:1.0:0:1\n"), "! 0 volume number 0 overwrites the set's own fields\n");
    EXPECT_EQ(on("V:99:FAR:3:1.0:0:1\n"),
              "! 0 volume number 99 lies outside the record: ignored\n");
    EXPECT_EQ(on("D:9:1.0:1\n"), "! 0 disk number 9 lies outside the record: ignored\n");
    EXPECT_EQ(on("D:0:1.0:1\n"), "! 0 disk number 0 overwrites volume 16\n");
}

TEST(ReportCheck, AnUnknownStatusIsToldWithItsNumber) {
    const std::string text = head + set + "V:1:DATA:3:1.0:0:3\n" + disks + monitor;
    EXPECT_TRUE(
        holds(remarks_on(text, "V:"), "! 0 volume 1 \"DATA\" RAID5 1.0 unknown status 3\n"));
}

TEST(ReportCheck, ALongLineIsReadInPieces) {
    const std::string text = own + "# " + std::string(100, 'x') + "\n";
    EXPECT_TRUE(holds(remarks_on(text, "#"), "line of more than 79 characters: read in pieces"));
    EXPECT_EQ(remarks_on(own + std::string(79, '#') + "\n", "#"),
              "  - ignored: the section has ended\n");
}

TEST(ReportCheck, AnotherUnitsMarkerBeginsASectionToo) {
    const std::string text = own + "RBOD#12\n" + unit_body;
    EXPECT_EQ(remarks_on(text, "RBOD#12"),
              "! 1 RBOD#1 is also found in this line (RBOD#12): the section begins here\n");
}

TEST(ReportCheck, ASectionWithoutAMonitorLineReadsTheNextOnes) {
    const std::string body = unit_body.substr(0, unit_body.find("H:"));
    const std::string text = own + unit_section(1, body) + unit_section(2, unit_body);
    const std::string said = remarks_on(text, "H:45");
    EXPECT_TRUE(holds(said, "! 1 this section has no monitor line: the next one's is read\n"))
        << said;
    EXPECT_TRUE(holds(said, "  2 readings 45.00, 2710.00, 12.05, 5.02, 1.20\n")) << said;
    EXPECT_EQ(status_of(text), 1);
}

TEST(ReportCheck, ASectionWithoutARaidSetIsUnusable) {
    const std::string text = own + unit_section(3, "H:45.0:2710:12.05:5.02:1.20\n");
    EXPECT_EQ(status_of(text), 2);
    EXPECT_TRUE(holds(screen(text), "CRITICAL: the section of unit 3 has no RAID set"))
        << screen(text);
}

TEST(ReportCheck, TheLastOfTwoRaidSetsWins) {
    const std::string text = head + set + "R:2:OTHER:1.0:2:12:0\n" + volume + disks + monitor;
    EXPECT_TRUE(holds(remarks_on(text, "R:2"), "! 0 replaces the RAID set before"));
    const ReportCheck check = check_report("report", text);
    EXPECT_EQ(check.enclosures[0].report.set->raidnum, 2);
}

TEST(ReportCheck, ReadingsOfZeroAreNoAnswer) {
    const std::string body = unit_body.substr(0, unit_body.find("H:")) + "H:45.0:1\n";
    EXPECT_TRUE(holds(remarks_on(own + unit_section(1, body), "H:45"),
                      "! 1 reading 4 (voltage) is no answer\n"));
}

TEST(ReportCheck, ASecondSectionOfAnEnclosureIsIgnored) {
    EXPECT_TRUE(
        holds(screen(own + own), " !        -> the controller: a second section: ignored\n"))
        << screen(own + own);
}

TEST(ReportCheck, WithoutTheControllersSectionTheReportIsUnusable) {
    EXPECT_EQ(status_of(""), 2);
    EXPECT_EQ(status_of(unit_section(1, unit_body)), 2);
}

TEST(ReportCheck, ControlCharactersAreShownHarmlessly) {
    const std::string text = own + "\033[31m\x80\n";
    EXPECT_TRUE(holds(screen(text), "\\x1b[31m\\x80")) << screen(text);
    EXPECT_EQ(to_json(answer(text)).find('\033'), std::string::npos);
}

TEST(ReportCheck, RemarksStayBelowTheirLineOnANarrowScreen) {
    Style narrow;
    narrow.width = 40;
    EXPECT_TRUE(holds(to_text(answer(own), narrow), "    5     R:1:MAINSET:2000.4:4:1234:0\n"
                                                    "          -> the controller: RAID set 1\n"
                                                    "          \"MAINSET\" 2000.4, 4 disks\n"
                                                    "          (1234)\n"))
        << to_text(answer(own), narrow);
}

TEST(ReportCheck, GarbageHasManyOddLinesAndAShortSummary) {
    std::string text;
    for (int line = 0; line < 200; ++line)
        text += std::string(static_cast<std::size_t>(line), 'V') + ":\x01:PCI:RBOD#1\n";
    const Answer said = answer(text);
    EXPECT_NE(exit_status(severity(said)), 0);
    EXPECT_LT(summary(said).size(), 600U) << summary(said);
}

TEST(ReportCheck, TheJsonHoldsLinesAndEnclosures) {
    const Json json = Json::parse(to_json(answer(own + unit_section(2, unit_body))));
    EXPECT_EQ(json["report"]["lines"], 22);
    EXPECT_EQ(json["lines"][5]["text"], "V:1:SYSTEMDATA:3:1200.2:0:1");
    EXPECT_EQ(json["lines"][5]["remarks"][0]["unit"], 0);
    EXPECT_EQ(json["enclosures"][1]["unit"], 2);
    EXPECT_EQ(json["enclosures"][1]["serial"], "HQ2");
    EXPECT_EQ(json["enclosures"][1]["volumes"][0]["name"], "DATA");
    EXPECT_EQ(json["enclosures"][0]["raid_set"]["size"], 2000.4);
    EXPECT_EQ(json["enclosures"][0]["disks"][2]["state"], "failed");
}
