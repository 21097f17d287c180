// What the volume tools and the tools around mounted file systems print.
#pragma once

#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

struct ListedVolume {
    const Group *group;
    const Volume *volume;
};

// The lists; empty without an entry.
std::string vgs_text(const State &state, const std::vector<const Group *> &groups);
std::string lvs_text(const State &state, const std::vector<ListedVolume> &volumes);
std::string pvs_text(const State &state, const std::vector<const PhysicalVolume *> &volumes);

// One entry of the display tools, as a sheet and as a line of fields.
std::string vgdisplay_text(const State &state, const Group &group);
std::string vgdisplay_line(const State &state, const Group &group);
std::string lvdisplay_text(const State &state, const Group &group, const Volume &volume);
std::string lvdisplay_line(const Group &group, const Volume &volume);
std::string pvdisplay_text(const State &state, const PhysicalVolume &volume);
std::string pvdisplay_line(const State &state, const PhysicalVolume &volume);

// The metadata of a group, as vgcfgbackup writes them to a file.
std::string backup_text(const State &state, const Group &group, const std::string &file);

// Seconds since 1970 and "2011-03-14 08:00:00 +0000".
long long epoch_seconds(double appliance_time);
std::string iso_date_text(double appliance_time);

// "952.00m", as the lists have it, and "952.00 MiB"; a size that had to be rounded up has a "<".
std::string short_size(std::uint64_t kib);
std::string long_size(std::uint64_t kib);

// Kernel names and links of a device, blank between them, as udev knows them; empty for none.
std::string udev_links(const State &state, const std::string &kernel_name);

// sfdisk -d of a disk under the name it was asked for by.
std::string table_dump(const Disk &disk, const std::string &shown_name);

// /etc/mtab, df, and the preloaded shim's list: mount point, block size, all, free, available.
std::string mtab_text(const State &state);
std::string df_text(const State &state);
std::string file_systems_text(const State &state);

} // namespace zavsim
