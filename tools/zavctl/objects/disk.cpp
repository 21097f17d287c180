#include "asking.h"
#include "disk_verbs.h"
#include "surveys.h"

#include "../core/event.h"
#include "../core/raid_set.h"
#include "../system/library.h"

#include <unistd.h>

namespace zavctl {

namespace {

constexpr VerbHelp list_help = {
    "The disks: state of every slot that the model's arrays use",
    "Shown: one line per disk with its state, its device and what there is to say:\n"
    "  found   there, and its health check passes                       ok\n"
    "  failed  there, but its health check does not pass                critical\n"
    "  absent  no disk in a slot that the arrays use, or not readable   critical\n"
    "  empty   no disk in a slot that no array uses                     ok\n"
    "  unknown the library or its tools give no answer to trust         could not tell\n"
    "Asked are the slots of the model's arrays, and others that hold a disk; with --all every\n"
    "slot. An empty slot is looked at for about 20 seconds, all slots at the same time.\n"
    "On the hardware-RAID model: every slot of the RAID controller and of each expansion unit\n"
    "(2-3 is disk 3 of unit 2), as the controller's report has them. An enclosure that the\n"
    "report lacks cannot be told.",
    "  zavctl disk list\n"
    "  zavctl disk list --jsonl | jq -r 'select(.severity != \"ok\") | .address.path'",
};

constexpr VerbHelp show_help = {
    "One disk, or several, in detail",
    "Shown: state, device, whether the arrays use the slot; behind a RAID controller size and\n"
    "RAID set. The slot is asked whatever the model; states and exit status are those of\n"
    "'zavctl disk list'.",
    "  zavctl disk show 3\n"
    "  zavctl disk show 2-3                 disk 3 of expansion unit 2\n"
    "  zavctl disk show 1 /dev/sata/disk2 --json",
};

int minor_type(const Machine &machine) {
    return machine.model.hardware_raid() ? ZAV_MINDEV_HDD_HWSATA : ZAV_MINDEV_HDD_SATA;
}

zavDevice own_disk(const Machine &machine, int slot) {
    return {ZAV_DEV_HDD, minor_type(machine), slot, 0};
}

zavDevice unit_disk(int unit, int slot) {
    return {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, packed({unit, slot}), 0};
}

bool node_exists(const Address &address) {
    return access(address.path.c_str(), F_OK) == 0;
}

// A whole disk of the kinds that the library tells about.
std::optional<zavDevice> disk_of_path(const std::string &path) {
    const library::NamedDevice named = library::device_of(path);
    const int minor = named.device.minor_type;
    const bool disk = minor == ZAV_MINDEV_HDD_SATA || minor == ZAV_MINDEV_HDD_HWSATA ||
                      minor == ZAV_MINDEV_HDD_SAS;
    if (named.result != ZAV_RC_OK || !disk || named.device.part != 0)
        return std::nullopt;
    return named.device;
}

std::optional<zavDevice> disk_of_word(const Machine &machine, const std::string &word) {
    if (word.starts_with("/"))
        return disk_of_path(word);
    const std::optional<SlotId> id = slot_id(word);
    if (!id)
        return std::nullopt;
    return id->unit == 0 ? own_disk(machine, id->number) : unit_disk(id->unit, id->number);
}

DiskReport unanswered(const Machine &machine, const zavDevice &device, const Session &session) {
    const SlotId id = slot_id(device);
    DiskReport disk;
    disk.slot = id.number;
    disk.unit = id.unit;
    disk.address = library::address_of(device);
    disk.expected = machine.model.known() && id.number >= 1 &&
                    (is_reported(disk) || id.number <= machine.model.disk_count);
    disk.node_present = node_exists(disk.address);
    disk.doubt = machine.disk_doubt;
    disk.failure = no_answer(session);
    return disk;
}

DiskReport answered(DiskReport disk) {
    const library::DiskAnswer answer = library::disk_state(disk.address.device);
    disk.state = answer.state.state;
    disk.failure = library::failure_of(answer.result);
    disk.record = answered_event(answer.result, answer.state);
    disk.node_present = node_exists(disk.address);
    if (is_reported(disk)) {
        const library::SetAnswer enclosure = library::raid_set(disk.address.device);
        tell_enclosure(disk, enclosure.result, enclosure.set);
    }
    return disk;
}

Answer list(Session &session, bool all) {
    const Machine machine = read_machine();
    const SharedCascade cascade = asked_cascade(session, machine);
    const auto reports = no_reports<DiskReport>();
    session.ask(ask_disks(machine, listed_disks(machine, *cascade, all), session, reports));
    Section section = disk_list_section(*reports);
    const std::vector<Finding> unlisted = cascade_findings(*cascade);
    section.findings.insert(section.findings.end(), unlisted.begin(), unlisted.end());
    if (!machine.model.known())
        section.findings = model_findings(machine.model);
    return {"disk list", "", {std::move(section)}};
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const Machine machine = read_machine();
    const auto disks = ids_of<zavDevice>(
        words, [&machine](const std::string &word) { return disk_of_word(machine, word); },
        "no disk. Disks are named like 3, 2-3 (disk 3 of expansion unit 2) or /dev/sata/disk3");
    for (std::size_t i = 0; i < words.size(); ++i)
        refuse_foreign(machine, words[i], disks[i]);
    const auto reports = no_reports<DiskReport>();
    session.ask(ask_disks(machine, disks, session, reports));
    return {"disk show", "", {disk_show_section(*reports)}};
}

} // namespace

std::vector<zavDevice> listed_disks(const Machine &machine, const CascadeReport &cascade,
                                    bool all) {
    const bool every = all || machine.model.hardware_raid();
    std::vector<zavDevice> disks;
    for (int slot = 1; slot <= machine.model.disk_slots; ++slot)
        if (const zavDevice disk = own_disk(machine, slot);
            every || slot <= machine.model.disk_count || node_exists(library::address_of(disk)))
            disks.push_back(disk);
    for (const UnitReport &unit : cascade.units)
        for (int slot = 1; unit.present && slot <= enclosure_slots; ++slot)
            disks.push_back(unit_disk(unit.number, slot));
    return disks;
}

std::vector<Question> ask_disks(const Machine &machine, const std::vector<zavDevice> &disks,
                                const Session &session, const Shared<DiskReport> &reports) {
    return questions_of(disks, [&](const zavDevice &device) {
        const DiskReport begin = unanswered(machine, device, session);
        return question("disk " + disk_name(begin), begin, reports, answered);
    });
}

std::vector<Question> ask_disks(const Machine &machine, const std::vector<int> &slots,
                                const Session &session, const Shared<DiskReport> &reports) {
    std::vector<zavDevice> disks;
    disks.reserve(slots.size());
    for (const int slot : slots)
        disks.push_back(own_disk(machine, slot));
    return ask_disks(machine, disks, session, reports);
}

void add_disk(Command root, Session &session) {
    const Command disk = add_object(root, "disk", "The disks: list, show, remove, add");
    const auto all = std::make_shared<bool>(false);
    add_list(disk, session, list_help, [all](Session &asking) {
        return list(asking, *all);
    }).add_flag("--all", *all, "Ask every slot of the model, also those that no array uses");
    add_show<std::string>(disk, session, show_help,
                          {"N", "Number of the slot, from 1; UNIT-N of an expansion unit; or the "
                                "path of the disk's device"},
                          show);
    add_disk_remove(disk, session);
    add_disk_add(disk, session);
}

} // namespace zavctl
