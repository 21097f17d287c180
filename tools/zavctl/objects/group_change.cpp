#include "change.h"
#include "exchange_facts.h"
#include "group_verbs.h"
#include "volume_surveys.h"

#include "../core/group_plan.h"
#include "../core/name_report.h"
#include "../system/files.h"
#include "../system/library.h"
#include "../system/members.h"
#include "../system/run.h"
#include "surveys.h"

#include <fmt/format.h>

#include <unistd.h>

namespace zavctl {

namespace {

constexpr VerbHelp add_help = {
    "Puts an array or a whole disk into a volume group, which is made if need be",
    "DEVICE is 'array N', 'disk N', a path such as /dev/swraid/disk3p1, or an address as 'zavctl\n"
    "name' takes it. First said: what will happen. Then zavctl asks, or, without a terminal,\n"
    "refuses unless --yes is given. In the end group and device are asked: a device that is not\n"
    "in the group is critical.\n"
    "Refused, with nothing changed (critical): the device is a member of an array, has "
    "partitions,\n"
    "is mounted, in a group already, failed or absent; the group does not answer.\n"
    "Ctrl-C does not stop a change that has begun.",
    "  zavctl vg add array 3 --group 2 --dry-run\n"
    "  zavctl vg add /dev/swraid/disk3p1 --group 1",
};

constexpr VerbHelp remove_help = {
    "Dismantles a volume group: ITS VOLUMES ARE DESTROYED",
    "First said: every volume with its usage and mount point, and what becomes free. Then zavctl\n"
    "asks, or, without a terminal, refuses unless --yes is given. In the end the group and the\n"
    "labels of its devices are looked for: what is left of them is critical.\n"
    "Refused, with nothing changed (critical): there is no such group, or it does not answer; a\n"
    "volume is in use; it has more volumes than the library removes. PrimaryOSVG, the system's\n"
    "group, is dismantled with --system-group only.\n"
    "Ctrl-C does not stop a change that has begun.",
    "  zavctl vg remove 2 --dry-run\n"
    "  zavctl vg remove 2 --yes",
};

zavDevice group_device(int number) {
    return {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0};
}

std::vector<std::string> missing(const std::vector<const char *> &tools) {
    std::vector<std::string> names;
    for (const char *tool : tools)
        if (find_tool(tool).empty())
            names.emplace_back(tool);
    return names;
}

GroupReport ask_group(Session &session, const Machine &machine, int number) {
    const auto groups = std::make_shared<std::vector<GroupReport>>();
    session.ask(ask_groups(machine, {number}, session, groups));
    return groups->front();
}

void add_array_state(Session &session, const Machine &machine, DeviceFact &fact) {
    const auto arrays = std::make_shared<std::vector<ArrayReport>>();
    session.ask(ask_arrays(machine, std::vector{fact.address.device.disk}, session, arrays));
    const ArrayReport &array = arrays->front();
    fact.state = shown_state(array);
    fact.trouble = severity(array) == Severity::unknown ? array_note(array) : "";
    fact.usable = severity(array) <= Severity::warning && array.state != ZAV_RAID_NOT_EXIST;
}

void add_disk_state(Session &session, const Machine &machine, DeviceFact &fact) {
    const int slot = fact.address.device.disk;
    const auto disks = std::make_shared<std::vector<DiskReport>>();
    session.ask(ask_disks(machine, std::vector{slot}, session, disks));
    const DiskReport &disk = disks->front();
    fact.state = shown_state(disk);
    fact.trouble = severity(disk) == Severity::unknown ? disk_note(disk) : "";
    fact.usable = disk.state == ZAV_HDD_FOUND;
    fact.partitions = partitions_of(slot);
    fact.memberships = memberships_of(slot);
}

// Other devices of the RAID kind are left to the library, which asks them itself.
void add_state(Session &session, const Machine &machine, DeviceFact &fact) {
    const int minor = fact.address.device.minor_type;
    if (minor == ZAV_MINDEV_RAID_SW)
        add_array_state(session, machine, fact);
    else if (minor == ZAV_MINDEV_HDD_SATA && fact.address.device.part == 0)
        add_disk_state(session, machine, fact);
    else
        fact.usable = true;
}

DeviceFact device_fact(const Address &address) {
    DeviceFact fact;
    fact.address = address;
    fact.node_present = !address.path.empty() && access(address.path.c_str(), F_OK) == 0;
    if (fact.node_present) {
        fact.mounted_at = mounted_at(address.path);
        fact.in_group = library::group_of_device(address.path);
    }
    return fact;
}

GroupFacts addition_facts(Session &session, const Address &address, int group) {
    const Machine machine = read_machine();
    GroupFacts facts;
    facts.hardware_raid = machine.model.hardware_raid();
    facts.group = ask_group(session, machine, group);
    facts.devices = {device_fact(address)};
    if (facts.devices.front().node_present)
        add_state(session, machine, facts.devices.front());
    facts.missing_tools =
        missing({"/usr/sbin/pvcreate", "/usr/sbin/vgcreate", "/usr/sbin/vgextend"});
    return facts;
}

GroupFacts removal_facts_of(Session &session, int number) {
    const Machine machine = read_machine();
    GroupFacts facts;
    facts.hardware_raid = machine.model.hardware_raid();
    facts.group = ask_group(session, machine, number);
    const auto volumes = std::make_shared<std::vector<VolumeReport>>();
    session.ask(ask_volumes(machine, volumes_of({facts.group}).ids, session, volumes));
    facts.volumes = volume_facts(*volumes, number);
    for (const Address &device : facts.group.devices)
        facts.devices.push_back(device_fact(device));
    facts.missing_tools =
        missing({"/usr/sbin/lvremove", "/usr/sbin/vgremove", "/usr/sbin/pvremove", "/bin/umount"});
    return facts;
}

// Of the volumes and devices that there were.
GroupFacts facts_after_removal(Session &session, const GroupFacts &before) {
    GroupFacts after = removal_facts_of(session, before.group.number);
    after.devices.clear();
    for (const DeviceFact &device : before.devices)
        after.devices.push_back(device_fact(device.address));
    return after;
}

std::function<std::vector<Sight>()> sights_of_group(const GroupFacts &facts) {
    std::vector<std::string> paths = {facts.group.address.path};
    for (const VolumeFact &volume : facts.volumes)
        paths.push_back(volume.report.address.path);
    return [paths] {
        std::vector<Sight> sights;
        for (const std::string &path : paths)
            if (access(path.c_str(), F_OK) == 0)
                sights.push_back({path, path + " is there", path + " is gone"});
        return sights;
    };
}

Address address_given(const std::vector<std::string> &words) {
    try {
        const auto given = device_words_given(words);
        if (const zavDevice *device = std::get_if<zavDevice>(&given))
            return library::address_of(*device);
        const std::string &path = std::get<std::string>(given);
        const library::NamedDevice named = library::device_of(path);
        if (named.result != ZAV_RC_OK)
            throw UsageError(fmt::format("'{}' is no device", printable(path)));
        return {named.device, path};
    } catch (const BadWords &bad) {
        throw UsageError(printable(bad.what()));
    }
}

Answer add(Session &session, const std::vector<std::string> &words, int group,
           const ChangeOptions &options) {
    const Address address = address_given(words);
    const GroupFacts facts = addition_facts(session, address, group);
    const auto act = [&] {
        const int result = run_change(
            session.streams,
            [device = address.device, group] {
                return library::add_to_group(device, group_device(group));
            },
            sights_of_group(facts));
        return group_addition_outcome(facts, addition_facts(session, address, group),
                                      library::failure_of(result));
    };
    return carry_out(session, group_addition_plan(facts), options,
                     fmt::format("Put it into {}?", facts.group.name), act);
}

Answer remove(Session &session, int group, bool system_group_too, const ChangeOptions &options) {
    const GroupFacts facts = removal_facts_of(session, group);
    const auto act = [&] {
        const int result = run_change(
            session.streams, [group] { return library::remove_group(group_device(group)); },
            sights_of_group(facts));
        return group_removal_outcome(facts, facts_after_removal(session, facts),
                                     library::failure_of(result));
    };
    return carry_out(session, group_removal_plan(facts, system_group_too), options,
                     fmt::format("Destroy {} with its volumes?", facts.group.name), act);
}

} // namespace

void add_vg_add(Command vg, Session &session) {
    const auto words = std::make_shared<std::vector<std::string>>();
    const auto group = std::make_shared<int>(0);
    const Command verb = add_verb(vg, session, "add", add_help);
    verb.add_option("DEVICE", *words, "'array N', 'disk N', a path or an address").required();
    verb.add_option("--group", *group, "Number of the group, 0 is PrimaryOSVG")
        .required()
        .type_name("N")
        .within(0, 9999);
    const auto options = add_change_options(verb);
    verb.callback([&session, words, group, options] {
        session.action = [&session, words, group, options] {
            return add(session, *words, *group, *options);
        };
    });
}

void add_vg_remove(Command vg, Session &session) {
    const auto group = std::make_shared<int>(0);
    const auto system_group = std::make_shared<bool>(false);
    const Command verb = add_verb(vg, session, "remove", remove_help);
    verb.add_option("N", *group, "Number of the group").required().within(0, 9999);
    verb.add_flag("--system-group", *system_group, "Also PrimaryOSVG, the system's own group");
    const auto options = add_change_options(verb);
    verb.callback([&session, group, system_group, options] {
        session.action = [&session, group, system_group, options] {
            return remove(session, *group, *system_group, *options);
        };
    });
}

} // namespace zavctl
