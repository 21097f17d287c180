#include "surveys.h"

#include "../core/mdstat.h"
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
    "a partition for; with --all every one.",
    "  zavctl array list\n"
    "  zavctl array list --jsonl | jq -r 'select(.state == \"resync\") | .rebuild_percent'",
};

constexpr VerbHelp show_help = {
    "One array, or several, in detail",
    "Shown: state, level, members, rebuild progress, and the kernel's own lines about it in\n"
    "/proc/mdstat. The array is asked whatever the disks hold; states and exit status are\n"
    "those of 'zavctl array list'.",
    "  zavctl array show 2\n"
    "  zavctl array show 1 2 --json",
};

zavDevice array_device(const Machine &machine, int number) {
    if (machine.model.hardware_raid())
        return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, number, 0};
    return {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 1};
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

bool expected(const Machine &machine, int number) {
    if (exists(library::address_of(array_device(machine, number))))
        return true;
    if (machine.model.hardware_raid())
        return number == 1; // the machine boots from it
    return some_disk_has_partition(machine, number);
}

ArrayReport unanswered(const Machine &machine, int number, const Session &session) {
    ArrayReport array;
    array.number = number;
    array.address = library::address_of(array_device(machine, number));
    if (!machine.model.hardware_raid())
        array.kernel_name = fmt::format("md{}", number - 1);
    array.expected = machine.model.known() && expected(machine, number);
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

ArrayReport answered(ArrayReport array, const std::string &tool_missing) {
    const library::RaidAnswer answer = library::raid_state(array.address.device);
    array.failure = library::failure_of(answer.result);
    array.state = answer.state.state;
    array.level = answer.state.raidlevel;
    array.resync = static_cast<double>(answer.state.resync);
    const int count = std::clamp(answer.state.raidcount, 0, 4);
    for (int i = 0; i < count; ++i)
        if (answer.state.hdddev[i].type != 0)
            array.members.push_back({library::address_of(answer.state.hdddev[i]), "unknown"});
    add_kernel_lines(array);
    if (array.failure && !tool_missing.empty())
        array.refusal = tool_missing;
    return array;
}

Answer array_answer(Session &session, const Machine &machine, const std::vector<int> &numbers,
                    const char *command) {
    const auto reports = std::make_shared<std::vector<ArrayReport>>();
    session.ask(ask_arrays(machine, numbers, session, reports));
    const bool list = std::string(command) == "array list";
    Section section = list ? array_list_section(*reports, {}) : array_show_section(*reports);
    if (list && !machine.model.known())
        section.findings = model_findings(machine.model);
    return {command, "", {std::move(section)}};
}

} // namespace

std::vector<int> listed_arrays(const Machine &machine, bool all) {
    std::vector<int> numbers;
    if (!machine.model.known())
        return numbers;
    const int last = machine.model.hardware_raid() ? controller_volumes : software_arrays;
    for (int number = 1; number <= last; ++number)
        if (all || expected(machine, number))
            numbers.push_back(number);
    return numbers;
}

std::vector<Question> ask_arrays(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<ArrayReport> &reports) {
    std::vector<Question> questions;
    for (const int number : numbers) {
        const std::size_t index = reports->size();
        const ArrayReport begin = unanswered(machine, number, session);
        reports->push_back(begin);
        questions.push_back(
            {fmt::format("array {}", number), [begin, index, reports, doubt = machine.array_doubt] {
                 return [array = answered(begin, doubt), index, reports] {
                     (*reports)[index] = array;
                 };
             }});
    }
    return questions;
}

void add_array(CLI::App &root, Session &session) {
    CLI::App *array = add_object(root, "array", "The RAID arrays: list, show");
    const auto all = std::make_shared<bool>(false);
    CLI::App *list = add_verb(*array, session, "list", list_help);
    list->add_flag("--all", *all, "Ask every array that the model can have");
    list->callback([&session, all] {
        session.action = [&session, all] {
            const Machine machine = read_machine();
            return array_answer(session, machine, listed_arrays(machine, *all), "array list");
        };
    });
    const auto numbers = std::make_shared<std::vector<int>>();
    CLI::App *show = add_verb(*array, session, "show", show_help);
    show->add_option("N", *numbers, "Number of the array, from 1")->required();
    show->callback([&session, numbers] {
        session.action = [&session, numbers] {
            return array_answer(session, read_machine(), *numbers, "array show");
        };
    });
}

} // namespace zavctl
