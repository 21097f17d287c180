// Arrays that are stopped and made anew, in the model.
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/texts.hpp"
#include "sim_machines.hpp"

#include <gtest/gtest.h>

using namespace zavsim;

namespace {

// Without its volumes an array is free.
State released(const std::string &level = "") {
    State state = four_disks(level);
    state.current_tools = false;
    state.groups.clear();
    return state;
}

TEST(SimulatedArrays, ANewRaid5BeginsWithARecoveryUnlessItIsForced) {
    for (const bool forced : {false, true}) {
        State state = released();
        ASSERT_EQ(stop_array(state, 1), Refusal::none);
        NewArray wanted{1, "MD1", "raid5", "1.2", forced, {{1, 2}, {2, 2}, {3, 2}, {4, 2}}};
        ASSERT_EQ(create_array(state, wanted), Refusal::none);
        EXPECT_EQ(create_array(state, wanted), Refusal::busy);
        const Array &made = array(state, 1);
        EXPECT_EQ(array_kib(made), 976896U);
        EXPECT_EQ(made.sync.kind, forced ? SyncKind::resync : SyncKind::recovery);
        EXPECT_EQ(is_degraded(made), !forced);
        advance(state, 241);
        EXPECT_EQ(array(state, 1).sync.kind, SyncKind::none);
        EXPECT_FALSE(is_degraded(array(state, 1)));
    }
}

TEST(SimulatedArrays, ARaid10OfThreeBearsOneLoss) {
    State state = released();
    ASSERT_EQ(stop_array(state, 1), Refusal::none);
    ASSERT_EQ(create_array(state, {1, "MD1", "raid10", "1.2", true, {{1, 2}, {2, 2}, {3, 2}}}),
              Refusal::none);
    Array &data = array(state, 1);
    EXPECT_EQ(array_kib(data), 488448U);
    EXPECT_EQ(fail_member(state, data, "a", 2), Refusal::none);
    EXPECT_EQ(fail_member(state, data, "c", 2), Refusal::busy);
}

TEST(SimulatedArrays, AStoppedOneIsKnownByItsMembers) {
    State state = released();
    ASSERT_EQ(stop_array(state, 1), Refusal::none);
    EXPECT_EQ(mdstat_text(state).find("md1"), std::string::npos);
    const Disk &disk = *find_disk(state, 3);
    const Partition &partition = *find_partition(disk, 2);
    EXPECT_NE(examine_scan_text(state, partition).find("/dev/md/MD1 level=raid5"),
              std::string::npos);
    EXPECT_NE(query_text(state, disk, &partition, "p").find("undetected raid5"), std::string::npos);
}

TEST(SimulatedArrays, WithoutRedundancyFailWithAnyDisk) {
    for (const std::string level : {"raid0", "linear"})
        for (const int slot : {1, 4}) {
            State state = released(level);
            EXPECT_FALSE(is_failed(state, array(state, 1)));
            state = after(state, {"disk " + std::to_string(slot) + " vanishes"});
            EXPECT_TRUE(is_failed(state, array(state, 1)));
            EXPECT_EQ(beginning_is_readable(state, array(state, 1)), slot != 1);
            EXPECT_EQ(stop_array(state, 1), Refusal::none);
        }
}

// Where the controller's hosts are not found the number is left out, and the kernel reads the next.
TEST(SimulatedDisks, ACommandWithoutAHostMeansTheFirst) {
    State state = released();
    scsi_command(state, "scsi remove-single-device  0 0 0");
    EXPECT_FALSE(find_disk(state, 1)->attached);
    EXPECT_TRUE(find_disk(state, 4)->attached);
}

} // namespace
