// What the library says about one logical volume, judged and shown.
#pragma once

#include "answer.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// A volume as people name it: "1-2", group and number.
struct VolumeId {
    int group = 0;
    int number = 0;
};

struct VolumeReport {
    VolumeId id;
    Address address;
    int state = 0;           // ZAV_LVM_* bits; none at all for a volume that is well
    std::uint64_t size = 0;  // as the library gives it, see shown_size(); 0 if not told
    double usage = 0;        // percent of the file system at the mount point
    std::string mount_point; // where it belongs
    bool mounted = false;    // something is mounted there
    std::string doubt;       // why the answer cannot be trusted, "" if it can
    std::optional<zavSystemEvent> record{}; // as the library answered it
    std::optional<Failure> failure;
};

// The library's answer when the mount point cannot be measured; all else is told then.
constexpr int volume_not_measured = 0x2801;

// "1-2" or "/dev/DataVG1/LogVol2"; none for other words.
std::optional<VolumeId> volume_id(const std::string &word);

// "1-2".
std::string in_words(const VolumeId &id);

// "normal", "full", "inactive", "failed", "not_exist", "unknown".
std::string volume_state_word(const VolumeReport &volume);

Severity severity(const VolumeReport &volume);
std::string shown_state(const VolumeReport &volume);
std::string volume_note(const VolumeReport &volume);

// Percent in use; none unless the volume's own file system was measured.
std::optional<double> usage_percent(const VolumeReport &volume);

Json volume_json(const VolumeReport &volume);

// `more` volumes exist that the library does not name.
Section volume_list_section(const std::vector<VolumeReport> &volumes, int more);
Section volume_show_section(const std::vector<VolumeReport> &volumes);

} // namespace zavctl
