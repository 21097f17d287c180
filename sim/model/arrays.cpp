#include "model/arrays.hpp"

#include "model/disks.hpp"

#include <algorithm>

namespace zavsim {

namespace {

template <typename Arrays>
auto *array_with_minor(Arrays &arrays, int minor) {
    const auto found = std::find_if(arrays.begin(), arrays.end(),
                                    [minor](const Array &array) { return array.minor == minor; });
    return found == arrays.end() ? nullptr : &*found;
}

template <typename Members>
auto *member_named(Members &members, const std::string &letter, int partition) {
    const auto found = std::find_if(members.begin(), members.end(), [&](const Member &member) {
        return member.letter == letter && member.partition == partition;
    });
    return found == members.end() ? nullptr : &*found;
}

bool alive(const Array &array, int raid_device) {
    const Member *member = member_at(array, raid_device);
    return member != nullptr && member->role == Role::in_sync;
}

// Two near copies: places 0 and 1 mirror each other, 2 and 3, and so on. With an odd number of
// places every two neighbours share something, around the end.
bool has_lost_pair(const Array &array) {
    const int count = array.raid_devices;
    for (int first = 0; first < count; first += count % 2 == 0 ? 2 : 1)
        if (!alive(array, first) && !alive(array, (first + 1) % count))
            return true;
    return false;
}

// The kernel never gives up the last copy of a mirror.
bool holds_last_copy(const Array &array, const Member &member) {
    if (member.role != Role::in_sync)
        return false;
    if (array.level == "raid1")
        return count_members(array, Role::in_sync) == 1;
    if (array.level != "raid10")
        return !is_redundant(array);
    Array without = array;
    for (Member &each : without.members)
        if (each.raid_device == member.raid_device)
            each.role = Role::faulty;
    return !has_lost_pair(array) && has_lost_pair(without);
}

// After more faults than it can bear an array takes no member in.
bool can_rebuild(const Array &array) {
    return is_redundant(array) && !is_broken(array);
}

int free_place(const Array &array) {
    for (int place = 0; place < array.raid_devices; ++place)
        if (member_at(array, place) == nullptr)
            return place;
    return -1;
}

// Members added later are numbered behind the layout's own.
int free_number(const Array &array) {
    const auto taken = [&array](int number) {
        return std::any_of(array.members.begin(), array.members.end(),
                           [number](const Member &member) { return member.number == number; });
    };
    int number = array.raid_devices;
    while (taken(number))
        ++number;
    return number;
}

void release_places(Array &array) {
    for (Member &member : array.members)
        if (member.role == Role::rebuilding) {
            member.role = Role::spare;
            member.raid_device = -1;
        }
}

void touch(const State &state, Array &array, int events) {
    array.updated = state.now;
    array.events += events;
}

void queue_sync(State &state, Array &array, SyncKind kind) {
    array.sync = Sync{};
    array.sync.kind = kind;
    array.sync.order = state.next_sync_order++;
}

} // namespace

Array *find_array(State &state, int minor) {
    return array_with_minor(state.arrays, minor);
}
const Array *find_array(const State &state, int minor) {
    return array_with_minor(state.arrays, minor);
}

const Array *array_of_uuid(const State &state, const std::string &uuid) {
    for (const auto *list : {&state.arrays, &state.stopped})
        for (const Array &array : *list)
            if (array.uuid == uuid)
                return &array;
    return nullptr;
}

Member member_on(const Disk &disk, int partition, int number, Role role) {
    Member member;
    member.slot = disk.slot;
    member.serial = disk.serial;
    member.letter = disk.letter;
    member.partition = partition;
    member.number = number;
    member.role = role;
    return member;
}

Member *find_member(Array &array, const std::string &letter, int partition) {
    return member_named(array.members, letter, partition);
}
const Member *find_member(const Array &array, const std::string &letter, int partition) {
    return member_named(array.members, letter, partition);
}

const Member *member_at(const Array &array, int raid_device) {
    for (const Member &member : array.members)
        if (member.raid_device == raid_device)
            return &member;
    return nullptr;
}

int count_members(const Array &array, Role role) {
    return static_cast<int>(
        std::count_if(array.members.begin(), array.members.end(),
                      [role](const Member &member) { return member.role == role; }));
}

std::uint64_t array_kib(const Array &array) {
    const auto devices = static_cast<std::uint64_t>(array.raid_devices);
    const std::uint64_t parts = array.level == "raid1"   ? 1
                                : array.level == "raid5" ? devices - 1
                                : array.level == "raid6" ? devices - 2
                                                         : devices;
    return array.component_kib * parts / (array.level == "raid10" ? 2 : 1);
}

bool is_redundant(const Array &array) {
    return array.level != "raid0" && array.level != "linear";
}

bool is_broken(const Array &array) {
    const int lost = array.raid_devices - count_members(array, Role::in_sync);
    if (array.level == "raid1")
        return lost >= array.raid_devices;
    if (array.level == "raid10")
        return has_lost_pair(array);
    return lost > (array.level == "raid6" ? 2 : array.level == "raid5" ? 1 : 0);
}

bool is_degraded(const Array &array) {
    return count_members(array, Role::in_sync) < array.raid_devices;
}

bool has_device(const State &state, const Member &member) {
    const Disk *disk = attached_disk(state, member.letter);
    return disk != nullptr && disk->serial == member.serial;
}

bool is_failed(const State &state, const Array &array) {
    if (is_redundant(array))
        return is_broken(array);
    return is_broken(array) ||
           std::any_of(array.members.begin(), array.members.end(),
                       [&state](const Member &member) { return !has_device(state, member); });
}

bool beginning_is_readable(const State &state, const Array &array) {
    if (array.inactive)
        return false;
    if (is_redundant(array) && !is_broken(array))
        return true;
    const auto readable = [&](int place) {
        return alive(array, place) && has_device(state, *member_at(array, place));
    };
    return readable(0) || (array.level == "raid10" && readable(1));
}

Refusal fail_member(State &state, Array &array, const std::string &letter, int partition) {
    Member *member = find_member(array, letter, partition);
    if (member == nullptr)
        return Refusal::no_such_device;
    if (holds_last_copy(array, *member))
        return Refusal::busy;
    if (member->role == Role::faulty)
        return Refusal::none;
    member->role = Role::faulty;
    member->raid_device = -1;
    touch(state, array, 2);
    if (array.sync.kind != SyncKind::none)
        array.sync = Sync{};
    settle(state, array);
    return Refusal::none;
}

Refusal remove_member(State &state, Array &array, const std::string &letter, int partition) {
    Member *member = find_member(array, letter, partition);
    if (member == nullptr)
        return Refusal::no_such_device;
    if (member->role == Role::in_sync || member->role == Role::rebuilding)
        return Refusal::busy;
    array.members.erase(array.members.begin() + (member - array.members.data()));
    touch(state, array, 1);
    return Refusal::none;
}

Refusal add_member(State &state, Array &array, const std::string &letter, int partition) {
    Disk *disk = attached_disk(state, letter);
    Partition *place = disk == nullptr ? nullptr : find_partition(*disk, partition);
    if (place == nullptr)
        return Refusal::no_such_device;
    for (const Array &any : state.arrays)
        if (find_member(any, letter, partition) != nullptr)
            return Refusal::busy;
    const int number = free_number(array);
    array.members.insert(array.members.begin(), member_on(*disk, partition, number, Role::spare));
    place->superblock = Superblock{array.uuid, number};
    touch(state, array, 1);
    settle(state, array);
    return Refusal::none;
}

Refusal start_scrub(State &state, Array &array, SyncKind kind) {
    if (array.sync.kind != SyncKind::none || !is_redundant(array) || is_degraded(array))
        return Refusal::busy;
    queue_sync(state, array, kind);
    return Refusal::none;
}

void settle(State &state, Array &array) {
    if (!can_rebuild(array))
        return release_places(array);
    for (Member &member : array.members)
        if (member.role == Role::spare && member.raid_device < 0 && free_place(array) >= 0) {
            member.raid_device = free_place(array);
            member.role = Role::rebuilding;
        }
    const bool rebuilds = count_members(array, Role::rebuilding) > 0;
    if (rebuilds && array.sync.kind != SyncKind::recovery)
        queue_sync(state, array, SyncKind::recovery);
}

} // namespace zavsim
