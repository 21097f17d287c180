#include "exchange.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *destroy_option = "--destroy-data";
constexpr int room_for_volumes = 6; // of a group in the library's table
constexpr int seconds_in_all = 5;
constexpr int seconds_per_member = 3;
constexpr int seconds_per_torn_down = 2;
constexpr int seconds_per_missing_node = 20;

using Hold = ArrayMember::Hold;

bool is_without_redundancy(const std::string &level) {
    return level == "raid0" || level == "linear";
}

bool has_rebuild(const PartitionFact &partition) {
    return std::any_of(partition.table.members.begin(), partition.table.members.end(),
                       [](const ArrayMember &member) { return member.hold == Hold::rebuilding; }) ||
           partition.array.state == ZAV_RAID_RESYNC;
}

// The work on one partition number, from the facts and what is known of the target so far.
class PartitionRemoval {
  public:
    PartitionRemoval(const ExchangeFacts &facts, const PartitionFact &partition, bool vanished,
                     const Consent &consent, Plan &plan)
        : facts_(facts), partition_(partition), vanished_(vanished), consent_(consent), plan_(plan),
          member_(member_of_slot(partition.table, facts.target.slot)),
          scan_(words_of_scan(partition.scan)) {}

    void plan() {
        if (partition_.mismatch)
            refuse(fmt::format("mdadm calls the superblock of disk{}p{} inconsistent with its "
                               "array (mismatch)",
                               facts_.source, partition_.number));
        if (is_without_redundancy(scan_.level))
            plan_tear_down();
        else if (vanished_)
            plan_vanished();
        else if (member_)
            plan_member();
    }

  private:
    void refuse(std::string why) { plan_.refusals.push_back({std::move(why)}); }

    std::string array() const { return array_words(partition_); }

    std::string member_name() const {
        return fmt::format("disk{}p{}", facts_.target.slot, partition_.number);
    }

    void step(const char *does, const std::string &text, int seconds, Severity severity) {
        PlanStep step{does, array() + ": " + text, partition_.array.number};
        step.severity = severity;
        if (severity != Severity::critical)
            step.redundant_after = redundant_without(partition_.table, facts_.target.slot);
        plan_.steps.push_back(step);
        plan_.seconds += seconds;
    }

    // Whether the library's commands reach this array.
    bool reaches() {
        if (scan_.array.empty() || scan_.level.empty())
            refuse(fmt::format("{}: mdadm tells no level for disk{}p{}, so the library would leave "
                               "{} in and detach it all the same",
                               array(), facts_.source, partition_.number, member_name()));
        else if (partition_.leads_to != partition_.holder)
            refuse(fmt::format("{}: mdadm calls it {}, which leads to {}: the library would miss "
                               "it and detach a disk that is still a member",
                               array(), printable(scan_.array),
                               partition_.leads_to.empty() ? "no array" : partition_.leads_to));
        else
            return true;
        return false;
    }

    void plan_member() {
        if (!reaches())
            return;
        if (member_->hold == Hold::active)
            plan_active_member();
        else
            step("take_out",
                 fmt::format("{} ({}) is taken out", member_name(), word(member_->hold)),
                 seconds_per_member, Severity::ok);
    }

    void refuse_half_vanished() {
        refuse(fmt::format("{}: {} is a member, but disk {} lacks a partition that disk {} has; "
                           "the library would take the whole disk for vanished and detach a member",
                           array(), member_name(), facts_.target.slot, facts_.source));
    }

    void plan_active_member() {
        if (has_rebuild(partition_)) {
            refuse(array() + " is being rebuilt and needs every active member: wait until it has "
                             "ended ('zavctl array list')");
        } else if (!survives_without(partition_.table, facts_.target.slot)) {
            refuse(fmt::format("{} cannot do without disk {}: its other members do not hold all "
                               "the data",
                               array(), facts_.target.slot));
        } else {
            const bool redundant = redundant_without(partition_.table, facts_.target.slot);
            step("take_out",
                 member_name() + " is failed and taken out; " +
                     (redundant ? "the array stays redundant"
                                : "THE ARRAY STAYS IN USE WITHOUT REDUNDANCY"),
                 seconds_per_member, redundant ? Severity::ok : Severity::warning);
        }
    }

    // Members whose node is gone: only those that the kernel has noticed can be taken out.
    void plan_vanished() {
        if (member_ != nullptr && reaches())
            refuse_half_vanished();
        for (const ArrayMember &member : partition_.table.members)
            if (member.slot == 0)
                plan_vanished_member(member);
    }

    void plan_vanished_member(const ArrayMember &member) {
        const std::string name = member.node.empty() ? "its member" : printable(member.node);
        if (!reaches())
            return;
        if (member.hold == Hold::faulty)
            step("take_out",
                 fmt::format("the faulty member without a device ({}) is taken out", name),
                 seconds_per_member, Severity::ok);
        else
            refuse(fmt::format("{}: the kernel has not noticed yet that {} is gone, and only a "
                               "faulty member can be taken out. Its next write notices: sync, or "
                               "write to a volume, and try again",
                               array(), name));
    }

    void plan_tear_down() {
        if (partition_.holder.empty() || partition_.holder != partition_.leads_to) {
            refuse(fmt::format("{} has no redundancy and is not running under the name that mdadm "
                               "tells ({}): the library could not stop it",
                               array(), printable(scan_.array)));
            return;
        }
        refuse_what_stops_half_way();
        const std::string loss = what_is_lost();
        if (!consent_.destroy)
            plan_.refusals.push_back(
                {fmt::format("{} has no redundancy: {}. {} does it all the same", array(), loss,
                             destroy_option),
                 destroy_option});
        step("destroy", loss, seconds_per_torn_down, Severity::critical);
    }

    std::string what_is_lost() const {
        if (!partition_.group)
            return "IT IS STOPPED AND ITS DATA LOST";
        const std::string volumes = volumes_words(partition_.volumes);
        return fmt::format("{} ON IT IS DESTROYED{}, and the array stopped", partition_.group->name,
                           volumes.empty() ? "" : " with its volumes " + volumes);
    }

    // The library stops at the first of these, with a part of the volumes gone.
    void refuse_what_stops_half_way() {
        if (!partition_.group)
            return;
        const GroupReport &group = *partition_.group;
        if (!group.answered())
            refuse(fmt::format("{} on {} cannot be asked: {}", group.name, array(),
                               group_note(group)));
        if (group.lv_count > room_for_volumes)
            refuse(fmt::format("{} has {} volumes, of which the library removes {}", group.name,
                               group.lv_count, room_for_volumes));
        for (const VolumeFact &volume : partition_.volumes)
            if (!volume.used_by.empty())
                refuse(fmt::format("volume {} is in use by {}", in_words(volume.report.id),
                                   printable(volume.used_by)));
    }

    const ExchangeFacts &facts_;
    const PartitionFact &partition_;
    bool vanished_;
    const Consent &consent_;
    Plan &plan_;
    const ArrayMember *member_;
    ScanWords scan_;
};

std::string heading(const ExchangeFacts &facts) {
    const DiskReport &disk = facts.target;
    const std::string path = disk.address.path;
    if (!disk.node_present)
        return fmt::format("Disk {} ({}) has vanished; what is left of it in the arrays is taken "
                           "out.",
                           disk.slot, path);
    return fmt::format("Disk {} ({}, {}) is taken out of service.", disk.slot, path,
                       shown_state(disk));
}

int seconds_of_looking(const ExchangeFacts &facts) {
    int seconds = 0;
    for (const DiskReport &disk : facts.disks)
        if (disk.slot < facts.source && !disk.node_present)
            seconds += seconds_per_missing_node;
    return seconds;
}

void refuse_disk(const ExchangeFacts &facts, Plan &plan) {
    if (facts.source == 0)
        plan.refusals.push_back({"there is no other healthy disk: this one must stay"});
    for (const std::string &group : facts.groups_on_target)
        plan.refusals.push_back(
            {fmt::format("{} lies on the disk itself and would lose it", group)});
    for (const DiskReport &disk : facts.disks)
        if (!disk.doubt.empty())
            plan.refusals.push_back({fmt::format("disk {}: {}", disk.slot, disk.doubt)});
}

void plan_partitions(const ExchangeFacts &facts, const Consent &consent, Plan &plan) {
    bool vanished = false;
    for (auto it = facts.partitions.rbegin(); it != facts.partitions.rend(); ++it) {
        vanished = vanished || !it->on_target;
        PartitionRemoval(facts, *it, vanished, consent, plan).plan();
    }
}

// The last line of defence: whatever mdadm tells or does not, a disk that the kernel uses is not
// detached.
void refuse_what_is_left_in(const ExchangeFacts &facts, Plan &plan) {
    for (const Membership &membership : facts.memberships) {
        const auto covered = [&](const PlanStep &step) {
            return std::any_of(facts.partitions.begin(), facts.partitions.end(),
                               [&](const PartitionFact &partition) {
                                   return partition.holder == membership.array &&
                                          partition.array.number == step.array;
                               });
        };
        if (plan.refusals.empty() && std::none_of(plan.steps.begin(), plan.steps.end(), covered))
            plan.refusals.push_back(
                {fmt::format("disk{}p{} is in {}, but mdadm does not tell what is needed to take "
                             "it out",
                             facts.target.slot, membership.partition, membership.array)});
    }
}

} // namespace

Plan removal_plan(const ExchangeFacts &facts, const Consent &consent) {
    Plan plan;
    plan.command = "disk remove";
    plan.heading = heading(facts);
    plan.seconds = seconds_in_all + seconds_of_looking(facts);
    refuse_unfit_machine(facts, plan);
    refuse_disk(facts, plan);
    plan_partitions(facts, consent, plan);
    refuse_what_is_left_in(facts, plan);
    if (plan.steps.empty() && plan.refusals.empty() && !facts.target.node_present)
        plan.refusals.push_back(
            {"the disk has no device and is in no array: nothing is to remove"});
    if (facts.target.node_present)
        plan.steps.push_back({"detach", fmt::format("the kernel gives the disk up; {} goes",
                                                    facts.target.address.path)});
    if (facts.target.state == ZAV_HDD_FOUND && facts.target.doubt.empty())
        plan.warnings.push_back("its health check passes: is it the right disk?");
    return plan;
}

} // namespace zavctl
