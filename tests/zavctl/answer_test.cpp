#include "core/answer.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

Answer sample() {
    Section disks;
    disks.title = "Disks";
    disks.key = "disks";
    disks.table = Table({"DISK", "STATE"}, 1);
    disks.table.add(Severity::ok, {"1", "found"});
    disks.records = Json::array({Json{{"slot", 1}}, Json{{"slot", 2}}});
    disks.findings = {{Severity::warning, "small"}, {Severity::critical, "big"}};
    return {"disk list", "The machine", {disks}};
}

} // namespace

TEST(Answer, TheWorstFindingDecidesAndComesFirst) {
    EXPECT_EQ(severity(sample()), Severity::critical);
    EXPECT_EQ(summary(sample()), "CRITICAL: big; small");
}

TEST(Answer, WithoutFindingsItSaysWhatIsWell) {
    Section section;
    section.well = "4 disks found";
    EXPECT_EQ(summary({"disk list", "", {section}}), "OK: 4 disks found");
}

TEST(Answer, TheTextHasHeadingSectionsAndOneLineForAll) {
    EXPECT_EQ(to_text(sample(), {}), "The machine\n\nDisks\n    DISK  STATE\n    1     found\n\n"
                                     "CRITICAL: big; small\n");
}

TEST(Answer, TheSummaryIsWrappedAtTheEndOfTheScreen) {
    Section section;
    section.findings = {{Severity::unknown, "one two three four five six"}};
    EXPECT_EQ(to_text({"x", "", {section}}, {false, 32}),
              "COULD NOT TELL: one two three\n    four five six\n");
}

TEST(Answer, TheJsonHasItsStableFrame) {
    const Json json = Json::parse(to_json(sample()));
    EXPECT_EQ(json["format"], 1);
    EXPECT_EQ(json["command"], "disk list");
    EXPECT_EQ(json["severity"], "critical");
    EXPECT_EQ(json["exit_status"], 2);
    EXPECT_EQ(json["findings"][0]["text"], "big");
    EXPECT_EQ(json["disks"].size(), 2U);
}

TEST(Answer, JsonLinesAreOneRecordEach) {
    EXPECT_EQ(to_jsonl(sample()), "{\"slot\":1}\n{\"slot\":2}\n");
}

TEST(Answer, JsonStaysValidWhateverTheBytes) {
    Answer answer = sample();
    answer.sections[0].records[0]["name"] = std::string("a\xff\033\0b", 5);
    const Json json = Json::parse(to_json(answer));
    EXPECT_EQ(json["disks"][0]["name"], std::string("a\xef\xbf\xbd\033\0b", 7));
}
