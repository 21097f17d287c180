// What mdadm and /proc/mdstat say about a software array.
#include "storage/zav_raid_parse.h"

#include "zav_api.h"

#include <climits>
#include <gtest/gtest.h>
#include <string>

namespace {

zav::RaidDetail detail_of(std::initializer_list<const char *> lines, bool expected = true) {
    zav::RaidDetail detail = {ZAV_RAIDLVL_NONE, -1, -1};
    bool supported = true;
    for (std::string line : lines)
        supported = zav::read_detail_line(line.data(), detail) && supported;
    EXPECT_EQ(supported, expected);
    return detail;
}

TEST(ArrayDetail, LevelsAreTestedInTheirOrder) {
    const std::pair<const char *, int> levels[] = {
        {"     Raid Level : raid0\n", ZAV_RAIDLVL_0},
        {"     Raid Level : raid1\n", ZAV_RAIDLVL_1},
        {"     Raid Level : raid5\n", ZAV_RAIDLVL_5},
        {"     Raid Level : raid10\n", ZAV_RAIDLVL_10},
        {"     Raid Level : linear\n", ZAV_RAIDLVL_JBOD},
        {" Raid Level raid1 raid10", ZAV_RAIDLVL_10},
        {" Raid Level raid0 linear", ZAV_RAIDLVL_JBOD},
        {" Raid Level raid5 raid0", ZAV_RAIDLVL_0},
        {" Raid Level raid1 raid5", ZAV_RAIDLVL_5},
    };
    for (const auto &[line, level] : levels)
        EXPECT_EQ(detail_of({line}).level, level) << line;
}

TEST(ArrayDetail, OtherLevelsAreNotSupported) {
    EXPECT_EQ(detail_of({"     Raid Level : raid6\n"}, false).level, ZAV_RAIDLVL_NONE);
    detail_of({"     Raid Level : \n"}, false);
    detail_of({"     Raid Level : container\n"}, false);
}

TEST(ArrayDetail, TheLevelNeedsItsLeadingBlank) {
    EXPECT_EQ(detail_of({"Raid Level : raid5\n"}).level, ZAV_RAIDLVL_NONE);
    EXPECT_EQ(detail_of({"xRaid Level : raid6\n"}).level, ZAV_RAIDLVL_NONE);
}

TEST(ArrayDetail, CountsStandBehindTheColon) {
    const zav::RaidDetail detail = detail_of({"   Raid Devices : 4\n", "  Active Devices : 3\n",
                                              "Working Devices : 9\n", "  Total Devices : 8\n"});
    EXPECT_EQ(detail.raid_devices, 4);
    EXPECT_EQ(detail.active_devices, 3);
}

TEST(ArrayDetail, CountsAreReadAs32BitNumbers) {
    EXPECT_EQ(detail_of({"Active Devices : 4294967299\n"}).active_devices, INT_MAX);
    EXPECT_EQ(detail_of({"Active Devices : -1\n"}).active_devices, -1);
    EXPECT_EQ(detail_of({"Active Devices : x\n"}).active_devices, 0);
    EXPECT_EQ(detail_of({"Active Devices ::\t2 3\n"}).active_devices, 2);
    EXPECT_EQ(detail_of({"Active Devices :\n"}).active_devices, 0);
}

TEST(ArrayDetail, ALineWithoutACountChangesNothing) {
    EXPECT_EQ(detail_of({"Active Devices"}).active_devices, -1);
    EXPECT_EQ(detail_of({"Raid Devices : "}).raid_devices, -1);
}

TEST(ArrayDetail, TheFirstMatchingWordDecides) {
    const zav::RaidDetail detail =
        detail_of({" Raid Level raid5 Raid Devices : 7", "Raid Devices : 6 Active Devices : 5"});
    EXPECT_EQ(detail.level, ZAV_RAIDLVL_5);
    EXPECT_EQ(detail.raid_devices, 6);
    EXPECT_EQ(detail.active_devices, -1);
}

// ---- The state's decision ----

struct Expected {
    int level;
    int members;
    int active;
    const char *status;
    int state;
    const char *trace;
};

void expect_states(std::initializer_list<Expected> cases) {
    for (const Expected &expected : cases) {
        const zav::RaidDecision decision = zav::decide_raid_state(expected.level, expected.members,
                                                                  expected.active, expected.status);
        const auto what = std::string("level ") + std::to_string(expected.level) + " members " +
                          std::to_string(expected.members) + " active " +
                          std::to_string(expected.active) + " " + expected.status;
        EXPECT_TRUE(decision.known) << what;
        EXPECT_EQ(decision.state, expected.state) << what;
        EXPECT_STREQ(decision.trace, expected.trace) << what;
        EXPECT_EQ(decision.resync, 0.0F) << what;
    }
}

constexpr int kNormal = ZAV_RAID_NORMAL;
constexpr int kDegraded = ZAV_RAID_DEGRADED;
constexpr int kFailed = ZAV_RAID_FAILED;

TEST(ArrayState, WithoutRedundancyIsAlwaysNormalAndComplete) {
    for (const int level : {ZAV_RAIDLVL_0, ZAV_RAIDLVL_JBOD}) {
        const zav::RaidDecision decision = zav::decide_raid_state(level, 4, 0, "");
        EXPECT_TRUE(decision.known);
        EXPECT_EQ(decision.state, kNormal);
        EXPECT_EQ(decision.resync, 100.0F);
        EXPECT_STREQ(decision.trace, "RAID0/JBOD");
    }
}

TEST(ArrayState, OfAMirrorIsNeverFailed) {
    expect_states({
        {ZAV_RAIDLVL_1, 2, 0, "[2/2] [UU]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 2, 0, "[4/2] [UU__]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 2, 2, "[2/1] [U_]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 2, 1, "[2/1] [U_]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 2, 0, "[2/0] [__]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 2, 3, "[UUU]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 2, 4, "[UUUU]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 4, 0, "[4/4] [UUUU]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 4, 4, "[4/3] [UUU_]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 4, 3, "[4/3] [UUU_]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 4, 2, "[UU]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 4, 2, "[UU__]", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 4, 0, "", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 4, 5, "", kDegraded, "RAID1"},
        {ZAV_RAIDLVL_1, 1, 0, "[U]", kNormal, nullptr},
        {ZAV_RAIDLVL_1, 3, 1, "[U__]", kNormal, nullptr},
    });
}

TEST(ArrayState, WithParitySurvivesOneLoss) {
    expect_states({
        {ZAV_RAIDLVL_5, 4, 0, "[4/4] [UUUU]", kNormal, nullptr},
        {ZAV_RAIDLVL_5, 4, 2, "[3/3] [UUU]", kNormal, nullptr},
        {ZAV_RAIDLVL_5, 4, 4, "[4/3] [UUU_]", kNormal, nullptr},
        {ZAV_RAIDLVL_5, 4, 3, "[4/3] [UUU_]", kDegraded, "RAID5"},
        {ZAV_RAIDLVL_5, 4, 2, "[4/2] [UU__]", kFailed, "RAID5"},
        {ZAV_RAIDLVL_5, 4, 1, "", kFailed, "RAID5"},
        {ZAV_RAIDLVL_5, 4, 0, "", kFailed, "RAID5"},
        {ZAV_RAIDLVL_5, 4, -7, "", kFailed, "RAID5"},
        {ZAV_RAIDLVL_5, 4, 5, "", kNormal, "RAID5"},
        {ZAV_RAIDLVL_5, 2, 1, "[U_]", kDegraded, "RAID5"},
        {ZAV_RAIDLVL_5, 2, 0, "[__]", kFailed, "RAID5"},
    });
}

TEST(ArrayState, OfStripedMirrorsNeedsOneOfEachPair) {
    expect_states({
        {ZAV_RAIDLVL_10, 4, 0, "[4/4] [UUUU]", kNormal, nullptr},
        {ZAV_RAIDLVL_10, 4, 4, "[4/3] [UUU_]", kNormal, nullptr},
        {ZAV_RAIDLVL_10, 4, 3, "[4/3] [UUU_]", kDegraded, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [_U_U]", kDegraded, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [U_U_]", kDegraded, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [U__U]", kDegraded, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [_UU_]", kDegraded, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [UU__]", kFailed, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 2, "[4/2] [__UU]", kFailed, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 1, "[4/1] [U_U_]", kFailed, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 0, "", kFailed, "RAID10"},
        {ZAV_RAIDLVL_10, 4, 5, "", kNormal, "RAID10"},
    });
}

TEST(ArrayState, OfOtherLevelsHasNoRule) {
    for (const int level : {ZAV_RAIDLVL_NONE, ZAV_RAIDLVL_6, ZAV_RAIDLVL_50, ZAV_RAIDLVL_60, 0, 10})
        EXPECT_FALSE(zav::decide_raid_state(level, 4, 4, "[UUUU]").known) << level;
}

// ---- The third line ----

using Kind = zav::RebuildLine;

constexpr int kUntouched = -77;

void expect_line(const std::string &line, Kind kind, int percent = kUntouched) {
    // On the heap and of exactly this size, so that a read past its end is caught.
    const std::string copy(line.c_str());
    int read = kUntouched;
    EXPECT_EQ(zav::read_rebuild_line(copy.c_str(), read), kind) << line;
    EXPECT_EQ(read, percent) << line;
}

TEST(ArrayState, OfNumbersThatNoArrayHasIsDecidedAllTheSame) {
    for (const int level : {ZAV_RAIDLVL_5, ZAV_RAIDLVL_10}) {
        EXPECT_EQ(zav::decide_raid_state(level, INT_MIN, 0, "").state, ZAV_RAID_NORMAL) << level;
        EXPECT_EQ(zav::decide_raid_state(level, INT_MAX, INT_MIN, "").state, ZAV_RAID_FAILED)
            << level;
    }
}

TEST(RebuildLine, OfSixBlanksIsIdle) {
    expect_line("      \n", Kind::kIdle);
    expect_line("      ", Kind::kUnexpected);
    expect_line("     \n", Kind::kUnexpected);
    expect_line("       \n", Kind::kUnexpected);
    expect_line("\n", Kind::kUnexpected);
    expect_line("", Kind::kUnexpected);
}

TEST(RebuildLine, OfADelayedResyncNeedsItsLineEnd) {
    expect_line("      \tresync=DELAYED\n", Kind::kDelayed);
    expect_line("resync=DELAYED\n", Kind::kDelayed);
    expect_line("      \tresync=DELAYED", Kind::kUnreadable);
    expect_line("      \tresync=DELAYED \n", Kind::kUnreadable);
}

TEST(RebuildLine, GivesWholePercents) {
    expect_line("      [==>..................]  recovery = 12.6% (123/977) finish=1.2min "
                "speed=349K/sec\n",
                Kind::kRunning, 12);
    expect_line("      [>....................]  recovery =  3.6% (3840/97280) finish=4.4min\n",
                Kind::kRunning, 3);
    expect_line("      [=========>...........]  resync = 47.1% (154432/326656) finish=0.3min\n",
                Kind::kRunning, 47);
    expect_line("      [====================>]  recovery = 99.9% (1/1)\n", Kind::kRunning, 99);
    expect_line("      [>....................]  recovery = 37.9% (1/1)\n", Kind::kRunning, 37);
}

std::string from_column_29(const std::string &text) {
    return "resync" + std::string(23, '=') + text;
}

TEST(RebuildLine, SkipsToThePieceBehindTheFirstEqualsSign) {
    expect_line(from_column_29("== a = 5 %"), Kind::kRunning, 5);
    expect_line(from_column_29("a==%%7%8"), Kind::kRunning, 0); // the piece begins with '='
    expect_line(from_column_29("a=%%7%8"), Kind::kRunning, 7);
    expect_line(from_column_29("a=5"), Kind::kRunning, 5);
    expect_line(from_column_29("a=x"), Kind::kRunning, 0);
    expect_line(from_column_29("a=-1.9%"), Kind::kRunning, -1);
    expect_line(from_column_29("a=1e2%"), Kind::kRunning, 100);
    expect_line(from_column_29("a=1e99%"), Kind::kRunning, INT_MIN);
    expect_line(from_column_29("a=nan%"), Kind::kRunning, INT_MIN);
}

TEST(RebuildLine, WithoutAPercentageIsUnreadable) {
    expect_line(from_column_29("a"), Kind::kUnreadable);
    expect_line(from_column_29("a="), Kind::kUnreadable);
    expect_line(from_column_29("a=%%%"), Kind::kUnreadable);
    expect_line(from_column_29("==="), Kind::kUnreadable);
    expect_line(from_column_29(""), Kind::kUnreadable);
}

TEST(RebuildLine, IsNeverReadBehindItsEnd) {
    expect_line("      \tresync=PENDING\n", Kind::kUnreadable);
    for (size_t length = 6; length <= 29; ++length)
        expect_line(from_column_29("").substr(0, length), Kind::kUnreadable);
}

TEST(RebuildLine, OfAnotherKindIsUnexpected) {
    expect_line("      bitmap: 1/1 pages [4KB], 65536KB chunk\n", Kind::kUnexpected);
    expect_line("      [>....................]  check =  0.4% (1920/325632) finish=8.3min\n",
                Kind::kUnexpected);
    expect_line("unused devices: <none>\n", Kind::kUnexpected);
}

} // namespace
