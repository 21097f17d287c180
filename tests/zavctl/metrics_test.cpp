// The metrics, read by a parser that takes the format strictly.
#include "core/metrics.h"

#include <gtest/gtest.h>
#include <map>
#include <regex>
#include <set>
#include <sstream>

using namespace zavctl;

namespace {

// What the exposition format allows: HELP, TYPE and the samples of a family together, each family
// once, each series once.
class Parser {
  public:
    explicit Parser(const std::string &text) {
        EXPECT_TRUE(text.empty() || text.back() == '\n');
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);)
            read(line);
    }

    // The value of a series as it is written, "" if there is none.
    std::string value(const std::string &series) const {
        const auto found = series_.find(series);
        return found == series_.end() ? "" : found->second;
    }
    bool has(const std::string &family) const { return families_.count(family) > 0; }

  private:
    void read(const std::string &line) {
        static const std::regex help(R"(# HELP ([a-zA-Z_:][a-zA-Z0-9_:]*) (\S[^\n]*\.))");
        static const std::regex type(R"(# TYPE ([a-zA-Z_:][a-zA-Z0-9_:]*) gauge)");
        static const std::regex sample(
            R"re((([a-z_]+)(\{([a-z_]+="([^"\\\n]|\\\\|\\"|\\n)*")(,[a-z_]+="([^"\\\n]|\\\\|\\"|\\n)*")*\})?) (-?[0-9]+(\.[0-9]+)?(e[-+][0-9]+)?))re");
        std::smatch match;
        if (std::regex_match(line, match, help)) {
            EXPECT_TRUE(families_.insert(match[1]).second) << "twice: " << line;
            family_ = match[1];
            typed_ = false;
        } else if (std::regex_match(line, match, type)) {
            EXPECT_EQ(match[1], family_) << line;
            EXPECT_FALSE(typed_) << line;
            typed_ = true;
        } else if (std::regex_match(line, match, sample)) {
            EXPECT_EQ(match[2], family_) << line;
            EXPECT_TRUE(typed_) << line;
            EXPECT_TRUE(series_.emplace(match[1], match[8]).second) << "twice: " << line;
        } else {
            ADD_FAILURE() << "no line of the format: " << line;
        }
    }

    std::map<std::string, std::string> series_;
    std::set<std::string> families_;
    std::string family_;
    bool typed_ = false;
};

Section section(const char *key, Json records) {
    Section one;
    one.key = key;
    one.records = std::move(records);
    return one;
}

Section model() {
    return section("model", {{"model", "2860_4hdd"},
                             {"product_name", "SV-2860"},
                             {"serial", "AB\"12\\34\n"},
                             {"error", nullptr}});
}

Parser metrics(std::vector<Section> sections) {
    sections.insert(sections.begin(), model());
    return Parser(metrics_text({"metrics", "", std::move(sections)}, 1.25));
}

Json disk(const char *id, const char *state, const char *severity) {
    return {{"id", id}, {"state", state}, {"severity", severity}};
}

Json sensor(const char *name, const char *kind, const Json &value, const char *state) {
    return {{"sensor", name}, {"kind", kind},   {"number", 1},      {"place", "LT"},
            {"value", value}, {"state", state}, {"latched", false}, {"severity", "ok"}};
}

} // namespace

TEST(Metrics, TellTheApplianceAndHowLongItTook) {
    const Parser all = metrics({});
    EXPECT_EQ(all.value("zav_up"), "1");
    EXPECT_EQ(all.value("zav_scrape_duration_seconds"), "1.25");
    EXPECT_EQ(all.value("zav_state{state=\"ok\"}"), "1");
}

TEST(Metrics, EscapeWhatLabelsMayNotHold) {
    EXPECT_EQ(metrics({}).value("zav_info{model=\"2860_4hdd\",product=\"SV-2860\","
                                "serial=\"AB\\\"12\\\\34\\n\"}"),
              "1");
}

TEST(Metrics, AStateIsOneSeriesPerState) {
    const Parser all = metrics({section("disks", {disk("3", "failed", "critical")})});
    EXPECT_EQ(all.value("zav_disk_state{disk=\"3\",state=\"failed\"}"), "1");
    EXPECT_EQ(all.value("zav_disk_state{disk=\"3\",state=\"found\"}"), "0");
    EXPECT_EQ(all.value("zav_disk_state{disk=\"3\",state=\"unknown\"}"), "0");
}

TEST(Metrics, AStateThatIsNotBelievedIsUnknown) {
    const Parser all = metrics({section("disks", {disk("3", "found", "unknown")})});
    EXPECT_EQ(all.value("zav_disk_state{disk=\"3\",state=\"found\"}"), "0");
    EXPECT_EQ(all.value("zav_disk_state{disk=\"3\",state=\"unknown\"}"), "1");
    EXPECT_EQ(all.value("zav_answered{object=\"disk 3\"}"), "0");
}

TEST(Metrics, AUnitWithAHotProcessorIsStillPresent) {
    const Parser all = metrics({section(
        "units", {{{"unit", 2},
                   {"state", "present"},
                   {"severity", "critical"},
                   {"temperature", {{"value", 88.5}, {"state", "alarm"}, {"severity", "critical"}}},
                   {"voltage", nullptr}}})});
    EXPECT_EQ(all.value("zav_unit_state{unit=\"2\",state=\"present\"}"), "1");
    EXPECT_EQ(all.value("zav_unit_temperature_celsius{unit=\"2\"}"), "88.5");
    EXPECT_FALSE(all.has("zav_unit_voltage_volts"));
}

TEST(Metrics, ReadingsAreInTheirFamilies) {
    const Parser all = metrics({section("sensors", {sensor("thermal 1", "thermal", 45.0, "normal"),
                                                    sensor("volt 3", "volt", 5.03, "normal"),
                                                    sensor("fan 2", "fan", 0, "critical")})});
    EXPECT_EQ(all.value("zav_temperature_celsius{sensor=\"thermal 1\",place=\"LT\"}"), "45");
    EXPECT_EQ(all.value("zav_voltage_volts{sensor=\"volt 3\",place=\"LT\"}"), "5.03");
    EXPECT_EQ(all.value("zav_fan_speed_rpm{sensor=\"fan 2\",place=\"LT\"}"), "0");
    EXPECT_EQ(all.value("zav_sensor_alarm_latched{sensor=\"fan 2\"}"), "0");
}

TEST(Metrics, WhatGaveNoNumberHasNoSeries) {
    EXPECT_FALSE(metrics({section("sensors", {sensor("thermal 1", "thermal", nullptr, "unknown")})})
                     .has("zav_temperature_celsius"));
}

TEST(Metrics, PercentAreRatiosAndMegabitsBytes) {
    const Parser all = metrics(
        {section("ups",
                 {{"state", "on battery"}, {"charge_percent", 98.5}, {"severity", "warning"}}),
         section("arrays", {{{"id", "2"},
                             {"state", "resync"},
                             {"rebuild_percent", 37.0},
                             {"severity", "warning"}}}),
         section("logical_volumes", {{{"volume", "1-2"},
                                      {"state", "normal"},
                                      {"mount_point", "/mnt/internal/data1-2"},
                                      {"usage_percent", 57.0},
                                      {"severity", "ok"}}}),
         section("nics",
                 {{{"nic", "eth0"}, {"link", "up"}, {"speed_mbit", 1000}, {"severity", "ok"}}}),
         section("load", {{{"probe", "file system"},
                           {"path", "/var"},
                           {"used_percent", 29.0},
                           {"severity", "ok"}}})});
    EXPECT_EQ(all.value("zav_ups_charge_ratio"), "0.985");
    EXPECT_EQ(all.value("zav_ups_state{state=\"on battery\"}"), "1");
    EXPECT_EQ(all.value("zav_array_rebuild_progress_ratio{array=\"2\"}"), "0.37");
    EXPECT_EQ(
        all.value("zav_volume_used_ratio{volume=\"1-2\",mountpoint=\"/mnt/internal/data1-2\"}"),
        "0.57");
    EXPECT_EQ(all.value("zav_network_up{device=\"eth0\"}"), "1");
    EXPECT_EQ(all.value("zav_network_speed_bytes_per_second{device=\"eth0\"}"), "125000000");
    EXPECT_EQ(all.value("zav_filesystem_used_ratio{mountpoint=\"/var\"}"), "0.29");
}

TEST(Metrics, AnUnknownModelIsDown) {
    const Section none = section("model", {{"model", "none"}, {"error", {{"code", 0x1301}}}});
    EXPECT_EQ(Parser(metrics_text({"metrics", "", {none}}, 0)).value("zav_up"), "0");
}
