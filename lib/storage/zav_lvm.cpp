// Logical and physical volumes: state, size, mount point and usage.
#include "common/diag.h"
#include "common/node.h"
#include "common/shell.h"
#include "common/text.h"
#include "common/usage.h"
#include "zav_api.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <sys/vfs.h>

namespace {

using zav::Command;

constexpr int kUnmeasured = ZAV_RC_ERR_LVM + 1;
constexpr float kFullPercent = 90.0F;
constexpr int kSectorsPerGb = 2097152;
constexpr int kLine = 120;

bool number_in_range(const zavDevice &volume) {
    const int last = volume.part == 0 ? 6 : 4;
    return volume.disk >= 1 && volume.disk <= last;
}

zavDevice group_of(const zavDevice &volume) {
    return {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, volume.part, 0};
}

zavLVMState undecided_lv(const zavDevice &dev) {
    zavLVMState state = {};
    state.type = ZAV_EVENT_LVM;
    state.dev.lvmlvdev = {
        .lvmtype = dev.minor_type, .lvmdev = dev, .size = 0, .usage = 0.0F, .vgdev = group_of(dev)};
    state.state = ZAV_LVM_NORMAL;
    return state;
}

zavLVMState undecided_pv(const zavDevice &dev) {
    zavLVMState state = {};
    state.type = ZAV_EVENT_LVM;
    state.dev.lvmpvdev = {.lvmtype = dev.minor_type,
                          .lvmdev = dev,
                          .size = 0,
                          .vgdev = group_of(dev),
                          .dev = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}};
    state.state = ZAV_LVM_NORMAL;
    return state;
}

// The seventh field of lvdisplay's line, in sectors; 0 GB if there is none.
zavSize size_in_gb(char *line) {
    zav::Fields fields(line);
    char *field = nullptr;
    for (int i = 0; i < 7; ++i)
        field = fields.next(":");
    if (field == nullptr)
        return 0;
    trim(field);
    const int gb = zav::to_int(field) / kSectorsPerGb + 1;
    ZAV_TRACE(zav::kTraceStep, "info -> dev.lvmlvdev.size:%d GB\n", gb);
    return static_cast<zavSize>(static_cast<int64_t>(gb));
}

int read_lv_size(const char *path, zavSize &size) {
    const Command command("lvdisplay -c %s 2>/dev/null", {path});
    zav::CommandOutput output(command);
    if (!output) {
        zavlogd(const_cast<char *>("zavgetStateLVMLV"), zav::kWarning, 1, "Failed on popen[%s]\n",
                command.text());
        return ZAV_RC_ERR_ESTRPIPE;
    }
    char line[kLine];
    if (output.line(line, sizeof line))
        size = size_in_gb(line);
    else
        ZAV_TRACE(zav::kTraceCommand, "fgets() returns NULL\n");
    return ZAV_RC_OK;
}

// A volume whose node is missing: LVM may know it all the same.
int missing_lv_state(const char *path) {
    const Command command("/usr/sbin/lvdisplay %s 2>/dev/null | grep \"NOT available\" &>/dev/null",
                          {path});
    return command.run() == 0 ? ZAV_LVM_INACTIVE : ZAV_LVM_NOT_EXIST;
}

// The group's entry of that number, or null. Counts may exceed the table.
const lvmPV *find_pv(const lvmVG &group, int number) {
    const int room = static_cast<int>(std::size(group.pvdev));
    for (int i = 0; i < std::min(group.pvcount, room); ++i)
        if (group.pvdev[i].lvmdev.disk == number)
            return &group.pvdev[i];
    return nullptr;
}

int state_on_disk(zavDevice *disk, int &state) {
    zavHddState info = {};
    if (const int rc = zavGetStateDisk(disk, &info); rc != ZAV_RC_OK)
        return rc;
    const bool failed = (info.state & (ZAV_HDD_ABSENT | ZAV_HDD_FAILED)) != 0;
    state = failed ? ZAV_LVM_FAILED : ZAV_LVM_NORMAL;
    return ZAV_RC_OK;
}

// A degraded or rebuilding array serves its physical volume well.
int state_on_array(zavDevice *array, int &state) {
    zavRaidState info = {};
    if (const int rc = zavGetStateRaid(array, &info); rc != ZAV_RC_OK)
        return rc;
    if ((info.state & ZAV_RAID_FAILED) != 0)
        state = ZAV_LVM_FAILED;
    else
        state = (info.state & ZAV_RAID_NOT_EXIST) != 0 ? ZAV_LVM_NOT_EXIST : ZAV_LVM_NORMAL;
    return ZAV_RC_OK;
}

int state_of_device(zavDevice *dev, int &state) {
    switch (dev->minor_type) {
    case ZAV_MINDEV_HDD_SATA:
        return state_on_disk(dev, state);
    case ZAV_MINDEV_RAID_SW:
    case ZAV_MINDEV_RAID_HW:
    case ZAV_MINDEV_RAID_SAS:
        return state_on_array(dev, state);
    default:
        return ZAV_RC_OK;
    }
}

} // namespace

int zavGetStateLVM(zavDevice *dev, zavLVMState *info) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (dev == nullptr || info == nullptr) {
        ZAV_LOG(zav::kAlert, 1, "Input arguments can't be null. Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->type != ZAV_DEV_LVM) {
        ZAV_LOG(zav::kAlert, 2, "Devie's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (zavCheckExeFile() != ZAV_RC_OK)
        return ZAV_RC_ERR_ENOENT;
    switch (dev->minor_type) {
    case ZAV_MINDEV_LVM_VG:
        return zavgetStateLVMVG(dev, info);
    case ZAV_MINDEV_LVM_PV:
        return zavgetStateLVMPV(dev, info);
    case ZAV_MINDEV_LVM_LV:
        return zavgetStateLVMLV(dev, info);
    default:
        break;
    }
    ZAV_LOG(zav::kAlert, 3,
            "Device's minor type is not "
            "ZAV_MINDEV_LVM_VG/ZAV_MINDEV_LVM_PV/ZAV_MINDEV_LVM_LV. Return ZAV_RC_ERR_EINVAL.");
    return ZAV_RC_ERR_EINVAL;
}

int zavgetStateLVMLV(zavDevice *dev, zavLVMState *info) {
    ZAV_TRACE(zav::kTraceStep, "Enter zavGetStateLVMLV()\n");
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *info = undecided_lv(*dev);
    lvmLV &volume = info->dev.lvmlvdev;
    if (!number_in_range(*dev))
        return ZAV_RC_ERR_EINVAL;

    char path[50] = "";
    if (const int rc = zavDevToStr(path, sizeof path, dev); rc != ZAV_RC_OK) {
        ZAV_LOG(zav::kWarning, 0, "zavDevToStr() returns 0x%x. dev[0x%x, 0x%x, 0x%x, 0x%x, %s] ",
                static_cast<unsigned>(rc), static_cast<unsigned>(dev->type),
                static_cast<unsigned>(dev->minor_type), static_cast<unsigned>(dev->disk),
                static_cast<unsigned>(dev->part), path);
        return rc;
    }
    const zav::NodeProbe probe = zav::probe_node(__func__, path);
    if (probe.result != zav::NodeProbe::Result::kPresent) {
        const bool missing = probe.result == zav::NodeProbe::Result::kMissing;
        info->state = missing ? missing_lv_state(path) : ZAV_LVM_NOT_EXIST;
        return missing ? ZAV_RC_OK : ZAV_RC_ERR;
    }
    info->state = 0; // no bit at all for a volume that is present and healthy

    const Command health("/usr/sbin/lvs %s &> /dev/null", {path});
    ZAV_TRACE(zav::kTraceStep, "strcmd: %s\n", health.text());
    if (health.run() != 0) {
        info->state = ZAV_LVM_FAILED;
        return ZAV_RC_OK;
    }
    if (const int rc = read_lv_size(path, volume.size); rc != ZAV_RC_OK)
        return rc;
    if (const int rc = zavgetFSusage(dev, &volume.usage); rc != ZAV_RC_OK)
        return rc;
    if (volume.usage > kFullPercent)
        info->state |= ZAV_LVM_FULL;
    return ZAV_RC_OK;
}

int zavgetStateLVMPV(zavDevice *dev, zavLVMState *info) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const zavDevice address = *dev; // the caller's may lie in the record
    *info = undecided_pv(address);
    lvmPV &volume = info->dev.lvmpvdev;

    zavDevice group_address = group_of(address);
    zavLVMState group = {};
    if (const int rc = zavgetStateLVMVG(&group_address, &group); rc != ZAV_RC_OK) {
        ZAV_LOG(zav::kWarning, 0, "zavgetStateLVMVG() failed.");
        return rc;
    }
    if (const lvmPV *entry = find_pv(group.dev.lvmvgdev, address.disk); entry != nullptr) {
        volume = *entry;
    } else if (group.dev.lvmvgdev.pvcount > 0) {
        info->state = ZAV_LVM_NOT_EXIST;
        return ZAV_RC_OK;
    }
    // A group without physical volumes gives no verdict: disk 0 is asked, which is refused.
    if (const int rc = state_of_device(&volume.dev, info->state); rc != ZAV_RC_OK)
        return rc;
    if (info->state != ZAV_LVM_NORMAL)
        return ZAV_RC_OK;

    char path[80];
    if (const int rc = zavDevToStr(path, sizeof path, &volume.dev); rc != ZAV_RC_OK) {
        ZAV_LOG(zav::kWarning, 1, "zavDevToStr() failed.");
        return rc;
    }
    if (Command("/usr/sbin/pvs %s &> /dev/null", {path}).run() != 0)
        info->state = ZAV_LVM_FAILED;
    return ZAV_RC_OK;
}

int zavDevToMnt(zavDevice *dev, char *mntpath) {
    if (dev == nullptr || mntpath == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (dev->part == 0)
        sprintf(mntpath, "/mnt/prios/disk1p%d", dev->disk);
    else
        sprintf(mntpath, "/mnt/internal/data%d-%d", dev->part, dev->disk);
    ZAV_TRACE(zav::kTraceStep, "%s() -- mount point: %s\n", __func__, mntpath);
    return ZAV_RC_OK;
}

int zavgetFSusage(zavDevice *dev, float *usage) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (dev == nullptr || usage == nullptr)
        return ZAV_RC_ERR_EINVAL;
    char path[48];
    if (const int rc = zavDevToMnt(dev, path); rc != ZAV_RC_OK)
        return rc;
    Command("ls -la %s &> /dev/null", {path}).run(); // wakes what is mounted on demand
    struct statfs system = {};
    if (const int rc = statfs(path, &system); rc != 0) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - rc: %d, errno: %d, errmsg: %s, mntpath: %s\n",
                  __func__, rc, errno, strerror(errno), path);
        return kUnmeasured;
    }
    *usage = zav::used_percent(static_cast<long double>(system.f_bavail),
                               static_cast<long double>(system.f_blocks));
    ZAV_TRACE(zav::kTraceStep, "%s() - usage: %2.2f\n", __func__, static_cast<double>(*usage));
    return ZAV_RC_OK;
}
