#include "enclosure_report.h"

#include "raid_set.h"

#include <fmt/format.h>

#include <cmath>
#include <iterator>

namespace zavctl {

namespace {

constexpr std::size_t unit_temperature_item = 0; // what the readings of a unit are known to be
constexpr std::size_t unit_voltage_item = 4;

std::string reading_text(const std::optional<double> &reading) {
    return reading ? fmt::format("{:.2f}", *reading) : "-";
}

std::string item_name(std::size_t item, bool of_unit) {
    if (of_unit && item == unit_temperature_item)
        return "Reading 0 (processor, C)";
    if (of_unit && item == unit_voltage_item)
        return "Reading 4 (processor, V)";
    return fmt::format("Reading {}", item);
}

} // namespace

std::string readings_text(const EnclosureReport &enclosure) {
    std::vector<std::string> texts;
    for (const std::optional<double> &reading : enclosure.readings)
        texts.push_back(reading_text(reading));
    return fmt::format("{}", fmt::join(texts, ", "));
}

Json number_or_null(const std::optional<double> &number) {
    return number && std::isfinite(*number) ? Json(*number) : Json(nullptr);
}

void add_enclosure(Json &json, const EnclosureReport &enclosure) {
    json["readings"] = Json::array();
    for (const std::optional<double> &reading : enclosure.readings)
        json["readings"].push_back(number_or_null(reading));
    json["raid_set"] = enclosure.set ? set_json(*enclosure.set) : Json(nullptr);
    json["volumes"] = enclosure.set ? volumes_json(*enclosure.set) : Json::array();
    json["disks"] = enclosure.set ? disks_json(*enclosure.set) : Json::array();
    json["no_raid_set"] = enclosure.no_set.empty() ? Json(nullptr) : Json(enclosure.no_set);
}

void add_enclosure(Details &details, const EnclosureReport &enclosure, bool of_unit) {
    for (std::size_t item = 0; item < enclosure.readings.size(); ++item)
        details.add(item_name(item, of_unit), reading_text(enclosure.readings[item]));
    if (!enclosure.set) {
        details.add("RAID set", enclosure.no_set, Severity::unknown);
        return;
    }
    const sRaidSetInfo &set = *enclosure.set;
    details.add("RAID set", fmt::format("{} {}", set.raidnum, in_words(set)));
    for (int number = 1; number <= static_cast<int>(std::size(set.sVolInfo)); ++number)
        if (const sVolSetInfo *volume = volume_of(set, number))
            details.add(fmt::format("Volume {}", number), in_words(*volume, set.diskcount));
    for (const sPhyDiskInfo &disk : set.sDiskInfo)
        details.add(fmt::format("Disk {}", disk.disknum), in_words(disk));
}

} // namespace zavctl
