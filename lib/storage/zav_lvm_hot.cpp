// Making, extending and dismantling volume groups while the system runs.
#include "common/diag.h"
#include "common/lock.h"
#include "common/shell.h"
#include "zav_api.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iterator>
#include <sys/wait.h>

namespace {

using zav::Command;

constexpr int kChangeLock = 12849; // 0x3231
constexpr int kToldKey = 1;        // the key that the messages of taking it name
constexpr size_t kPath = 50;

// A message with its log number.
struct Refusal {
    int number;
    const char *text;
};

int refuse(const char *function, int priority, const Refusal &refusal) {
    zavlogd(const_cast<char *>(function), priority, refusal.number, "%s", refusal.text);
    return ZAV_RC_ERR_EINVAL;
}

void trace_failure(const char *function, const Command &command, int status, int error) {
    ZAV_TRACE(zav::kTraceCommand, "%s() - rc: %d, errno: %d, errmsg: %s, strcmd: %s\n", function,
              status, error, strerror(error), command.text());
}

int run(const char *function, const Command &command) {
    const int status = command.run();
    if (status != 0)
        trace_failure(function, command, status, WEXITSTATUS(status));
    return status;
}

// ---- Adding ----

bool is_block_device(int minor_type) {
    switch (minor_type) {
    case ZAV_MINDEV_HDD_SATA:
    case ZAV_MINDEV_RAID_SW:
    case ZAV_MINDEV_RAID_HW:
    case ZAV_MINDEV_RAID_SAS:
    case ZAV_MINDEV_RAID_ISCSI:
        return true;
    default:
        return false;
    }
}

// The first message of the first argument that is not acceptable, or null.
const Refusal *check_arguments(const zavDevice *dev, const zavDevice *lvmdev) {
    static constexpr Refusal kNull = {0, "Arguments can't be null."};
    // The text names the wrong type; it is what callers know.
    static constexpr Refusal kType = {
        1, "Input device's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL."};
    static constexpr Refusal kMinorType = {
        2, "Input device's minor_type is not acceptable. Return ZAV_RC_ERR_EINVAL."};
    static constexpr Refusal kGroupType = {
        3, "lvmdev's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL."};
    static constexpr Refusal kGroupMinorType = {
        4, "lvmdev's minor_type is not ZAV_MINDEV_LVM_VG. Return ZAV_RC_ERR_EINVAL."};
    if (dev == nullptr || lvmdev == nullptr)
        return &kNull;
    if (dev->type != ZAV_DEV_HDD && dev->type != ZAV_DEV_RAID)
        return &kType;
    if (!is_block_device(dev->minor_type))
        return &kMinorType;
    if (lvmdev->type != ZAV_DEV_LVM)
        return &kGroupType;
    return lvmdev->minor_type == ZAV_MINDEV_LVM_VG ? nullptr : &kGroupMinorType;
}

// Whether it answers at all; what the answer is does not matter.
bool answers(zavDevice *dev) {
    if (dev->minor_type == ZAV_MINDEV_HDD_SATA) {
        zavHddState info = {};
        return zavGetStateDisk(dev, &info) == ZAV_RC_OK;
    }
    zavRaidState info = {};
    return zavGetStateRaid(dev, &info) == ZAV_RC_OK;
}

int log_failure(const char *function, const char *what, int number, const Command &command) {
    zavlogd(const_cast<char *>(function), zav::kWarning, number, "%s failed. [%s]", what,
            command.text());
    return ZAV_RC_ERR;
}

int put_into_group(const char *function, const char *group, const char *path) {
    const bool exists = run(function, Command("/usr/sbin/vgs %s &>/dev/null", {group})) == 0;
    const Command change(exists ? "/usr/sbin/vgextend %s %s" : "/usr/sbin/vgcreate %s %s",
                         {group, path});
    if (run(function, change) == 0)
        return ZAV_RC_OK;
    return exists ? log_failure(function, "vgextend", 10, change)
                  : log_failure(function, "vgcreate", 9, change);
}

// ---- Removing ----

// An unmount that fails because the volume is in use. The error number left behind is read like
// an exit status, so that an ordinary one, EBUSY itself, counts as none.
bool unmount_is_busy(const char *function, const Command &unmount) {
    const int status = unmount.run();
    const int error = errno;
    const int told = WEXITSTATUS(error);
    ZAV_TRACE(zav::kTraceStep, "%s() - After umount, rcEH: %d, error: %d %s\n", function, status,
              told, strerror(told));
    return status != 0 && told == EBUSY;
}

// Removes one logical volume, unmounted first. ZAV_RC_ERR_EBUSY ends the work.
int remove_volume(const char *function, zavDevice *volume) {
    char mount_point[48];
    zavDevToMnt(volume, mount_point);
    const Command mounted("df | grep \"%s\" &> /dev/null", {mount_point});
    ZAV_TRACE(zav::kTraceStep, "%s() - strcmd: %s\n", function, mounted.text());
    if (mounted.run() == 0) {
        const Command unmount("/bin/umount %s", {mount_point});
        if (unmount_is_busy(function, unmount)) {
            zavlogd(const_cast<char *>(function), zav::kAlert, 5,
                    "Failed on umount(%s). errno: 0x%x %s", unmount.text(),
                    static_cast<unsigned>(EBUSY), strerror(EBUSY));
            return ZAV_RC_ERR_EBUSY;
        }
    }
    char path[kPath] = "";
    zavDevToStr(path, sizeof path, volume);
    ZAV_TRACE(zav::kTraceStep, "%s - device path from zavDevToStr is:  %s\n", function, path);
    const Command remove("/usr/sbin/lvremove -f %s &>/dev/null", {path});
    ZAV_TRACE(zav::kTraceStep, "%s - strcmd:  %s\n", function, remove.text());
    if (run(function, remove) == 0)
        return ZAV_RC_OK;
    zavlogd(const_cast<char *>(function), zav::kAlert, 6, "command failed.[%s]", remove.text());
    return ZAV_RC_ERR;
}

void log_exit_status(const char *function, int number, const Command &command, int status) {
    zavlogd(const_cast<char *>(function), zav::kAlert, number, "command failed.[%s] [%d %s ]",
            command.text(), WEXITSTATUS(status), strerror(WEXITSTATUS(status)));
}

int remove_label(const char *function, zavDevice *device) {
    char path[kPath] = "";
    zavDevToStr(path, sizeof path, device);
    ZAV_TRACE(zav::kTraceStep, "%s - device path from zavDevToStr is:  %s\n", function, path);
    const Command remove("/usr/sbin/pvremove -f %s &>/dev/null", {path});
    ZAV_TRACE(zav::kTraceStep, "%s - strcmd:  %s\n", function, remove.text());
    const int status = run(function, remove);
    if (status == 0)
        return ZAV_RC_OK;
    log_exit_status(function, 6, remove, status);
    return ZAV_RC_ERR;
}

// The volumes, the group, the labels. Volumes and labels that cannot be removed are passed over and
// remembered in `failed`.
int dismantle(const char *function, int number, lvmVG &group, int &failed) {
    const int volumes = std::min(group.lvcount, static_cast<int>(std::size(group.lvdev)));
    for (int i = 0; i < volumes; ++i) {
        const int rc = remove_volume(function, &group.lvdev[i].lvmdev);
        if (rc == ZAV_RC_ERR_EBUSY)
            return rc;
        if (rc != ZAV_RC_OK)
            failed = rc;
    }
    char name[32];
    if (zavMapVGToStr(number, name) != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - problem with getting VGName", function);
        return refuse(function, zav::kWarning,
                      {7, "Problem with getting VGName from zavMapVGToStr(). "
                          "Return ZAV_RC_ERR_EINVAL."});
    }
    ZAV_TRACE(zav::kTraceStep, "%s() - VG name: %s.\n", function, name);
    const Command remove("/usr/sbin/vgremove %s &>/dev/null", {name});
    if (const int status = run(function, remove); status != 0) {
        log_exit_status(function, 8, remove, status);
        return ZAV_RC_ERR;
    }
    const int labels = std::min(group.pvcount, static_cast<int>(std::size(group.pvdev)));
    for (int i = 0; i < labels; ++i)
        if (const int rc = remove_label(function, &group.pvdev[i].dev); rc != ZAV_RC_OK)
            failed = rc;
    return ZAV_RC_OK;
}

} // namespace

int zavLVMHotAdd(zavDevice *dev, zavDevice *lvmdev) {
    if (const Refusal *refusal = check_arguments(dev, lvmdev); refusal != nullptr)
        return refuse(__func__, zav::kAlert, *refusal);
    if (!answers(dev))
        return refuse(__func__, zav::kAlert,
                      {5, "dev is not a available device. Return ZAV_RC_ERR_EINVAL."});
    char path[kPath];
    if (zavDevToStr(path, sizeof path, dev) != ZAV_RC_OK)
        return refuse(__func__, zav::kWarning,
                      {6, "Problem with getting pv device path from zavDevToStr(). "
                          "Return ZAV_RC_ERR_EINVAL."});
    ZAV_TRACE(zav::kTraceStep, "%s() - pv's physical device path: %s\n", __func__, path);

    const Command label("/usr/sbin/pvcreate %s &> /dev/null", {path});
    if (run(__func__, label) != 0)
        return log_failure(__func__, "pvcreate", 7, label);

    char group[32];
    if (zavMapVGToStr(lvmdev->disk, group) != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - problem with getting VGName", __func__);
        return refuse(__func__, zav::kWarning,
                      {8, "Problem with getting VGName from zavMapVGToStr(). "
                          "Return ZAV_RC_ERR_EINVAL."});
    }
    ZAV_TRACE(zav::kTraceStep, "%s() - VG name: %s.\n", __func__, group);
    return put_into_group(__func__, group, path);
}

int zavLVMHotRemove(zavDevice *lvmdev) {
    if (lvmdev == nullptr)
        return refuse(__func__, zav::kAlert, {1, "Arguments can't be null."});
    if (lvmdev->type != ZAV_DEV_LVM)
        return refuse(__func__, zav::kAlert,
                      {2, "lvmdev's type is not ZAV_DEV_LVM. Return ZAV_RC_ERR_EINVAL."});
    if (lvmdev->minor_type != ZAV_MINDEV_LVM_VG)
        return refuse(__func__, zav::kAlert,
                      {3, "Input device's minor_type is not ZAV_MINDEV_LVM_VG. "
                          "Return ZAV_RC_ERR_EINVAL."});
    zav::Lock lock(kChangeLock);
    if (lock.get() != ZAV_RC_OK) {
        ZAV_LOG(zav::kAlert, 3, "Get Semaphore failed!!");
        return ZAV_RC_ERR;
    }
    if (lock.take(kToldKey) != ZAV_RC_OK) {
        ZAV_LOG(zav::kAlert, 3, "semaphore_p [%d] failed!!", kChangeLock);
        return ZAV_RC_ERR;
    }
    zavLVMState info = {};
    if (const int rc = zavgetStateLVMVG(lvmdev, &info); rc != ZAV_RC_OK) {
        ZAV_LOG(zav::kAlert, 4, "zavgetStateLVMVG() failed. rc: 0x%x", static_cast<unsigned>(rc));
        return rc;
    }
    if (info.state == ZAV_LVM_NOT_EXIST)
        return ZAV_RC_ERR_ENODEV;
    int failed = ZAV_RC_OK;
    if (const int rc = dismantle(__func__, lvmdev->disk, info.dev.lvmvgdev, failed);
        rc != ZAV_RC_OK)
        return rc;
    if (lock.release(kChangeLock) != ZAV_RC_OK) {
        ZAV_LOG(zav::kAlert, 3, "semaphore_v [%d] failed!!", kChangeLock);
        return ZAV_RC_ERR;
    }
    return failed;
}
