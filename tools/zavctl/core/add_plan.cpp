#include "exchange.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr const char *recreate_option = "--recreate";
constexpr int data_partition = 2; // the only one that the library makes an array of
constexpr int mirrored = 1;       // the data RAID type for which the script makes no array
constexpr int seconds_in_all = 6;
constexpr int seconds_to_attach = 10;
constexpr int seconds_to_recreate = 10;
constexpr int seconds_per_missing_node = 20;

using Hold = ArrayMember::Hold;

// "/dev/md/MD0" to MD3, the names that the library can ask about.
bool is_name_of_appliance(const std::string &array) {
    for (const char *name : {"/dev/md/MD0", "/dev/md/MD1", "/dev/md/MD2", "/dev/md/MD3"})
        if (array.find(name) != std::string::npos)
            return true;
    return false;
}

class PartitionAddition {
  public:
    PartitionAddition(const ExchangeFacts &facts, const PartitionFact &partition,
                      const Consent &consent, Plan &plan)
        : facts_(facts), partition_(partition), consent_(consent), plan_(plan),
          scan_(words_of_scan(partition.scan)) {}

    void plan() {
        if (trimmed(partition_.scan).empty() && !partition_.holder.empty())
            refuse(fmt::format("disk{}p{} is in {}, but mdadm tells nothing of it", facts_.source,
                               partition_.number, partition_.holder));
        else if (trimmed(partition_.scan).empty())
            plan_set_up();
        else if (is_known())
            plan_array();
    }

  private:
    void refuse(std::string why) { plan_.refusals.push_back({std::move(why)}); }

    std::string array() const { return array_words(partition_); }

    std::string member_name() const {
        return fmt::format("disk{}p{}", facts_.target.slot, partition_.number);
    }

    void step(const char *does, const std::string &text, int seconds, Severity severity) {
        PlanStep step{does, text, partition_.array.number};
        step.severity = severity;
        plan_.steps.push_back(step);
        plan_.seconds += seconds;
    }

    bool is_known() {
        const ArrayReport &report = partition_.array;
        if (!is_name_of_appliance(scan_.array))
            refuse(fmt::format("mdadm calls the array of disk{}p{} {}, which is none of the "
                               "appliance's: the disk would not join it",
                               facts_.source, partition_.number,
                               scan_.array.empty() ? "nothing" : printable(scan_.array)));
        else if (scan_.level.empty())
            refuse(fmt::format("{}: mdadm tells no level for disk{}p{}, so the library would wipe "
                               "the disk and let it join nothing",
                               array(), facts_.source, partition_.number));
        else if (report.failure || !report.doubt.empty())
            refuse(fmt::format("{} gives no answer to trust: {}", array(), array_note(report)));
        else
            return true;
        return false;
    }

    void plan_array() {
        switch (partition_.array.state) {
        case ZAV_RAID_DEGRADED:
        case ZAV_RAID_RESYNC:
            step("join",
                 fmt::format("{}: {} joins and is rebuilt, for as long as that takes", array(),
                             member_name()),
                 0, Severity::ok);
            break;
        case ZAV_RAID_FAILED:
        case ZAV_RAID_NOT_EXIST:
            plan_lost_array();
            break;
        default:
            step("none", array() + ": lacks no member, nothing is done", 0, Severity::ok);
        }
    }

    bool all_disks_present() const {
        const int disks = facts_.ata_disks + (facts_.target.node_present ? 0 : 1);
        return disks == facts_.platform.model.disk_count;
    }

    std::string what_it_is() const {
        return partition_.array.state == ZAV_RAID_FAILED ? "has failed" : "does not exist";
    }

    void plan_lost_array() {
        if (partition_.array.state == ZAV_RAID_NOT_EXIST)
            plan_.seconds += seconds_per_missing_node;
        if (!all_disks_present())
            plan_lost_array_left();
        else if (partition_.number != data_partition || partition_.array.number != data_partition)
            refuse(fmt::format("{} {}: the library would make the data array anew in its place. "
                               "Start it first ('mdadm --assemble --scan')",
                               array(), what_it_is()));
        else
            plan_recreation();
    }

    void plan_lost_array_left() {
        const std::string text =
            fmt::format("{} {} and stays as it is: {} of {} disks are present", array(),
                        what_it_is(), facts_.ata_disks, facts_.platform.model.disk_count);
        step("none", text, 0, Severity::warning);
        plan_.warnings.push_back(text);
    }

    std::string loss() const {
        const std::string volumes = volumes_words(partition_.volumes);
        return volumes.empty() ? "whatever it held is lost"
                               : "its volumes " + volumes + " are lost";
    }

    void plan_recreation() {
        if (!consent_.recreate)
            plan_.refusals.push_back(
                {fmt::format("{} {}, and all disks are present: it would be CREATED ANEW, {}. If "
                             "it only is not running, 'mdadm --assemble --scan' may bring it back. "
                             "{} makes it anew",
                             array(), what_it_is(), loss(), recreate_option),
                 recreate_option});
        step("recreate",
             fmt::format("{} {} and is CREATED ANEW from partition {} of every disk, {}; "
                         "hbqSetup.sh makes empty volumes",
                         array(), what_it_is(), data_partition, loss()),
             seconds_to_recreate, Severity::critical);
    }

    void plan_set_up() {
        const bool makes_arrays = facts_.platform.model.data_raid_type != mirrored;
        const std::string work = makes_arrays ? "createraid, then lvmrestore" : "lvmrestore";
        const std::string text =
            fmt::format("partition {} of disk {} is in no array: hbqSetup.sh sets up arrays and "
                        "volumes ({})",
                        partition_.number, facts_.source, work);
        if (!consent_.recreate)
            plan_.refusals.push_back({fmt::format("{}, which may erase what there is. {} lets it",
                                                  text, recreate_option),
                                      recreate_option});
        step("set_up", text, 0, Severity::critical);
    }

    const ExchangeFacts &facts_;
    const PartitionFact &partition_;
    const Consent &consent_;
    Plan &plan_;
    ScanWords scan_;
};

void refuse_source(const ExchangeFacts &facts, Plan &plan) {
    if (facts.source == 0)
        plan.refusals.push_back({"no disk is found that is an active member of /dev/md0: there is "
                                 "none whose partition table could be copied"});
    else if (facts.source == facts.target.slot)
        plan.refusals.push_back(
            {"the disk itself is the first active member of /dev/md0: it is in service"});
}

std::vector<std::string> arrays_of_target(const ExchangeFacts &facts) {
    std::vector<std::string> words;
    for (const PartitionFact &partition : facts.partitions)
        if (const ArrayMember *member = member_of_slot(partition.table, facts.target.slot))
            words.push_back(fmt::format("{} in {}", word(member->hold), array_words(partition)));
    return words;
}

void refuse_target(const ExchangeFacts &facts, Plan &plan) {
    const DiskReport &disk = facts.target;
    if (disk.node_present && !disk.doubt.empty())
        plan.refusals.push_back({disk.doubt});
    else if (disk.node_present && disk.state != ZAV_HDD_FOUND)
        plan.refusals.push_back({"it is not healthy: " + disk_note(disk)});
    if (!disk.expected)
        plan.refusals.push_back({fmt::format("the arrays of this model use slots 1 to {}",
                                             facts.platform.model.disk_count)});
    const std::vector<std::string> arrays = arrays_of_target(facts);
    if (arrays.empty() && !facts.memberships.empty())
        plan.refusals.push_back(
            {fmt::format("it is in service: a member of {}", facts.memberships.front().array)});
    if (!arrays.empty())
        plan.refusals.push_back(
            {fmt::format("it is in service: {}. 'zavctl disk remove {}' takes it out first",
                         listed(arrays), disk.slot)});
    for (const std::string &group : facts.groups_on_target)
        plan.refusals.push_back({group + " lies on the disk itself"});
}

void refuse_pointless(const ExchangeFacts &facts, Plan &plan) {
    const bool has_work =
        std::any_of(plan.steps.begin(), plan.steps.end(), [](const PlanStep &step) {
            return step.does == "join" || step.does == "recreate" || step.does == "set_up";
        });
    if (!has_work && plan.refusals.empty())
        plan.refusals.push_back({fmt::format("no array would take it: disk {} would be wiped for "
                                             "nothing",
                                             facts.target.slot)});
}

void warn_of_content(const ExchangeFacts &facts, Plan &plan) {
    const TargetContent &content = facts.content;
    std::vector<std::string> words;
    if (!content.partitions.empty())
        words.push_back(fmt::format("{} {}", content.partitions.size(),
                                    content.partitions.size() == 1 ? "partition" : "partitions"));
    if (content.superblocks)
        words.emplace_back("members of an array");
    if (content.marked)
        words.emplace_back("the mark of an appliance's disk");
    if (!words.empty())
        plan.warnings.push_back("it is not empty, and will be: it holds " + listed(words));
    if (content.smaller)
        plan.warnings.push_back(fmt::format("it is smaller than disk {}, whose partitions may not "
                                            "fit on it",
                                            facts.source));
}

void plan_preparation(const ExchangeFacts &facts, Plan &plan) {
    const DiskReport &disk = facts.target;
    if (!disk.node_present) {
        plan.steps.push_back(
            {"attach", fmt::format("the kernel is told to look for a disk in slot {}; without one "
                                   "nothing more is done",
                                   disk.slot)});
        plan.seconds += seconds_to_attach;
    }
    PlanStep wipe{"wipe", fmt::format("{} is WIPED, gets the partition table of disk {} and the "
                                      "mark of an appliance's disk",
                                      disk.address.path, facts.source)};
    wipe.severity = Severity::warning;
    plan.steps.push_back(wipe);
}

} // namespace

Plan addition_plan(const ExchangeFacts &facts, const Consent &consent) {
    Plan plan;
    plan.command = "disk add";
    plan.heading = fmt::format("Disk {} ({}, {}) is brought into service.", facts.target.slot,
                               facts.target.address.path,
                               facts.target.node_present ? shown_state(facts.target) : "no device");
    plan.seconds = seconds_in_all;
    refuse_unfit_machine(facts, plan);
    refuse_source(facts, plan);
    refuse_target(facts, plan);
    plan_preparation(facts, plan);
    for (const PartitionFact &partition : facts.partitions)
        PartitionAddition(facts, partition, consent, plan).plan();
    refuse_pointless(facts, plan);
    warn_of_content(facts, plan);
    return plan;
}

} // namespace zavctl
