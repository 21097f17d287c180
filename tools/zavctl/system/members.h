// Disks, partitions and arrays as the kernel and mdadm show them.
#pragma once

#include "../core/exchange.h"
#include "../core/watch.h"

#include <string>
#include <vector>

namespace zavctl {

// "/dev/sata/disk3", "/dev/sata/disk3p2".
std::string disk_path(int slot, int partition = 0);

// The partition numbers of which the disk has a node.
std::vector<int> partitions_of(int slot);

// Adds how the kernel calls the disk's partitions now. Names stay known when the nodes are gone.
void add_node_names(int slot, NodeNames &names);

// The arrays that the kernel has the disk's partitions in, by /proc/mdstat alone.
std::vector<Membership> memberships_of(int slot);

// What the kernel and mdadm tell of the source's partitions and the arrays that they are in; the
// library is not asked. Members are recognized by the nodes of slots 1 to `slots`.
std::vector<PartitionFact> read_partitions(int source, int target, int slots);

// The slot of the first active member of /dev/md0: its disk is the one that the library copies the
// partition table of. 0 if there is none.
int first_member_slot(int slots);

TargetContent read_content(int source, int target);

// "bash (812) and vim (900)": who keeps the directory's file system from being unmounted.
std::string users_of(const std::string &directory);

} // namespace zavctl
