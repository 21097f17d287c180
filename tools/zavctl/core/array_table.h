// What mdadm tells of an array's members, and what it can do without.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

struct ArrayMember {
    enum class Hold { active, rebuilding, spare, faulty };
    Hold hold = Hold::active;
    int number = -1;  // the kernel's, [2] in /proc/mdstat
    int place = -1;   // in the layout; -1 for none
    std::string node; // the kernel's name of the partition, "sdc2"; "" if it has none any more
    int slot = 0;     // of its disk; 0 if that is not known
};

// "active", "rebuilding", "spare", "faulty".
std::string word(ArrayMember::Hold hold);

struct ArrayTable {
    std::string level; // "raid5", as mdadm's scan calls it
    int places = 0;
    std::vector<ArrayMember> members;
};

// What `mdadm --detail` prints; slots are not filled in.
ArrayTable table_in_detail(std::string_view detail);

// Adds the nodes that mdadm does not tell, as those of vanished partitions, from the array's lines
// in /proc/mdstat, which keeps them.
void add_nodes(ArrayTable &table, std::string_view mdstat_block);

const ArrayMember *member_of_slot(const ArrayTable &table, int slot);

// Whether every block has a copy, or can be computed, without the disk in that slot.
bool survives_without(const ArrayTable &table, int slot);

// Whether one more disk may fail then.
bool redundant_without(const ArrayTable &table, int slot);

// What mdadm's scan says of a partition: the array it belongs to, and its level in words that the
// library knows. "" for what is not told.
struct ScanWords {
    std::string array; // "/dev/md/MD1"
    std::string level; // "raid5"
};
ScanWords words_of_scan(std::string_view scan);

} // namespace zavctl
