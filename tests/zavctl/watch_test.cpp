// What is read of arrays and seen while they change.
#include "core/array_table.h"
#include "core/watch.h"

#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

using namespace zavctl;
using Words = std::vector<std::string>;
using Hold = ArrayMember::Hold;

namespace {

std::string captured(const std::string &file) {
    std::ifstream stream(std::string(CAPTURES) + "/" + file);
    std::ostringstream text;
    text << stream.rdbuf();
    EXPECT_FALSE(text.str().empty()) << file;
    return text.str();
}

ArrayTable table(const std::string &scenario, const char *array = "md1") {
    return table_in_detail(captured(scenario + "/mdadm-detail-" + array + ".txt"));
}

std::vector<Sight> sights(const std::string &text) {
    return sights_in_mdstat(text, {{"sdc2", "disk3p2"}});
}

} // namespace

TEST(ArrayTable, AHealthyArraysMembersAreActive) {
    const ArrayTable healthy = table("healthy-4disk");
    EXPECT_EQ(healthy.level, "raid5");
    EXPECT_EQ(healthy.places, 4);
    ASSERT_EQ(healthy.members.size(), 4U);
    EXPECT_EQ(healthy.members[2].hold, Hold::active);
    EXPECT_EQ(healthy.members[2].place, 2);
    EXPECT_EQ(healthy.members[2].node, "sdd2");
}

TEST(ArrayTable, ARaid10sMembersNameTheirDeviceBehindTheirSet) {
    EXPECT_EQ(table("raid10-healthy").members[1].node, "sdb2");
}

TEST(ArrayTable, FaultyMembersAreToldWithAndWithoutADevice) {
    const ArrayTable failed = table("member-failed");
    ASSERT_EQ(failed.members.size(), 4U);
    EXPECT_EQ(failed.members[3].hold, Hold::faulty);
    EXPECT_EQ(failed.members[3].node, "sdd2");
    ArrayTable vanished = table("disk-vanished");
    ASSERT_EQ(vanished.members.size(), 4U);
    EXPECT_EQ(vanished.members[3].hold, Hold::faulty);
    EXPECT_EQ(vanished.members[3].node, "");
    add_nodes(vanished, "md1 : active raid5 sda2[0] sdd2[3](F) sdc2[2] sdb2[1]\n");
    EXPECT_EQ(vanished.members[3].node, "sdd2");
    EXPECT_EQ(vanished.members[0].node, "sda2");
}

TEST(ArrayTable, AMemberBeingRebuiltIsNoActiveOne) {
    const ArrayTable rebuilding = table("resyncing-data");
    EXPECT_TRUE(
        std::any_of(rebuilding.members.begin(), rebuilding.members.end(),
                    [](const ArrayMember &member) { return member.hold == Hold::rebuilding; }));
}

TEST(ArrayTable, TheScanTellsArrayAndLevel) {
    const ScanWords words = words_of_scan("ARRAY /dev/md/MD1 level=raid5 metadata=1.2 name=a\n");
    EXPECT_EQ(words.array, "/dev/md/MD1");
    EXPECT_EQ(words.level, "raid5");
    EXPECT_EQ(words_of_scan("ARRAY /dev/md/MD1  metadata=1.2\n").level, "");
    EXPECT_EQ(words_of_scan("ARRAY /dev/md/MD1 level=raid6\n").level, "");
    EXPECT_EQ(words_of_scan("ARRAY /dev/md/" + std::string(40, 'x') + " level=raid5\n").array, "");
    EXPECT_EQ(words_of_scan("").array, "");
}

TEST(Watch, DifferencesAreSaidInThisSystemsNames) {
    const std::string before = "md1 : active raid5 sda2[0] sdc2[2]\n      1 blocks\n";
    const auto seen = [&before](const std::string &after) {
        return differences(sights(before), sights(after));
    };
    EXPECT_EQ(seen(before), Words{});
    EXPECT_EQ(seen("md1 : active raid5 sda2[0] sdc2[2](F)\n"), Words{"disk3p2 is faulty in md1"});
    EXPECT_EQ(seen("md1 : active raid5 sda2[0]\n"), Words{"disk3p2 is out of md1"});
    EXPECT_EQ(seen(before + "md2 : active raid1 sde3[0](S)\n"),
              (Words{"md2 runs", "sde3 is a spare of md2"}));
    EXPECT_EQ(seen(""),
              (Words{"md1 does not run any more", "sda2 is out of md1", "disk3p2 is out of md1"}));
}

TEST(Watch, WhatToolsPrintIsMarkedAndMadeSafe) {
    EXPECT_EQ(tool_lines("mdadm: a\033[31m\n\n  b"),
              "          | mdadm: a\\x1b[31m\n          | b\n");
    EXPECT_EQ(tool_lines(""), "");
}
