// A sound four-disk appliance with its facts, for the plans to be tried on.
#pragma once

#include "core/exchange.h"

#include "zav_api.h"

#include <algorithm>

inline zavctl::DiskReport disk_report(int slot, int state = ZAV_HDD_FOUND) {
    zavctl::DiskReport disk;
    disk.slot = slot;
    disk.address = {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, 0},
                    "/dev/sata/disk" + std::to_string(slot)};
    disk.state = state;
    disk.expected = true;
    disk.node_present = state != ZAV_HDD_ABSENT;
    return disk;
}

inline std::string node(int slot, int partition) {
    return std::string("sd") + static_cast<char>('a' + slot - 1) + std::to_string(partition);
}

// Partition `number` of four disks, in the array of that number.
inline zavctl::PartitionFact partition(int number, const std::string &level) {
    zavctl::PartitionFact fact;
    const std::string digit = std::to_string(number - 1);
    fact.number = number;
    fact.on_target = true;
    fact.scan = "ARRAY /dev/md/MD" + digit + " level=" + level + " metadata=1.2 num-devices=4\n";
    fact.leads_to = fact.holder = "md" + digit;
    fact.table.level = level;
    fact.table.places = 4;
    for (int slot = 1; slot <= 4; ++slot)
        fact.table.members.push_back(
            {zavctl::ArrayMember::Hold::active, slot - 1, slot - 1, node(slot, number), slot});
    fact.array.number = number;
    fact.array.state = ZAV_RAID_NORMAL;
    fact.array.kernel_name = fact.holder;
    return fact;
}

inline zavctl::ArrayMember &member(zavctl::PartitionFact &fact, int slot) {
    return *std::find_if(fact.table.members.begin(), fact.table.members.end(),
                         [slot](const zavctl::ArrayMember &m) { return m.slot == slot; });
}

inline void lose(zavctl::PartitionFact &fact, int slot) {
    std::erase_if(fact.table.members,
                  [slot](const zavctl::ArrayMember &m) { return m.slot == slot; });
    fact.array.state = ZAV_RAID_DEGRADED;
}

// Four disks; disk 3 is the one to be exchanged, disk 1 the healthy one.
inline zavctl::ExchangeFacts sound_facts() {
    zavctl::ExchangeFacts facts;
    facts.platform.model.code = ZAV_MODEL_SOLVANE_2860_4HDD;
    facts.platform.model.disk_slots = facts.platform.model.disk_count = 4;
    facts.platform.model.data_raid_type = 5;
    facts.platform.shell_false = {zavctl::RunResult::End::exited, 1, ""};
    facts.platform.sata_hosts = {"host0", "host1", "host2", "host3"};
    facts.target = disk_report(3, ZAV_HDD_FAILED);
    facts.disks = {disk_report(1), disk_report(2), disk_report(4)};
    facts.source = 1;
    facts.partitions = {partition(1, "raid1"), partition(2, "raid5"), partition(3, "raid1")};
    facts.ata_disks = 4;
    return facts;
}

// The same with an empty disk in slot 3 that every array lacks.
inline zavctl::ExchangeFacts facts_with_new_disk() {
    zavctl::ExchangeFacts facts = sound_facts();
    facts.target = disk_report(3);
    for (zavctl::PartitionFact &fact : facts.partitions) {
        lose(fact, 3);
        fact.on_target = false;
    }
    return facts;
}

inline std::vector<std::string> words_of(const zavctl::Plan &plan) {
    std::vector<std::string> words;
    for (const zavctl::PlanStep &step : plan.steps)
        words.push_back(step.does);
    return words;
}

// Whether exactly one thing speaks against it, in these words.
inline bool refused_for(const zavctl::Plan &plan, const std::string &why) {
    return plan.refusals.size() == 1 && plan.refusals[0].text.find(why) != std::string::npos;
}

inline std::string all_refusals(const zavctl::Plan &plan) {
    std::string text;
    for (const zavctl::Refusal &refusal : plan.refusals)
        text += refusal.text + "\n";
    return text;
}
