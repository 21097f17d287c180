#include "model/arrays.hpp"
#include "model/devices.hpp"
#include "model/disks.hpp"
#include "model/load.hpp"
#include "model/texts_optical.hpp"
#include "model/texts_volumes.hpp"
#include "model/volumes.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

struct Mounted {
    const Group *group;
    const Volume *volume;
};

// As they were mounted when the appliance started: the system's first.
std::vector<Mounted> mounted_volumes(const State &state) {
    std::vector<Mounted> list;
    for (const Group &group : state.groups) {
        std::vector<Mounted> mounted;
        for (const Volume &volume : group.volumes)
            if (!volume.mount_point.empty() && volume.file_system)
                mounted.push_back({&group, &volume});
        list.insert(list.begin(), mounted.begin(), mounted.end());
    }
    return list;
}

// The file system keeps to the stripes of the array below it, in its blocks of 1 KiB.
std::string stripe_option(const State &state, const Volume &volume) {
    const PhysicalVolume *pv =
        volume.segments.empty() ? nullptr : pv_of_id(state, volume.segments.front().pv);
    for (const Array &array : state.arrays)
        if (pv != nullptr && array.uuid == pv->ground.array && array.chunk_kib > 0)
            return fmt::format(",stripe={}", array_kib(array) / array.component_kib *
                                                 static_cast<std::uint64_t>(array.chunk_kib));
    return {};
}

using Row = std::array<std::string, 6>;

Row df_row(const Mounted &mounted) {
    const FileSystem &system = *mounted.volume->file_system;
    const std::uint64_t available = available_kib(system);
    const std::uint64_t all = system.used_kib + available;
    // Part of a percent counts as one.
    const std::uint64_t percent = all == 0 ? 100 : (system.used_kib * 100 + all - 1) / all;
    return {mapper_path(*mounted.group, *mounted.volume),
            std::to_string(system.kib),
            std::to_string(system.used_kib),
            std::to_string(available),
            fmt::format("{}%", percent),
            mounted.volume->mount_point};
}

std::string disk_links(const Disk &disk, int partition) {
    const std::string part = partition == 0 ? "" : fmt::format("-part{}", partition);
    std::string links = fmt::format("sata/disk{}{}", disk.slot,
                                    partition == 0 ? "" : fmt::format("p{}", partition));
    links += fmt::format(" disk/by-path/pci-0000:00:1f.2-ata-{}{}", disk.slot, part);
    if (partition != 0)
        links += fmt::format(" disk/by-partuuid/{:08x}-{:02}", disk.label_id, partition);
    return links +
           fmt::format(" disk/by-id/ata-QEMU_HARDDISK_SLOT{}{:04}{}", disk.slot, disk.serial, part);
}

std::string links_of_disk(const State &state, const DevicePlace &place) {
    const Disk *disk = attached_disk(state, place.letter);
    if (disk == nullptr)
        return {};
    const bool there = place.partition == 0 || (find_partition(*disk, place.partition) != nullptr &&
                                                disk->settles <= state.now);
    return there ? disk_links(*disk, place.partition) : "";
}

int number_behind(const std::string &name, const std::string &beginning) {
    const std::string digits =
        name.rfind(beginning, 0) == 0 ? name.substr(beginning.size()) : std::string();
    const bool number = !digits.empty() && digits.size() < 5 &&
                        digits.find_first_not_of("0123456789") == std::string::npos;
    return number ? std::stoi(digits) : -1;
}

std::string links_of_array(const State &state, int minor) {
    const Array *array = find_array(state, minor);
    if (array == nullptr)
        return {};
    const std::string link = array_link(minor);
    return link.empty() ? "md/" + array->name : link;
}

std::string links_of_volume(const State &state, int minor) {
    for (const Group &group : state.groups)
        for (const Volume &volume : group.volumes)
            if (volume.active && volume.minor == minor)
                return fmt::format("{}/{} {}", group.name, volume.name,
                                   mapper_path(group, volume).substr(5));
    return {};
}

} // namespace

std::string udev_links(const State &state, const std::string &kernel_name) {
    if (const auto place = parse_kernel_name(kernel_name))
        return links_of_disk(state, *place);
    if (const int minor = number_behind(kernel_name, "md"); minor >= 0)
        return links_of_array(state, minor);
    if (const int minor = number_behind(kernel_name, "dm-"); minor >= 0)
        return links_of_volume(state, minor);
    return {};
}

std::string table_dump(const Disk &disk, const std::string &shown_name) {
    std::string text = fmt::format("label: dos\nlabel-id: 0x{:08x}\ndevice: {}\nunit: sectors\n"
                                   "sector-size: 512\n\n",
                                   disk.label_id, shown_name);
    const bool ends_in_digit = shown_name.back() >= '0' && shown_name.back() <= '9';
    for (const Partition &partition : disk.partitions)
        text += fmt::format("{}{}{} : start={:12}, size={:12}, type=fd\n", shown_name,
                            ends_in_digit ? "p" : "", partition.number, partition.start,
                            partition.kib * 2);
    return text;
}

std::string mtab_text(const State &state) {
    std::string text = "proc /proc proc rw,relatime 0 0\n"
                       "sysfs /sys sysfs rw,relatime 0 0\n";
    text.insert(0, own_mounts_text());
    for (const Mounted &mounted : mounted_volumes(state))
        text += fmt::format("{} {} ext4 rw,relatime{} 0 0\n",
                            mapper_path(*mounted.group, *mounted.volume),
                            mounted.volume->mount_point, stripe_option(state, *mounted.volume));
    return text + disc_mount_text(state);
}

std::string df_text(const State &state) {
    std::vector<Row> rows = {
        {"Filesystem", "1K-blocks", "Used", "Available", "Use%", "Mounted on"}};
    for (const Mounted &mounted : mounted_volumes(state))
        rows.push_back(df_row(mounted));
    std::array<std::size_t, 5> widths = {14, 5, 5, 5, 4};
    for (const Row &row : rows)
        for (std::size_t i = 0; i < widths.size(); ++i)
            widths.at(i) = std::max(widths.at(i), row.at(i).size());
    std::string text;
    for (const Row &row : rows)
        text +=
            fmt::format("{:{}} {:>{}} {:>{}} {:>{}} {:>{}} {}\n", row[0], widths[0], row[1],
                        widths[1], row[2], widths[2], row[3], widths[3], row[4], widths[4], row[5]);
    return text;
}

std::string file_systems_text(const State &state) {
    std::string text;
    for (const Mounted &mounted : mounted_volumes(state)) {
        const FileSystem &system = *mounted.volume->file_system;
        text += fmt::format("{} 1024 {} {} {}\n", mounted.volume->mount_point, system.kib,
                            system.kib - system.used_kib, available_kib(system));
    }
    return text + own_usage_text(state);
}

} // namespace zavsim
