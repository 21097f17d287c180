#include "sim_machines.hpp"

#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/factory.hpp"

#include <algorithm>
#include <gtest/gtest.h>

using namespace zavsim;

namespace {

void rename_disks(State &state, const std::string &from, const std::string &to) {
    const auto swap = [&](std::string &letter) {
        letter = letter == from ? to : letter == to ? from : letter;
    };
    for (Disk &disk : state.disks)
        swap(disk.letter);
    for (Array &each : state.arrays)
        for (Member &member : each.members)
            swap(member.letter);
}

State members_added() {
    State state = members_removed();
    EXPECT_EQ(add_member(state, array(state, 0), "d", 1), Refusal::none);
    EXPECT_EQ(add_member(state, array(state, 1), "d", 2), Refusal::none);
    return state;
}

// As if the sync had come that far in that many seconds.
void run_sync(State &state, Array &which, double kib, double seconds) {
    which.sync.running = true;
    which.sync.done_kib = kib;
    which.sync.started = state.now - seconds;
}

void finish(Array &which) {
    which.sync = Sync{};
    for (Member &member : which.members)
        if (member.role == Role::rebuilding)
            member.role = Role::in_sync;
}

} // namespace

State appliance(const std::string &model, const std::string &level) {
    return new_appliance({model, level, true, 1});
}

State with_units(int units) {
    return new_appliance({"2980", "", false, 1, false, units});
}

State four_disks(const std::string &level) {
    return appliance("2860-4", level);
}

State after(State state, const std::vector<std::string> &sentences) {
    for (const std::string &sentence : sentences)
        EXPECT_EQ(perform_sentence(state, sentence), "");
    return state;
}

Array &array(State &state, int minor) {
    return *find_array(state, minor);
}

// The disk in slot 3 was found as sdd, that in slot 4 as sdc.
State healthy() {
    State state = four_disks();
    rename_disks(state, "c", "d");
    return state;
}

State member_failed() {
    State state = four_disks();
    EXPECT_EQ(fail_member(state, array(state, 0), "d", 1), Refusal::none);
    EXPECT_EQ(fail_member(state, array(state, 1), "d", 2), Refusal::none);
    return state;
}

State members_removed() {
    State state = member_failed();
    EXPECT_EQ(remove_member(state, array(state, 0), "d", 1), Refusal::none);
    EXPECT_EQ(remove_member(state, array(state, 1), "d", 2), Refusal::none);
    return state;
}

State resyncing(double kib, double seconds) {
    State state = members_added();
    run_sync(state, array(state, 0), kib, seconds);
    return state;
}

State rebuilt() {
    State state = members_added();
    finish(array(state, 0));
    finish(array(state, 1));
    return state;
}

State resyncing_data(double kib, double seconds) {
    State state = members_added();
    finish(array(state, 0));
    run_sync(state, array(state, 1), kib, seconds);
    return state;
}

State scrubbing(SyncKind kind) {
    State state = rebuilt();
    EXPECT_EQ(start_scrub(state, array(state, 1), kind), Refusal::none);
    run_sync(state, array(state, 1), 1920, 3);
    return state;
}

State with_bitmap() {
    State state = rebuilt();
    array(state, 1).bitmap = true;
    return state;
}

State two_disks_degraded() {
    State state = appliance("2860-2");
    EXPECT_EQ(fail_member(state, array(state, 0), "b", 1), Refusal::none);
    EXPECT_EQ(fail_member(state, array(state, 1), "b", 2), Refusal::none);
    return state;
}

// md1 was made anew, so that it stands first; md0 has lost a member.
State two_disks_pending() {
    State state = appliance("2860-2");
    EXPECT_EQ(fail_member(state, array(state, 0), "b", 1), Refusal::none);
    std::swap(state.arrays[0], state.arrays[1]);
    array(state, 1).sync.kind = SyncKind::resync;
    array(state, 1).sync.pending = true;
    array(state, 1).auto_read_only = true;
    return state;
}

State two_disks_resyncing() {
    State state = two_disks_pending();
    Array &data = array(state, 1);
    data.auto_read_only = data.sync.pending = false;
    std::reverse(data.members.begin(), data.members.end());
    run_sync(state, data, 512, 4);
    return state;
}

State inactive() {
    State state = appliance("2860-2");
    std::swap(state.arrays[0], state.arrays[1]);
    Array &data = array(state, 1);
    data.minor = 127;
    data.inactive = true;
    data.members.pop_back();
    return state;
}

// One fresh array alone: its members stand in reverse, as they were added.
State alone(const std::string &level, std::uint64_t component_kib, int chunk_kib) {
    State state = four_disks(level);
    state.arrays = {array(state, 1)};
    Array &data = state.arrays.front();
    data.component_kib = component_kib;
    data.chunk_kib = chunk_kib;
    std::sort(data.members.begin(), data.members.end(),
              [](const Member &a, const Member &b) { return a.number > b.number; });
    return state;
}

State mirror_alone() {
    State state = four_disks();
    state.arrays = {array(state, 0)};
    Array &system = state.arrays.front();
    system.component_kib = 64512;
    std::sort(system.members.begin(), system.members.end(),
              [](const Member &a, const Member &b) { return a.number > b.number; });
    return state;
}

State with_metadata(const std::string &metadata, std::uint64_t component_kib) {
    State state = alone("raid5", component_kib, 512);
    state.arrays.front().metadata = metadata;
    return state;
}

State raid5_two_lost() {
    return after(rebuilt(), {"disk 3 vanishes", "disk 4 vanishes"});
}
