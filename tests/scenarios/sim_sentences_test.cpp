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
                             "fan 1 stops"})
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
