// How arrays begin and end.
#include "model/arrays.hpp"
#include "model/contents.hpp"
#include "model/disks.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

bool is_striped(const std::string &level) {
    return level != "raid1" && level != "linear";
}

// Behind the superblock comes a gap, which is larger where a stripe is to begin at a round place.
std::uint64_t component_of(std::uint64_t member_kib, const std::string &level, int chunk_kib) {
    const std::uint64_t gap = is_striped(level) ? 2048 : 1024;
    const std::uint64_t rest = member_kib - std::min(member_kib, gap);
    return chunk_kib == 0 ? rest : rest - rest % static_cast<std::uint64_t>(chunk_kib);
}

bool is_held(const State &state, const Disk &disk, int partition) {
    const bool by_array =
        std::any_of(state.arrays.begin(), state.arrays.end(), [&](const Array &array) {
            return find_member(array, disk.letter, partition) != nullptr;
        });
    return by_array || is_in_use(state, {"", disk.serial, partition});
}

Array shell_of(State &state, const NewArray &wanted) {
    Array array;
    array.minor = wanted.minor;
    array.name = wanted.name;
    array.level = wanted.level;
    array.metadata = wanted.metadata;
    array.raid_devices = static_cast<int>(wanted.devices.size());
    array.chunk_kib = is_striped(wanted.level) ? 512 : 0;
    array.uuid = fmt::format("3c608c57:a379fcf8:5bb34228:{:08x}", 0x6e892400 + state.next_id++);
    array.created = array.updated = state.now;
    return array;
}

// The smallest member decides.
std::uint64_t smallest_kib(const State &state, const NewArray &wanted) {
    std::uint64_t least = UINT64_MAX;
    for (const auto &[slot, partition] : wanted.devices)
        least = std::min(least, find_partition(*find_disk(state, slot), partition)->kib);
    return least;
}

void take_members(State &state, Array &array, const NewArray &wanted) {
    for (int place = 0; place < array.raid_devices; ++place) {
        const auto &[slot, partition] = wanted.devices[static_cast<std::size_t>(place)];
        Disk &disk = *find_disk(state, slot);
        Member member = member_on(disk, partition, place, Role::in_sync);
        member.raid_device = place;
        find_partition(disk, partition)->superblock = Superblock{array.uuid, place};
        remove_pv(state, {"", disk.serial, partition});
        // The current kernel lists the latest first.
        array.members.insert(state.current_tools ? array.members.begin() : array.members.end(),
                             member);
    }
}

// Unless it is forced a raid5 begins without its last member, which is then rebuilt.
void begin_sync(State &state, Array &array, bool forced) {
    if (!is_redundant(array))
        return;
    array.sync.kind = SyncKind::resync;
    array.sync.order = state.next_sync_order++;
    if (array.level != "raid5" || forced)
        return;
    array.sync.kind = SyncKind::recovery;
    for (Member &member : array.members)
        if (member.raid_device == array.raid_devices - 1) {
            member.role = Role::rebuilding;
            member.number = array.raid_devices;
        }
}

} // namespace

Refusal create_array(State &state, const NewArray &wanted) {
    for (const auto &[slot, partition] : wanted.devices) {
        const Disk *disk = find_disk(state, slot);
        if (disk == nullptr || !disk->attached || find_partition(*disk, partition) == nullptr)
            return Refusal::no_such_device;
        if (is_held(state, *disk, partition))
            return Refusal::busy;
    }
    if (find_array(state, wanted.minor) != nullptr)
        return Refusal::busy;
    Array array = shell_of(state, wanted);
    array.component_kib = component_of(smallest_kib(state, wanted), array.level, array.chunk_kib);
    take_members(state, array, wanted);
    begin_sync(state, array, wanted.forced);
    state.arrays.insert(state.arrays.begin(), array);
    forget_lost(state);
    return Refusal::none;
}

Refusal stop_array(State &state, int minor) {
    Array *array = find_array(state, minor);
    if (array == nullptr)
        return Refusal::no_such_device;
    if (is_in_use(state, place_of_array(*array).ground))
        return Refusal::busy;
    array->sync = Sync{};
    array->members.clear();
    state.stopped.push_back(*array);
    state.arrays.erase(state.arrays.begin() + (array - state.arrays.data()));
    forget_lost(state);
    return Refusal::none;
}

} // namespace zavsim
