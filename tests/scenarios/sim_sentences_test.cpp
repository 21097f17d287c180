// The scenario language.
#include "model/sentences.hpp"

#include <gtest/gtest.h>

using namespace zavsim;

namespace {

TEST(Sentences, SayWhatHappensToADisk) {
    const Sentence sentence = parse_sentence("disk 3 fails");
    EXPECT_EQ(sentence.error, "");
    EXPECT_EQ(sentence.action.kind, Action::Kind::disk_fails);
    EXPECT_EQ(sentence.action.number, 3);
    EXPECT_EQ(parse_sentence("disk 1 vanishes").action.kind, Action::Kind::disk_vanishes);
    EXPECT_EQ(parse_sentence("disk 1 appears").action.kind, Action::Kind::disk_appears);
    EXPECT_EQ(parse_sentence("disk 1 joins").action.kind, Action::Kind::disk_joins);
}

TEST(Sentences, SayWhatHappensToAnArray) {
    EXPECT_EQ(parse_sentence("array 2 checks").action.kind, Action::Kind::array_checks);
    EXPECT_EQ(parse_sentence("array 2 repairs").action.kind, Action::Kind::array_repairs);
    EXPECT_EQ(parse_sentence("array 2 stops").action.kind, Action::Kind::array_stops);
}

TEST(Sentences, SayWhatHappensToAVolume) {
    const Action filled = parse_sentence("volume 1-2 fills 95%").action;
    EXPECT_EQ(filled.kind, Action::Kind::volume_fills);
    EXPECT_EQ(filled.group, 1);
    EXPECT_EQ(filled.number, 2);
    EXPECT_EQ(filled.percent, 95);
    EXPECT_EQ(parse_sentence("volume 0-1 is active").action.kind, Action::Kind::volume_is_active);
    EXPECT_EQ(parse_sentence("volume 0-1 is inactive").action.kind,
              Action::Kind::volume_is_inactive);
    EXPECT_EQ(parse_sentence("volume 0-1 is busy").action.kind, Action::Kind::volume_is_busy);
    EXPECT_EQ(parse_sentence("volume 0-1 is idle").action.kind, Action::Kind::volume_is_idle);
}

TEST(Sentences, SayWhatHappensToATool) {
    EXPECT_DOUBLE_EQ(parse_sentence("tool mdadm hangs 1.5m").action.seconds, 90);
    EXPECT_DOUBLE_EQ(parse_sentence("tool mdadm hangs 500ms").action.seconds, 0.5);
    EXPECT_EQ(parse_sentence("tool mdadm exits 3").action.status, 3);
    EXPECT_EQ(parse_sentence("tool smartctl is missing").action.kind,
              Action::Kind::tool_is_missing);
    EXPECT_EQ(parse_sentence("tool smartctl works again").action.kind, Action::Kind::tool_works);
    EXPECT_EQ(parse_sentence(R"(tool mdadm prints "a \"b\" # c\n")").action.text, "a \"b\" # c\n");
}

TEST(Sentences, SayWhatHappensToAControllersVolume) {
    const Action degraded = parse_sentence("controller volume 2 degrades").action;
    EXPECT_EQ(degraded.kind, Action::Kind::raid_volume_degrades);
    EXPECT_EQ(degraded.unit, 0);
    EXPECT_EQ(degraded.number, 2);
    const Action rebuilt = parse_sentence("unit 7 volume rebuilds").action;
    EXPECT_EQ(rebuilt.kind, Action::Kind::raid_volume_rebuilds);
    EXPECT_EQ(rebuilt.unit, 7);
    EXPECT_EQ(rebuilt.number, 1);
    EXPECT_EQ(parse_sentence("unit 1 volume fails").action.kind, Action::Kind::raid_volume_fails);
    EXPECT_EQ(parse_sentence("controller volume 1 recovers").action.kind,
              Action::Kind::raid_volume_recovers);
}

TEST(Sentences, SayWhatHappensToAUnit) {
    const Action failed = parse_sentence("unit 3 disk 4 fails").action;
    EXPECT_EQ(failed.kind, Action::Kind::disk_fails);
    EXPECT_EQ(failed.unit, 3);
    EXPECT_EQ(failed.number, 4);
    EXPECT_EQ(parse_sentence("unit 3 vanishes").action.kind, Action::Kind::unit_vanishes);
    EXPECT_EQ(parse_sentence("unit 3 appears").action.kind, Action::Kind::unit_appears);
    EXPECT_EQ(parse_sentence("unit 3 loses its link").action.kind, Action::Kind::unit_loses_link);
    EXPECT_EQ(parse_sentence("unit 3 finds its link").action.kind, Action::Kind::unit_finds_link);
}

TEST(Sentences, SayWhatTheHardwareMonitorReads) {
    const Action hot = parse_sentence("unit 3 temperature 88.5").action;
    EXPECT_EQ(hot.kind, Action::Kind::temperature_changes);
    EXPECT_EQ(hot.unit, 3);
    EXPECT_DOUBLE_EQ(hot.value, 88.5);
    EXPECT_DOUBLE_EQ(parse_sentence("unit 3 voltage 1.15").action.value, 1.15);
    EXPECT_EQ(parse_sentence("unit 3 voltage 1").action.kind, Action::Kind::voltage_changes);
    EXPECT_EQ(parse_sentence("controller temperature 0").action.unit, 0);
}

TEST(Sentences, SayWhatHappensToTheReport) {
    EXPECT_EQ(parse_sentence("report is missing").action.kind, Action::Kind::report_is_missing);
    EXPECT_EQ(parse_sentence("report is truncated").action.kind, Action::Kind::report_is_truncated);
    EXPECT_EQ(parse_sentence("report is garbled").action.kind, Action::Kind::report_is_garbled);
    EXPECT_EQ(parse_sentence("report works again").action.kind, Action::Kind::report_works);
    const Action rewritten = parse_sentence("report rewrites 1.5m").action;
    EXPECT_EQ(rewritten.kind, Action::Kind::report_rewrites);
    EXPECT_DOUBLE_EQ(rewritten.seconds, 90);
}

TEST(Sentences, TellTheRangesOfTheirNumbers) {
    EXPECT_EQ(parse_sentence("unit 8 vanishes").error, "unit wants a number from 1 to 7");
    EXPECT_EQ(parse_sentence("unit 0 vanishes").error, "unit wants a number from 1 to 7");
    EXPECT_EQ(parse_sentence("unit 3 disk 5 fails").error,
              "unit 3 disk wants a number from 1 to 4");
    EXPECT_EQ(parse_sentence("controller volume 3 fails").error,
              "controller volume wants a number from 1 to 2");
    EXPECT_EQ(parse_sentence("unit 3 temperature 201").error,
              "unit 3 temperature wants degrees from 0 to 200, such as 88 or 61.5");
    EXPECT_EQ(parse_sentence("unit 3 voltage 20.01").error,
              "unit 3 voltage wants volts from 0 to 20, such as 1.1");
}

TEST(Sentences, RefuseWhatTheyDoNotMean) {
    for (const char *text : {"",
                             "disk",
                             "disk 3",
                             "disk 5 fails",
                             "disk 0 fails",
                             "disk 3 fails now",
                             "disk x fails",
                             "disk 3 explodes",
                             "array 2 fails",
                             "array checks",
                             "volume",
                             "volume 1",
                             "volume 1-",
                             "volume 1-0 is busy",
                             "volume -1 is busy",
                             "volume 1-2",
                             "volume 1-2 fills",
                             "volume 1-2 fills 95",
                             "volume 1-2 fills 101%",
                             "volume 1-2 fills %",
                             "volume 1-2 is full",
                             "volume 1-2 is busy now",
                             "tool",
                             "tool mdadm",
                             "tool ls hangs 3s",
                             "tool mdadm hangs",
                             "tool mdadm hangs 30",
                             "tool mdadm hangs 3h",
                             "tool mdadm hangs 1.2.3s",
                             "tool mdadm exits 256",
                             "tool mdadm exits -1",
                             "tool mdadm prints text",
                             "tool mdadm prints \"text",
                             "tool mdadm is broken",
                             "tool mdadm works",
                             "controller",
                             "controller volume",
                             "controller volume 1",
                             "controller volume 1 explodes",
                             "controller voltage 1.2",
                             "controller vanishes",
                             "unit",
                             "unit 3",
                             "unit 3 explodes",
                             "unit 3 vanishes now",
                             "unit 3 loses",
                             "unit 3 disk 1",
                             "unit 3 disk 1 joins",
                             "unit 3 volume",
                             "unit 3 volume 1 fails",
                             "unit 3 temperature",
                             "unit 3 temperature -1",
                             "unit 3 temperature 88.55",
                             "unit 3 temperature 88.",
                             "unit 3 temperature .5",
                             "unit 3 temperature hot",
                             "unit 3 voltage 1.155",
                             "unit 3 voltage 1.1.1",
                             "report",
                             "report is",
                             "report is wrong",
                             "report works",
                             "report rewrites",
                             "report rewrites 5",
                             "lamp 1 stops"})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

TEST(Sentences, WordsOfACommandLineBecomeOneAgain) {
    const std::string sentence = join_words({"tool", "mdadm", "prints", "two words\n"});
    EXPECT_EQ(parse_sentence(sentence).action.text, "two words\n");
}

TEST(Scenarios, AreSortedByTimeAndKeepTheOrderOfEqualTimes) {
    const Scenario scenario = parse_scenario("# first\n"
                                             "at 30s disk 3 appears\n"
                                             "\n"
                                             "at 10s  disk 3 fails   # the reason\n"
                                             "at 0.5m disk 3 joins\n",
                                             "file");
    ASSERT_TRUE(scenario.errors.empty());
    ASSERT_EQ(scenario.events.size(), 3U);
    EXPECT_EQ(scenario.events[0].sentence, "disk 3 fails");
    EXPECT_DOUBLE_EQ(scenario.events[0].at, 10);
    EXPECT_EQ(scenario.events[1].sentence, "disk 3 appears");
    EXPECT_EQ(scenario.events[2].sentence, "disk 3 joins");
}

TEST(Scenarios, NameFileAndLineOfEveryMistake) {
    const Scenario scenario = parse_scenario("at 10s disk 3 fails\n"
                                             "at 10 disk 3 fails\n"
                                             "disk 3 fails\n"
                                             "at 10s disk 7 fails\n",
                                             "night.txt");
    ASSERT_EQ(scenario.errors.size(), 3U);
    EXPECT_EQ(scenario.errors[0].rfind("night.txt:2: ", 0), 0U);
    EXPECT_EQ(scenario.errors[1].rfind("night.txt:3: ", 0), 0U);
    EXPECT_EQ(scenario.errors[2], "night.txt:4: disk wants a number from 1 to 4");
}

} // namespace
