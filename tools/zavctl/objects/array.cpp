#include "asking.h"
#include "surveys.h"

#include "../core/event.h"
#include "../core/mdstat.h"
#include "../core/raid_set.h"
#include "../system/files.h"
#include "../system/library.h"

#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <unistd.h>

namespace zavctl {

namespace {

constexpr int software_arrays = 4;
constexpr int controller_volumes = 2;

constexpr VerbHelp list_help = {
    "The arrays: level, state, members and rebuild progress",
    "Shown: one line per array with its level, state and members:\n"
    "  normal      all members work                                      ok\n"
    "  degraded    works, but has lost a member                          warning\n"
    "  rebuilding  a rebuild runs or waits, with its progress            warning\n"
    "  failed      has lost more members than its level can bear         critical\n"
    "  missing     disks have partitions for it, but it does not exist   critical\n"
    "  unknown     the library or its tools give no answer to trust      could not tell\n"
    "Array N is built from partition N of every disk. Asked are the arrays that some disk has\n"
    "a partition for; with --all every one.\n"
    "On the hardware-RAID model: the volumes of the RAID controller and of each expansion unit\n"
    "(2-1 is volume 1 of unit 2), as the controller's report has them. An enclosure that the\n"
    "report lacks cannot be told; a volume whose device is missing is looked for 20 seconds.",
    "  zavctl array list\n"
    "  zavctl array list --jsonl | jq -r 'select(.state == \"resync\") | .rebuild_percent'",
};

constexpr VerbHelp show_help = {
    "One array, or several, in detail",
    "Shown: state, level, members, rebuild progress, and the kernel's own lines about it in\n"
    "/proc/mdstat; behind a RAID controller name, size and RAID set. The array is asked whatever\n"
    "the disks hold; states and exit status are those of 'zavctl array list'.",
    "  zavctl array show 2\n"
    "  zavctl array show 2-1                volume 1 of expansion unit 2\n"
    "  zavctl array show 1 /dev/swraid/disk2p1 --json",
};

zavDevice own_array(const Machine &machine, int number) {
    if (machine.model.hardware_raid())
        return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, number, 0};
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 1};
}

zavDevice unit_array(int unit, int number) {
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, packed({unit, number}), 0};
}

// Software arrays are named by the one partition that they have.
std::optional<zavDevice> array_of_path(const std::string &path) {
    const library::NamedDevice named = library::device_of(path);
    const int part = named.device.minor_type == ZAV_MINDEV_RAID_SW ? 1 : 0;
    if (named.result != ZAV_RC_OK || named.device.type != ZAV_DEV_RAID || named.device.part != part)
        return std::nullopt;
    return named.device;
}

std::optional<zavDevice> array_of_word(const Machine &machine, const std::string &word) {
    if (word.starts_with("/"))
        return array_of_path(word);
    const std::optional<SlotId> id = slot_id(word);
    if (!id)
        return std::nullopt;
    return id->unit == 0 ? own_array(machine, id->number) : unit_array(id->unit, id->number);
}

bool exists(const Address &address) {
    return access(address.path.c_str(), F_OK) == 0;
}

bool some_disk_has_partition(const Machine &machine, int number) {
    for (int slot = 1; slot <= machine.model.disk_slots; ++slot)
        if (exists(library::address_of({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, slot, number})))
            return true;
    return false;
}

bool expected(const Machine &machine, const zavDevice &array) {
    if (exists(library::address_of(array)))
        return true;
    if (array.minor_type == ZAV_MINDEV_RAID_HW)
        return array.disk == 1; // the machine boots from it
    return array.minor_type == ZAV_MINDEV_RAID_SW && some_disk_has_partition(machine, array.disk);
}

ArrayReport unanswered(const Machine &machine, const zavDevice &device, const Session &session) {
    const SlotId id = slot_id(device);
    ArrayReport array;
    array.number = id.number;
    array.unit = id.unit;
    array.address = library::address_of(device);
    if (device.minor_type == ZAV_MINDEV_RAID_SW)
        array.kernel_name = fmt::format("md{}", id.number - 1);
    array.expected = machine.model.known() && expected(machine, device);
    array.failure = no_answer(session);
    return array;
}

// The kernel's name of a node that the appliance's rules have made a link to it: "sdc2". "" if
// the node is none.
std::string kernel_node(const Address &address) {
    std::error_code error;
    const auto target = std::filesystem::read_symlink(address.path, error);
    return error ? "" : target.filename().string();
}

void add_kernel_lines(ArrayReport &array) {
    if (array.kernel_name.empty())
        return;
    const FileFact mdstat = read_file("/proc/mdstat");
    array.kernel_says = mdstat_block(mdstat.text, array.kernel_name);
    array.refusal = array.failure ? mdstat_refusal(mdstat.text, array.kernel_name) : "";
    array.doubt = mdstat_mixup(mdstat.text, array.kernel_name);
    for (Member &member : array.members)
        member.state = exists(member.address)
                           ? member_state(array.kernel_says, kernel_node(member.address))
                           : "no_partition";
}

void add_enclosure(ArrayReport &array) {
    if (!is_reported(array))
        return;
    array.node_present = exists(array.address);
    const library::SetAnswer enclosure = library::raid_set(array.address.device);
    tell_enclosure(array, enclosure.result, enclosure.set);
}

ArrayReport answered(ArrayReport array, const std::string &tool_missing) {
    const library::RaidAnswer answer = library::raid_state(array.address.device);
    array.failure = library::failure_of(answer.result);
    array.record = answered_event(answer.result, answer.state);
    array.state = answer.state.state;
    array.level = answer.state.raidlevel;
    array.resync = static_cast<double>(answer.state.resync);
    // A volume's places are the slots of its enclosure, empty ones included.
    const int count = is_reported(array) ? 4 : std::clamp(answer.state.raidcount, 0, 4);
    for (int i = 0; i < count; ++i)
        if (answer.state.hdddev[i].type != 0)
            array.members.push_back({library::address_of(answer.state.hdddev[i]), "unknown"});
    add_kernel_lines(array);
    add_enclosure(array);
    if (array.failure && !tool_missing.empty())
        array.refusal = tool_missing;
    return array;
}

Answer list(Session &session, bool all) {
    const Machine machine = read_machine();
    const SharedCascade cascade = asked_cascade(session, machine);
    const auto reports = no_reports<ArrayReport>();
    session.ask(ask_arrays(machine, listed_arrays(machine, *cascade, all), session, reports));
    Section section = array_list_section(*reports, {});
    const std::vector<Finding> unlisted = cascade_findings(*cascade);
    section.findings.insert(section.findings.end(), unlisted.begin(), unlisted.end());
    if (!machine.model.known())
        section.findings = model_findings(machine.model);
    return {"array list", "", {std::move(section)}};
}

Answer show(Session &session, const std::vector<std::string> &words) {
    const Machine machine = read_machine();
    const auto arrays = ids_of<zavDevice>(
        words, [&machine](const std::string &word) { return array_of_word(machine, word); },
        "no array. Arrays are named like 2, 2-1 (volume 1 of expansion unit 2) or "
        "/dev/swraid/disk2p1");
    for (std::size_t i = 0; i < words.size(); ++i)
        refuse_foreign(machine, words[i], arrays[i]);
    const auto reports = no_reports<ArrayReport>();
    session.ask(ask_arrays(machine, arrays, session, reports));
    return {"array show", "", {array_show_section(*reports)}};
}

bool is_reported_volume(const EnclosureReport &enclosure, int number) {
    return enclosure.set && volume_of(*enclosure.set, number) != nullptr;
}

// A volume that neither has a device nor stands in the report is not asked: the library would look
// for its device in vain.
void add_unit_arrays(const CascadeReport &cascade, bool all, std::vector<zavDevice> &arrays) {
    for (const UnitReport &unit : cascade.units) {
        const zavDevice array = unit_array(unit.number, 1);
        if (unit.present &&
            (all || is_reported_volume(unit.enclosure, 1) || exists(library::address_of(array))))
            arrays.push_back(array);
    }
}

} // namespace

std::vector<zavDevice> listed_arrays(const Machine &machine, const CascadeReport &cascade,
                                     bool all) {
    std::vector<zavDevice> arrays;
    if (!machine.model.known())
        return arrays;
    const int last = machine.model.hardware_raid() ? controller_volumes : software_arrays;
    for (int number = 1; number <= last; ++number)
        if (const zavDevice array = own_array(machine, number);
            all || expected(machine, array) || is_reported_volume(cascade.controller, number))
            arrays.push_back(array);
    add_unit_arrays(cascade, all, arrays);
    return arrays;
}

std::vector<Question> ask_arrays(const Machine &machine, const std::vector<zavDevice> &arrays,
                                 const Session &session, const Shared<ArrayReport> &reports) {
    return questions_of(arrays, [&](const zavDevice &device) {
        const ArrayReport begin = unanswered(machine, device, session);
        return question("array " + array_id(begin), begin, reports,
                        [missing = machine.array_doubt](const ArrayReport &array) {
                            return answered(array, missing);
                        });
    });
}

std::vector<Question> ask_arrays(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<ArrayReport> &reports) {
    std::vector<zavDevice> arrays;
    arrays.reserve(numbers.size());
    for (const int number : numbers)
        arrays.push_back(own_array(machine, number));
    return ask_arrays(machine, arrays, session, reports);
}

void add_array(Command root, Session &session) {
    const Command array = add_object(root, "array", "The RAID arrays: list, show");
    const auto all = std::make_shared<bool>(false);
    add_list(array, session, list_help, [all](Session &asking) {
        return list(asking, *all);
    }).add_flag("--all", *all, "Ask every array that the model can have");
    add_show<std::string>(array, session, show_help,
                          {"N", "Number of the array, from 1; UNIT-N of an expansion unit; or the "
                                "path of the array's device"},
                          show);
}

} // namespace zavctl
