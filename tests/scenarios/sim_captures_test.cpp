// What the simulator prints as "current" is, but for dates and identifiers, what a current system
// printed in the same state.
#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/factory.hpp"
#include "model/texts.hpp"
#include "sim_machines.hpp"

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
