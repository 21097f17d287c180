#include "group_plan.h"

#include "name_report.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <charconv>

namespace zavctl {

namespace {

constexpr const char *system_option = "--system-group";

void refuse(Plan &plan, std::string why) {
    plan.refusals.push_back({std::move(why)});
}

PlanStep step(std::string does, std::string text, Severity severity) {
    PlanStep made{std::move(does), std::move(text)};
    made.severity = severity;
    return made;
}

void refuse_unfit(const GroupFacts &facts, Plan &plan) {
    if (facts.hardware_raid)
        refuse(plan, "the disks and arrays of this model are the RAID controller's: volume groups "
                     "are changed on models with software RAID alone");
    if (!facts.group.doubt.empty())
        refuse(plan, "the library's answers cannot be trusted here: " + facts.group.doubt);
    if (!facts.missing_tools.empty())
        refuse(plan, listed(facts.missing_tools) +
                         (facts.missing_tools.size() == 1 ? " is missing" : " are missing"));
}

bool exists(const GroupFacts &facts) {
    return (facts.group.state & ZAV_LVM_NOT_EXIST) == 0;
}

bool is_carrier(const zavDevice &device) {
    if (device.minor_type == ZAV_MINDEV_HDD_SATA)
        return device.part == 0;
    return device.type == ZAV_DEV_RAID;
}

void refuse_content(const DeviceFact &device, Plan &plan) {
    if (!device.memberships.empty())
        refuse(plan, fmt::format("it is in use: a member of {}", device.memberships.front().array));
    else if (!device.partitions.empty())
        refuse(plan, fmt::format("it has {} partitions", device.partitions.size()));
    if (!device.mounted_at.empty())
        refuse(plan, "it is mounted at " + printable(device.mounted_at));
    if (device.in_group && !device.in_group->empty())
        refuse(plan, "it is a physical volume of group " + printable(*device.in_group));
}

void refuse_device(const DeviceFact &device, Plan &plan) {
    if (!is_carrier(device.address.device))
        refuse(plan, "a group lies on a whole SATA disk or on an array");
    else if (!device.node_present)
        refuse(plan, device.address.path + " does not exist");
    else if (!device.trouble.empty())
        refuse(plan, "its state cannot be told: " + device.trouble);
    else if (!device.usable)
        refuse(plan, "its state is: " + device.state);
    else
        refuse_content(device, plan);
}

std::string volume_list(const std::vector<VolumeFact> &volumes, bool there) {
    std::vector<std::string> names;
    for (const VolumeFact &volume : volumes)
        if ((volume.report.state & ZAV_LVM_NOT_EXIST) == 0 || !there)
            names.push_back(in_words(volume.report.id));
    return listed(names);
}

void plan_volumes(const GroupFacts &facts, Plan &plan) {
    for (const VolumeFact &volume : facts.volumes) {
        plan.steps.push_back(step("destroy",
                                  fmt::format("volume {} is {}REMOVED", volumes_words({volume}),
                                              volume.report.mounted ? "unmounted and " : ""),
                                  Severity::critical));
        if (!volume.used_by.empty())
            refuse(plan, fmt::format("volume {} is in use by {}", in_words(volume.report.id),
                                     printable(volume.used_by)));
    }
}

void refuse_unnamed_volumes(const GroupFacts &facts, Plan &plan) {
    const int named = static_cast<int>(facts.volumes.size());
    if (facts.group.lv_count > named)
        refuse(plan, fmt::format("it has {} volumes, of which the library removes {}: remove the "
                                 "others first (lvremove)",
                                 facts.group.lv_count, named));
}

void finish(Outcome &outcome, const std::optional<Failure> &failure) {
    outcome.failure = failure;
    const bool complete = outcome.findings.empty();
    if (failure)
        outcome.findings.push_back(
            {complete ? Severity::warning : Severity::critical,
             (complete ? "all is as planned, but the library reports: " : "the library: ") +
                 in_words(*failure)});
    outcome.word = complete ? "done" : failure ? "failed" : "incomplete";
}

void judge_labels(const GroupFacts &after, Outcome &outcome) {
    for (const DeviceFact &device : after.devices)
        if (device.in_group) {
            outcome.findings.push_back(
                {Severity::critical,
                 device_words(device.address) + " still carries the label of a physical volume"});
            outcome.advice.push_back("pvremove " + device.address.path);
        }
}

} // namespace

std::variant<std::string, zavDevice> device_words_given(const std::vector<std::string> &words) {
    int number = 0;
    const std::string &last = words.back();
    const auto [end, error] = std::from_chars(last.data(), last.data() + last.size(), number);
    const bool numbered =
        words.size() == 2 && error == std::errc() && end == last.data() + last.size();
    if (numbered && words[0] == "array")
        return zavDevice{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, number, 1};
    if (numbered && words[0] == "disk")
        return zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, number, 0};
    const std::vector<NameQuery> queries = name_queries(words);
    if (queries.size() != 1)
        throw BadWords("one device at a time, such as 'array 3', 'disk 4' or /dev/swraid/disk3p1");
    return queries.front();
}

Plan group_addition_plan(const GroupFacts &facts) {
    const DeviceFact &device = facts.devices.front();
    const std::string name = device_words(device.address);
    Plan plan;
    plan.command = "vg add";
    plan.heading =
        fmt::format("{} ({}, {}) goes into {}.", name, device.address.path,
                    device.state.empty() ? "state unknown" : device.state, facts.group.name);
    refuse_unfit(facts, plan);
    refuse_device(device, plan);
    if (exists(facts) && !facts.group.answered() && facts.group.doubt.empty())
        refuse(plan,
               fmt::format("{} does not answer: {}", facts.group.name, group_note(facts.group)));
    plan.steps.push_back(step("label", name + " becomes a physical volume; what it holds is lost",
                              Severity::warning));
    plan.steps.push_back(
        exists(facts) ? step("extend", facts.group.name + " is extended by it", Severity::ok)
                      : step("create", facts.group.name + " is created on it", Severity::ok));
    if (device.state == "degraded" || device.state == "rebuilding")
        plan.warnings.push_back(fmt::format("{} is {}", name, device.state));
    return plan;
}

Plan group_removal_plan(const GroupFacts &facts, bool system_group_too) {
    Plan plan;
    plan.command = "vg remove";
    plan.heading = fmt::format("{} is dismantled; ITS VOLUMES ARE DESTROYED.", facts.group.name);
    refuse_unfit(facts, plan);
    if (!exists(facts))
        refuse(plan, "there is no volume group " + facts.group.name);
    else if (!facts.group.answered() && facts.group.doubt.empty())
        refuse(plan,
               fmt::format("{} does not answer: {}", facts.group.name, group_note(facts.group)));
    else
        refuse_unnamed_volumes(facts, plan);
    if (facts.group.number == 0 && !system_group_too)
        plan.refusals.push_back({fmt::format("{} is the system's own group. {} dismantles it all "
                                             "the same",
                                             facts.group.name, system_option),
                                 system_option});
    plan_volumes(facts, plan);
    plan.steps.push_back(step("remove", facts.group.name + " is removed", Severity::critical));
    for (const DeviceFact &device : facts.devices)
        plan.steps.push_back(step("unlabel",
                                  device_words(device.address) +
                                      " is no physical volume any more and free for other use",
                                  Severity::ok));
    return plan;
}

Outcome group_addition_outcome(const GroupFacts &before, const GroupFacts &after,
                               const std::optional<Failure> &failure) {
    Outcome outcome;
    const DeviceFact &device = after.devices.front();
    const std::string name = device_words(device.address);
    const bool in_group = device.in_group && *device.in_group == before.group.name;
    if (!in_group)
        outcome.findings.push_back(
            {Severity::critical, fmt::format("{} is not in {}", name, before.group.name)});
    if (!after.group.answered())
        outcome.findings.push_back({Severity::critical, before.group.name + " does not answer"});
    if (!in_group && device.in_group && device.in_group->empty()) {
        outcome.findings.push_back({Severity::critical, name + " is left as a physical volume"});
        outcome.advice.push_back("pvremove " + device.address.path);
    }
    outcome.well = fmt::format("{} is in {}, which lies on {} {} now", name, before.group.name,
                               after.group.pv_count,
                               after.group.pv_count == 1 ? "physical volume" : "physical volumes");
    finish(outcome, failure);
    return outcome;
}

Outcome group_removal_outcome(const GroupFacts &before, const GroupFacts &after,
                              const std::optional<Failure> &failure) {
    Outcome outcome;
    const std::string left = volume_list(after.volumes, true);
    if (exists(after)) {
        outcome.findings.push_back(
            {Severity::critical,
             fmt::format("{} is still there{}", before.group.name,
                         left.empty() ? ", its volumes are gone" : ", with volumes " + left)});
    } else {
        judge_labels(after, outcome);
    }
    const std::string volumes = volume_list(before.volumes, false);
    outcome.well = fmt::format("{} is gone{}", before.group.name,
                               volumes.empty() ? "" : ", with its volumes " + volumes);
    finish(outcome, failure);
    return outcome;
}

} // namespace zavctl
