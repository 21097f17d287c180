// Arrays of the model: what they survive, and what acts on their members.
#pragma once

#include "model/state.hpp"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace zavsim {

Array *find_array(State &state, int minor);
const Array *find_array(const State &state, int minor);
// Running or stopped.
const Array *array_of_uuid(const State &state, const std::string &uuid);

Member member_on(const Disk &disk, int partition, int number, Role role);
Member *find_member(Array &array, const std::string &letter, int partition);
const Member *find_member(const Array &array, const std::string &letter, int partition);
const Member *member_at(const Array &array, int raid_device);

int count_members(const Array &array, Role role);
std::uint64_t array_kib(const Array &array);

// Whether the level can work around a lost member.
bool is_redundant(const Array &array);
// Whether data are lost: too few members for the level.
bool is_broken(const Array &array);
bool is_degraded(const Array &array);

// Whether the kernel still reaches the disk that it knows the member by.
bool has_device(const State &state, const Member &member);
// Broken, or without redundancy and without one of its disks.
bool is_failed(const State &state, const Array &array);
// Where labels and metadata of volumes are; an array that has failed may still give it away.
bool beginning_is_readable(const State &state, const Array &array);

// The errors with which the kernel refuses.
enum class Refusal { none, busy, no_such_device };

Refusal fail_member(State &state, Array &array, const std::string &letter, int partition);
Refusal remove_member(State &state, Array &array, const std::string &letter, int partition);
Refusal add_member(State &state, Array &array, const std::string &letter, int partition);

// What mdadm --create is asked for.
struct NewArray {
    int minor = 0;
    std::string name;
    std::string level;
    std::string metadata = "1.2";
    bool forced = false; // a raid5 begins with all members and a resync, not with a recovery
    std::vector<std::pair<int, int>> devices; // slot and partition
};
// Writes anew what the members hold; refused while one of them is in use.
Refusal create_array(State &state, const NewArray &wanted);
// Refused while volumes on it are active.
Refusal stop_array(State &state, int minor);

// A check or a repair; refused while the array does something else.
Refusal start_scrub(State &state, Array &array, SyncKind kind);

// Gives free places to spares and queues the recovery; called after every change of members.
void settle(State &state, Array &array);

} // namespace zavsim
