// A job of the burner while it runs: what is told of its progress, and of cancelling it.
#include "core/disc_job.h"

#include <gtest/gtest.h>

using namespace zavctl;
using std::chrono::seconds;

namespace {

std::vector<std::string> told(JobCourse course, const std::vector<int> &percentages) {
    std::vector<std::string> all;
    for (const int percent : percentages)
        if (const std::string news = course.news(percent); !news.empty())
            all.push_back(news);
    return all;
}

std::string summary_of(const Section &section) {
    return summary(Answer{"disc", "", {section}});
}

using Words = std::vector<std::string>;

} // namespace

TEST(JobCourse, ALinePerPhaseAndTenPercent) {
    EXPECT_EQ(told(JobCourse("writing"), {0, 0, 3, 9, 10, 14, 38, 39, 98, 99, 100}),
              (Words{"starting", "writing, 3 %", "writing, 10 %", "writing, 30 %", "writing, 90 %",
                     "closing"}));
}

TEST(JobCourse, APercentageThatFallsIsNotTold) {
    EXPECT_EQ(told(JobCourse("erasing"), {40, 20, 44, 0, 99, 60}),
              (Words{"erasing, 40 %", "closing"}));
}

TEST(JobCourse, WhatAnEarlierJobLeftIsNoEnd) {
    EXPECT_EQ(told(JobCourse("writing"), {100, 0, 20}), (Words{"starting", "writing, 20 %"}));
}

TEST(JobCourse, AJobWithoutProgressIsToldOnce) {
    EXPECT_EQ(told(JobCourse("formatting", false), {0, 0, 50}), Words{"formatting"});
}

TEST(JobCourse, TheLineHasBarTimeAndEstimate) {
    EXPECT_EQ(JobCourse("writing").line(25, seconds(60)),
              "[=====>..............]  25 %  writing, 1:00, about 3:00 left");
    EXPECT_EQ(JobCourse("writing").line(0, seconds(7)),
              "[>...................]   0 %  starting, 0:07");
    EXPECT_EQ(JobCourse("formatting", false).line(0, seconds(7)),
              "formatting, 0:07; no progress is told");
}

TEST(JobCourse, NothingIsEstimatedAtTheBeginningAndInTheEnd) {
    EXPECT_FALSE(remaining_time(0, seconds(10)));
    EXPECT_FALSE(remaining_time(-5, seconds(10)));
    EXPECT_FALSE(remaining_time(99, seconds(10)));
    EXPECT_EQ(remaining_time(50, seconds(10)), seconds(10));
}

TEST(JobCourse, TimesAreThoseOfAClock) {
    EXPECT_EQ(clock_words(seconds(7)), "0:07");
    EXPECT_EQ(clock_words(seconds(760)), "12:40");
    EXPECT_EQ(clock_words(seconds(3723)), "1:02:03");
}

TEST(JobProgress, TellsPercentAndTools) {
    const Section section = progress_section({42, {{"mkisofs", 815}, {"cdrecord", 816}}});
    EXPECT_EQ(summary_of(section), "OK: 42 %, running: mkisofs (815) and cdrecord (816)");
    EXPECT_EQ(section.records["percent"], 42);
    EXPECT_EQ(section.records["tools"][1]["pid"], 816);
}

TEST(JobProgress, WhatAnEarlierJobLeftIsNoProgress) {
    const Section section = progress_section({100, {}});
    EXPECT_EQ(summary_of(section), "OK: no tool of the burner runs; the last job left 100 %");
    EXPECT_EQ(section.records["running"], false);
    EXPECT_TRUE(section.records["percent"].is_null());
    EXPECT_EQ(section.records["left_percent"], 100);
    EXPECT_EQ(summary_of(progress_section({})), "OK: no tool of the burner runs");
}

TEST(JobCancel, TellsWhatWasStoppedAndWhatStillRuns) {
    CancelReport report;
    EXPECT_EQ(summary_of(cancel_section(report)),
              "OK: nothing to cancel: no tool of the burner ran");
    report.before = {{"growisofs", 812}, {"mkisofs", 813}};
    EXPECT_EQ(summary_of(cancel_section(report)), "OK: stopped: growisofs (812) and mkisofs (813)");
    report.after = {{"growisofs", 812}};
    EXPECT_EQ(summary_of(cancel_section(report)),
              "OK: told to end: growisofs (812) and mkisofs (813); still running: growisofs (812)");
}

TEST(JobCancel, AFailureIsCritical) {
    CancelReport report;
    report.failure = Failure{-1, "", "killall is not on the PATH"};
    EXPECT_EQ(summary_of(cancel_section(report)),
              "CRITICAL: nothing was cancelled: killall is not on the PATH");
}
