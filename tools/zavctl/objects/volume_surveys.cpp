#include "volume_surveys.h"

#include "asking.h"

#include "../core/event.h"
#include "../system/files.h"
#include "../system/library.h"
#include "../system/run.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <set>
#include <span>

namespace zavctl {

namespace {

constexpr std::chrono::seconds tool_limit{10};
constexpr const char *missing_group_mixup =
    "vgs names no such group, but another whose name holds this one's";

std::string known_to_vgs() {
    return run({"/usr/sbin/vgs"}, tool_limit).output;
}

// Every query makes the same failure of a missing tool.
void explain(std::optional<Failure> &failure, const std::string &tool_missing) {
    if (failure && failure->code == ZAV_RC_ERR_ENOENT && !tool_missing.empty())
        failure->meaning = tool_missing + " is missing";
}

GroupReport unanswered_group(const Machine &machine, int number, const Session &session) {
    GroupReport group;
    group.number = number;
    group.name = group_name(number);
    group.address = library::address_of({ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0});
    group.doubt = machine.volume_doubt;
    group.expected = true;
    group.failure = no_answer(session);
    return group;
}

// The entries that a table holds; counts may exceed it, and come from a tool's text.
template <class Entry, std::size_t size>
std::span<const Entry> entries(const Entry (&table)[size], int count) {
    return {table, static_cast<std::size_t>(std::clamp(count, 0, static_cast<int>(size)))};
}

void add_parts(GroupReport &group, const lvmVG &record) {
    group.size = record.size;
    group.pv_count = record.pvcount;
    group.lv_count = record.lvcount;
    for (const lvmPV &pv : entries(record.pvdev, record.pvcount)) {
        group.devices.push_back(library::address_of(pv.dev));
        group.pvs.push_back(pv.lvmdev.disk);
    }
    for (const lvmLV &volume : entries(record.lvdev, record.lvcount))
        group.volumes.push_back(volume.lvmdev.disk);
}

GroupReport answered(GroupReport group, const std::string &tool_missing) {
    const library::VolumeAnswer answer = library::volume_state(group.address.device);
    group.failure = library::failure_of(answer.result);
    group.record = answered_event(answer.result, answer.state);
    group.state = answer.state.state;
    explain(group.failure, tool_missing);
    if ((group.state & ZAV_LVM_NORMAL) != 0)
        add_parts(group, answer.state.dev.lvmvgdev);
    const std::vector<int> known = groups_in_list(known_to_vgs());
    const bool listed = std::find(known.begin(), known.end(), group.number) != known.end();
    if (group.state == ZAV_LVM_FAILED && !group.failure && !listed && group.doubt.empty())
        group.doubt = missing_group_mixup;
    return group;
}

VolumeReport unanswered_volume(const Machine &machine, const VolumeId &id, const Session &session) {
    VolumeReport volume;
    volume.id = id;
    volume.address = library::address_of({ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, id.number, id.group});
    volume.mount_point = library::mount_point(volume.address.device);
    volume.doubt = machine.volume_doubt;
    volume.failure = no_answer(session);
    return volume;
}

VolumeReport answered(VolumeReport volume, const std::string &tool_missing) {
    const library::VolumeAnswer answer = library::volume_state(volume.address.device);
    volume.failure = library::failure_of(answer.result);
    volume.record = answered_event(answer.result, answer.state);
    volume.state = answer.state.state;
    volume.size = answer.state.dev.lvmlvdev.size;
    volume.usage = static_cast<double>(answer.state.dev.lvmlvdev.usage);
    volume.mounted = is_mounted(volume.mount_point);
    explain(volume.failure, tool_missing);
    return volume;
}

PvReport unanswered_pv(const Machine &machine, const VolumeId &id, const Session &session) {
    PvReport pv;
    pv.id = id;
    pv.address = {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, id.number, id.group}, ""};
    pv.doubt = machine.volume_doubt;
    pv.failure = no_answer(session);
    return pv;
}

PvReport answered(PvReport pv, const std::string &tool_missing) {
    const library::VolumeAnswer answer = library::volume_state(pv.address.device);
    const lvmPV &record = answer.state.dev.lvmpvdev;
    pv.failure = library::failure_of(answer.result);
    pv.record = answered_event(answer.result, answer.state);
    pv.state = answer.state.state;
    pv.size = record.size;
    pv.device = library::address_of(record.dev);
    explain(pv.failure, tool_missing);
    return pv;
}

Named named(const std::vector<GroupReport> &groups, std::vector<int> GroupReport::*numbers,
            int GroupReport::*count) {
    Named result;
    for (const GroupReport &group : groups) {
        for (const int number : group.*numbers)
            if (number > 0)
                result.ids.push_back({group.number, number});
            else
                ++result.more; // an entry that could not be read
        result.more += std::max(0, group.*count - static_cast<int>((group.*numbers).size()));
    }
    return result;
}

// A question that knows which tool is missing.
template <class Report>
Question asked_of_tools(const std::string &about, const Machine &machine, const Report &begin,
                        const Shared<Report> &reports) {
    return question(about, begin, reports,
                    [missing = machine.volume_tool_missing](const Report &report) {
                        return answered(report, missing);
                    });
}

bool has_arrays(const Machine &machine) {
    return machine.model.known() && !machine.model.hardware_raid() && machine.model.disk_count > 1;
}

} // namespace

std::vector<int> listed_groups(const Machine &machine) {
    std::set<int> numbers;
    if (has_arrays(machine))
        numbers = {0, 1};
    const std::vector<int> known = groups_in_list(known_to_vgs());
    numbers.insert(known.begin(), known.end());
    int error = 0;
    for (const std::string &name : names_in("/dev", error))
        if (const auto number = group_number(name))
            numbers.insert(*number);
    return {numbers.begin(), numbers.end()};
}

std::vector<Question> ask_groups(const Machine &machine, const std::vector<int> &numbers,
                                 const Session &session, const Shared<GroupReport> &reports) {
    return questions_of(numbers, [&](int number) {
        return asked_of_tools("group " + group_name(number), machine,
                              unanswered_group(machine, number, session), reports);
    });
}

std::vector<Question> ask_volumes(const Machine &machine, const std::vector<VolumeId> &ids,
                                  const Session &session, const Shared<VolumeReport> &reports) {
    return questions_of(ids, [&](const VolumeId &id) {
        return asked_of_tools("volume " + in_words(id), machine,
                              unanswered_volume(machine, id, session), reports);
    });
}

std::vector<Question> ask_pvs(const Machine &machine, const std::vector<VolumeId> &ids,
                              const Session &session, const Shared<PvReport> &reports) {
    return questions_of(ids, [&](const VolumeId &id) {
        return asked_of_tools("physical volume " + in_words(id), machine,
                              unanswered_pv(machine, id, session), reports);
    });
}

Named volumes_of(const std::vector<GroupReport> &groups) {
    return named(groups, &GroupReport::volumes, &GroupReport::lv_count);
}

Named pvs_of(const std::vector<GroupReport> &groups) {
    return named(groups, &GroupReport::pvs, &GroupReport::pv_count);
}

void add_findings_of_silent(const std::vector<GroupReport> &groups, Section &section) {
    std::vector<GroupReport> silent;
    std::copy_if(groups.begin(), groups.end(), std::back_inserter(silent),
                 [](const GroupReport &group) { return !group.answered(); });
    const std::vector<Finding> findings = group_findings(silent);
    section.findings.insert(section.findings.end(), findings.begin(), findings.end());
}

} // namespace zavctl
