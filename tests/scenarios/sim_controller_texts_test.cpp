// What the hardware-RAID model's programs read: the controller's report and the SAS topology.
#include "model/json.hpp"
#include "model/texts_controller.hpp"
#include "sim_machines.hpp"

#include <algorithm>
#include <array>
#include <gtest/gtest.h>
#include <map>
#include <regex>
#include <sstream>

using namespace zavsim;

namespace {

const std::string controller_section = "PCI\n"
                                       "M:HBRC-R16\n"
                                       "S:HR25C01741\n"
                                       "I:\n"
                                       "R:1:MAINSET:2000.4:4:1234:0\n"
                                       "V:1:SYSTEMDATA:3:1200.2:0:1\n"
                                       "V:2:ARCHIVE:1:200.0:0:1\n"
                                       "D:1:500.1:1\n"
                                       "D:2:500.1:1\n"
                                       "D:3:500.1:1\n"
                                       "D:4:500.1:1\n"
                                       "H:52.0:3300:12.10:5.05:3.33\n";

// `rest` of the volume's line: level and size.
std::string unit_section(const std::string &number, const std::string &rest,
                         const std::string &monitor) {
    return "RBOD#" + number +
           "\n"
           "M:HBQE-T500\n"
           "S:HQ25U0030" +
           number +
           "\n"
           "I:\n"
           "R:1:UNIT" +
           number + "SET:4000.8:4:1234:0\nV:1:UNIT" + number + "VOL:" + rest +
           ":0:1\n"
           "D:1:1000.2:1\n"
           "D:2:1000.2:1\n"
           "D:3:1000.2:1\n"
           "D:4:1000.2:1\n"
           "H:" +
           monitor + "\n";
}

const std::string first_two_units = unit_section("1", "3:3000.6", "45.0:2710:12.05:5.02:1.20") +
                                    unit_section("2", "1:2000.4", "46.0:2720:12.05:5.02:1.20");

TEST(Report, OfAControllerWithoutUnits) {
    EXPECT_EQ(report_text(with_units(0)), controller_section);
}

TEST(Report, OfAControllerWithTwoUnits) {
    EXPECT_EQ(report_text(with_units(2)), controller_section + first_two_units);
}

TEST(Report, OfAControllerWithAllItsUnits) {
    EXPECT_EQ(report_text(with_units(7)),
              controller_section + first_two_units +
                  unit_section("3", "3:3000.6", "47.0:2730:12.05:5.02:1.20") +
                  unit_section("4", "1:2000.4", "48.0:2740:12.05:5.02:1.20") +
                  unit_section("5", "3:3000.6", "49.0:2750:12.05:5.02:1.20") +
                  unit_section("6", "1:2000.4", "50.0:2760:12.05:5.02:1.20") +
                  unit_section("7", "0:4000.8", "51.0:2770:12.05:5.02:1.20"));
}

std::vector<std::string> lines_of(const std::string &text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

std::vector<std::string> fields_of(const std::string &line, const std::string &separators) {
    std::vector<std::string> fields;
    for (std::size_t at = 0; (at = line.find_first_not_of(separators, at)) != std::string::npos;) {
        const std::size_t end = std::min(line.find_first_of(separators, at), line.size());
        fields.push_back(line.substr(at, end - at));
        at = end;
    }
    return fields;
}

// Readers take 15 characters of a field and 79 of a line, and end a section at the first "H:".
TEST(Report, KeepsToWhatItsReadersTake) {
    const State state = after(with_units(7), {"unit 7 temperature 200", "unit 7 voltage 20"});
    for (const std::string &line : lines_of(report_text(state))) {
        EXPECT_LE(line.size(), 79U) << line;
        EXPECT_TRUE(line.find("H:") == std::string::npos || line.rfind("H:", 0) == 0) << line;
        for (const std::string &field : fields_of(line, ":"))
            EXPECT_LE(field.size(), 15U) << line;
    }
}

TEST(Report, IsTheHardwareRaidModelsAlone) {
    EXPECT_FALSE(report_file(four_disks()));
    EXPECT_EQ(topology_text(four_disks()), "SAS topology, 0 expanders\n\n");
}

TEST(Report, CanBeMissing) {
    EXPECT_FALSE(report_file(after(with_units(2), {"report is missing"})));
}

TEST(Report, CanBeCutWithinALine) {
    const State state = after(with_units(2), {"report is truncated"});
    const std::string whole = report_text(state);
    const std::string half = *report_file(state);
    EXPECT_EQ(whole.rfind(half, 0), 0U);
    EXPECT_NEAR(static_cast<double>(half.size()), static_cast<double>(whole.size()) / 2, 80);
    EXPECT_NE(half.back(), '\n');
    EXPECT_NE(whole.at(half.size()), '\n');
}

TEST(Report, IsCutWithinALineWhereverItsMiddleIs) {
    EXPECT_EQ(first_half("abcdef"), "abc");
    EXPECT_EQ(first_half("ab\ncde"), "ab\nc");   // the middle is behind the line's end
    EXPECT_EQ(first_half("abc\ndef"), "abc\nd"); // or before it
}

TEST(Report, CanBeRubbish) {
    const std::string text = *report_file(after(with_units(2), {"report is garbled"}));
    EXPECT_NE(text.find('\0'), std::string::npos);
    EXPECT_EQ(text.find("PCI"), std::string::npos);
    EXPECT_EQ(text.find("RBOD#"), std::string::npos);
    const auto lines = lines_of(text);
    EXPECT_TRUE(std::any_of(lines.begin(), lines.end(),
                            [](const std::string &line) { return line.size() > 256; }));
}

TEST(Report, WorksAgain) {
    for (const char *fault : {"report is missing", "report is truncated", "report is garbled"})
        EXPECT_EQ(report_file(after(with_units(2), {fault, "report works again"})),
                  report_text(with_units(2)));
}

TEST(Topology, OfTwoUnits) {
    const std::string head = "Expander HBQE-T500  phys: 18\n";
    EXPECT_EQ(topology_text(with_units(2)),
              "SAS topology, 2 expanders\n\n" + head +
                  "phy   0:D:attached:[5001B4D5008FF01F800:00  V i(SSP+SMP) t(SSP)]  6 Gbps\n"
                  "phy   4:S:attached:[5001B4D5008FF03F:03 exp t(SMP)]  6 Gbps\n"
                  "phy   5:S:attached:[5001B4D5008FF03F:03 exp t(SMP)]  6 Gbps\n"
                  "phy   8:S:attached:[0000000000000000:00]\n"
                  "phy   9:S:attached:[0000000000000000:00]\n"
                  "phy  10:S:attached:[0000000000000000:00]\n"
                  "phy  11:S:attached:[0000000000000000:00]\n"
                  "phy  14:T:attached:[5000C500A100000C:00  t(SATA)]  6 Gbps\n"
                  "phy  15:T:attached:[5000C500A100000D:00  t(SATA)]  6 Gbps\n"
                  "phy  16:T:attached:[5000C500A100000E:00  t(SATA)]  6 Gbps\n"
                  "phy  17:T:attached:[5000C500A100000F:00  t(SATA)]  6 Gbps\n\n" +
                  head +
                  "phy   0:D:attached:[5001B4D5008FF03F800:00  V i(SSP+SMP) t(SSP)]  6 Gbps\n"
                  "phy   4:S:attached:[500605B000C7F540:02  i(SSP+STP+SMP)]  6 Gbps\n"
                  "phy   5:S:attached:[500605B000C7F540:02  i(SSP+STP+SMP)]  6 Gbps\n"
                  "phy   8:S:attached:[0000000000000000:00]\n"
                  "phy   9:S:attached:[0000000000000000:00]\n"
                  "phy  10:S:attached:[5001B4D5008FF01F:05 exp t(SMP)]  6 Gbps\n"
                  "phy  11:S:attached:[5001B4D5008FF01F:05 exp t(SMP)]  6 Gbps\n"
                  "phy  14:T:attached:[5000C500A1000007:00  t(SATA)]  6 Gbps\n"
                  "phy  15:T:attached:[5000C500A1000008:00  t(SATA)]  6 Gbps\n"
                  "phy  16:T:attached:[5000C500A1000009:00  t(SATA)]  6 Gbps\n"
                  "phy  17:T:attached:[5000C500A100000A:00  t(SATA)]  6 Gbps\n\n");
}

struct Links {
    bool at_controller = false;
    std::string up;
    std::string lower;
    std::string upper;
};

// Reads as the appliance's software does: the expander's own phy, the one upstream, then the lower
// and at last the upper one downstream. By address without its last three characters.
std::map<std::string, Links> read_topology(const std::string &text) {
    std::map<std::string, Links> expanders;
    std::string current;
    for (const std::string &line : lines_of(text)) {
        const auto fields = fields_of(line, ":[]");
        const std::string address = fields.size() > 3 ? fields[3].substr(0, 16) : "";
        if (line.find("phy   0") != std::string::npos) {
            EXPECT_EQ(fields[3].size(), 19U) << line;
            current = address;
        } else if (line.find("phy   4") != std::string::npos) {
            expanders[current].up = address;
            expanders[current].at_controller = line.find("SSP+STP+SMP") != std::string::npos;
        } else if (line.find("phy   8") != std::string::npos) {
            expanders[current].lower = address;
        } else if (line.find("phy  10") != std::string::npos) {
            expanders[current].upper = address;
            current = "behind the last link";
        }
    }
    EXPECT_EQ(expanders.count("behind the last link"), 0U);
    return expanders;
}

// The addresses by the numbers that the units have of their places.
std::map<int, std::string> places_in(const std::map<std::string, Links> &expanders) {
    std::map<int, std::string> places;
    for (const auto &[address, links] : expanders)
        if (links.at_controller)
            places[1] = address;
    for (int unit = 1; unit < 8; ++unit) {
        const auto found = expanders.find(places.count(unit) == 0 ? "" : places[unit]);
        if (found == expanders.end())
            continue;
        if (found->second.upper != "0000000000000000")
            places[2 * unit] = found->second.upper;
        if (found->second.lower != "0000000000000000")
            places[2 * unit + 1] = found->second.lower;
    }
    return places;
}

TEST(Topology, LeadsToEveryUnitByItsPlace) {
    const State state = with_units(7);
    const auto expanders = read_topology(topology_text(state));
    const auto places = places_in(expanders);
    EXPECT_EQ(expanders.size(), 7U);
    ASSERT_EQ(places.size(), 7U);
    for (int unit = 1; unit <= 7; ++unit)
        EXPECT_EQ(places.at(unit),
                  state.controller->enclosures.at(static_cast<std::size_t>(unit)).address);
}

TEST(Topology, LeadsBackToTheController) {
    const auto expanders = read_topology(topology_text(with_units(7)));
    const auto places = places_in(expanders);
    EXPECT_EQ(expanders.at(places.at(1)).up, "500605B000C7F540");
    for (int unit = 2; unit <= 7; ++unit) {
        EXPECT_EQ(expanders.at(places.at(unit)).up, places.at(unit / 2));
        EXPECT_FALSE(expanders.at(places.at(unit)).at_controller);
    }
}

TEST(Topology, HasNoExpanderWithoutUnits) {
    EXPECT_TRUE(read_topology(topology_text(with_units(0))).empty());
}

TEST(Topology, ShowsALinkThatIsLost) {
    const State lost = after(with_units(3), {"unit 3 loses its link"});
    const std::string address = lost.controller->enclosures.at(3).address;
    EXPECT_EQ(read_topology(topology_text(lost)).at(address).up, "0000000000000000");
    EXPECT_EQ(report_text(lost), report_text(with_units(3)));
    EXPECT_EQ(topology_text(after(lost, {"unit 3 finds its link"})), topology_text(with_units(3)));
}

TEST(Topology, OfAFirstUnitWithoutItsLinkIsNowhereAtTheController) {
    const State lost = after(with_units(2), {"unit 1 loses its link"});
    EXPECT_EQ(topology_text(lost).find("SSP+STP+SMP"), std::string::npos);
}

TEST(ControllerState, SurvivesTheStateFile) {
    const State state = after(with_units(3), {"disk 1 vanishes", "disk 1 appears",
                                              "unit 2 disk 3 fails", "unit 3 loses its link",
                                              "report is truncated", "report rewrites 5s"});
    const State loaded = state_from_text(to_text(state));
    EXPECT_EQ(to_text(loaded), to_text(state));
    EXPECT_EQ(report_file(loaded), report_file(state));
}

} // namespace
