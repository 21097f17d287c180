// What befalls a RAID controller's disks, volumes and expansion units.
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/devices.hpp"
#include "model/texts_controller.hpp"
#include "sim_machines.hpp"

#include <algorithm>
#include <gtest/gtest.h>
#include <sstream>

using namespace zavsim;

namespace {

// The lines of a section of the report that begin so.
std::string lines(const State &state, const std::string &section, const std::string &beginning) {
    std::istringstream in(report_text(state));
    std::string found;
    bool inside = false;
    for (std::string line; std::getline(in, line);) {
        if (line == "PCI" || line.rfind("RBOD#", 0) == 0)
            inside = line == section;
        if (inside && line.rfind(beginning, 0) == 0)
            found += line + "\n";
    }
    return found;
}

// Of one volume: its progress and status.
std::string volume(const State &state, const std::string &section, int number = 1) {
    const std::string line = lines(state, section, "V:" + std::to_string(number) + ":");
    std::size_t at = line.size();
    for (int field = 0; field < 2; ++field)
        at = line.rfind(':', at - 1);
    return line.substr(at + 1, line.size() - at - 2);
}

State later(State state, double seconds) {
    advance(state, state.now + seconds);
    return state;
}

std::string refusal(State state, const std::string &sentence) {
    return perform_sentence(state, sentence);
}

TEST(ControllerDisk, FailsAndDegradesItsVolumes) {
    const State state = after(with_units(2), {"disk 3 fails"});
    EXPECT_EQ(lines(state, "PCI", "D:"), "D:1:500.1:1\nD:2:500.1:1\nD:3:500.1:4\nD:4:500.1:1\n");
    EXPECT_EQ(volume(state, "PCI", 1), "0:2");
    EXPECT_EQ(volume(state, "PCI", 2), "0:2");
}

TEST(ControllerDisk, ThatVanishesHasNoSize) {
    const State state = after(with_units(2), {"disk 3 vanishes"});
    EXPECT_EQ(lines(state, "PCI", "D:3"), "D:3:0.0:2\n");
    EXPECT_EQ(volume(state, "PCI", 1), "0:2");
}

TEST(ControllerDisk, ThatFailsTouchesNoOtherSection) {
    const State state = after(with_units(2), {"disk 3 fails"});
    const State unit = after(with_units(2), {"unit 2 disk 3 fails"});
    EXPECT_EQ(lines(state, "RBOD#1", ""), lines(with_units(2), "RBOD#1", ""));
    EXPECT_EQ(lines(unit, "RBOD#1", ""), lines(with_units(2), "RBOD#1", ""));
    EXPECT_EQ(lines(unit, "PCI", ""), lines(with_units(2), "PCI", ""));
    EXPECT_EQ(lines(unit, "RBOD#2", "D:3"), "D:3:1000.2:4\n");
}

TEST(RaidVolumes, OfRaid5FailWithTheirSecondDisk) {
    const State state = after(with_units(1), {"unit 1 disk 1 fails"});
    EXPECT_EQ(volume(state, "RBOD#1"), "0:2");
    EXPECT_EQ(volume(after(state, {"unit 1 disk 3 vanishes"}), "RBOD#1"), "0:8");
}

TEST(RaidVolumes, OfRaid10BearOneLossInEachPair) {
    const State state = after(with_units(2), {"unit 2 disk 1 fails", "unit 2 disk 4 vanishes"});
    EXPECT_EQ(volume(state, "RBOD#2"), "0:2");
    EXPECT_EQ(volume(after(state, {"unit 2 disk 2 fails"}), "RBOD#2"), "0:8");
    EXPECT_EQ(volume(after(state, {"unit 2 disk 3 fails"}), "RBOD#2"), "0:8");
}

TEST(RaidVolumes, ThatAreStripedFailWithTheirFirstDisk) {
    EXPECT_EQ(volume(after(with_units(7), {"unit 7 disk 2 fails"}), "RBOD#7"), "0:8");
}

TEST(RaidVolumes, OfOneSetFailEachByItsOwnLevel) {
    const State state = after(with_units(0), {"disk 1 fails", "disk 3 fails"});
    EXPECT_EQ(volume(state, "PCI", 1), "0:8");
    EXPECT_EQ(volume(state, "PCI", 2), "0:2");
}

TEST(Replacement2980, IsRebuiltByTheControllerInFourMinutes) {
    const State state = after(with_units(0), {"disk 3 vanishes", "disk 3 appears"});
    EXPECT_EQ(lines(state, "PCI", "D:3"), "D:3:500.1:1\n");
    EXPECT_EQ(volume(state, "PCI", 1), "0:4");
    EXPECT_EQ(volume(state, "PCI", 2), "0:4");
    EXPECT_EQ(volume(later(state, 60), "PCI", 1), "25:4");
    EXPECT_EQ(volume(later(state, 239), "PCI", 1), "99:4");
    EXPECT_EQ(volume(later(state, 240), "PCI", 1), "0:1");
    EXPECT_EQ(volume(later(state, 240), "PCI", 2), "0:1");
}

TEST(Replacement2980, ProgressesAlikeInManySmallSteps) {
    State state = after(with_units(0), {"disk 3 vanishes", "disk 3 appears"});
    for (int step = 1; step <= 600; ++step)
        advance(state, 0.1 * step);
    EXPECT_EQ(volume(state, "PCI"), "25:4");
}

TEST(Replacement2980, OfADiskThatOnlyFailedNeedsAnEmptySlot) {
    const State state = after(with_units(0), {"disk 3 fails"});
    EXPECT_EQ(refusal(state, "disk 3 appears"), "disk 3 is in its slot");
    EXPECT_EQ(volume(after(state, {"disk 3 vanishes", "disk 3 appears"}), "PCI"), "0:4");
}

TEST(Replacement2980, ThatFailsEndsTheRebuild) {
    const State rebuilding = later(after(with_units(0), {"disk 3 vanishes", "disk 3 appears"}), 60);
    EXPECT_EQ(volume(after(rebuilding, {"disk 3 fails"}), "PCI"), "0:2");
    const State again = after(rebuilding, {"disk 3 vanishes", "disk 3 appears"});
    EXPECT_EQ(volume(again, "PCI"), "0:4");
}

TEST(Replacement2980, IsNoneYetWhenAnotherDiskFails) {
    const State rebuilding = later(after(with_units(0), {"disk 3 vanishes", "disk 3 appears"}), 60);
    EXPECT_EQ(volume(after(rebuilding, {"disk 1 fails"}), "PCI", 1), "0:8");
    EXPECT_EQ(volume(later(rebuilding, 180), "PCI", 1), "0:1");
    EXPECT_EQ(volume(after(later(rebuilding, 180), {"disk 1 fails"}), "PCI", 1), "0:2");
}

TEST(Replacement2980, WaitsForAnotherOfTheSameVolume) {
    const State first = after(with_units(2), {"unit 2 disk 3 vanishes", "unit 2 disk 1 vanishes",
                                              "unit 2 disk 3 appears"});
    const State both = after(later(first, 60), {"unit 2 disk 1 appears"});
    EXPECT_EQ(volume(both, "RBOD#2"), "25:4");
    EXPECT_EQ(volume(later(both, 180), "RBOD#2"), "0:4");
    EXPECT_EQ(volume(later(both, 180 + 120), "RBOD#2"), "50:4");
    EXPECT_EQ(volume(later(both, 180 + 240), "RBOD#2"), "0:1");
}

TEST(Replacement2980, DoesNotBringAFailedVolumeBack) {
    const State state = later(after(with_units(0), {"disk 1 vanishes", "disk 3 vanishes",
                                                    "disk 1 appears", "disk 3 appears"}),
                              1000);
    EXPECT_EQ(volume(state, "PCI", 1), "0:8");
    EXPECT_EQ(volume(state, "PCI", 2), "0:1");
    const State recovered = after(state, {"controller volume 1 recovers", "disk 2 fails"});
    EXPECT_EQ(volume(recovered, "PCI", 1), "0:2");
}

TEST(RaidVolumes, TakeAStateThatIsSaid) {
    for (const std::string name : {"controller volume 1 ", "unit 1 volume "}) {
        const std::string section = name[0] == 'u' ? "RBOD#1" : "PCI";
        const State state = with_units(1);
        EXPECT_EQ(volume(after(state, {name + "degrades"}), section), "0:2");
        EXPECT_EQ(volume(after(state, {name + "fails"}), section), "0:8");
        const State rebuilding = after(state, {name + "fails", name + "rebuilds"});
        EXPECT_EQ(volume(rebuilding, section), "0:4");
        EXPECT_EQ(volume(later(rebuilding, 120), section), "50:4");
        EXPECT_EQ(volume(later(rebuilding, 240), section), "0:1");
        EXPECT_EQ(volume(after(later(rebuilding, 120), {name + "recovers"}), section), "0:1");
    }
}

TEST(RaidVolumes, TakeTheStateAlone) {
    const State state = after(with_units(1), {"controller volume 2 fails"});
    EXPECT_EQ(volume(state, "PCI", 1), "0:1");
    EXPECT_EQ(volume(state, "PCI", 2), "0:8");
    EXPECT_EQ(volume(state, "RBOD#1"), "0:1");
}

// Which units the report has, and whether the topology has as many expanders.
std::string units(const State &state) {
    std::istringstream in(report_text(state));
    std::string numbers;
    for (std::string line; std::getline(in, line);)
        if (line.rfind("RBOD#", 0) == 0)
            numbers += line.substr(5);
    const std::string head = "SAS topology, " + std::to_string(numbers.size()) + " expanders\n";
    EXPECT_EQ(topology_text(state).rfind(head, 0), 0U) << topology_text(state);
    return numbers;
}

TEST(Unit, TakesAlongWhatHangsOnIt) {
    EXPECT_EQ(units(with_units(7)), "1234567");
    EXPECT_EQ(units(after(with_units(7), {"unit 2 vanishes"})), "1367");
    EXPECT_EQ(units(after(with_units(7), {"unit 1 vanishes"})), "");
    EXPECT_EQ(units(after(with_units(7), {"unit 7 vanishes"})), "123456");
}

TEST(Unit, ComesBackWithWhatHungOnIt) {
    EXPECT_EQ(report_text(after(with_units(7), {"unit 2 vanishes", "unit 2 appears"})),
              report_text(with_units(7)));
    EXPECT_EQ(topology_text(after(with_units(7), {"unit 2 vanishes", "unit 2 appears"})),
              topology_text(with_units(7)));
}

TEST(Unit, ThatVanishedByItselfComesBackByItself) {
    const State state = after(with_units(7), {"unit 5 vanishes", "unit 2 vanishes"});
    EXPECT_EQ(units(after(state, {"unit 2 appears"})), "123467");
    EXPECT_EQ(units(after(state, {"unit 5 appears"})), "1367");
    EXPECT_EQ(units(after(state, {"unit 5 appears", "unit 2 appears"})), "1234567");
}

TEST(Unit, CanBeAddedToTheCascade) {
    EXPECT_EQ(report_text(after(with_units(2), {"unit 3 appears"})), report_text(with_units(3)));
}

TEST(Unit, KeepsWhatBefellItWhileItIsAway) {
    const State away = after(
        with_units(2), {"unit 2 disk 1 vanishes", "unit 2 disk 1 appears", "unit 2 vanishes"});
    EXPECT_EQ(volume(after(later(away, 1000), {"unit 2 appears"}), "RBOD#2"), "0:4");
}

TEST(Unit, IsMonitored) {
    const State state = after(with_units(2), {"unit 2 temperature 88", "unit 2 voltage 1.1"});
    EXPECT_EQ(lines(state, "RBOD#2", "H:"), "H:88.0:2720:12.05:5.02:1.10\n");
    EXPECT_EQ(lines(state, "RBOD#1", "H:"), "H:45.0:2710:12.05:5.02:1.20\n");
}

TEST(Controller, IsMonitored) {
    const State state = after(with_units(2), {"controller temperature 71.5"});
    EXPECT_EQ(lines(state, "PCI", "H:"), "H:71.5:3300:12.10:5.05:3.33\n");
}

TEST(Controller, RefusesWhatCannotBe) {
    const State state = after(with_units(3), {"disk 2 vanishes", "unit 1 disk 2 vanishes"});
    EXPECT_EQ(refusal(state, "disk 1 appears"), "disk 1 is in its slot");
    EXPECT_EQ(refusal(state, "disk 2 vanishes"), "there is no disk 2");
    EXPECT_EQ(refusal(state, "disk 2 fails"), "there is no disk 2");
    EXPECT_EQ(refusal(state, "unit 1 disk 2 fails"), "there is no unit 1 disk 2");
    EXPECT_EQ(refusal(state, "unit 1 appears"), "unit 1 is in its place");
    EXPECT_EQ(refusal(state, "unit 4 vanishes"), "there is no unit 4");
    EXPECT_EQ(refusal(state, "unit 4 temperature 50"), "there is no unit 4");
    for (const char *verb : {"joins", "detaches", "attaches"})
        EXPECT_EQ(refusal(state, std::string("disk 1 ") + verb),
                  "the RAID controller takes disks in by itself: they fail, vanish and appear");
    const State hidden = after(state, {"unit 1 vanishes"});
    EXPECT_EQ(refusal(hidden, "unit 3 disk 1 fails"), "there is no unit 3");
    EXPECT_EQ(refusal(after(state, {"report is missing"}), "report rewrites 5s"),
              "there is no report");
}

TEST(Controller, IsTheHardwareRaidModelsAlone) {
    for (const char *sentence : {"unit 1 vanishes", "unit 1 disk 1 fails", "report is missing",
                                 "controller volume 1 fails", "controller temperature 50"})
        EXPECT_EQ(refusal(four_disks(), sentence), "this model has no RAID controller") << sentence;
}

TEST(Controller, SparesOtherModelsDisks) {
    const State state = after(four_disks(), {"disk 3 fails"});
    EXPECT_TRUE(state.disks.at(2).failing);
    EXPECT_TRUE(with_units(2).disks.empty());
}

std::vector<std::string> node_paths(const State &state) {
    std::vector<std::string> paths;
    for (const Node &node : device_nodes(state))
        paths.push_back(node.path);
    return paths;
}

bool has_node(const State &state, const std::string &path) {
    const auto paths = node_paths(state);
    return std::count(paths.begin(), paths.end(), path) == 1;
}

TEST(ControllerNodes, AreThoseOfItsDisksAndVolumesAndTheDrive) {
    EXPECT_EQ(node_paths(with_units(1)),
              (std::vector<std::string>{
                  "/dev/hwsata/disk1", "/dev/hwsata/disk2", "/dev/hwsata/disk3",
                  "/dev/hwsata/disk4", "/dev/hwraid/disk1", "/dev/hwraid/disk2", "/dev/sas/r1disk1",
                  "/dev/sas/r1disk2", "/dev/sas/r1disk3", "/dev/sas/r1disk4",
                  "/dev/sasraid/r1disk1", "/dev/sr0", "/dev/scd0", "/dev/cdrom"}));
}

TEST(ControllerNodes, OfADiskGoWithIt) {
    const State state = after(with_units(1), {"disk 2 vanishes", "unit 1 disk 3 vanishes"});
    EXPECT_FALSE(has_node(state, "/dev/hwsata/disk2"));
    EXPECT_FALSE(has_node(state, "/dev/sas/r1disk3"));
    EXPECT_TRUE(has_node(after(state, {"disk 2 appears"}), "/dev/hwsata/disk2"));
    EXPECT_TRUE(has_node(after(with_units(1), {"disk 2 fails"}), "/dev/hwsata/disk2"));
}

TEST(ControllerNodes, OfAVolumeStayWhateverItsState) {
    for (const char *verb : {"degrades", "fails", "rebuilds"}) {
        const State state = after(with_units(1), {std::string("unit 1 volume ") + verb,
                                                  std::string("controller volume 2 ") + verb});
        EXPECT_TRUE(has_node(state, "/dev/sasraid/r1disk1"));
        EXPECT_TRUE(has_node(state, "/dev/hwraid/disk2"));
    }
}

TEST(ControllerNodes, OfAUnitGoWithTheOneThatItHangsOn) {
    const State state = after(with_units(5), {"unit 2 vanishes"});
    for (const char *path : {"/dev/sas/r2disk1", "/dev/sasraid/r2disk1", "/dev/sas/r5disk4"})
        EXPECT_FALSE(has_node(state, path)) << path;
    EXPECT_TRUE(has_node(state, "/dev/sasraid/r3disk1"));
}

} // namespace
