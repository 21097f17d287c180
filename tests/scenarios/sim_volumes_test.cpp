// Volumes in the model.
#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/contents.hpp"
#include "model/devices.hpp"
#include "model/disks.hpp"
#include "model/factory.hpp"
#include "model/json.hpp"
#include "model/texts_volumes.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <gtest/gtest.h>

using namespace zavsim;

namespace {

State appliance(const std::string &level = "", const std::string &model = "2860-4") {
    return new_appliance({model, level, false, 1, false});
}

void act(State &state, const std::string &sentence) {
    ASSERT_EQ(perform_sentence(state, sentence), "") << sentence;
}

bool has_node(const State &state, const std::string &path) {
    const auto nodes = device_nodes(state);
    return std::any_of(nodes.begin(), nodes.end(),
                       [&path](const Node &node) { return node.path == path; });
}

Volume &volume(State &state, const std::string &group, const std::string &name) {
    return *find_volume(*find_group(state, group), name);
}

std::vector<std::string> groups_of(const State &state) {
    std::vector<std::string> names;
    for (const Group *group : visible_groups(state))
        names.push_back(group->name);
    return names;
}

using Names = std::vector<std::string>;

TEST(SimulatedVolumes, AreThereOnEveryModelWithArrays) {
    for (const std::string model : {"2740-2", "2740-4", "2860-2", "2860-4"})
        EXPECT_EQ(groups_of(appliance("", model)), (Names{"DataVG1", "PrimaryOSVG"})) << model;
    for (const std::string model : {"2740", "2980"})
        EXPECT_EQ(groups_of(appliance("", model)), Names{}) << model;
}

TEST(SimulatedVolumes, HaveNodesWhileTheyAreActive) {
    State state = appliance();
    EXPECT_TRUE(has_node(state, "/dev/DataVG1/LogVol2"));
    EXPECT_TRUE(has_node(state, "/dev/mapper/DataVG1-LogVol2"));
    EXPECT_TRUE(has_node(state, "/dev/dm-1"));
    act(state, "volume 1-2 is inactive");
    EXPECT_FALSE(has_node(state, "/dev/DataVG1/LogVol2"));
    EXPECT_FALSE(has_node(state, "/dev/dm-1"));
    EXPECT_TRUE(has_node(state, "/dev/DataVG1/LogVol1"));
    act(state, "volume 1-2 is active");
    EXPECT_TRUE(has_node(state, "/dev/DataVG1/LogVol2"));
    EXPECT_EQ(volume(state, "DataVG1", "LogVol2").mount_point, "/mnt/internal/data1-2");
}

TEST(SimulatedVolumes, FillToTheShareThatUsersCannotWrite) {
    State state = appliance();
    for (const auto &[sentence, percent] :
         std::vector<std::pair<std::string, int>>{{"volume 0-1 fills 95%", 95},
                                                  {"volume 0-1 fills 100%", 100},
                                                  {"volume 0-1 fills 40%", 40}}) {
        act(state, sentence);
        const FileSystem &system = *volume(state, "PrimaryOSVG", "LogVol1").file_system;
        const double usage =
            (1 - static_cast<double>(available_kib(system)) / static_cast<double>(system.kib)) *
            100;
        EXPECT_GE(usage, percent);
        EXPECT_LT(usage, percent + 0.01);
        EXPECT_LE(system.used_kib, system.kib);
    }
}

TEST(SimulatedVolumes, ABusyOneStaysMounted) {
    State state = appliance();
    act(state, "volume 1-1 is busy");
    EXPECT_NE(perform_sentence(state, "volume 1-1 is inactive"), "");
    act(state, "volume 1-1 is idle");
    act(state, "volume 1-1 is inactive");
    EXPECT_NE(perform_sentence(state, "volume 1-1 is busy"), "");
}

TEST(SimulatedVolumes, ThatAreNotThereTakeNoSentence) {
    State state = appliance();
    for (const char *sentence : {"volume 2-1 fills 5%", "volume 1-3 is busy", "volume 0-9 is idle"})
        EXPECT_NE(perform_sentence(state, sentence), "") << sentence;
}

TEST(SimulatedVolumes, HoldTheirArray) {
    State state = appliance();
    EXPECT_EQ(stop_array(state, 1), Refusal::busy);
    EXPECT_NE(perform_sentence(state, "array 2 stops"), "");
    act(state, "volume 1-1 is inactive");
    EXPECT_EQ(stop_array(state, 1), Refusal::busy);
    act(state, "volume 1-2 is inactive");
    act(state, "array 2 stops");
    EXPECT_FALSE(has_node(state, "/dev/md1"));
    EXPECT_EQ(groups_of(state), Names{"PrimaryOSVG"});
}

// The metadata stand where a redundant array may still be read, as on a current system.
TEST(SimulatedVolumes, GoWithTheBeginningOfAFailedArray) {
    State late = appliance();
    act(late, "disk 3 vanishes");
    act(late, "disk 4 vanishes");
    EXPECT_EQ(groups_of(late), (Names{"DataVG1", "PrimaryOSVG"}));
    State early = appliance();
    act(early, "disk 1 vanishes");
    act(early, "disk 2 vanishes");
    EXPECT_EQ(groups_of(early), Names{"PrimaryOSVG"});
    State stripe = appliance("raid0");
    act(stripe, "disk 2 vanishes");
    EXPECT_TRUE(is_failed(stripe, *find_array(stripe, 1)));
    EXPECT_EQ(groups_of(stripe), (Names{"DataVG1", "PrimaryOSVG"}));
    State row = appliance("linear");
    act(row, "disk 1 vanishes");
    EXPECT_EQ(groups_of(row), Names{"PrimaryOSVG"});
}

TEST(SimulatedVolumes, AnArrayThatCannotBeWrittenKeepsItsMetadata) {
    State state = appliance();
    act(state, "disk 3 vanishes");
    act(state, "disk 4 vanishes");
    Group &group = *find_group(state, "DataVG1");
    group.volumes.front().mount_point.clear();
    EXPECT_NE(remove_volume(state, group, "LogVol1"), "");
    EXPECT_EQ(group.volumes.size(), 2U);
}

TEST(SimulatedVolumes, AreForgottenWithTheLastSuperblockOfTheirArray) {
    State state = appliance();
    act(state, "volume 1-1 is inactive");
    act(state, "volume 1-2 is inactive");
    act(state, "array 2 stops");
    for (Disk &disk : state.disks) {
        ASSERT_NE(find_group(state, "DataVG1"), nullptr);
        partition_was_written(state, disk, *find_partition(disk, 2), {0, 1048576});
    }
    EXPECT_EQ(find_group(state, "DataVG1"), nullptr);
    EXPECT_TRUE(state.stopped.empty());
    EXPECT_EQ(state.physical_volumes.size(), 1U);
}

TEST(SimulatedVolumes, FillTheGapsThatOthersLeft) {
    State state = appliance();
    Group &group = *find_group(state, "PrimaryOSVG");
    group.volumes.front().mount_point.clear();
    EXPECT_EQ(remove_volume(state, group, "LogVol1"), "");
    EXPECT_EQ(create_volume(state, group, "LogVol3", 20), "  Volume group \"PrimaryOSVG\" has "
                                                          "insufficient free space (19 extents): "
                                                          "20 required.\n");
    EXPECT_EQ(create_volume(state, group, "LogVol3", 10), "");
    const Volume &made = group.volumes.back();
    ASSERT_EQ(made.segments.size(), 2U);
    EXPECT_EQ(made.segments[0].first, 0);
    EXPECT_EQ(made.segments[0].extents, 8);
    EXPECT_EQ(made.segments[1].first, 12);
    EXPECT_EQ(made.segments[1].extents, 2);
}

TEST(SimulatedVolumes, SurviveTheStateFile) {
    State state = appliance();
    act(state, "volume 1-2 is inactive");
    const State back = state_from_text(to_text(state));
    EXPECT_EQ(to_text(back), to_text(state));
    EXPECT_EQ(mtab_text(back), mtab_text(state));
}

TEST(SimulatedDevices, AreKnownToUdevByTheAppliancesLinks) {
    const State state = appliance();
    EXPECT_EQ(udev_links(state, "md1"), "swraid/disk2p1");
    EXPECT_EQ(udev_links(state, "sdb1").rfind("sata/disk2p1 disk/by-path/", 0), 0U);
    EXPECT_EQ(udev_links(state, "sdb").rfind("sata/disk2 disk/by-path/", 0), 0U);
    for (const char *name : {"md7", "md", "mdx", "sdx", "sda9", "sr0", "dm-9", ""})
        EXPECT_EQ(udev_links(state, name), "") << name;
}

TEST(SimulatedDisks, LoseWhatIsWrittenOver) {
    State state = appliance();
    Disk &disk = *find_disk(state, 4);
    disk_was_written(state, disk, {0, 2097152}, 0);
    EXPECT_EQ(disk.label_id, 0U);
    EXPECT_TRUE(disk.table_wiped);
    EXPECT_FALSE(find_partition(disk, 1)->superblock);
    EXPECT_TRUE(find_partition(disk, 2)->superblock);
    EXPECT_TRUE(has_node(state, "/dev/sata/disk4p2")); // until the kernel looks again
    act(state, "disk 4 detaches");
    act(state, "disk 4 attaches");
    EXPECT_FALSE(has_node(state, "/dev/sata/disk4p2"));
}

TEST(SimulatedDisks, AMarkMakesACurrentUdevLookAgain) {
    State old = appliance();
    disk_was_written(old, *find_disk(old, 4), {440, 2}, 0x104d);
    EXPECT_TRUE(has_node(old, "/dev/sata/disk4p2"));
    State current = new_appliance({"2860-4", "", true, 1, false});
    disk_was_written(current, *find_disk(current, 4), {440, 2}, 0x104d);
    EXPECT_FALSE(has_node(current, "/dev/sata/disk4p2"));
    EXPECT_TRUE(has_node(current, "/dev/sata/disk4"));
    current.now += 1.1;
    EXPECT_TRUE(has_node(current, "/dev/sata/disk4p2"));
}

} // namespace
