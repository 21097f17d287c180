// pvcreate, pvremove, vgcreate, vgextend, vgremove, vgchange, lvcreate, lvremove and lvchange.
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/volume_arguments.hpp"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <iostream>

namespace zavsim {

namespace {

// Asks on standard output; no answer is a no.
bool confirmed(const std::string &question) {
    fmt::print("{} [y/n]: ", question);
    std::fflush(stdout);
    std::string answer;
    if (!std::getline(std::cin, answer)) {
        fmt::print("[n]\n");
        std::fflush(stdout);
        return false;
    }
    return !answer.empty() && (answer.front() == 'y' || answer.front() == 'Y');
}

int finish(Turn &turn, const std::string &problem, const std::string &success) {
    if (!problem.empty())
        return lvm_problem(problem);
    turn.commit();
    fmt::print("{}", success);
    return 0;
}

int usage_problem(const std::string &tool, const Arguments &arguments, const std::string &usage) {
    return not_simulated(
        tool, arguments.unknown.empty() ? "anything but " + usage : arguments.unknown, lvm_usage);
}

// A physical volume behind the path: the one that is there, or a new one.
struct FoundPv {
    PhysicalVolume *pv = nullptr;
    bool made = false;
    std::string problem;
};

FoundPv find_or_make_pv(State &state, const std::string &path) {
    const auto place = place_behind(state, path);
    if (!place)
        return {nullptr, false, fmt::format("  No device found for {}.\n", path)};
    if (PhysicalVolume *pv = find_pv(state, place->ground))
        return {pv, false, {}};
    const std::string problem = create_pv(state, *place, path);
    return {find_pv(state, place->ground), true, problem};
}

std::string made_text(const std::string &path) {
    return fmt::format("  Physical volume \"{}\" successfully created.\n", path);
}

std::string invalid_name(const std::string &name) {
    return fmt::format("  Name contains invalid character, valid set includes: [a-zA-Z0-9.-_+].\n"
                       "  New name \"{}\" is invalid.\n",
                       name);
}

std::string remove_all_volumes(State &state, Group &group) {
    while (!group.volumes.empty()) {
        const std::string name = group.volumes.back().name;
        std::string problem = remove_volume(state, group, name);
        if (!problem.empty())
            return problem;
    }
    return {};
}

std::string pvremove_problem(State &state, const std::string &path, bool forced) {
    const auto place = place_behind(state, path);
    if (!place)
        return fmt::format("  No device found for {}.\n", path);
    const PhysicalVolume *pv = find_pv(state, place->ground);
    if (pv == nullptr)
        return forced ? "" : fmt::format("  No PV found on device {}.\n", path);
    if (pv->group.empty()) {
        remove_pv(state, place->ground);
        return {};
    }
    return fmt::format("  PV {} is used by VG {} so please use vgreduce first.\n"
                       "  (If you are certain you need pvremove, then confirm by using --force "
                       "twice.)\n  {}: physical volume label not removed.\n",
                       path, pv->group, path);
}

// "100", "128m", "1G" in extents; 0 when it is no size.
int extents_of_size(const std::string &text) {
    const std::size_t end = std::min(text.find_first_not_of("0123456789"), text.size());
    const std::string unit = text.substr(end);
    if (end == 0 || end > 9 || unit.size() > 1)
        return 0;
    const std::uint64_t number = std::stoull(text.substr(0, end));
    const char letter = unit.empty() ? 'm' : static_cast<char>(tolower(unit.front()));
    const std::uint64_t kib = letter == 'k'   ? number
                              : letter == 'm' ? number * 1024
                              : letter == 'g' ? number * 1024 * 1024
                                              : 0;
    return static_cast<int>(std::min<std::uint64_t>((kib + extent_kib - 1) / extent_kib, 1U << 30));
}

int wanted_extents(const Arguments &arguments) {
    const auto size = arguments.values.find("-L");
    const auto extents = arguments.values.find("-l");
    if (size != arguments.values.end())
        return extents_of_size(size->second);
    const std::string number = extents == arguments.values.end() ? "" : extents->second;
    return number.empty() || number.size() > 8 ||
                   number.find_first_not_of("0123456789") != std::string::npos
               ? 0
               : std::stoi(number);
}

struct Target {
    Group *group = nullptr;
    std::vector<std::string> volumes;
};

// The volume that was named, or all of a group.
Target target_of(State &state, const std::string &word) {
    const VolumeName name = volume_name_of(state, word);
    if (readable_group(state, name.group) == nullptr)
        return {};
    Target target{find_group(state, name.group), {}};
    for (const Volume &volume : target.group->volumes)
        if (name.volume.empty() || volume.name == name.volume)
            target.volumes.push_back(volume.name);
    if (!name.volume.empty() && target.volumes.empty()) {
        lvm_problem(
            fmt::format("  Failed to find logical volume \"{}/{}\"\n", name.group, name.volume));
        return {};
    }
    return target;
}

std::string switch_volume(State &state, const Group &group, Volume &volume, bool on) {
    return on ? activate(state, volume) : deactivate(group, volume);
}

// -ay or -an for one word; `told` gets what the group's tool says.
int switch_volumes(State &state, const std::string &word, bool on, std::string &told) {
    const Target target = target_of(state, word);
    if (target.group == nullptr)
        return lvm_failed;
    for (const std::string &name : target.volumes) {
        const std::string problem =
            switch_volume(state, *target.group, *find_volume(*target.group, name), on);
        if (!problem.empty())
            return lvm_problem(problem);
    }
    told += fmt::format("  {} logical volume(s) in volume group \"{}\" now active\n",
                        on ? target.volumes.size() : 0, target.group->name);
    return 0;
}

int run_change(const char *tool, const std::vector<std::string> &words, bool tells) {
    const Arguments arguments = sort_words(words, {"-ay", "-an"});
    const bool on = arguments.has("-ay");
    if (!arguments.unknown.empty() || arguments.names.empty() || on == arguments.has("-an"))
        return usage_problem(tool, arguments, "-ay or -an and a name");
    Turn turn;
    std::string told;
    int status = 0;
    for (const std::string &word : arguments.names)
        status = std::max(status, switch_volumes(turn.state(), word, on, told));
    turn.commit();
    if (tells)
        fmt::print("{}", told);
    return status;
}

} // namespace

int run_pvcreate(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-y", "--yes", "-f"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return usage_problem("pvcreate", arguments, "one device");
    const std::string path = arguments.names.front();
    Turn turn;
    const auto place = place_behind(turn.state(), path);
    if (!place)
        return lvm_problem(fmt::format("  No device found for {}.\n", path));
    return finish(turn, create_pv(turn.state(), *place, path), made_text(path));
}

int run_pvremove(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-f", "-y", "--yes"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return usage_problem("pvremove", arguments, "one device");
    const std::string path = arguments.names.front();
    Turn turn;
    return finish(turn, pvremove_problem(turn.state(), path, arguments.has("-f")),
                  fmt::format("  Labels on physical volume \"{}\" successfully wiped.\n", path));
}

int run_vgcreate(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-y", "--yes"});
    if (!arguments.unknown.empty() || arguments.names.size() != 2)
        return usage_problem("vgcreate", arguments, "a name and one device");
    const std::string name = arguments.names[0];
    const std::string path = arguments.names[1];
    Turn turn;
    const Group *present = find_group(turn.state(), name);
    const bool taken = present != nullptr && is_visible(turn.state(), *present);
    if (!is_valid_name(name))
        return lvm_problem(invalid_name(name));
    if (!taken && std::filesystem::exists("/dev/" + name))
        return lvm_problem(fmt::format("  /dev/{}: already exists in filesystem\n", name));
    const FoundPv found = find_or_make_pv(turn.state(), path);
    if (!found.problem.empty())
        return lvm_problem(found.problem);
    return finish(turn, create_group(turn.state(), name, *found.pv, path),
                  (found.made ? made_text(path) : "") +
                      fmt::format("  Volume group \"{}\" successfully created\n", name));
}

int run_vgextend(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-y", "--yes"});
    if (!arguments.unknown.empty() || arguments.names.size() != 2)
        return usage_problem("vgextend", arguments, "a name and one device");
    const std::string name = arguments.names[0];
    const std::string path = arguments.names[1];
    Turn turn;
    if (readable_group(turn.state(), name) == nullptr)
        return lvm_failed;
    const FoundPv found = find_or_make_pv(turn.state(), path);
    if (!found.problem.empty())
        return lvm_problem(found.problem);
    Group &group = *find_group(turn.state(), name);
    return finish(turn, extend_group(turn.state(), group, *found.pv, path),
                  (found.made ? made_text(path) : "") +
                      fmt::format("  Volume group \"{}\" successfully extended\n", name));
}

int run_vgremove(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-f", "-y", "--yes"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return usage_problem("vgremove", arguments, "one name");
    const std::string name = arguments.names.front();
    std::size_t volumes = 0;
    {
        Turn turn;
        complain_of_devices(turn.state());
        const Group *group = readable_group(turn.state(), name);
        if (group == nullptr)
            return lvm_failed;
        volumes = group->volumes.size();
    }
    // The answer may take its time, while others go on.
    if (volumes > 0 && arguments.flags.empty() &&
        !confirmed(fmt::format("Do you really want to remove volume group \"{}\" containing {} "
                               "logical volumes?",
                               name, volumes)))
        return lvm_problem(fmt::format("  Volume group \"{}\" not removed\n", name));
    Turn turn;
    Group *group = find_group(turn.state(), name);
    if (group == nullptr)
        return lvm_failed;
    const std::string problem = remove_all_volumes(turn.state(), *group);
    if (problem.empty())
        remove_group(turn.state(), name);
    turn.commit();
    return finish(turn, problem, fmt::format("  Volume group \"{}\" successfully removed\n", name));
}

int run_vgchange(const std::vector<std::string> &words) {
    return run_change("vgchange", words, true);
}

int run_lvchange(const std::vector<std::string> &words) {
    return run_change("lvchange", words, false);
}

int run_lvcreate(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-y", "--yes"}, {"-L", "-l", "-n"});
    const auto name = arguments.values.find("-n");
    const int extents = wanted_extents(arguments);
    if (!arguments.unknown.empty() || arguments.names.size() != 1 || extents <= 0 ||
        name == arguments.values.end())
        return usage_problem("lvcreate", arguments, "-L SIZE -n NAME GROUP");
    if (!is_valid_name(name->second))
        return lvm_problem(invalid_name(name->second));
    Turn turn;
    if (readable_group(turn.state(), arguments.names.front()) == nullptr)
        return lvm_failed;
    Group &group = *find_group(turn.state(), arguments.names.front());
    return finish(turn, create_volume(turn.state(), group, name->second, extents),
                  fmt::format("  Logical volume \"{}\" created.\n", name->second));
}

int run_lvremove(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-f", "-y", "--yes"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return usage_problem("lvremove", arguments, "one volume");
    if (arguments.flags.empty())
        return not_simulated("lvremove", "to ask (without -f)", lvm_usage);
    Turn turn;
    complain_of_devices(turn.state());
    const Target target = target_of(turn.state(), arguments.names.front());
    if (target.group == nullptr)
        return lvm_failed;
    std::string told;
    std::string problem;
    for (const std::string &name : target.volumes) {
        problem = remove_volume(turn.state(), *target.group, name);
        if (!problem.empty())
            break;
        told += fmt::format("  Logical volume \"{}\" successfully removed.\n", name);
    }
    turn.commit();
    return finish(turn, problem, told);
}

} // namespace zavsim
