// What stands on disks, partitions and arrays, and what is lost when they are written over.
#pragma once

#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

struct Stretch {
    std::uint64_t offset = 0; // bytes
    std::uint64_t length = 0;
};

// Something was written there; of a disk, `label_id` is what its bytes 440 to 443 now are.
void disk_was_written(State &state, Disk &disk, Stretch stretch, std::uint32_t label_id);
void partition_was_written(State &state, Disk &disk, Partition &partition, Stretch stretch);
void array_was_written(State &state, const Array &array, Stretch stretch);

// Whether an array or a volume works on the disk or a part of it.
bool is_in_use(const State &state, const Disk &disk);

struct Table {
    std::uint32_t label_id = 0;
    std::vector<Partition> partitions; // number, start and size
};
// A new table, known to the kernel. What stood at the same place is still there.
void set_table(State &state, Disk &disk, const Table &table);

// Forgets arrays, physical volumes and groups of which nothing is left on any disk.
void forget_lost(State &state);

} // namespace zavsim
