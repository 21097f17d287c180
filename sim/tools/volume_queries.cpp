// vgs, lvs, pvs, vgdisplay, lvdisplay, pvdisplay and vgcfgbackup.
#include "model/texts_volumes.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/volume_arguments.hpp"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <system_error>

namespace zavsim {

namespace {

struct Groups {
    std::vector<const Group *> list;
    int status = 0;
};

// The groups that were named, or all.
Groups asked_groups(const State &state, const std::vector<std::string> &names) {
    if (names.empty())
        return {readable_groups(state), 0};
    Groups groups;
    for (const std::string &name : names)
        if (const Group *group =
                readable_group(state, name.rfind("/dev/", 0) == 0 ? name.substr(5) : name))
            groups.list.push_back(group);
        else
            groups.status = lvm_failed;
    return groups;
}

struct Volumes {
    std::vector<ListedVolume> list;
    int status = 0;
};

void list_group(Volumes &volumes, const Group &group) {
    std::vector<const Volume *> sorted;
    for (const Volume &volume : group.volumes)
        sorted.push_back(&volume);
    std::sort(sorted.begin(), sorted.end(),
              [](const Volume *a, const Volume *b) { return a->name < b->name; });
    for (const Volume *volume : sorted)
        volumes.list.push_back({&group, volume});
}

void list_named(State &state, Volumes &volumes, const std::string &word) {
    const VolumeName name = volume_name_of(state, word);
    const Group *group = readable_group(state, name.group);
    const Volume *volume = group == nullptr ? nullptr : find_volume(*group, name.volume);
    if (group != nullptr && name.volume.empty())
        return list_group(volumes, *group);
    if (volume != nullptr)
        return volumes.list.push_back({group, volume});
    if (group != nullptr)
        lvm_problem(
            fmt::format("  Failed to find logical volume \"{}/{}\"\n", name.group, name.volume));
    volumes.status = lvm_failed;
}

Volumes asked_volumes(State &state, const std::vector<std::string> &words) {
    Volumes volumes;
    for (const std::string &word : words)
        list_named(state, volumes, word);
    if (words.empty())
        for (const Group *group : readable_groups(state))
            list_group(volumes, *group);
    return volumes;
}

struct PhysicalVolumes {
    std::vector<const PhysicalVolume *> list;
    int status = 0;
};

bool is_shown(const State &state, const PhysicalVolume &pv) {
    const Group *group = find_group(state, pv.group);
    if (place_of(state, pv).size_kib > 0)
        return true;
    return group != nullptr && state.current_tools && is_visible(state, *group);
}

void list_named(const State &state, PhysicalVolumes &volumes, const std::string &path) {
    const auto place = place_behind(state, path);
    const PhysicalVolume *pv = place ? find_pv(state, place->ground) : nullptr;
    if (pv != nullptr && place_of(state, *pv).size_kib > 0)
        return volumes.list.push_back(pv);
    volumes.status =
        lvm_problem(place ? fmt::format("  Failed to find physical volume \"{}\".\n", path)
                          : fmt::format("  Cannot use {}: device not found\n", path));
}

PhysicalVolumes asked_pvs(const State &state, const std::vector<std::string> &paths) {
    PhysicalVolumes volumes;
    for (const std::string &path : paths)
        list_named(state, volumes, path);
    if (paths.empty())
        for (const PhysicalVolume &pv : state.physical_volumes)
            if (is_shown(state, pv))
                volumes.list.push_back(&pv);
    return volumes;
}

// The display tool goes by group, free ones last; the list by name.
void sort_by_group(std::vector<const PhysicalVolume *> &list) {
    std::stable_sort(
        list.begin(), list.end(), [](const PhysicalVolume *a, const PhysicalVolume *b) {
            return std::pair(a->group.empty(), a->group) < std::pair(b->group.empty(), b->group);
        });
}

void sort_by_node(const State &state, std::vector<const PhysicalVolume *> &list) {
    std::stable_sort(list.begin(), list.end(),
                     [&state](const PhysicalVolume *a, const PhysicalVolume *b) {
                         return place_of(state, *a).node < place_of(state, *b).node;
                     });
}

} // namespace

int run_vgs(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty())
        return not_simulated("vgs", arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    const Groups groups = asked_groups(turn.state(), arguments.names);
    fmt::print("{}", vgs_text(turn.state(), groups.list));
    return groups.status;
}

int run_lvs(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty())
        return not_simulated("lvs", arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    const Volumes volumes = asked_volumes(turn.state(), arguments.names);
    fmt::print("{}", lvs_text(turn.state(), volumes.list));
    return volumes.status;
}

int run_pvs(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty())
        return not_simulated("pvs", arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    PhysicalVolumes volumes = asked_pvs(turn.state(), arguments.names);
    sort_by_node(turn.state(), volumes.list);
    fmt::print("{}", pvs_text(turn.state(), volumes.list));
    return volumes.status;
}

int run_vgdisplay(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-c"});
    if (!arguments.unknown.empty())
        return not_simulated("vgdisplay", arguments.unknown, lvm_usage);
    Turn turn;
    const State &state = turn.state();
    complain_of_devices(state);
    const Groups groups = asked_groups(state, arguments.names);
    for (const Group *group : groups.list)
        fmt::print("{}", arguments.has("-c") ? vgdisplay_line(state, *group)
                                             : vgdisplay_text(state, *group));
    return groups.status;
}

int run_lvdisplay(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-c"});
    if (!arguments.unknown.empty())
        return not_simulated("lvdisplay", arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    const Volumes volumes = asked_volumes(turn.state(), arguments.names);
    for (const auto &[group, volume] : volumes.list)
        fmt::print("{}", arguments.has("-c") ? lvdisplay_line(*group, *volume)
                                             : lvdisplay_text(turn.state(), *group, *volume));
    return volumes.status;
}

int run_pvdisplay(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-c"});
    if (!arguments.unknown.empty())
        return not_simulated("pvdisplay", arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    PhysicalVolumes volumes = asked_pvs(turn.state(), arguments.names);
    sort_by_group(volumes.list);
    for (const PhysicalVolume *pv : volumes.list)
        fmt::print("{}", arguments.has("-c") ? pvdisplay_line(turn.state(), *pv)
                                             : pvdisplay_text(turn.state(), *pv));
    return volumes.status;
}

int run_vgcfgbackup(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {}, {"-f"});
    const auto file = arguments.values.find("-f");
    if (!arguments.unknown.empty() || file == arguments.values.end() || arguments.names.size() != 1)
        return not_simulated(
            "vgcfgbackup",
            arguments.unknown.empty() ? "anything but -f FILE NAME" : arguments.unknown, lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    const Group *group = readable_group(turn.state(), arguments.names.front());
    if (group == nullptr)
        return lvm_failed;
    // Not created where its directory is missing: write_text would make that.
    if (!std::filesystem::is_directory(std::filesystem::absolute(file->second).parent_path()))
        return lvm_problem(fmt::format("  {}: Failed to create: No such file or directory\n"
                                       "  Backup of volume group {} metadata failed.\n",
                                       file->second, group->name));
    write_text(file->second, backup_text(turn.state(), *group, file->second));
    fmt::print("  Volume group \"{}\" successfully backed up.\n", group->name);
    return 0;
}

} // namespace zavsim
