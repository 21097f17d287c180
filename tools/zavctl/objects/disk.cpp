#include "disk_verbs.h"
#include "surveys.h"

#include "../system/library.h"

#include <fmt/format.h>

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
    "slot. An empty slot is looked at for about 20 seconds, all slots at the same time.",
    "  zavctl disk list\n"
    "  zavctl disk list --jsonl | jq -r 'select(.severity != \"ok\") | .address.path'",
};

constexpr VerbHelp show_help = {
    "One disk, or several, in detail",
    "Shown: state, device, whether the arrays use the slot. The slot is asked whatever the\n"
    "model; states and exit status are those of 'zavctl disk list'.",
    "  zavctl disk show 3\n"
    "  zavctl disk show 1 2 --json",
};

int minor_type(const Machine &machine) {
    return machine.model.hardware_raid() ? ZAV_MINDEV_HDD_HWSATA : ZAV_MINDEV_HDD_SATA;
}

Address disk_address(const Machine &machine, int slot) {
    return library::address_of({ZAV_DEV_HDD, minor_type(machine), slot, 0});
}

bool node_exists(const Address &address) {
    return access(address.path.c_str(), F_OK) == 0;
}

DiskReport unanswered(const Machine &machine, int slot, const Session &session) {
    DiskReport disk;
    disk.slot = slot;
    disk.address = disk_address(machine, slot);
    disk.expected = machine.model.known() && slot >= 1 && slot <= machine.model.disk_count;
    disk.node_present = node_exists(disk.address);
    disk.doubt = machine.disk_doubt;
    disk.failure = no_answer(session);
    return disk;
}

DiskReport answered(DiskReport disk) {
    const library::DiskAnswer answer = library::disk_state(disk.address.device);
    disk.state = answer.state.state;
    disk.failure = library::failure_of(answer.result);
    disk.node_present = node_exists(disk.address);
    return disk;
}

Answer disk_answer(Session &session, const Machine &machine, const std::vector<int> &slots,
                   const char *command) {
    const auto reports = std::make_shared<std::vector<DiskReport>>();
    session.ask(ask_disks(machine, slots, session, reports));
    const bool list = std::string(command) == "disk list";
    Section section = list ? disk_list_section(*reports) : disk_show_section(*reports);
    if (list && !machine.model.known())
        section.findings = model_findings(machine.model);
    return {command, "", {std::move(section)}};
}

} // namespace

std::vector<int> listed_slots(const Machine &machine, bool all) {
    std::vector<int> slots;
    for (int slot = 1; slot <= machine.model.disk_slots; ++slot)
        if (all || slot <= machine.model.disk_count || node_exists(disk_address(machine, slot)))
            slots.push_back(slot);
    return slots;
}

std::vector<Question> ask_disks(const Machine &machine, const std::vector<int> &slots,
                                const Session &session, const Shared<DiskReport> &reports) {
    std::vector<Question> questions;
    for (const int slot : slots) {
        const std::size_t index = reports->size();
        const DiskReport begin = unanswered(machine, slot, session);
        reports->push_back(begin);
        questions.push_back({fmt::format("disk {}", slot), [begin, index, reports] {
                                 return [disk = answered(begin), index, reports] {
                                     (*reports)[index] = disk;
                                 };
                             }});
    }
    return questions;
}

void add_disk(CLI::App &root, Session &session) {
    CLI::App *disk = add_object(root, "disk", "The disks: list, show, remove, add");
    const auto all = std::make_shared<bool>(false);
    CLI::App *list = add_verb(*disk, session, "list", list_help);
    list->add_flag("--all", *all, "Ask every slot of the model, also those that no array uses");
    list->callback([&session, all] {
        session.action = [&session, all] {
            const Machine machine = read_machine();
            return disk_answer(session, machine, listed_slots(machine, *all), "disk list");
        };
    });
    const auto slots = std::make_shared<std::vector<int>>();
    CLI::App *show = add_verb(*disk, session, "show", show_help);
    show->add_option("N", *slots, "Number of the slot, from 1")->required();
    show->callback([&session, slots] {
        session.action = [&session, slots] {
            return disk_answer(session, read_machine(), *slots, "disk show");
        };
    });
    add_disk_remove(*disk, session);
    add_disk_add(*disk, session);
}

} // namespace zavctl
