#include "zav_disk_pipeline.h"

#include <cstdio>

namespace zav {

namespace {

// What keeps the slot's line of the list of hosts.
struct SlotFilters {
    const char *detach;
    const char *attach;
};

constexpr SlotFilters kFilters[] = {
    {"sed -e '2,6d'", "sed -e '2,6d'"},
    {"sed -e '1d' -e '3,6d'", "sed -e '1d' -e '3,6d'"},
    {"sed -e '1,2d' -e '4,6d'", "sed -e '1,2d' -e'4,6d'"},
    {"sed -e '1,3d' -e '5,6d'", "sed -e '1,3d' -e'5,6d'"},
};
constexpr int kSlots = sizeof kFilters / sizeof kFilters[0];

} // namespace

bool host_pipeline(char (&command)[kLongestPipeline], HostAction action, int slot) {
    if (slot < 1 || slot > kSlots)
        return false;
    const SlotFilters &filters = kFilters[slot - 1];
    const bool detach = action == HostAction::kDetach;
    snprintf(command, sizeof command,
             "echo \"scsi %s `ls -d /sys/devices/pci0000:00/0000:00:1f.2/host? | "
             "sed -n 's/host/ /pg' | awk '{print $2}' | %s` 0 0 0\" > /proc/scsi/scsi%s",
             detach ? "remove-single-device" : "add-single-device",
             detach ? filters.detach : filters.attach, detach ? " 2>/dev/null" : "");
    return true;
}

} // namespace zav
