#include "exchange.h"

#include <fmt/format.h>

#include <cstring>

namespace zavctl {

namespace {

void refuse(Plan &plan, std::string why) {
    plan.refusals.push_back({std::move(why)});
}

void refuse_model(const ModelReport &model, Plan &plan) {
    if (!model.known())
        refuse(plan, "the model of this machine is not known");
    else if (model.hardware_raid())
        refuse(plan, "the disks of this model are the RAID controller's");
    else if (model.data_raid_type < 0)
        refuse(plan, "/etc/Kiru/raidtype tells no RAID type of the data array");
}

void refuse_shell(const PlatformFacts &platform, Plan &plan) {
    const std::string doubt = shell_doubt(platform.shell_false);
    if (!doubt.empty())
        refuse(plan, "/bin/sh does not do what the commands need: " + doubt);
}

void refuse_hot_plug(const ExchangeFacts &facts, Plan &plan) {
    const PlatformFacts &platform = facts.platform;
    if (platform.scsi.error != 0)
        refuse(plan, fmt::format("/proc/scsi/scsi: {}; no disk can be detached or attached",
                                 std::strerror(platform.scsi.error)));
    const auto hosts = static_cast<int>(platform.sata_hosts.size());
    if (hosts < facts.target.slot)
        refuse(plan, fmt::format("the SATA controller's directory in /sys shows {} hosts, none for "
                                 "slot {}: the commands would miss the disk",
                                 hosts, facts.target.slot));
}

std::string volume_words(const VolumeReport &volume) {
    const std::optional<double> percent = usage_percent(volume);
    std::string text = fmt::format("{} ({}", in_words(volume.id), shown_size(volume.size));
    if (percent)
        text += fmt::format(", {:.0f} % used", *percent);
    text += volume.mounted ? ", mounted at " + volume.mount_point : ", not mounted";
    return text + ")";
}

} // namespace

void refuse_unfit_machine(const ExchangeFacts &facts, Plan &plan) {
    refuse_model(facts.platform.model, plan);
    refuse_shell(facts.platform, plan);
    if (!facts.missing_tools.empty())
        refuse(plan, listed(facts.missing_tools) +
                         (facts.missing_tools.size() == 1 ? " is missing" : " are missing"));
    refuse_hot_plug(facts, plan);
}

std::string array_words(const PartitionFact &partition) {
    std::string level = partition.table.level;
    if (level.starts_with("raid"))
        level = "RAID" + level.substr(4);
    if (partition.holder.empty())
        return fmt::format("array {}", partition.array.number);
    const std::string more = level.empty() ? "" : ", " + level;
    return fmt::format("array {} ({}{})", partition.array.number, partition.holder, more);
}

std::string volumes_words(const std::vector<VolumeFact> &volumes) {
    std::vector<std::string> words;
    words.reserve(volumes.size());
    for (const VolumeFact &volume : volumes)
        words.push_back(volume_words(volume.report));
    return listed(words);
}

} // namespace zavctl
