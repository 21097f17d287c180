#include "exchange_facts.h"

#include "../system/files.h"
#include "../system/library.h"
#include "../system/members.h"
#include "../system/platform.h"
#include "../system/run.h"
#include "surveys.h"
#include "volume_surveys.h"

#include <fmt/format.h>

#include <algorithm>
#include <thread>
#include <unistd.h>

namespace zavctl {

namespace {

constexpr std::chrono::seconds tool_limit{10};
constexpr std::chrono::milliseconds node_look{500};
constexpr int node_looks = 40; // 20 seconds, the library's own patience with a new disk
constexpr int software_arrays = 4;

struct Asked {
    Shared<DiskReport> disks = std::make_shared<std::vector<DiskReport>>();
    Shared<ArrayReport> arrays = std::make_shared<std::vector<ArrayReport>>();
    Shared<GroupReport> groups = std::make_shared<std::vector<GroupReport>>();
    Shared<VolumeReport> volumes = std::make_shared<std::vector<VolumeReport>>();
};

bool node_exists(int slot) {
    return access(disk_path(slot).c_str(), F_OK) == 0;
}

// The slots whose state matters and that have a device; the others are known to be empty.
std::vector<int> slots_to_ask(const Machine &machine, int target) {
    std::vector<int> slots;
    for (int slot = 1; slot <= machine.model.disk_slots; ++slot)
        if ((slot <= machine.model.disk_count || slot == target) && node_exists(slot))
            slots.push_back(slot);
    return slots;
}

std::vector<int> existing_arrays() {
    std::vector<int> numbers;
    for (int number = 1; number <= software_arrays; ++number)
        if (access(fmt::format("/dev/swraid/disk{}p1", number).c_str(), F_OK) == 0)
            numbers.push_back(number);
    return numbers;
}

void append(std::vector<Question> &all, const std::vector<Question> &more) {
    all.insert(all.end(), more.begin(), more.end());
}

Asked ask(Session &session, const Machine &machine, int target) {
    Asked asked;
    std::vector<Question> questions =
        ask_disks(machine, slots_to_ask(machine, target), session, asked.disks);
    append(questions, ask_arrays(machine, existing_arrays(), session, asked.arrays));
    append(questions, ask_groups(machine, listed_groups(machine), session, asked.groups));
    session.ask(questions);
    session.ask(ask_volumes(machine, volumes_of(*asked.groups).ids, session, asked.volumes));
    return asked;
}

DiskReport empty_slot(const Machine &machine, int slot) {
    DiskReport disk;
    disk.slot = slot;
    disk.address = library::address_of({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0});
    disk.state = ZAV_HDD_ABSENT;
    disk.expected = slot <= machine.model.disk_count;
    return disk;
}

DiskReport report_of(const Machine &machine, const Asked &asked, int slot) {
    for (const DiskReport &disk : *asked.disks)
        if (disk.slot == slot)
            return disk;
    return empty_slot(machine, slot);
}

void add_disks(const Machine &machine, const Asked &asked, int target, ExchangeFacts &facts) {
    facts.target = report_of(machine, asked, target);
    for (int slot = 1; slot <= machine.model.disk_count; ++slot)
        if (slot != target)
            facts.disks.push_back(report_of(machine, asked, slot));
}

// "/dev/md/MD1" is array 2; the array of the partition's own number for other names.
int array_number(const PartitionFact &partition) {
    const std::string array = words_of_scan(partition.scan).array;
    constexpr const char *name = "/dev/md/MD";
    const std::size_t at = array.find(name);
    const char digit = at == std::string::npos ? ' ' : array.c_str()[at + std::string(name).size()];
    return digit >= '0' && digit < '0' + software_arrays ? digit - '0' + 1 : partition.number;
}

ArrayReport array_report(const Asked &asked, int number) {
    for (const ArrayReport &array : *asked.arrays)
        if (array.number == number)
            return array;
    ArrayReport missing;
    missing.number = number;
    missing.state = ZAV_RAID_NOT_EXIST;
    missing.expected = true;
    return missing;
}

bool lies_on(const GroupReport &group, int minor_type, int number) {
    return std::any_of(group.devices.begin(), group.devices.end(), [=](const Address &address) {
        return address.device.minor_type == minor_type && address.device.disk == number;
    });
}

void add_group(const Asked &asked, PartitionFact &partition) {
    for (const GroupReport &group : *asked.groups)
        if (lies_on(group, ZAV_MINDEV_RAID_SW, partition.array.number)) {
            partition.group = group;
            partition.volumes = volume_facts(*asked.volumes, group.number);
        }
}

void add_partitions(const Machine &machine, const Asked &asked, ExchangeFacts &facts) {
    if (facts.source == 0)
        return;
    facts.partitions = read_partitions(facts.source, facts.target.slot, machine.model.disk_slots);
    for (PartitionFact &partition : facts.partitions) {
        partition.array = array_report(asked, array_number(partition));
        add_group(asked, partition);
    }
}

std::vector<std::string> missing(const std::vector<const char *> &tools) {
    std::vector<std::string> names;
    for (const char *tool : tools)
        if (find_tool(tool).empty())
            names.emplace_back(tool);
    return names;
}

ExchangeFacts common_facts(const Machine &machine, const Asked &asked, int slot) {
    ExchangeFacts facts;
    facts.platform = read_platform(machine.model);
    facts.memberships = memberships_of(slot);
    facts.ata_disks = library::ata_disk_count();
    add_disks(machine, asked, slot, facts);
    for (const GroupReport &group : *asked.groups)
        if (lies_on(group, ZAV_MINDEV_HDD_SATA, slot))
            facts.groups_on_target.push_back(group.name);
    return facts;
}

int first_healthy(const ExchangeFacts &facts) {
    for (const DiskReport &disk : facts.disks)
        if (disk.state == ZAV_HDD_FOUND && !disk.failure)
            return disk.slot;
    return 0;
}

bool wait_for_node(int slot, bool wanted) {
    for (int look = 0; look < node_looks && node_exists(slot) != wanted; ++look)
        std::this_thread::sleep_for(node_look);
    return node_exists(slot) == wanted;
}

} // namespace

ExchangeFacts removal_facts(Session &session, int slot) {
    const Machine machine = read_machine();
    const Asked asked = ask(session, machine, slot);
    ExchangeFacts facts = common_facts(machine, asked, slot);
    facts.source = first_healthy(facts);
    facts.missing_tools = missing({"/sbin/mdadm", "grep", "mknod", "rm"});
    add_partitions(machine, asked, facts);
    return facts;
}

ExchangeFacts addition_facts(Session &session, int slot) {
    const Machine machine = read_machine();
    const Asked asked = ask(session, machine, slot);
    ExchangeFacts facts = common_facts(machine, asked, slot);
    facts.source = first_member_slot(machine.model.disk_slots);
    facts.missing_tools = missing({"/sbin/mdadm", "mdadm", "udevinfo", "/sbin/sfdisk", "sfdisk",
                                   "/bin/dd", "dd", "sed", "awk"});
    add_partitions(machine, asked, facts);
    facts.content = read_content(facts.source, slot);
    return facts;
}

Aftermath read_aftermath(const ExchangeFacts &before) {
    const int slot = before.target.slot;
    Aftermath after;
    after.node_present = node_exists(slot);
    after.content = read_content(before.source, slot);
    after.partitions = read_partitions(before.source, slot, before.platform.model.disk_slots);
    after.groups = groups_in_list(run({"/usr/sbin/vgs"}, tool_limit).output);
    return after;
}

bool wait_for_device(int slot) {
    return wait_for_node(slot, true);
}

bool wait_until_gone(int slot) {
    return wait_for_node(slot, false);
}

std::vector<VolumeFact> volume_facts(const std::vector<VolumeReport> &volumes, int group) {
    std::vector<VolumeFact> facts;
    for (const VolumeReport &volume : volumes)
        if (volume.id.group == group)
            facts.push_back({volume, volume.mounted ? users_of(volume.mount_point) : ""});
    return facts;
}

} // namespace zavctl
