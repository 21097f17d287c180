// What is said of the mark by which an expansion unit belongs to a chassis.
#include "core/mark_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

const Failure no_volume{2, "ZAV_RC_ERR_ENOENT", "there is no volume"};

MarkReport mark(int unit, int state) {
    return {unit, state, std::nullopt};
}

std::string summary_of(const Section &section) {
    return summary(Answer{"unit check", "", {section}});
}

} // namespace

TEST(Mark, HasItsSeverity) {
    EXPECT_EQ(severity(mark(1, ZAV_IRBOD_SAME)), Severity::ok);
    EXPECT_EQ(severity(mark(1, ZAV_IRBOD_UNMARKED)), Severity::warning);
    EXPECT_EQ(severity(mark(1, ZAV_IRBOD_OTHER)), Severity::critical);
    EXPECT_EQ(severity(MarkReport{1, 0, no_volume}), Severity::unknown);
}

TEST(Mark, TheListHasOneLinePerUnit) {
    const Section section = mark_section(
        {mark(1, ZAV_IRBOD_SAME), mark(2, ZAV_IRBOD_UNMARKED), mark(3, ZAV_IRBOD_OTHER)});
    EXPECT_EQ(section_text(section, Style()),
              "    UNIT  MARK      NOTE\n"
              "    1     same\n"
              " !  2     unmarked  'zavctl unit mark 2' gives it the mark of this chassis\n"
              " X  3     other     another chassis has set it up\n");
    EXPECT_EQ(summary_of(section),
              "CRITICAL: unit 3 carries the mark of another chassis; unit 2 carries no mark");
}

TEST(Mark, TheRecordHasItsFields) {
    const Json json = mark_json(mark(2, ZAV_IRBOD_UNMARKED));
    EXPECT_EQ(json["kind"], "mark");
    EXPECT_EQ(json["unit"], 2);
    EXPECT_EQ(json["mark"], "unmarked");
    EXPECT_EQ(json["severity"], "warning");
    EXPECT_EQ(mark_json(MarkReport{1, 0, no_volume})["error"]["code"], 2);
}

TEST(MarkPlan, AsksOnlyBeforeItOverwritesAnotherMark) {
    EXPECT_TRUE(overwrites_another(mark(1, ZAV_IRBOD_OTHER)));
    EXPECT_FALSE(overwrites_another(mark(1, ZAV_IRBOD_UNMARKED)));
    EXPECT_FALSE(overwrites_another(mark(1, ZAV_IRBOD_SAME)));
    EXPECT_EQ(mark_plan(mark(1, ZAV_IRBOD_OTHER)).warnings.size(), 1U);
    EXPECT_TRUE(mark_plan(mark(1, ZAV_IRBOD_UNMARKED)).warnings.empty());
}

TEST(MarkPlan, AMarkThatStandsThereIsNotWrittenAgain) {
    EXPECT_EQ(mark_plan(mark(1, ZAV_IRBOD_SAME)).steps[0].does, "none");
    EXPECT_EQ(mark_plan(mark(1, ZAV_IRBOD_UNMARKED)).steps[0].does, "mark");
}

TEST(MarkPlan, AMarkThatCannotBeReadIsNotOverwritten) {
    const Plan plan = mark_plan({4, 0, no_volume});
    ASSERT_TRUE(plan.refused());
    EXPECT_EQ(plan.refusals[0].option, "");
    EXPECT_EQ(plan.refusals[0].text, "the mark that it carries cannot be read: there is no volume "
                                     "(ZAV_RC_ERR_ENOENT, code 2)");
}

TEST(MarkOutcome, IsWhatTheUnitCarriesThen) {
    const Outcome done = mark_outcome(mark(1, ZAV_IRBOD_SAME), std::nullopt);
    EXPECT_EQ(done.word, "done");
    EXPECT_TRUE(done.findings.empty());
    const Outcome incomplete = mark_outcome(mark(1, ZAV_IRBOD_UNMARKED), std::nullopt);
    EXPECT_EQ(incomplete.word, "incomplete");
    EXPECT_EQ(incomplete.findings[0].severity, Severity::critical);
    const Outcome failed = mark_outcome(mark(1, ZAV_IRBOD_OTHER), no_volume);
    EXPECT_EQ(failed.word, "failed");
    const Outcome doubtful = mark_outcome(mark(1, ZAV_IRBOD_SAME), no_volume);
    EXPECT_EQ(doubtful.word, "done");
    EXPECT_EQ(doubtful.findings[0].severity, Severity::warning);
}
