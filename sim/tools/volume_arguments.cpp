#include "tools/volume_arguments.hpp"

#include "model/arrays.hpp"
#include "tools/device_argument.hpp"

#include <algorithm>
#include <charconv>
#include <filesystem>
#include <fmt/format.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

void complain_of_read(const std::string &device) {
    fmt::print(stderr, "  {}: read failed after 0 of 4096 at 0: Input/output error\n", device);
}

bool can_be_read(const State &state, const Volume &volume) {
    return std::all_of(volume.segments.begin(), volume.segments.end(),
                       [&state](const Segment &segment) {
                           const PhysicalVolume *pv = pv_of_id(state, segment.pv);
                           return pv != nullptr && place_of(state, *pv).size_kib > 0;
                       });
}

// The appliance's own tools do without a group that is not whole; the current ones only warn.
bool is_readable(const State &state, const Group &group) {
    return is_visible(state, group) && (state.current_tools || !is_partial(state, group));
}

void complain_of_missing(const State &state, const Group &group) {
    if (!is_visible(state, group) || !is_partial(state, group))
        return;
    for (const PhysicalVolume *pv : pvs_of(state, group.name))
        if (place_of(state, *pv).size_kib == 0)
            fmt::print(stderr, "  {}Couldn't find device with uuid {}.\n",
                       state.current_tools ? "WARNING: " : "", pv->id);
    if (!state.current_tools)
        fmt::print(stderr, "  Couldn't find all physical volumes for volume group {}.\n",
                   group.name);
}

} // namespace

std::optional<Place> place_behind(const State &state, const std::string &path) {
    if (const auto minor = array_behind(path)) {
        const Array *array = find_array(state, *minor);
        return array == nullptr ? std::nullopt : std::optional(place_of_array(*array));
    }
    const auto device = device_behind(path);
    const Disk *disk = device ? attached_disk(state, device->letter) : nullptr;
    if (disk == nullptr)
        return std::nullopt;
    const Place place = place_on_disk(*disk, device->partition);
    return place.size_kib == 0 ? std::nullopt : std::optional(place);
}

VolumePlace volume_behind(State &state, const std::string &path) {
    std::error_code error;
    const std::string node = fs::canonical(path, error);
    const std::string beginning = "/dev/dm-";
    int minor = 0;
    if (error || node.rfind(beginning, 0) != 0)
        return {};
    const char *end = node.data() + node.size();
    if (std::from_chars(node.data() + beginning.size(), end, minor).ptr != end)
        return {};
    return volume_of_minor(state, minor);
}

VolumeName volume_name_of(State &state, const std::string &word) {
    if (word.rfind("/dev/", 0) == 0)
        if (const VolumePlace found = volume_behind(state, word); found.volume != nullptr)
            return {found.group->name, found.volume->name};
    const std::string name = word.rfind("/dev/", 0) == 0 ? word.substr(5) : word;
    const std::size_t slash = std::min(name.find('/'), name.size());
    return {name.substr(0, slash), slash == name.size() ? "" : name.substr(slash + 1)};
}

const Group *readable_group(const State &state, const std::string &name) {
    const Group *group = find_group(state, name);
    if (group != nullptr && is_readable(state, *group))
        return group;
    lvm_problem(fmt::format("  Volume group \"{}\" not found\n  Cannot process volume group {}\n",
                            name, name));
    return nullptr;
}

std::vector<const Group *> readable_groups(const State &state) {
    std::vector<const Group *> groups = visible_groups(state);
    groups.erase(
        std::remove_if(groups.begin(), groups.end(),
                       [&state](const Group *group) { return !is_readable(state, *group); }),
        groups.end());
    return groups;
}

void complain_of_devices(const State &state) {
    for (const Array &array : state.arrays)
        if (!array.inactive && !beginning_is_readable(state, array))
            complain_of_read(fmt::format("/dev/md{}", array.minor));
    for (const Group &group : state.groups) {
        for (const Volume &volume : group.volumes)
            if (volume.active && !can_be_read(state, volume))
                complain_of_read(fmt::format("/dev/{}/{}", group.name, volume.name));
        complain_of_missing(state, group);
    }
}

int lvm_problem(const std::string &text) {
    fmt::print(stderr, "{}", text);
    return lvm_failed;
}

bool is_valid_name(const std::string &name) {
    return !name.empty() && name.size() < 128 && name != "." && name != ".." &&
           name.front() != '-' && std::all_of(name.begin(), name.end(), [](char c) {
               return isalnum(static_cast<unsigned char>(c)) != 0 || c == '.' || c == '_' ||
                      c == '+' || c == '-';
           });
}

} // namespace zavsim
