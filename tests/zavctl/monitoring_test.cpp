// The line for monitoring schedulers.
#include "core/monitoring.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

Section section(const char *key, Json records, const char *well = "") {
    Section one;
    one.key = key;
    one.records = std::move(records);
    one.well = well;
    return one;
}

Section disks(Severity severity = Severity::ok, const char *is = "") {
    Section one = section("disks", {{{"id", "3"}, {"state", "found"}}}, "4 disks found");
    if (severity != Severity::ok)
        one.findings = {finding_about(severity, "disk", "3", is, is)};
    return one;
}

Section full_volume() {
    Section one = section("logical_volumes", {{{"volume", "1-2"}, {"usage_percent", 95.0}}});
    one.findings = {{Severity::warning, "volume 1-2 is 95 % full"}};
    return one;
}

PluginResult check(std::vector<Section> sections, const std::vector<std::string> &objects = {}) {
    return checked({"check", "", std::move(sections)}, objects);
}

} // namespace

TEST(Monitoring, AllWellIsOneLine) {
    const PluginResult result = check({disks()});
    EXPECT_EQ(result.output, "OK: 4 disks found\n");
    EXPECT_EQ(result.status, 0);
}

TEST(Monitoring, TheWorstIsFirstAndTheOthersAreLinesOfTheirOwn) {
    const PluginResult result = check({full_volume(), disks(Severity::critical, "has failed")});
    EXPECT_EQ(result.output,
              "CRITICAL: disk 3 has failed, and 1 more | 'volume 1-2'=95%;90;;0;100\n"
              "WARNING: volume 1-2 is 95 % full\n");
    EXPECT_EQ(result.status, 2);
}

TEST(Monitoring, CouldNotTellIsUnknown) {
    const PluginResult result = check({disks(Severity::unknown, "gives no answer to trust")});
    EXPECT_EQ(result.output, "UNKNOWN: disk 3 gives no answer to trust\n");
    EXPECT_EQ(result.status, 3);
}

TEST(Monitoring, OnlyTheChosenObjectsCount) {
    const PluginResult result =
        check({full_volume(), disks(Severity::critical, "has failed")}, {"lv"});
    EXPECT_EQ(result.output, "WARNING: volume 1-2 is 95 % full | 'volume 1-2'=95%;90;;0;100\n");
    EXPECT_EQ(result.status, 1);
}

TEST(Monitoring, AnObjectThatTheApplianceDoesNotHaveIsUnknown) {
    const PluginResult result = check({disks()}, {"unit"});
    EXPECT_EQ(result.output, "UNKNOWN: this appliance has no expansion unit\n");
    EXPECT_EQ(result.status, 3);
    EXPECT_EQ(check({section("ups", {{"state", "none"}})}, {"ups"}).output,
              "UNKNOWN: this appliance has no UPS\n");
}

TEST(Monitoring, AWordThatIsNoObjectIsUnknown) {
    const PluginResult result = check({disks()}, {"toaster"});
    EXPECT_EQ(result.status, 3);
    EXPECT_EQ(result.output, "UNKNOWN: 'toaster' is no object to check: there are disk, array, "
                             "unit, vg, lv, pv, sensor, nic, ups and load\n");
}

TEST(Monitoring, ABarInATextDoesNotBeginTheData) {
    Section one = section("disks", {{{"id", "1"}}});
    one.findings = {{Severity::warning, "a|b\nc"}};
    EXPECT_EQ(check({one}).output, "WARNING: a/b\\x0ac\n");
}

TEST(Monitoring, ReadingsHaveTheirLimits) {
    const Json limits = {{"critical_low", nullptr},
                         {"warning_low", nullptr},
                         {"warning_high", 65},
                         {"critical_high", 75}};
    const Json volts = {{"critical_low", 0.96},
                        {"warning_low", 1.08},
                        {"warning_high", 1.32},
                        {"critical_high", 1.44}};
    Section sensors = section("sensors",
                              {{{"sensor", "thermal 1"}, {"value", 45.0}, {"limits", limits}},
                               {{"sensor", "volt 1"}, {"value", 1.2}, {"limits", volts}},
                               {{"sensor", "fan 2"}, {"value", nullptr}, {"limits", nullptr}}},
                              "3 sensors normal");
    EXPECT_EQ(check({sensors}).output,
              "OK: 3 sensors normal | 'thermal 1'=45;65;75;; 'volt 1'=1.2;1.08:1.32;0.96:1.44;;\n");
}

TEST(Monitoring, UseAndChargeArePercent) {
    EXPECT_EQ(check({section("ups", {{"state", "online"}, {"charge_percent", 98.5}}, "UPS online"),
                     section("load",
                             {{{"probe", "file system"}, {"path", "/var"}, {"used_percent", 12.5}},
                              {{"probe", "swap"}, {"path", nullptr}, {"used_percent", 0.0}}})})
                  .output,
              "OK: UPS online | 'UPS charge'=98.5%;;;0;100 /var=12.5%;90;95;0;100 "
              "swap=0%;0;10;0;100\n");
}
