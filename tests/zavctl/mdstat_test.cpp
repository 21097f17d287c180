#include "core/mdstat.h"

#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

using namespace zavctl;

namespace {

std::string captured(const std::string &scenario) {
    std::ifstream file(std::string(CAPTURES) + "/" + scenario + "/mdstat.txt");
    std::ostringstream text;
    text << file.rdbuf();
    EXPECT_FALSE(text.str().empty()) << scenario;
    return text.str();
}

} // namespace

TEST(Mdstat, HealthyAndRebuildingArraysAreTaken) {
    EXPECT_TRUE(mdstat_problems(captured("healthy-4disk")).empty());
    EXPECT_TRUE(mdstat_problems(captured("degraded-3disk")).empty());
    EXPECT_TRUE(mdstat_problems(captured("resyncing-data")).empty());
    EXPECT_TRUE(mdstat_problems(captured("two-disk-healthy")).empty());
}

TEST(Mdstat, ACheckIsNotTaken) {
    const auto problems = mdstat_problems(captured("checking"));
    ASSERT_EQ(problems.size(), 1U);
    EXPECT_EQ(problems[0].kernel_name, "md1");
    EXPECT_NE(problems[0].reason.find("check ="), std::string::npos) << problems[0].reason;
}

TEST(Mdstat, ABitmapIsNotTaken) {
    const std::string reason = mdstat_refusal(captured("internal-bitmap"), "md1");
    EXPECT_NE(reason.find("'bitmap: "), std::string::npos) << reason;
}

TEST(Mdstat, APendingResyncIsNotTaken) {
    const std::string reason = mdstat_refusal(captured("two-disk-resync-pending"), "md1");
    EXPECT_NE(reason.find("resync=PENDING"), std::string::npos) << reason;
}

TEST(Mdstat, AStatusLineOf79CharactersIsTooLong) {
    const std::string status = "      " + std::string(73, '1');
    const std::string reason =
        mdstat_refusal("md1 : active raid5\n" + status + "\n      \n", "md1");
    EXPECT_NE(reason.find("79 characters"), std::string::npos) << reason;
    EXPECT_EQ(mdstat_refusal("md1 : active raid5\n" + status.substr(1) + "\n      \n", "md1"), "");
}

TEST(Mdstat, AnotherArrayWhoseNameHoldsThisOneIsTakenForIt) {
    const std::string text = "md127 : active raid1 sda2[0]\n      1 blocks [1/1] [U]\n      \n"
                             "md1 : active raid1 sdb2[0]\n      1 blocks [1/1] [U]\n      \n";
    EXPECT_NE(mdstat_mixup(text, "md1").find("md127"), std::string::npos);
    EXPECT_EQ(mdstat_mixup(text, "md2"), "");
}

TEST(Mdstat, TextThatEndsTooSoonIsNotTaken) {
    EXPECT_NE(mdstat_refusal("md1 : active raid5\n", "md1"), "");
    EXPECT_NE(mdstat_refusal("md1 : active raid5\n      1 blocks\n", "md1"), "");
    EXPECT_NE(mdstat_refusal("md1 : active raid5", "md1"), "");
    EXPECT_EQ(mdstat_refusal("", "md1"), "");
}

TEST(Mdstat, ABlockIsTheArraysOwnLines) {
    const std::string block = mdstat_block(captured("healthy-4disk"), "md1");
    EXPECT_EQ(block.substr(0, 4), "md1 ");
    EXPECT_EQ(block.find("md0"), std::string::npos);
    EXPECT_NE(block.find("[UUUU]"), std::string::npos);
    EXPECT_EQ(mdstat_block(captured("healthy-4disk"), "md3"), "");
}

TEST(Mdstat, MembersAreActiveFaultySpareOrOut) {
    const std::string block = "md1 : active raid5 sda2[0] sdb2[1](F) sdc2[2](S) sdaa2[5](F)\n";
    EXPECT_EQ(member_state(block, "sda2"), "active");
    EXPECT_EQ(member_state(block, "sdb2"), "faulty");
    EXPECT_EQ(member_state(block, "sdc2"), "spare");
    EXPECT_EQ(member_state(block, "sdd2"), "out");
    EXPECT_EQ(member_state(block, "a2"), "out"); // a part of a name is no name
    EXPECT_EQ(member_state("", "sda2"), "unknown");
}
