// What is said of Ethernet ports and bonds.
#include "core/nic_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

NicReport nic(const char *name, int state, int speed = 0) {
    NicReport report;
    report.id = *nic_id(name);
    report.state = state;
    report.speed = speed;
    report.in_kernel = state != ZAV_NET_NOT_EXIST;
    return report;
}

std::string summary_of(const Section &section) {
    return summary(Answer{"nic list", "", {section}});
}

} // namespace

TEST(Nic, IsNamedByItsInterfaceOrItsNumber) {
    EXPECT_EQ(name_of(*nic_id("eth3")), "eth3");
    EXPECT_EQ(name_of(*nic_id("4")), "eth3");
    EXPECT_EQ(name_of(*nic_id("bond1")), "bond1");
    for (const char *word : {"", "eth4", "eth", "bond2", "0", "5", "lo"})
        EXPECT_FALSE(nic_id(word)) << word;
}

TEST(NicReport, LinksHaveTheirSeverity) {
    EXPECT_EQ(severity(nic("eth0", ZAV_NET_UP, 1000)), Severity::ok);
    EXPECT_EQ(severity(nic("eth0", ZAV_NET_DOWN)), Severity::warning);
    EXPECT_EQ(severity(nic("eth0", ZAV_NET_NOT_EXIST)), Severity::ok);
    EXPECT_EQ(severity(nic("eth0", ZAV_NET_ERR)), Severity::unknown);
}

TEST(NicReport, APortThatIsSwitchedOffNeedsNoLink) {
    NicReport port = nic("eth1", ZAV_NET_DOWN);
    port.switched_off = true;
    EXPECT_EQ(severity(port), Severity::ok);
    EXPECT_EQ(nic_note(port), "switched off: no link is expected");
}

TEST(NicReport, APortThatWasAskedForHasToExist) {
    NicReport port = nic("eth3", ZAV_NET_NOT_EXIST);
    port.asked_for = true;
    EXPECT_EQ(severity(port), Severity::critical);
    EXPECT_EQ(summary_of(nic_show_section({port})), "CRITICAL: port eth3 does not exist");
}

TEST(NicReport, APortThatTheKernelHasIsNotBelievedNotToExist) {
    NicReport port = nic("eth0", ZAV_NET_NOT_EXIST);
    port.in_kernel = true;
    doubt_nic(port, false);
    EXPECT_EQ(severity(port), Severity::unknown);
    EXPECT_EQ(existing({port}).size(), 1U);
}

TEST(NicReport, WithoutEthtoolNotExistingIsWorthNothingUnlessTheKernelSaysSo) {
    NicReport port = nic("eth0", ZAV_NET_NOT_EXIST);
    doubt_nic(port, true);
    EXPECT_EQ(severity(port), Severity::ok);
    port.in_kernel.reset();
    doubt_nic(port, true);
    EXPECT_EQ(severity(port), Severity::unknown);
    EXPECT_EQ(nic_note(port), "/sbin/ethtool is missing: every port reads as not existing");
}

TEST(NicReport, AListLeavesOutWhatDoesNotExist) {
    const auto there = existing({nic("eth0", ZAV_NET_UP, 1000), nic("eth1", ZAV_NET_NOT_EXIST),
                                 nic("eth2", ZAV_NET_DOWN), nic("bond0", ZAV_NET_ERR)});
    ASSERT_EQ(there.size(), 3U);
    EXPECT_EQ(name_of(there[1].id), "eth2");
}

TEST(NicReport, TheListHasOneLinePerPort) {
    const Section section = nic_list_section(
        {nic("eth0", ZAV_NET_UP, 1000), nic("eth1", ZAV_NET_DOWN), nic("bond0", ZAV_NET_UP)});
    EXPECT_EQ(section_text(section, Style()),
              "    PORT   LINK  SPEED        NOTE\n"
              "    eth0   up    1000 Mbit/s\n"
              " !  eth1   down  -\n"
              "    bond0  up    -            ethtool does not know its speed\n");
    EXPECT_EQ(summary_of(section), "WARNING: port eth1 has no link");
}

TEST(NicReport, AFailureIsToldWithWhatWasReadBefore) {
    NicReport port = nic("eth0", ZAV_NET_ERR);
    port.failure = Failure{ZAV_RC_ERR_NIC, "ZAV_RC_ERR_NIC", "a speed that is not known"};
    const Json json = nic_json(port);
    EXPECT_EQ(json["link"], "unknown");
    EXPECT_TRUE(json["speed_mbit"].is_null());
    EXPECT_EQ(json["note"], "a speed that is not known (ZAV_RC_ERR_NIC, code 0x2900)");
    EXPECT_EQ(summary_of(nic_list_section({port})),
              "COULD NOT TELL: port eth0 gives no answer to trust");
}

TEST(NicReport, TheRecordHasItsFields) {
    const Json json = nic_json(nic("bond0", ZAV_NET_UP, 100));
    EXPECT_EQ(json["nic"], "bond0");
    EXPECT_EQ(json["kind"], "bond");
    EXPECT_EQ(json["number"], 1);
    EXPECT_EQ(json["link"], "up");
    EXPECT_EQ(json["speed_mbit"], 100);
    EXPECT_EQ(json["severity"], "ok");
    EXPECT_EQ(nic_json(nic("eth2", ZAV_NET_DOWN))["kind"], "port");
}
