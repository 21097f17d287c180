// What the simulated volume tools print is, but for dates and identifiers, what a current system's
// printed in the same state.
#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/texts_volumes.hpp"
#include "model/volumes.hpp"
#include "sim_machines.hpp"

#include <algorithm>
#include <fstream>
#include <functional>
#include <gtest/gtest.h>
#include <iterator>
#include <regex>

using namespace zavsim;

namespace {

std::string captured(const std::string &file) {
    std::ifstream in(std::string(CAPTURES) + "/" + file, std::ios::binary);
    EXPECT_TRUE(in) << file;
    return {std::istreambuf_iterator<char>(in), {}};
}

std::string normalised(std::string text) {
    static const std::vector<std::pair<std::regex, const char *>> rules = {
        {std::regex("[A-Za-z0-9]{6}(-[A-Za-z0-9]{4}){5}-[A-Za-z0-9]{6}"), "ID"},
        {std::regex("[A-Z][a-z]{2} [A-Z][a-z]{2} [ 0-9]{2} [0-9:]{8} [0-9]{4}"), "DATE"},
        {std::regex("[0-9]{4}-[0-9]{2}-[0-9]{2} [0-9:]{8} \\+0000"), "DATE"},
        {std::regex("creation_time = [0-9]{10}"), "creation_time = SECONDS"}};
    for (const auto &[pattern, replacement] : rules)
        text = std::regex_replace(text, pattern, replacement);
    return text;
}

const Group &group_of(const State &state, const std::string &name) {
    return *find_group(state, name);
}
const Volume &volume_of(const State &state, const std::string &group, const std::string &name) {
    return *find_volume(group_of(state, group), name);
}

std::string all_groups(const State &state) {
    return vgs_text(state, visible_groups(state));
}

std::vector<ListedVolume> listed(const State &state) {
    std::vector<ListedVolume> list;
    for (const Group *group : visible_groups(state))
        for (const Volume &volume : group->volumes)
            list.push_back({group, &volume});
    return list;
}

std::string all_volumes(const State &state) {
    return lvs_text(state, listed(state));
}

std::string all_sheets(const State &state) {
    std::string text;
    for (const auto &[group, volume] : listed(state))
        text += lvdisplay_text(state, *group, *volume);
    return text;
}

// In the display tool's order, by group, or turned round, by node.
std::vector<const PhysicalVolume *> physical(const State &state, bool turned) {
    std::vector<const PhysicalVolume *> list;
    for (const PhysicalVolume &pv : state.physical_volumes)
        list.push_back(&pv);
    if (turned)
        std::reverse(list.begin(), list.end());
    return list;
}

std::string all_pvs(const State &state) {
    return pvs_text(state, physical(state, group_of(state, "DataVG1").volumes.size() == 2));
}

std::string all_pv_sheets(const State &state) {
    std::string text;
    for (const PhysicalVolume *pv : physical(state, false))
        text += pvdisplay_text(state, *pv);
    return text;
}

State inactive_volume() {
    return after(four_disks(), {"volume 1-2 is inactive"});
}

// One group over a mirror of 63 MiB and a partition of 64.
State two_pvs() {
    State state = four_disks();
    state.groups.clear();
    state.physical_volumes.clear();
    state.arrays = {array(state, 0)};
    state.arrays.front().component_kib = 64512;
    Partition &partition = *find_partition(*find_disk(state, 2), 3);
    partition.kib = 65536;
    partition.superblock.reset();
    for (const Place &place :
         {place_of_array(state.arrays.front()), place_on_disk(*find_disk(state, 2), 3)})
        EXPECT_EQ(create_pv(state, place, place.node), "");
    EXPECT_EQ(create_group(state, "DataVG2", state.physical_volumes[0], ""), "");
    EXPECT_EQ(extend_group(state, state.groups.front(), state.physical_volumes[0], ""), "");
    EXPECT_EQ(create_volume(state, state.groups.front(), "LogVol1", 16), "");
    EXPECT_EQ(create_volume(state, state.groups.front(), "LogVol2", 4), "");
    return state;
}

struct Capture {
    std::string file;
    std::function<std::string()> text;
};

void PrintTo(const Capture &capture, std::ostream *out) {
    *out << capture.file;
}

using Captures = std::vector<Capture>;

void add_healthy(Captures &list) {
    const std::string folder = "healthy-4disk/";
    list.push_back({folder + "vgs.txt", [] { return all_groups(four_disks()); }});
    list.push_back({folder + "vgs-DataVG1.txt", [] {
                        const State state = four_disks();
                        return vgs_text(state, {&group_of(state, "DataVG1")});
                    }});
    list.push_back({folder + "lvs.txt", [] { return all_volumes(four_disks()); }});
    list.push_back({folder + "pvs.txt", [] { return all_pvs(four_disks()); }});
    list.push_back({folder + "lvdisplay.txt", [] { return all_sheets(four_disks()); }});
    list.push_back({folder + "pvdisplay.txt", [] { return all_pv_sheets(four_disks()); }});
    for (const std::string name : {"DataVG1", "PrimaryOSVG"}) {
        list.push_back({folder + "vgdisplay-" + name + ".txt", [name] {
                            const State state = four_disks();
                            return vgdisplay_text(state, group_of(state, name));
                        }});
        list.push_back({folder + "vgcfgbackup-file-" + name + ".txt", [name] {
                            const State state = four_disks();
                            return backup_text(state, group_of(state, name),
                                               "/etc/Kiru/zav/" + name);
                        }});
    }
    list.push_back({folder + "vgdisplay-c-DataVG1.txt", [] {
                        const State state = four_disks();
                        return vgdisplay_line(state, group_of(state, "DataVG1"));
                    }});
    list.push_back({folder + "pvdisplay-c-_dev_md1.txt", [] {
                        const State state = four_disks();
                        return pvdisplay_line(state, state.physical_volumes.front());
                    }});
    list.push_back({folder + "lvdisplay-c-PrimaryOSVG-LogVol2.txt", [] {
                        const State state = four_disks();
                        return lvdisplay_line(group_of(state, "PrimaryOSVG"),
                                              volume_of(state, "PrimaryOSVG", "LogVol2"));
                    }});
}

void add_inactive(Captures &list) {
    const std::string folder = "lv-inactive/";
    list.push_back({folder + "lvs.txt", [] { return all_volumes(inactive_volume()); }});
    list.push_back({folder + "vgdisplay-DataVG1.txt", [] {
                        const State state = inactive_volume();
                        return vgdisplay_text(state, group_of(state, "DataVG1"));
                    }});
    list.push_back({folder + "lvdisplay-DataVG1-LogVol2.txt", [] {
                        const State state = inactive_volume();
                        return lvdisplay_text(state, group_of(state, "DataVG1"),
                                              volume_of(state, "DataVG1", "LogVol2"));
                    }});
    list.push_back({folder + "lvdisplay-c-DataVG1-LogVol2.txt", [] {
                        const State state = inactive_volume();
                        return lvdisplay_line(group_of(state, "DataVG1"),
                                              volume_of(state, "DataVG1", "LogVol2"));
                    }});
}

void add_commands(Captures &list) {
    const std::string folder = "lvm-commands/";
    list.push_back({folder + "vgs.txt", [] { return all_groups(two_pvs()); }});
    list.push_back({folder + "lvs.txt", [] { return all_volumes(two_pvs()); }});
    list.push_back({folder + "lvdisplay.txt", [] { return all_sheets(two_pvs()); }});
    list.push_back({folder + "pvdisplay.txt", [] { return all_pv_sheets(two_pvs()); }});
    list.push_back({folder + "pvs.txt", [] {
                        const State state = two_pvs();
                        return pvs_text(state, physical(state, false));
                    }});
    list.push_back({folder + "vgdisplay-DataVG2.txt", [] {
                        const State state = two_pvs();
                        return vgdisplay_text(state, group_of(state, "DataVG2"));
                    }});
    list.push_back({folder + "vgcfgbackup-file-DataVG2.txt", [] {
                        const State state = two_pvs();
                        return backup_text(state, group_of(state, "DataVG2"),
                                           "/etc/Kiru/zav/DataVG2");
                    }});
    list.push_back({folder + "pvdisplay-c-free.txt", [] {
                        State state = two_pvs();
                        remove_group(state, "DataVG2");
                        return pvdisplay_line(state, state.physical_volumes.back());
                    }});
}

void add_other(Captures &list) {
    const auto lost = [] { return raid5_two_lost(); };
    list.push_back({"raid5-two-lost/vgs.txt", [=] { return all_groups(lost()); }});
    list.push_back({"raid5-two-lost/lvs.txt", [=] { return all_volumes(lost()); }});
    list.push_back({"raid5-two-lost/pvs.txt", [=] { return all_pvs(lost()); }});
    const auto two_disks = [] { return appliance("2860-2"); };
    list.push_back({"two-disk-healthy/vgs.txt", [=] { return all_groups(two_disks()); }});
    list.push_back({"two-disk-healthy/lvdisplay.txt", [=] { return all_sheets(two_disks()); }});
    list.push_back({"two-disk-healthy/pvdisplay.txt", [=] { return all_pv_sheets(two_disks()); }});
}

Captures all_captures() {
    Captures list;
    add_healthy(list);
    add_inactive(list);
    add_commands(list);
    add_other(list);
    return list;
}

class SimulatedVolumeText : public testing::TestWithParam<Capture> {};

TEST_P(SimulatedVolumeText, IsThatOfACurrentSystem) {
    EXPECT_EQ(normalised(GetParam().text()), normalised(captured(GetParam().file)));
}

INSTANTIATE_TEST_SUITE_P(Captures, SimulatedVolumeText, testing::ValuesIn(all_captures()),
                         [](const testing::TestParamInfo<Capture> &each) {
                             std::string name = each.param.file;
                             for (char &c : name)
                                 c = isalnum(static_cast<unsigned char>(c)) != 0 ? c : '_';
                             return name;
                         });

// The captured lists hold the capturing machine's own mounts as well.
std::vector<std::string> lines_with(const std::string &text, const std::string &part) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        if (line.find(part) != std::string::npos)
            lines.push_back(std::regex_replace(line, std::regex(" +"), " "));
    return lines;
}

TEST(SimulatedMounts, StandInTheTableAsOnACurrentSystem) {
    EXPECT_EQ(lines_with(mtab_text(four_disks()), "LogVol"),
              lines_with(captured("healthy-4disk/mtab.txt"), "LogVol"));
}

TEST(SimulatedMounts, AreListedAsOnACurrentSystem) {
    State state = four_disks();
    Group &group = *find_group(state, "DataVG1");
    group.volumes.front().file_system->used_kib = 20494; // a file of 20 MiB
    EXPECT_EQ(lines_with(df_text(state), "data1-1"),
              lines_with(captured("healthy-4disk/df-busy.txt"), "data1-1"));
}

TEST(SimulatedTables, AreDumpedAsByACurrentSfdisk) {
    State state = four_disks();
    Disk &disk = *find_disk(state, 1);
    disk.label_id = 0x3c92104d;
    EXPECT_EQ(table_dump(disk, "/dev/sata/disk1"), captured("healthy-4disk/sfdisk-d.txt"));
}

} // namespace
