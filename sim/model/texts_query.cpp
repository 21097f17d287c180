#include "model/arrays.hpp"
#include "model/texts.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

// The oldest superblocks have no name, so that the kernel's stands in its place.
std::string old_superblock_text(const State &state, const Array &array) {
    const std::string level = state.current_tools ? ""
                                                  : fmt::format("level={} num-devices={} ",
                                                                array.level, array.raid_devices);
    return fmt::format("ARRAY /dev/md{} {}UUID={}\n", array.minor, level, array.uuid);
}

// A partition that the array no longer holds is a mismatch, however good its data.
const char *activity(const State &state, const Array &array, const Disk &disk, int partition) {
    const bool runs = std::any_of(state.arrays.begin(), state.arrays.end(),
                                  [&array](const Array &each) { return each.uuid == array.uuid; });
    const Member *member = find_member(array, disk.letter, partition);
    const bool held = member != nullptr && member->serial == disk.serial;
    return !runs ? "undetected" : held ? "active" : "mismatch";
}

} // namespace

std::string examine_scan_text(const State &state, const Partition &partition) {
    const Array *array =
        partition.superblock ? array_of_uuid(state, partition.superblock->uuid) : nullptr;
    if (array == nullptr)
        return {};
    if (array->metadata == "0.90")
        return old_superblock_text(state, *array);
    if (state.current_tools)
        return fmt::format("ARRAY /dev/md/{}  metadata={} UUID={} name=appliance:{}\n", array->name,
                           array->metadata, array->uuid, array->name);
    return fmt::format("ARRAY /dev/md/{} level={} metadata={} num-devices={} UUID={} "
                       "name=appliance:{}\n",
                       array->name, array->level, array->metadata, array->raid_devices, array->uuid,
                       array->name);
}

std::string query_text(const State &state, const Disk &disk, const Partition *partition,
                       const std::string &shown_name) {
    std::string text = shown_name + ": is not an md array\n";
    if (partition == nullptr || !partition->superblock)
        return text;
    const Array *array = array_of_uuid(state, partition->superblock->uuid);
    if (array == nullptr)
        return text;
    return text + fmt::format("{}: device {} in {} device {} {} /dev/md{}.  Use mdadm --examine "
                              "for more detail.\n",
                              shown_name, partition->superblock->number, array->raid_devices,
                              activity(state, *array, disk, partition->number), array->level,
                              array->minor);
}

} // namespace zavsim
