// What is said of expansion units, and how their cascade is drawn.
#include "core/unit_tree.h"

#include "zav_api.h"

#include <cmath>
#include <cstring>
#include <gtest/gtest.h>

using namespace zavctl;

namespace {

constexpr int no_unit = -1;

sRBODSet no_units() {
    sRBODSet set;
    std::memset(&set, 0xFF, sizeof set);
    for (sRBOD &unit : set.RBOD)
        unit.iExist = 0;
    return set;
}

void add(sRBODSet &set, int number, int upper = no_unit, int lower = no_unit) {
    sRBOD &unit = set.RBOD[number - 1];
    unit = {};
    unit.iExist = 1;
    unit.id = number;
    std::strcpy(unit.model, "HBQE-T500");
    std::strcpy(unit.sn, "SN1");
    unit.parentid = number / 2;
    unit.upperchildid = upper;
    unit.lowerchildid = lower;
}

UnitSensor sensor(double value, int state = ZAV_RBOD_NORMAL) {
    UnitSensor report;
    report.value = value;
    report.state = state;
    doubt_reading(report);
    return report;
}

CascadeReport cascade_of(const sRBODSet &set) {
    CascadeReport cascade;
    cascade.units = units_of(set);
    for (UnitReport &unit : cascade.units) {
        unit.temperature = sensor(45);
        unit.voltage = sensor(1.2);
    }
    return cascade;
}

CascadeReport one_unit() {
    sRBODSet set = no_units();
    add(set, 1);
    return cascade_of(set);
}

CascadeReport five_units() {
    sRBODSet set = no_units();
    add(set, 1, 2, 3);
    add(set, 2, 4, 5);
    add(set, 3);
    add(set, 4);
    add(set, 5);
    return cascade_of(set);
}

std::string first_column(const CascadeReport &cascade, bool unicode) {
    Style style;
    style.unicode = unicode;
    std::string text;
    for (const UnitPlace &place : unit_places(cascade))
        text += drawn(place.branches, style) + std::to_string(place.unit->number) + "\n";
    return text;
}

Severity worst_of(const Section &section) {
    return severity(Answer{"unit list", "", {section}});
}

std::string summary_of(const Section &section) {
    return summary(Answer{"unit list", "", {section}});
}

} // namespace

TEST(UnitTree, ChildrenHangBelowTheirParentsTheUpperOneFirst) {
    EXPECT_EQ(first_column(five_units(), false), "`-- 1\n"
                                                 "    |-- 2\n"
                                                 "    |   |-- 4\n"
                                                 "    |   `-- 5\n"
                                                 "    `-- 3\n");
}

TEST(UnitTree, ATerminalThatCanGetsBoxDrawing) {
    EXPECT_EQ(first_column(five_units(), true), "└── 1\n"
                                                "    ├── 2\n"
                                                "    │   ├── 4\n"
                                                "    │   └── 5\n"
                                                "    └── 3\n");
}

TEST(UnitTree, BothDrawingsHaveTheSameColumns) {
    const Section section = unit_list_section(five_units());
    Style unicode;
    unicode.unicode = true;
    const std::string ascii = section.table.text({});
    EXPECT_EQ(columns(section.table.text(unicode)), columns(ascii));
    EXPECT_NE(ascii.find("|   |-- unit 4  HBQE-T500  SN1"), std::string::npos) << ascii;
}

TEST(UnitTree, AUnitWithoutAParentHangsOnTheController) {
    sRBODSet set = no_units();
    add(set, 1);
    add(set, 6);
    EXPECT_EQ(first_column(cascade_of(set), false), "|-- 1\n`-- 6\n");
}

TEST(UnitTree, LinksInACircleEnd) {
    CascadeReport cascade = five_units();
    cascade.units[0].parent = 4;
    EXPECT_EQ(unit_places(cascade).size(), cascade.units.size());
}

TEST(UnitReport, ALinkThatLeadsToNoUnitShowsItAsMissing) {
    sRBODSet set = no_units();
    add(set, 1, 2, no_unit);
    add(set, 2, 4, 5);
    add(set, 4);
    const CascadeReport cascade = cascade_of(set);
    const Section section = unit_list_section(cascade);
    EXPECT_EQ(summary_of(section), "CRITICAL: unit 5 does not answer");
    EXPECT_EQ(first_column(cascade, false), "`-- 1\n    `-- 2\n        |-- 4\n        `-- 5\n");
    EXPECT_EQ(section.records[3]["state"], "missing");
    EXPECT_NE(section.table.text({}).find("a link of unit 2 leads to it"), std::string::npos);
}

TEST(UnitReport, ALinkBeyondTheSeventhUnitCannotBeTold) {
    sRBODSet set = no_units();
    add(set, 1, 2, no_unit);
    add(set, 2, 4, no_unit);
    add(set, 4, 8, no_unit);
    const Section section = unit_list_section(cascade_of(set));
    EXPECT_EQ(summary_of(section), "COULD NOT TELL: unit 8 gives no answer to trust");
}

TEST(UnitReport, AUnitAskedForThatIsNotThereIsCritical) {
    CascadeReport cascade;
    UnitReport unit;
    unit.number = 3;
    unit.asked_for = true;
    cascade.units = {unit};
    EXPECT_EQ(summary_of(unit_show_section(cascade)), "CRITICAL: unit 3 is not there");
}

TEST(UnitReport, SensorStatesHaveTheirSeverity) {
    EXPECT_EQ(severity(sensor(45)), Severity::ok);
    EXPECT_EQ(severity(sensor(78, ZAV_RBOD_WARN)), Severity::warning);
    EXPECT_EQ(severity(sensor(88, ZAV_RBOD_ALARM)), Severity::critical);
    EXPECT_EQ(severity(sensor(88, ZAV_RBOD_FAIL)), Severity::critical);
    EXPECT_EQ(severity(sensor(88, 7)), Severity::unknown);
}

TEST(UnitReport, AReadingOfZeroOrNoNumberIsNoAnswer) {
    for (const double value : {0.0, std::nan(""), static_cast<double>(INFINITY)})
        for (const int state : {ZAV_RBOD_NORMAL, ZAV_RBOD_ALARM}) {
            const UnitSensor report = sensor(value, state);
            EXPECT_EQ(severity(report), Severity::unknown) << value;
            EXPECT_NE(report.doubt, "");
            EXPECT_EQ(sensor_text(report, "{:.1f} C"), "unknown");
        }
}

TEST(UnitReport, AHotUnitIsToldWithItsReading) {
    CascadeReport cascade = one_unit();
    cascade.units[0].temperature = sensor(78, ZAV_RBOD_WARN);
    EXPECT_EQ(summary_of(unit_list_section(cascade)),
              "WARNING: unit 1 has temperature 78.0 C (warning)");
}

TEST(UnitReport, TheJsonHoldsEveryField) {
    CascadeReport cascade = one_unit();
    cascade.units[0].enclosure.readings = {45.0, std::nullopt};
    cascade.units[0].enclosure.no_set = "none";
    const Json json = unit_json(cascade.units[0]);
    EXPECT_EQ(json["kind"], "unit");
    EXPECT_EQ(json["unit"], 1);
    EXPECT_EQ(json["state"], "present");
    EXPECT_EQ(json["present"], true);
    EXPECT_EQ(json["model"], "HBQE-T500");
    EXPECT_EQ(json["sas_address"], nullptr);
    EXPECT_EQ(json["parent"], 0);
    EXPECT_EQ(json["upper_child"], nullptr);
    EXPECT_EQ(json["temperature"]["value"], 45.0);
    EXPECT_EQ(json["temperature"]["state"], "normal");
    EXPECT_EQ(json["voltage"]["severity"], "ok");
    EXPECT_EQ(json["readings"], Json({45.0, nullptr}));
    EXPECT_EQ(json["raid_set"], nullptr);
    EXPECT_EQ(json["error"], nullptr);
}

TEST(UnitReport, ADiscoveryThatFailedIsToldOnce) {
    CascadeReport cascade;
    cascade.failure = Failure{128, "ZAV_RC_ERR", "a step failed"};
    const Section section = unit_list_section(cascade);
    EXPECT_EQ(worst_of(section), Severity::unknown);
    EXPECT_EQ(summary_of(section), "COULD NOT TELL: the expansion units cannot be told: a step "
                                   "failed (ZAV_RC_ERR, code 128)");
}

TEST(UnitReport, AMissingScriptIsNoEmptyCascade) {
    CascadeReport cascade;
    cascade.doubt = "/usr/bin/query_sas.sh is missing or not executable";
    EXPECT_EQ(worst_of(unit_list_section(cascade)), Severity::unknown);
}

TEST(UnitReport, WithoutUnitsNothingIsWrong) {
    EXPECT_EQ(summary_of(unit_list_section({})), "OK: 0 expansion units present");
}
