#include "model/actions.hpp"

#include "model/arrays.hpp"
#include "model/contents.hpp"
#include "model/controller_actions.hpp"
#include "model/disks.hpp"
#include "model/driver_events.hpp"
#include "model/health_actions.hpp"
#include "model/optical.hpp"
#include "model/sentences.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <sstream>

namespace zavsim {

namespace {

// The member that an array holds of this very disk, whatever it is called by now.
const Member *held_member(const Array &array, const Disk &disk) {
    for (const Member &member : array.members)
        if (member.serial == disk.serial)
            return &member;
    return nullptr;
}

void fail_members(State &state, const Disk &disk) {
    for (Array &array : state.arrays)
        if (const Member *member = held_member(array, disk))
            fail_member(state, array, std::string(member->letter), member->partition);
}

std::string disk_fails(State &state, Disk &disk) {
    if (!disk.inserted)
        return fmt::format("there is no disk {}", disk.slot);
    disk.failing = true;
    fail_members(state, disk);
    return {};
}

// The kernel gives a disk up that stays in its slot, with all that it holds.
std::string disk_detaches(State &state, Disk &disk) {
    if (!disk.attached)
        return fmt::format("there is no disk {}", disk.slot);
    detach(state, disk);
    fail_members(state, disk);
    return {};
}

std::string disk_attaches(State &state, Disk &disk) {
    if (!disk.inserted || disk.attached)
        return fmt::format("disk {} {}", disk.slot,
                           disk.attached ? "is attached" : "is not in its slot");
    attach(state, disk);
    return {};
}

std::string disk_vanishes(State &state, Disk &disk) {
    if (!disk.inserted)
        return fmt::format("there is no disk {}", disk.slot);
    if (disk.attached)
        disk_detaches(state, disk);
    disk.inserted = false;
    forget_lost(state);
    return {};
}

std::string disk_appears(State &state, Disk &disk) {
    if (disk.inserted)
        return fmt::format("disk {} is in its slot", disk.slot);
    disk = blank_disk(state, disk.slot);
    attach(state, disk);
    forget_lost(state);
    return {};
}

const Disk *pattern_for(const State &state, const Disk &disk) {
    for (const Disk &other : state.disks)
        if (other.slot != disk.slot && other.attached && !other.partitions.empty())
            return &other;
    return nullptr;
}

void copy_partitions(const Disk &pattern, Disk &disk) {
    for (const Partition &partition : pattern.partitions)
        disk.partitions.push_back({partition.number, partition.start, partition.kib, std::nullopt});
}

void drop_faulty_members_of_slot(Array &array, int slot) {
    auto &members = array.members;
    members.erase(std::remove_if(members.begin(), members.end(),
                                 [slot](const Member &member) {
                                     return member.slot == slot && member.role == Role::faulty;
                                 }),
                  members.end());
}

std::string disk_joins(State &state, Disk &disk) {
    if (!disk.attached)
        return fmt::format("there is no disk {}", disk.slot);
    const Disk *pattern = pattern_for(state, disk);
    if (disk.partitions.empty() && pattern == nullptr)
        return fmt::format("no other disk has partitions for disk {}", disk.slot);
    if (disk.partitions.empty())
        copy_partitions(*pattern, disk);
    disk.label_id = (disk.label_id & 0xffff0000U) | disk_mark;
    // From the first array on: the one that asks first rebuilds first.
    for (auto array = state.arrays.rbegin(); array != state.arrays.rend(); ++array) {
        drop_faulty_members_of_slot(*array, disk.slot);
        if (is_degraded(*array))
            add_member(state, *array, disk.letter, array->minor + 1);
    }
    return {};
}

std::string act_on_disk(State &state, const Action &action) {
    Disk *disk = find_disk(state, action.number);
    if (disk == nullptr)
        return fmt::format("this model has no slot {}", action.number);
    switch (action.kind) {
    case Action::Kind::disk_fails:
        return disk_fails(state, *disk);
    case Action::Kind::disk_vanishes:
        return disk_vanishes(state, *disk);
    case Action::Kind::disk_appears:
        return disk_appears(state, *disk);
    case Action::Kind::disk_detaches:
        return disk_detaches(state, *disk);
    case Action::Kind::disk_attaches:
        return disk_attaches(state, *disk);
    default:
        return disk_joins(state, *disk);
    }
}

std::string act_on_array(State &state, const Action &action) {
    Array *array = find_array(state, action.number - 1);
    if (array == nullptr)
        return fmt::format("there is no array {}", action.number);
    if (action.kind == Action::Kind::array_stops)
        return stop_array(state, array->minor) == Refusal::none
                   ? ""
                   : fmt::format("array {} is in use", action.number);
    const SyncKind kind =
        action.kind == Action::Kind::array_checks ? SyncKind::check : SyncKind::repair;
    if (start_scrub(state, *array, kind) != Refusal::none)
        return fmt::format("array {} is busy or has no redundancy", action.number);
    return {};
}

std::string take_volume_away(const Group &group, Volume &volume) {
    if (volume.busy)
        return fmt::format("volume {}/{} is busy", group.name, volume.name);
    volume.mount_point.clear();
    volume.active = false;
    volume.minor = -1;
    return {};
}

std::string bring_volume_back(State &state, const Group &group, Volume &volume) {
    if (!activate(state, volume).empty())
        return fmt::format("volume {}/{} lies on what is gone", group.name, volume.name);
    if (volume.file_system)
        volume.mount_point = usual_mount_point(group.name, volume.name);
    return {};
}

std::string fill_volume(const Group &group, Volume &volume, int percent) {
    if (!volume.file_system)
        return fmt::format("volume {}/{} has no file system", group.name, volume.name);
    fill_file_system(*volume.file_system, percent);
    return {};
}

std::string set_busy(const Group &group, Volume &volume, bool busy) {
    if (volume.mount_point.empty())
        return fmt::format("volume {}/{} is not mounted", group.name, volume.name);
    volume.busy = busy;
    return {};
}

std::string act_on_volume(State &state, const Action &action) {
    Group *group = find_group(state, action.group == 0 ? "PrimaryOSVG"
                                                       : fmt::format("DataVG{}", action.group));
    Volume *volume =
        group == nullptr ? nullptr : find_volume(*group, fmt::format("LogVol{}", action.number));
    if (volume == nullptr)
        return fmt::format("there is no volume {}-{}", action.group, action.number);
    switch (action.kind) {
    case Action::Kind::volume_fills:
        return fill_volume(*group, *volume, action.percent);
    case Action::Kind::volume_is_active:
        return bring_volume_back(state, *group, *volume);
    case Action::Kind::volume_is_inactive:
        return take_volume_away(*group, *volume);
    default:
        return set_busy(*group, *volume, action.kind == Action::Kind::volume_is_busy);
    }
}

ToolFault &fault_of(State &state, const std::string &tool) {
    for (ToolFault &fault : state.faults)
        if (fault.tool == tool)
            return fault;
    state.faults.push_back({tool, 0, std::nullopt, std::nullopt, std::nullopt, false});
    return state.faults.back();
}

void act_on_tool(State &state, const Action &action) {
    ToolFault &fault = fault_of(state, action.tool);
    if (action.kind == Action::Kind::tool_hangs)
        fault.hangs = action.seconds;
    else if (action.kind == Action::Kind::tool_prints)
        fault.prints = action.text;
    else if (action.kind == Action::Kind::tool_exits)
        fault.exits = action.status;
    else if (action.kind == Action::Kind::tool_fails)
        fault.fails_at = action.percent;
    else if (action.kind == Action::Kind::tool_is_missing)
        fault.missing = true;
    else
        fault = ToolFault{action.tool, 0, std::nullopt, std::nullopt, std::nullopt, false};
}

bool is_about_disk(Action::Kind kind) {
    return kind <= Action::Kind::disk_attaches;
}
bool is_about_array(Action::Kind kind) {
    return kind > Action::Kind::disk_attaches && kind <= Action::Kind::array_stops;
}
bool is_about_volume(Action::Kind kind) {
    return kind > Action::Kind::array_stops && kind <= Action::Kind::volume_is_idle;
}
// Where there is a RAID controller, the disks are its own.
bool is_about_controller(const State &state, const Action &action) {
    return action.kind > Action::Kind::tool_works || action.unit != 0 ||
           (is_about_disk(action.kind) && state.controller);
}

} // namespace

std::string perform(State &state, const Action &action) {
    if (is_about_drive(action.kind))
        return act_on_drive(state, action);
    if (is_about_health(action.kind))
        return act_on_health(state, action);
    if (is_about_controller(state, action))
        return act_on_controller(state, action);
    if (is_about_disk(action.kind))
        return act_on_disk(state, action);
    if (is_about_array(action.kind))
        return act_on_array(state, action);
    if (is_about_volume(action.kind))
        return act_on_volume(state, action);
    act_on_tool(state, action);
    return {};
}

std::string perform_sentence(State &state, const std::string &sentence) {
    const Sentence parsed = parse_sentence(sentence);
    std::string problem = parsed.error.empty() ? perform(state, parsed.action) : parsed.error;
    look_for_changes(state);
    state.notes.push_back(problem.empty() ? sentence : sentence + ": " + problem);
    return problem;
}

void scsi_command(State &state, const std::string &line) {
    std::istringstream in(line);
    std::string name;
    std::string verb;
    int host = -1;
    if (!(in >> name >> verb >> host) || name != "scsi")
        return;
    if (host == optical_host && state.drive.present && !state.drive.job)
        state.drive.attached =
            verb == "add-single-device" || (state.drive.attached && verb != "remove-single-device");
    for (Disk &disk : state.disks) {
        if (disk.host != host || !disk.inserted)
            continue;
        if (verb == "add-single-device" && !disk.attached) {
            disk_attaches(state, disk);
        } else if (verb == "remove-single-device" && disk.attached) {
            disk_detaches(state, disk);
        }
    }
}

} // namespace zavsim
