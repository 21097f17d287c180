// Runs on the simulated appliance: calls the library as told, word by word, and prints what came of
// it.
//   remove N | add N | rescan N     the calls, with their codes
//   group-add N G | group-remove G  array N into group G; the group away
//   settle                         waits until no array rebuilds
//   gone N                         waits until the disk's nodes are gone
//   state                          arrays, groups, nodes and marks
//   leftovers                      what the calls left behind
//   rounds COUNT                   takes disks out and in again, and compares
#include "zav_api.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <string>
#include <sys/sem.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace {

zavDevice disk_address(int slot) {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0};
}
zavDevice array_address(int number) {
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 1};
}
zavDevice group_address(int number) {
    return {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0};
}

std::string array_state(int number) {
    zavDevice dev = array_address(number);
    zavRaidState info = {};
    const int rc = zavGetStateRaid(&dev, &info);
    if (rc != ZAV_RC_OK)
        return "error " + std::to_string(rc);
    char level[128];
    char state[128];
    return std::string(zav_raidleveldef_to_str(info.raidlevel, level)) +
           zav_raidstatedef_to_str(info.state, state);
}

std::string group_state(int number) {
    zavDevice dev = group_address(number);
    zavLVMState info = {};
    const int rc = zavGetStateLVM(&dev, &info);
    if (rc != ZAV_RC_OK)
        return "error " + std::to_string(rc);
    char state[128];
    return std::string(zav_lvmstatedef_to_str(info.state, state)) +
           std::to_string(info.dev.lvmvgdev.pvcount) + " pv " +
           std::to_string(info.dev.lvmvgdev.lvcount) + " lv";
}

std::string mark(const fs::path &node) {
    std::ifstream in(node, std::ios::binary);
    in.seekg(440);
    const int first = in.get();
    const int second = in.get();
    return first == 0x4D && second == 0x10 ? " marked" : "";
}

// The nodes of the disks, whole ones with their mark.
std::string nodes() {
    std::set<std::string> names;
    for (const auto &entry : fs::directory_iterator("/dev/sata"))
        names.insert(entry.path().filename());
    std::string text;
    for (const std::string &name : names)
        text += " " + name + (name.find('p') == std::string::npos ? mark("/dev/sata/" + name) : "");
    return text;
}

std::string state() {
    std::string text;
    for (int number = 1; number <= 3; ++number)
        text += "array " + std::to_string(number) + " " + array_state(number) + "\n";
    for (int number = 0; number <= 2; ++number)
        text += "group " + std::to_string(number) + " " + group_state(number) + "\n";
    return text + "nodes" + nodes() + "\n";
}

bool rebuilding() {
    std::ifstream in("/proc/mdstat");
    std::ostringstream text;
    text << in.rdbuf();
    return text.str().find("recovery") != std::string::npos ||
           text.str().find("resync") != std::string::npos;
}

void settle() {
    do
        sleep(5);
    while (rebuilding());
}

// The kernel drops a disk's nodes on its own time.
bool gone(int slot) {
    const std::string name = "/dev/sata/disk" + std::to_string(slot);
    for (int tries = 0; tries < 1000; ++tries) {
        if (!fs::exists(name) && !fs::exists(name + "p1"))
            return true;
        sleep(5);
    }
    return false;
}

long descriptors() {
    return std::distance(fs::directory_iterator("/proc/self/fd"), {});
}

const long descriptors_at_start = descriptors();

// What a call must not leave behind.
std::string leftovers() {
    std::string text;
    if (descriptors() != descriptors_at_start)
        text += ", a descriptor";
    if (waitpid(-1, nullptr, WNOHANG) != -1)
        text += ", a child";
    for (const int key : {0x6911, 0x3231}) {
        const int id = semget(key, 1, 0);
        if (id >= 0 && semctl(id, 0, GETVAL) != 1)
            text += ", a lock";
    }
    if (fs::exists("/dev/sata/hotrmtmp"))
        text += ", a temporary node";
    return text.empty() ? "nothing left" : "left" + text;
}

int report(const char *what, int number, int rc) {
    printf("%s %d: %d\n", what, number, rc);
    fflush(stdout);
    return rc;
}

int exchange(const char *what, int (*function)(zavDevice *), int slot) {
    zavDevice dev = disk_address(slot);
    return report(what, slot, function(&dev));
}

int fail(const std::string &text) {
    printf("%s\n", text.c_str());
    return 1;
}

// The states of the arrays alone, which is what most rounds compare: asking LVM takes its time.
std::string array_states() {
    std::string text;
    for (int number = 1; number <= 3; ++number)
        text += array_state(number) + " ";
    return text;
}

// One disk out and a fresh one in; every other time it is gone before it is taken out. "" if all
// went well.
std::string exchange_once(int slot, bool vanished) {
    zavDevice dev = disk_address(slot);
    const std::string act = "zavsim act disk " + std::to_string(slot);
    if (vanished && system((act + " vanishes").c_str()) != 0)
        return "the disk does not vanish";
    if (const int rc = zavDiskHotRemove(&dev); rc != 0)
        return "remove gives " + std::to_string(rc);
    if (!gone(slot))
        return "the node is still there";
    if (array_states() != "ZAV_RAIDLVL_1[ZAV_RAID_DEGRADED] ZAV_RAIDLVL_5[ZAV_RAID_DEGRADED] "
                          "ZAV_RAIDLVL_1[ZAV_RAID_DEGRADED] ")
        return "without the disk the arrays are " + array_states();
    if (vanished && system((act + " appears").c_str()) != 0)
        return "no disk appears";
    if (const int rc = zavDiskHotAdd(&dev); rc != 0)
        return "add gives " + std::to_string(rc);
    settle();
    return "";
}

int rounds(int count) {
    const std::string before = state();
    const std::string arrays_before = array_states();
    for (int round = 0; round < count; ++round) {
        std::string wrong = exchange_once(2 + round % 3, round % 2 == 1);
        if (wrong.empty() && array_states() != arrays_before)
            wrong = "the arrays are " + array_states();
        if (wrong.empty() && leftovers() != "nothing left")
            wrong = leftovers();
        if (!wrong.empty())
            return fail("round " + std::to_string(round) + ": " + wrong);
    }
    if (state() != before)
        return fail(before + "became\n" + state());
    printf("%d rounds\n", count);
    return 0;
}

} // namespace

int main(int argc, char **argv) {
    const auto number = [&](int &i) { return ++i < argc ? atoi(argv[i]) : -1; };
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "remove") {
            exchange("remove", zavDiskHotRemove, number(i));
        } else if (word == "add") {
            exchange("add", zavDiskHotAdd, number(i));
        } else if (word == "rescan") {
            exchange("rescan", zavSATARescan, number(i));
        } else if (word == "group-add") {
            zavDevice array = array_address(number(i));
            zavDevice group = group_address(number(i));
            report("group-add", group.disk, zavLVMHotAdd(&array, &group));
        } else if (word == "group-remove") {
            zavDevice group = group_address(number(i));
            report("group-remove", group.disk, zavLVMHotRemove(&group));
        } else if (word == "settle") {
            settle();
        } else if (word == "gone") {
            if (!gone(number(i)))
                puts("the disk is still there");
        } else if (word == "state") {
            fputs(state().c_str(), stdout);
        } else if (word == "leftovers") {
            puts(leftovers().c_str());
        } else if (word == "rounds") {
            return rounds(number(i));
        } else {
            fprintf(stderr, "exchange_probe: what is %s?\n", word.c_str());
            return 64;
        }
    }
    return 0;
}
