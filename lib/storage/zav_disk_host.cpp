// Attaching and detaching the disks of the motherboard's SATA controller.
#include "common/diag.h"
#include "common/model.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_disk_pipeline.h"

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <dirent.h>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

namespace {

constexpr const char *kController = "/sys/devices/pci0000:00/0000:00:1f.2";
constexpr int kMaxHosts = 6; // the controller's ports
constexpr int kAttach = 1;
constexpr int kDetach = 2;
constexpr unsigned kDetachSeconds = 10;
constexpr unsigned kNodeSeconds = 20; // until the kernel has made the disk's node
constexpr double kAttachLimit = 30.0;
constexpr off_t kMarkOffset = 440; // the disk signature of the boot record
constexpr uint32_t kMark = 0x104D;

bool is_sata_disk(const zavDevice *dev) {
    return dev != nullptr && dev->type == ZAV_DEV_HDD && dev->minor_type == ZAV_MINDEV_HDD_SATA;
}

int refuse(const char *function, const char *message) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EINVAL, "%s", message);
    return ZAV_RC_ERR_EINVAL;
}

// The number in "host3"; false for another name.
bool host_number(const char *name, int &number) {
    constexpr const char *kHost = "host";
    const char *digits = name + strlen(kHost);
    if (!zav::starts_with(name, kHost) || *digits < '0' || *digits > '9')
        return false;
    number = zav::to_int(digits);
    return true;
}

// The controller's first six hosts, in ascending order; -1 if the directory cannot be read.
int find_hosts(const char *function, int (&hosts)[kMaxHosts]) {
    dirent **entries = nullptr;
    const int total = scandir(kController, &entries, nullptr, nullptr);
    if (total < 0)
        return -1;
    ZAV_TRACE(zav::kTraceStep, "%s() - total dir num: %d\n", function, total);
    int count = 0;
    for (int i = 0; i < total; ++i) {
        if (count < kMaxHosts && host_number(entries[i]->d_name, hosts[count]))
            ++count;
        free(entries[i]);
    }
    free(static_cast<void *>(entries));
    for (int i = 0; i < count; ++i) {
        for (int j = 0; j < count; ++j)
            if (hosts[i] < hosts[j])
                std::swap(hosts[i], hosts[j]);
    }
    for (int i = 0; i < count; ++i)
        ZAV_TRACE(zav::kTraceStep, "%s() - host[%d]: %d\n", function, i, hosts[i]);
    return count;
}

// ---- zavSATARescan's steps. All their log lines are alerts with number 0. ----

constexpr const char *kRescan = "zavSATARescan";

#define LOG_RESCAN(...) zavlogd(const_cast<char *>(kRescan), zav::kAlert, 0, __VA_ARGS__)

int reject(zavDevice *dev, int rc) {
    zavSATARemove(dev);
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", kRescan);
    return rc;
}

// Runs the slot's pipeline and waits for the node. The time that the pipeline took is the answer's.
int attach(zavDevice *dev, double &seconds) {
    const time_t start = time(nullptr);
    if (start == static_cast<time_t>(-1))
        return -errno;
    char command[zav::kLongestPipeline];
    if (!zav::host_pipeline(command, zav::HostAction::kAttach, dev->disk))
        return ZAV_RC_ERR_EINVAL;
    zav::Command(command, {}).run();
    const time_t end = time(nullptr);
    if (end == static_cast<time_t>(-1))
        return -errno;
    seconds = difftime(end, start);
    sleep(kNodeSeconds);
    return ZAV_RC_OK;
}

enum class Read { kDone, kNoNode, kNoSeek, kFailed };

Read read_signature(const char *label, uint32_t &signature, int &error) {
    errno = 0;
    const zav::Descriptor node(open(label, O_RDONLY | O_CLOEXEC));
    if (!node) {
        error = errno;
        return Read::kNoNode;
    }
    if (lseek(node.get(), kMarkOffset, SEEK_SET) < 0) {
        error = errno;
        return Read::kNoSeek;
    }
    unsigned char bytes[4];
    if (read(node.get(), bytes, sizeof bytes) != static_cast<ssize_t>(sizeof bytes)) {
        error = errno;
        return Read::kFailed;
    }
    signature = static_cast<uint32_t>(bytes[0]) | static_cast<uint32_t>(bytes[1]) << 8 |
                static_cast<uint32_t>(bytes[2]) << 16 | static_cast<uint32_t>(bytes[3]) << 24;
    return Read::kDone;
}

// A disk that carries the appliance's mark, or cannot be read, is detached again.
int judge(zavDevice *dev, const char *label) {
    uint32_t signature = 0;
    int error = 0;
    switch (read_signature(label, signature, error)) {
    case Read::kNoNode:
        LOG_RESCAN("[open %s %d %s]\n", label, error, strerror(error));
        return reject(dev, error);
    case Read::kNoSeek:
        LOG_RESCAN("[lseek %s %d]\n", label, error);
        return reject(dev, error);
    case Read::kFailed:
        LOG_RESCAN("[read %d]\n", error);
        LOG_RESCAN("[Read Failed %s]\n", label);
        return reject(dev, 0);
    case Read::kDone:
        break;
    }
    if ((signature & 0xFFFF) != kMark)
        return 0;
    LOG_RESCAN("[Initialized by HBQ-2XXX %s 0x%X]\n", label, signature);
    return reject(dev, 0);
}

} // namespace

int zavHotCmd(int cmd, zavDevice *dev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (!is_sata_disk(dev))
        return refuse(__func__, "Invaild Device: just support ZAV_DEV_HDD/ZAV_MINDEV_HDD_SATA.");
    if (cmd != kAttach && cmd != kDetach)
        return refuse(__func__, "Unknown Command");
    if (dev->disk < 1 || dev->disk > 4)
        return refuse(__func__, "dev->disk must between 1 and 4");
    int hosts[kMaxHosts] = {};
    const int count = find_hosts(__func__, hosts);
    if (count < 0) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_ENOENT, "No entry - %s. Return ZAV_RC_ERR_ENOENT.",
                kController);
        return ZAV_RC_ERR_ENOENT;
    }
    if (dev->disk > count) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_ENODEV, "dev->disk %d has no host", dev->disk);
        return ZAV_RC_ERR_ENODEV;
    }
    zavScsiCmd(cmd, hosts[dev->disk - 1], 0, 0, 0);
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return ZAV_RC_OK;
}

void zavScsiCmd(int cmd, int host, int channel, int id, int lun) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    zav::File scsi("/proc/scsi/scsi", "we");
    if (!scsi) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_HDD, "open /proc/scsi/scsi failed");
        return;
    }
    if (cmd != kAttach && cmd != kDetach) {
        refuse(__func__, "Unknown Command");
        return;
    }
    char line[128];
    snprintf(line, sizeof line, "scsi %s %d %d %d %d",
             cmd == kAttach ? "add-single-device" : "remove-single-device", host, channel, id, lun);
    ZAV_TRACE(zav::kTraceStep, "%s() - buf: %s\n", __func__, line);
    if (fputs(line, scsi.get()) == EOF || fflush(scsi.get()) != 0)
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_HDD, "write /proc/scsi/scsi failed");
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
}

void zavSATARemove(zavDevice *dev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    if (dev == nullptr)
        return;
    ZAV_LOG(zav::kAlert, 0, "[zavSATARemove Disk %d]\n", dev->disk); // an event, no failure
    char command[zav::kLongestPipeline];
    if (!zav::host_pipeline(command, zav::HostAction::kDetach, dev->disk))
        return;
    zav::Command(command, {}).run();
    sleep(kDetachSeconds);
    ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
}

// Mixes three kinds of result: the library's codes, positive errnos of the node, negated ones of
// the clock. A disk that is refused counts as success.
int zavSATARescan(zavDevice *dev) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    if (!is_sata_disk(dev))
        return ZAV_RC_ERR_EINVAL;
    zav::ModelConfig config;
    if (const int rc = config.read(); rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - model[0x%x], diskmax[%d]\n", __func__,
                  static_cast<unsigned>(config.model), config.diskmax);
        return rc;
    }
    if (!config.is_known()) {
        LOG_RESCAN("just be supported on model 2740H|2860. Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->disk < 1 || dev->disk > config.diskmax)
        return ZAV_RC_ERR_EINVAL;
    char label[128];
    if (const int rc = zavDevToStr(label, sizeof label, dev); rc != ZAV_RC_OK) {
        LOG_RESCAN("[zavDevToStr %d]\n", rc);
        return rc;
    }
    double seconds = 0.0;
    if (const int rc = attach(dev, seconds); rc != ZAV_RC_OK)
        return rc;
    if (seconds >= kAttachLimit) {
        LOG_RESCAN("[Timeout %s]\n", label);
        return reject(dev, 0);
    }
    return judge(dev, label);
}
