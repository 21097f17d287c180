// What is said of the UPS.
#include "core/ups_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

UpsReport ups(int state, double charge) {
    UpsReport report;
    report.present = true;
    report.state = state;
    report.charge = charge;
    doubt_charge(report);
    return report;
}

std::string summary_of(const UpsReport &report) {
    return summary(Answer{"ups", "", {ups_section(report)}});
}

} // namespace

TEST(Ups, OnLineIsWell) {
    EXPECT_EQ(summary_of(ups(ZAV_UPS_ONLINE, 98.5)), "OK: UPS on line");
    EXPECT_EQ(section_text(ups_section(ups(ZAV_UPS_ONLINE, 98.5)), Style()),
              "    UPS      online\n"
              "    Charge   98.5 %\n"
              "    Told by  the UPS daemon\n");
}

TEST(Ups, OnBatteryIsAWarningAndCriticalWhenNearlyEmpty) {
    EXPECT_EQ(summary_of(ups(ZAV_UPS_ONBATT, 87)),
              "WARNING: the UPS is on battery, charged 87.0 %");
    EXPECT_EQ(severity(ups(ZAV_UPS_ONBATT, 20.1)), Severity::warning);
    EXPECT_EQ(severity(ups(ZAV_UPS_ONBATT, 20)), Severity::critical);
    EXPECT_EQ(summary_of(ups(ZAV_UPS_ONBATT, 20)),
              "CRITICAL: the UPS is on battery, charged 20.0 %");
}

TEST(Ups, AnEmptyBatteryOnLineIsAWarning) {
    EXPECT_EQ(severity(ups(ZAV_UPS_ONLINE, 15)), Severity::warning);
    EXPECT_EQ(ups_note(ups(ZAV_UPS_ONLINE, 15)), "the battery would not last through a power cut");
}

TEST(Ups, AnotherStateIsToldWithItsNumber) {
    EXPECT_EQ(ups_state_word(ups(ZAV_UPS_OTHER, 90)), "other");
    EXPECT_EQ(summary_of(ups(9, 90)),
              "WARNING: the UPS is neither on line nor on battery (code 9)");
    EXPECT_EQ(ups_json(ups(9, 90))["code"], 9);
}

TEST(Ups, WithoutOneNothingIsWrong) {
    UpsReport none;
    none.failure = Failure{ZAV_RC_ERR_ENODEV, "ZAV_RC_ERR_ENODEV", "no daemon"};
    EXPECT_EQ(summary_of(none), "OK: no UPS");
    EXPECT_EQ(ups_json(none)["state"], "none");
    EXPECT_EQ(section_text(ups_overview_section(none), Style()), "");
}

TEST(Ups, ASilentDaemonCannotBeTold) {
    UpsReport silent = ups(ZAV_UPS_ONLINE, 98);
    silent.failure = Failure{ZAV_RC_ERR_ENODEV, "ZAV_RC_ERR_ENODEV", "the daemon does not run"};
    EXPECT_EQ(summary_of(silent),
              "COULD NOT TELL: the UPS gives no answer to trust: the daemon does not run "
              "(ZAV_RC_ERR_ENODEV, code 19)");
    EXPECT_TRUE(ups_json(silent)["charge_percent"].is_null());
    EXPECT_TRUE(ups_json(silent)["code"].is_null());
}

TEST(Ups, AChargeThatNoBatteryHasIsNotBelieved) {
    EXPECT_EQ(severity(ups(ZAV_UPS_ONLINE, 250)), Severity::unknown);
    EXPECT_EQ(severity(ups(ZAV_UPS_ONLINE, -1)), Severity::unknown);
    UpsReport report = ups(ZAV_UPS_ONLINE, 50);
    report.charge.reset();
    doubt_charge(report);
    EXPECT_EQ(severity(report), Severity::unknown);
}

TEST(Ups, TheHookIsNamedAsTheSource) {
    UpsReport report = ups(ZAV_UPS_ONLINE, 98);
    EXPECT_EQ(ups_json(report)["source"], "daemon");
    report.from_hook = true;
    EXPECT_EQ(ups_json(report)["source"], "hook");
}

TEST(Ups, TheOverviewIsOneRow) {
    EXPECT_EQ(section_text(ups_overview_section(ups(ZAV_UPS_ONBATT, 87)), Style()),
              "    STATE       CHARGE\n"
              " !  on battery  87.0 %\n");
}
