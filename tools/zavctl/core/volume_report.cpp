#include "volume_report.h"

#include "group_report.h"
#include "verdict.h"

#include "zav_event.h"

#include <fmt/format.h>

#include <charconv>

namespace zavctl {

namespace {

// Sector counts of the library's width end here: what is larger reads as this.
constexpr std::uint64_t largest_size = 1024;

std::optional<int> number(std::string_view text) {
    int value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc() || end != text.data() + text.size() || value < 0)
        return std::nullopt;
    return value;
}

std::optional<VolumeId> id_of_numbers(std::string_view word) {
    const std::size_t dash = word.find('-');
    if (dash == std::string_view::npos)
        return std::nullopt;
    const auto group = number(word.substr(0, dash));
    const auto volume = number(word.substr(dash + 1));
    if (!group || !volume)
        return std::nullopt;
    return VolumeId{*group, *volume};
}

// "DataVG1/LogVol2".
std::optional<VolumeId> id_of_path(std::string_view path) {
    constexpr std::string_view volume_word = "LogVol";
    const std::size_t slash = path.find('/');
    if (slash == std::string_view::npos || !path.substr(slash + 1).starts_with(volume_word))
        return std::nullopt;
    const auto group = group_number(path.substr(0, slash));
    const auto volume = number(path.substr(slash + 1 + volume_word.size()));
    if (!group || !volume)
        return std::nullopt;
    return VolumeId{*group, *volume};
}

bool is_measured(const VolumeReport &volume) {
    return volume.mounted && !(volume.failure && volume.failure->code == volume_not_measured);
}

// A query that could not measure the usage has told everything else.
bool has_failed(const VolumeReport &volume) {
    return volume.failure && volume.failure->code != volume_not_measured;
}

// What is full is another file system, as nothing is mounted where the volume belongs.
int believed_state(const VolumeReport &volume) {
    return is_measured(volume) ? volume.state : volume.state & ~ZAV_LVM_FULL;
}

std::string size_text(const VolumeReport &volume) {
    return volume.size >= largest_size ? fmt::format(">{} GB", largest_size - 1)
                                       : shown_size(volume.size);
}

std::string usage_text(const VolumeReport &volume) {
    const std::optional<double> percent = usage_percent(volume);
    return percent ? fmt::format("{:.0f} %", *percent) : "-";
}

std::string name_of(const VolumeReport &volume) {
    return fmt::format("{} {}/LogVol{}", in_words(volume.id), group_name(volume.id.group),
                       volume.id.number);
}

Finding finding(const VolumeReport &volume) {
    const Severity bad = severity(volume);
    const auto about = [&volume, bad](const std::string &is, const std::string &are) {
        return finding_about(bad, "volume", in_words(volume.id), is, are);
    };
    if (bad == Severity::unknown)
        return about("gives no answer to trust", "give no answer to trust");
    const std::string word = volume_state_word(volume);
    if (word == "failed")
        return about("has failed", "have failed");
    if (word == "not_exist")
        return about("does not exist", "do not exist");
    if (word == "inactive")
        return about("is not active", "are not active");
    return about(fmt::format("is {:.0f} % full", volume.usage),
                 fmt::format("are {:.0f} % full", volume.usage));
}

Section common_section(const std::vector<VolumeReport> &volumes) {
    Section section = section_of("logical_volumes", volumes, volume_json, finding);
    section.well = counted(count_well(volumes), "volume", "normal");
    return section;
}

Details volume_details(const VolumeReport &volume) {
    Details details;
    details.add("Volume", name_of(volume));
    details.add("State", shown_state(volume), severity(volume));
    details.add("Size", size_text(volume));
    details.add("Used", usage_percent(volume)
                            ? progress_bar(*usage_percent(volume)) + " " + usage_text(volume)
                            : "-");
    details.add("Device", volume.address.path.empty() ? "-" : volume.address.path);
    details.add("Mount point",
                volume.mount_point + (volume.mounted ? "" : " (nothing is mounted there)"));
    add_verdict(details, volume_note(volume), volume.doubt);
    return details;
}

} // namespace

std::optional<VolumeId> volume_id(const std::string &word) {
    constexpr std::string_view device_directory = "/dev/";
    if (word.starts_with(device_directory))
        return id_of_path(std::string_view(word).substr(device_directory.size()));
    return id_of_numbers(word);
}

std::string in_words(const VolumeId &id) {
    return fmt::format("{}-{}", id.group, id.number);
}

std::string volume_state_word(const VolumeReport &volume) {
    if (has_failed(volume))
        return "unknown";
    switch (believed_state(volume)) {
    case 0: // a volume that is well has no state bits
        return "normal";
    case ZAV_LVM_FULL:
        return "full";
    case ZAV_LVM_INACTIVE:
        return "inactive";
    case ZAV_LVM_FAILED:
        return "failed";
    case ZAV_LVM_NOT_EXIST:
        return "not_exist";
    default:
        return "unknown";
    }
}

Severity severity(const VolumeReport &volume) {
    const std::string word = volume_state_word(volume);
    if (!volume.doubt.empty() || word == "unknown")
        return Severity::unknown;
    if (word == "failed" || word == "not_exist")
        return Severity::critical;
    return word == "normal" ? Severity::ok : Severity::warning;
}

std::string shown_state(const VolumeReport &volume) {
    if (severity(volume) == Severity::unknown)
        return "unknown";
    const std::string word = volume_state_word(volume);
    return word == "not_exist" ? "missing" : word;
}

std::string volume_note(const VolumeReport &volume) {
    if (has_failed(volume))
        return in_words(*volume.failure);
    if (severity(volume) == Severity::unknown)
        return fmt::format("the library says {}, which cannot be trusted",
                           volume_state_word(volume));
    const std::string word = volume_state_word(volume);
    if (word == "failed")
        return "its device is there, but LVM does not answer for it";
    if (word == "not_exist")
        return "there is no device for it, and LVM does not know it as inactive";
    if (word == "inactive")
        return "LVM knows it, but it is not active";
    return is_measured(volume) ? "" : "not mounted";
}

std::optional<double> usage_percent(const VolumeReport &volume) {
    const std::string word = volume_state_word(volume);
    if (!is_measured(volume) || (word != "normal" && word != "full"))
        return std::nullopt;
    return volume.usage;
}

Json volume_json(const VolumeReport &volume) {
    const std::optional<double> percent = usage_percent(volume);
    Json json;
    json["kind"] = "logical_volume";
    json["volume"] = in_words(volume.id);
    json["group"] = volume.id.group;
    json["group_name"] = group_name(volume.id.group);
    json["number"] = volume.id.number;
    json["address"] = to_json(volume.address);
    json["state"] = volume_state_word(volume);
    json["state_bits"] = volume.state;
    json["size_gb"] = volume.size > 0 ? Json(volume.size) : Json(nullptr);
    json["usage_percent"] = percent ? Json(*percent) : Json(nullptr);
    json["mount_point"] = volume.mount_point;
    json["mounted"] = volume.mounted;
    add_verdict(json, severity(volume), volume_note(volume), volume.doubt, volume.failure);
    return json;
}

Section volume_list_section(const std::vector<VolumeReport> &volumes, int more) {
    Section section = common_section(volumes);
    section.table = Table({"VOLUME", "STATE", "SIZE", "USED", "MOUNTED AT"}, 1);
    for (const VolumeReport &volume : volumes)
        section.table.add(severity(volume),
                          {name_of(volume), shown_state(volume), size_text(volume),
                           usage_text(volume), volume.mounted ? volume.mount_point : "-"},
                          volume_note(volume));
    if (more > 0)
        section.lines.push_back(
            fmt::format("    and {} more, which the library does not name", more));
    return section;
}

Section volume_show_section(const std::vector<VolumeReport> &volumes) {
    Section section = common_section(volumes);
    add_details(section, volumes, volume_details);
    return section;
}

} // namespace zavctl
