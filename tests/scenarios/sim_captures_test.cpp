// What the simulator prints as "current" is, but for dates and identifiers, what a current system
// printed in the same state.
#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/factory.hpp"
#include "model/texts.hpp"

#include <algorithm>
#include <fstream>
#include <functional>
#include <gtest/gtest.h>
#include <iterator>
#include <regex>

using namespace zavsim;

namespace {

std::string captured(const std::string &file) {
    std::ifstream in(std::string(CAPTURES) + "/" + file, std::ios::binary);
    EXPECT_TRUE(in) << file;
    return {std::istreambuf_iterator<char>(in), {}};
}

std::string normalised(std::string text) {
    static const std::vector<std::pair<std::regex, const char *>> rules = {
        {std::regex("((Creation|Update) Time : )[A-Z][a-z]{2} [A-Z][a-z]{2} [ 0-9]{2} "
                    "[0-9:]{8} [0-9]{4}"),
         "$01DATE"},
        {std::regex("[0-9a-f]{8}(:[0-9a-f]{8}){3}"), "UUID"},
        {std::regex("(Events : (0\\.)?)[0-9]+"), "$01COUNT"}};
    for (const auto &[pattern, replacement] : rules)
        text = std::regex_replace(text, pattern, replacement);
    return text;
}

// The block of one array in an mdstat text.
std::string block_of(const std::string &mdstat, const std::string &name) {
    const std::size_t start = mdstat.find(name + " : ");
    const std::size_t end = mdstat.find("\n      \n", start);
    return start == std::string::npos ? "no " + name : mdstat.substr(start, end - start);
}

State appliance(const std::string &model, const std::string &level = "") {
    return new_appliance({model, level, true, 1});
}

State four_disks(const std::string &level = "") {
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

State resyncing(double kib, double seconds) {
    State state = members_added();
    run_sync(state, array(state, 0), kib, seconds);
    return state;
}

void finish(Array &which) {
    which.sync = Sync{};
    for (Member &member : which.members)
        if (member.role == Role::rebuilding)
            member.role = Role::in_sync;
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

std::string mdstat_of(const State &state) {
    return mdstat_text(state);
}
std::string detail_of(const State &state, int minor) {
    return detail_text(state, *find_array(state, minor), "/dev/md" + std::to_string(minor));
}
std::string scan_of(const State &state, int slot, int partition) {
    return examine_scan_text(state, *find_partition(*find_disk(state, slot), partition));
}
std::string query_of(const State &state, int slot, int partition) {
    const Disk &disk = *find_disk(state, slot);
    return query_text(state, disk, find_partition(disk, partition),
                      "/dev/sata/disk" + std::to_string(slot) + "p" + std::to_string(partition));
}

struct Capture {
    std::string file;
    std::function<std::string()> text;
    std::string block; // compare this array's block alone
};

// Names the case in a test's report.
void PrintTo(const Capture &capture, std::ostream *out) {
    *out << capture.file;
}

using Captures = std::vector<Capture>;

Capture mdstat(const std::string &folder, const std::function<State()> &state,
               const std::string &file = "mdstat.txt", const std::string &block = "") {
    return {folder + "/" + file, [state] { return mdstat_of(state()); }, block};
}

Capture detail(const std::string &folder, int minor, const std::function<State()> &state) {
    return {folder + "/mdadm-detail-md" + std::to_string(minor) + ".txt",
            [state, minor] { return detail_of(state(), minor); }, ""};
}

std::string suffix(int slot, int partition) {
    return "-disk" + std::to_string(slot) + "p" + std::to_string(partition) + ".txt";
}

Capture scan(const std::string &folder, int slot, int partition,
             const std::function<State()> &state) {
    return {folder + "/examine-scan" + suffix(slot, partition),
            [=] { return scan_of(state(), slot, partition); }, ""};
}

Capture query(const std::string &folder, int slot, int partition,
              const std::function<State()> &state) {
    return {folder + "/misc-query" + suffix(slot, partition),
            [=] { return query_of(state(), slot, partition); }, ""};
}

// A folder of one array alone: its four texts.
void add_alone(Captures &list, const std::string &folder, int minor,
               const std::function<State()> &state) {
    const int partition = minor + 1;
    list.push_back(mdstat(folder, state));
    list.push_back({folder + "/mdadm-detail.txt", [=] { return detail_of(state(), minor); }, ""});
    list.push_back(
        {folder + "/examine-scan.txt", [=] { return scan_of(state(), 1, partition); }, ""});
    list.push_back(
        {folder + "/misc-query.txt", [=] { return query_of(state(), 1, partition); }, ""});
}

void add_levels(Captures &list) {
    add_alone(list, "level-raid0", 1, [] { return alone("raid0", 63488, 512); });
    add_alone(list, "level-raid1", 0, mirror_alone);
    add_alone(list, "level-linear", 1, [] { return alone("linear", 64512, 0); });
    add_alone(list, "level-raid5", 1, [] { return alone("raid5", 63488, 512); });
    add_alone(list, "level-raid6", 1, [] { return alone("raid6", 63488, 512); });
    add_alone(list, "level-raid10", 1, [] { return alone("raid10", 63488, 512); });
    add_alone(list, "metadata-0.90", 1, [] { return with_metadata("0.90", 65024); });
    add_alone(list, "metadata-1.0", 1, [] { return with_metadata("1.0", 65024); });
}

void add_large(Captures &list) {
    const auto large = [] { return alone("raid5", 3040738304, 512); };
    const auto medium = [] { return alone("raid5", 124713984, 64); };
    list.push_back(mdstat("large-3t-raid5-no-bitmap", large));
    list.push_back(mdstat("large-120g-raid5-64k-no-bitmap", medium));
    list.push_back(
        {"large-3t-raid5-no-bitmap/mdadm-detail.txt", [=] { return detail_of(large(), 1); }, ""});
    list.push_back({"large-120g-raid5-64k-no-bitmap/mdadm-detail.txt",
                    [=] { return detail_of(medium(), 1); }, ""});
}

void add_replacement(Captures &list) {
    for (const auto &[folder, state] : std::vector<std::pair<std::string, std::function<State()>>>{
             {"healthy-4disk", healthy},
             {"member-failed", member_failed},
             {"degraded-3disk", members_removed},
             {"resyncing", [] { return resyncing(3840, 11); }},
             {"resyncing-data", [] { return resyncing_data(2304, 10); }}})
        for (int minor : {0, 1}) {
            list.push_back(detail(folder, minor, state));
            list.push_back(scan(folder, 4, minor + 1, state));
            list.push_back(query(folder, 4, minor + 1, state));
            list.push_back(query(folder, 1, minor + 1, state));
        }
    list.push_back(mdstat("healthy-4disk", healthy));
    list.push_back(mdstat("member-failed", member_failed));
    list.push_back(mdstat("degraded-3disk", members_removed));
    list.push_back(mdstat("resyncing", [] { return resyncing(3840, 11); }));
    list.push_back(mdstat(
        "resyncing", [] { return resyncing(768, 1); }, "mdstat-1.txt"));
    list.push_back(mdstat(
        "resyncing", [] { return resyncing(1536, 3); }, "mdstat-2.txt"));
    list.push_back(mdstat("resyncing-data", [] { return resyncing_data(2304, 10); }));
    list.push_back(mdstat(
        "resyncing-data", [] { return resyncing_data(2304, 5); }, "mdstat-3.txt"));
}

void add_lost(Captures &list) {
    const auto vanished = [] { return after(four_disks(), {"disk 4 vanishes"}); };
    const auto one = [] { return after(four_disks("raid10"), {"disk 2 vanishes"}); };
    const auto two = [] {
        return after(four_disks("raid10"), {"disk 2 vanishes", "disk 4 vanishes"});
    };
    const auto pair = [] {
        return after(four_disks("raid10"), {"disk 4 vanishes", "disk 3 vanishes"});
    };
    list.push_back(mdstat("disk-vanished", vanished));
    list.push_back(mdstat("raid10-healthy", [] { return four_disks("raid10"); }));
    list.push_back(mdstat("raid10-one-lost", one));
    list.push_back(mdstat("raid10-two-lost", two));
    // A mirror of four notices the second loss only at its next write; the data array's block is
    // what these two are about.
    list.push_back(mdstat("raid10-pair-lost", pair, "mdstat.txt", "md1"));
    list.push_back(mdstat("raid5-two-lost", raid5_two_lost, "mdstat.txt", "md1"));
    list.push_back(detail("disk-vanished", 0, vanished));
    list.push_back(detail("disk-vanished", 1, vanished));
    list.push_back(detail("raid10-healthy", 1, [] {
        State state = four_disks("raid10");
        array(state, 1).dirty = true;
        return state;
    }));
    list.push_back(detail("raid10-one-lost", 1, one));
    list.push_back(detail("raid10-two-lost", 1, two));
    list.push_back(detail("raid10-pair-lost", 1, pair));
    list.push_back(detail("raid5-two-lost", 1, raid5_two_lost));
}

void add_other(Captures &list) {
    list.push_back(mdstat("two-disk-healthy", [] { return appliance("2860-2"); }));
    list.push_back(detail("two-disk-healthy", 1, [] { return appliance("2860-2"); }));
    list.push_back(mdstat("two-disk-degraded", two_disks_degraded));
    list.push_back(detail("two-disk-degraded", 0, two_disks_degraded));
    list.push_back(mdstat("two-disk-resync-pending", two_disks_pending));
    list.push_back(detail("two-disk-resync-pending", 1, two_disks_pending));
    list.push_back(mdstat("two-disk-resync-pending", two_disks_resyncing, "mdstat-resync.txt"));
    list.push_back({"two-disk-resync-pending/mdadm-detail-resync.txt",
                    [] { return detail_of(two_disks_resyncing(), 1); }, ""});
    list.push_back(mdstat("inactive-array", inactive));
    list.push_back(mdstat("internal-bitmap", with_bitmap));
    list.push_back(detail("internal-bitmap", 1, with_bitmap));
    list.push_back(mdstat("checking", [] { return scrubbing(SyncKind::check); }));
    list.push_back(detail("checking", 1, [] { return scrubbing(SyncKind::check); }));
    list.push_back(mdstat("repairing", [] { return scrubbing(SyncKind::repair); }));
    list.push_back({"healthy-4disk/scsi.txt", [] { return scsi_text(four_disks()); }, ""});
    list.push_back({"disk-vanished/scsi.txt",
                    [] { return scsi_text(after(four_disks(), {"disk 4 vanishes"})); }, ""});
    list.push_back(
        {"disk-back/scsi.txt",
         [] {
             return scsi_text(after(four_disks(), {"disk 4 vanishes", "disk 4 appears"}));
         },
         ""});
    list.push_back({"healthy-4disk/smartctl-disk1.txt",
                    [] { return smartctl_text(four_disks(), false); }, ""});
    list.push_back({"healthy-4disk/smartctl-missing.txt",
                    [] { return smartctl_no_device_text(four_disks(), "/dev/sata/disk9"); }, ""});
}

Captures all_captures() {
    Captures list;
    add_replacement(list);
    add_lost(list);
    add_levels(list);
    add_large(list);
    add_other(list);
    return list;
}

class SimulatedText : public testing::TestWithParam<Capture> {};

TEST_P(SimulatedText, IsThatOfACurrentSystem) {
    const Capture &capture = GetParam();
    const std::string real = captured(capture.file);
    const std::string text = capture.text();
    if (capture.block.empty())
        EXPECT_EQ(normalised(text), normalised(real));
    else
        EXPECT_EQ(block_of(text, capture.block), block_of(real, capture.block));
}

INSTANTIATE_TEST_SUITE_P(Captures, SimulatedText, testing::ValuesIn(all_captures()),
                         [](const testing::TestParamInfo<Capture> &each) {
                             std::string name = each.param.file;
                             for (char &c : name)
                                 c = isalnum(static_cast<unsigned char>(c)) != 0 ? c : '_';
                             return name;
                         });

} // namespace
