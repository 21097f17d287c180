// What changes between two rounds, and how the screen shows it.
#include "core/event.h"
#include "core/thing.h"
#include "core/watch_screen.h"

#include <algorithm>
#include <gtest/gtest.h>

using namespace zavctl;

namespace {

using Lines = std::vector<std::string>;

Section section(const std::string &key, Json records) {
    Section one;
    one.key = key;
    one.records = std::move(records);
    return one;
}

Answer answer(std::vector<Section> sections) {
    return {"watch", "Solvane 2860", std::move(sections)};
}

Json disk(const char *id, const char *state, const char *severity) {
    return {{"id", id}, {"state", state}, {"severity", severity}};
}

Answer disks(const Json &records) {
    return answer({section("disks", records)});
}

std::vector<Change> between(const Answer &before, const Answer &after) {
    return changes(things_of(before), things_of(after));
}

std::vector<std::string> texts(const std::vector<Change> &all) {
    std::vector<std::string> result;
    for (const Change &change : all)
        result.push_back(change_text(change));
    return result;
}

Json unit(const char *state, const char *temperature) {
    return {{"unit", 2},
            {"state", state},
            {"severity", "critical"},
            {"temperature", {{"value", 88.0}, {"state", temperature}, {"severity", "critical"}}},
            {"voltage", nullptr}};
}

Answer shown(const Lines &names, Severity severity, const char *state) {
    Section one = section("disks", Json::array());
    one.title = "Disks";
    one.table = Table({"DISK", "STATE"}, 1);
    for (const std::string &name : names)
        one.table.add(name == "3" ? severity : Severity::ok, {name, name == "3" ? state : "found"});
    one.well = "disks found";
    return answer({one});
}

WatchView view(Answer of) {
    WatchView one;
    one.answer = std::move(of);
    one.time = "12:03:41";
    one.round = 4;
    one.interval = 5;
    return one;
}

bool has_line(const Lines &lines, const std::string &text) {
    return std::find(lines.begin(), lines.end(), text) != lines.end();
}

} // namespace

TEST(Changes, AnotherStateIsOne) {
    const auto all =
        between(disks({disk("3", "found", "ok")}), disks({disk("3", "failed", "critical")}));
    ASSERT_EQ(all.size(), 1U);
    EXPECT_EQ(change_text(all[0]), "disk 3: found -> failed");
    EXPECT_EQ(all[0].severity, Severity::critical);
}

TEST(Changes, NothingHasChangedWhenAllIsAsItWas) {
    const Answer same = disks({disk("3", "found", "ok"), disk("2-3", "absent", "critical")});
    EXPECT_TRUE(between(same, same).empty());
}

TEST(Changes, AReadingThatMovesIsNone) {
    const auto fan = [](double value) {
        return answer({section(
            "sensors",
            {{{"sensor", "fan 2"}, {"value", value}, {"state", "normal"}, {"severity", "ok"}}})});
    };
    EXPECT_TRUE(between(fan(3000), fan(2990)).empty());
}

TEST(Changes, AStateThatIsNotBelievedAnyMoreIsOne) {
    EXPECT_EQ(
        texts(between(disks({disk("3", "found", "ok")}), disks({disk("3", "found", "unknown")}))),
        Lines{"disk 3: found -> found, not to be trusted"});
}

TEST(Changes, WhatAppearsAndWhatGoesAreTold) {
    EXPECT_EQ(texts(between(disks({disk("3", "found", "ok")}), disks({disk("4", "found", "ok")}))),
              (Lines{"disk 3: found -> not listed any more", "disk 4: not listed -> found"}));
}

TEST(Changes, AUnitAndItsSensorsAreThingsOfTheirOwn) {
    EXPECT_EQ(texts(between(answer({section("units", {unit("present", "normal")})}),
                            answer({section("units", {unit("present", "alarm")})}))),
              Lines{"unit 2 temperature: normal -> alarm"});
    EXPECT_EQ(texts(between(answer({section("units", {unit("present", "alarm")})}),
                            answer({section("units", {unit("missing", "alarm")})}))),
              Lines{"unit 2: present -> missing"});
}

TEST(Changes, EveryKindOfThingIsNamedAsItsEventsAre) {
    const Answer all = answer(
        {section("arrays", {{{"id", "2-1"}, {"state", "not_exist"}, {"severity", "critical"}}}),
         section("volume_groups", {{{"group", 1}, {"state", "normal"}, {"severity", "ok"}}}),
         section("physical_volumes",
                 {{{"volume", "0-1"}, {"state", "normal"}, {"severity", "ok"}}}),
         section("logical_volumes",
                 {{{"volume", "1-2"}, {"state", "full"}, {"severity", "warning"}}}),
         section("nics", {{{"nic", "eth0"}, {"link", "up"}, {"severity", "ok"}}}),
         section("ups", {{"state", "online"}, {"severity", "ok"}}),
         section(
             "load",
             {{{"probe", "file system"}, {"path", "/var"}, {"state", "normal"}, {"severity", "ok"}},
              {{"probe", "swap"}, {"path", nullptr}, {"state", "normal"}, {"severity", "ok"}}})});
    Lines subjects;
    for (const Thing &thing : things_of(all))
        subjects.push_back(thing.subject);
    EXPECT_EQ(subjects, (Lines{"array 2-1", "volume group 1", "physical volume 0-1", "volume 1-2",
                               "eth0", "UPS", "file system /var", "swap"}));
}

TEST(Changes, AsJsonHaveTimeSubjectAndStates) {
    const auto all =
        between(disks({disk("3", "found", "ok")}), disks({disk("3", "failed", "critical")}));
    EXPECT_EQ(change_json(all.at(0), "2026-11-22T12:03:41+01:00").dump(),
              R"({"kind":"change","time":"2026-11-22T12:03:41+01:00","key":"disks",)"
              R"("subject":"disk 3","before":"found","after":"failed","severity":"critical",)"
              R"("text":"disk 3: found -> failed"})");
}

TEST(ThingEvents, FollowFromWhatIsShown) {
    const Answer all =
        answer({section("sensors", {{{"sensor", "fan 2"},
                                     {"kind", "fan"},
                                     {"number", 2},
                                     {"value", 0.0},
                                     {"state", "critical"}}}),
                section("nics", {{{"nic", "eth0"},
                                  {"kind", "port"},
                                  {"number", 1},
                                  {"link", "not existing"},
                                  {"speed_mbit", nullptr}}}),
                section("ups", {{"state", "on battery"}, {"code", 5}, {"charge_percent", 98.5}}),
                section("load", {{{"probe", "file system"},
                                  {"path", "/var"},
                                  {"used_percent", 96.5},
                                  {"state", "critical"}}})});
    Lines told;
    for (const zavSystemEvent &event : events_of(all))
        told.push_back(event_text(event));
    EXPECT_EQ(told, (Lines{"fan 2: critical, 0 rpm", "eth0: not exist", "UPS: on battery, 98.5 %",
                           "file system /var: critical, 96.5 %"}));
}

TEST(ThingEvents, TheLibrarysOwnRecordsComeFirst) {
    Section one = section("disks", Json::array());
    one.events = {
        event_of(zavHddState{ZAV_EVENT_HDD, {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}, 4})};
    ASSERT_EQ(events_of(answer({one})).size(), 1U);
    EXPECT_EQ(event_subject(events_of(answer({one}))[0]), "disk 3");
}

TEST(ThingEvents, WhatGaveNoReadingHasNone) {
    EXPECT_TRUE(events_of(answer({section("sensors", {{{"sensor", "fan 2"},
                                                       {"kind", "fan"},
                                                       {"number", 2},
                                                       {"value", nullptr},
                                                       {"state", "unknown"}}})}))
                    .empty());
}

TEST(WatchScreen, HasTimeRoundAndSummaryAtTheTop) {
    const Lines lines = watch_lines(view(shown({"1", "3"}, Severity::ok, "found")), Style(), 0);
    ASSERT_GE(lines.size(), 3U);
    EXPECT_EQ(lines[0], "Solvane 2860");
    EXPECT_EQ(lines[1], "12:03:41  round 4, every 5 s; Ctrl-C ends");
    EXPECT_EQ(lines[2], "OK: disks found");
}

TEST(WatchScreen, StarsTheRowThatChanged) {
    Answer now = shown({"1", "3"}, Severity::critical, "failed");
    star_changes(now, shown({"1", "3"}, Severity::ok, "found"));
    const Lines lines = watch_lines(view(now), Style(), 0);
    EXPECT_TRUE(has_line(lines, "*X  3     failed"));
    EXPECT_TRUE(has_line(lines, "    1     found"));
}

TEST(WatchScreen, LeavesOutWhatIsWellWhereThereIsNoRoom) {
    const Answer many =
        shown({"1", "2", "3", "4", "5", "6", "7", "8"}, Severity::critical, "failed");
    const Lines lines = watch_lines(view(many), Style(), 10);
    EXPECT_LE(lines.size(), 10U);
    EXPECT_TRUE(has_line(lines, " X  3     failed"));
    EXPECT_FALSE(has_line(lines, "    1     found"));
    EXPECT_TRUE(has_line(lines, "The window is too small for what is well."));
}

TEST(WatchScreen, HasTheLastChangesAtTheBottomTheNewestFirst) {
    WatchView one = view(shown({"3"}, Severity::ok, "found"));
    one.recent = {"12:03:41  b", "12:03:36  a"};
    const Lines lines = watch_lines(one, Style(), 24);
    ASSERT_GE(lines.size(), 3U);
    EXPECT_EQ(Lines(lines.end() - 3, lines.end()),
              (Lines{"Last changes", "12:03:41  b", "12:03:36  a"}));
}

TEST(WatchScreen, NeverIsWiderOrHigherThanTheWindow) {
    Style narrow;
    narrow.width = 12;
    for (std::size_t height = 1; height < 12; ++height) {
        const Lines lines =
            watch_lines(view(shown({"1", "3"}, Severity::critical, "failed")), narrow, height);
        EXPECT_LE(lines.size(), height);
        for (const std::string &line : lines)
            EXPECT_LE(columns(line), narrow.width) << line;
    }
}

TEST(WatchScreen, IsDrawnInPlace) {
    EXPECT_EQ(drawing({"a", "b"}), "\033[Ha\033[K\r\nb\033[K\033[J");
}

TEST(Cut, CountsCharactersAndLeavesSequencesWhole) {
    EXPECT_EQ(cut("\033[1;31mäbc\033[0m", 2), "\033[1;31mäb\033[0m");
    EXPECT_EQ(cut("abc", 0), "abc");
    EXPECT_EQ(cut("abc", 3), "abc");
}
