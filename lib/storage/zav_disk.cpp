// Is a disk present and healthy?
#include "common/diag.h"
#include "common/model.h"
#include "common/node.h"
#include "zav_api.h"

#include <cstdio>
#include <cstdlib>
#include <sys/wait.h>

namespace {

// What the raw status of the health check means; ZAV_RC_ERR if it could not be run at all.
int decide_health(int status, int *state) {
    if (status == -1 || status == 127)
        return ZAV_RC_ERR;
    if (status == 0)
        *state = ZAV_HDD_FOUND;
    else
        *state = WEXITSTATUS(status) == 2 ? ZAV_HDD_ABSENT : ZAV_HDD_FAILED;
    return ZAV_RC_OK;
}

} // namespace

int zavGetStateDisk(zavDevice *dev, zavHddState *info) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    if (dev == nullptr || info == nullptr) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_EINVAL,
                "Arguments can't be null. Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->type != ZAV_DEV_HDD) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_EINVAL,
                "Device's type is not ZAV_DEV_HDD. Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->part != 0) // a partition has no disk state; refused without a word
        return ZAV_RC_ERR_EINVAL;

    *info = {.type = ZAV_EVENT_HDD, .dev = *dev, .state = 0};

    switch (dev->minor_type) {
    case ZAV_MINDEV_HDD_SATA:
        return getDiskStateSATA(dev, info);
    case ZAV_MINDEV_HDD_HWSATA:
        return getDiskStateHWSATA(dev, info);
    case ZAV_MINDEV_HDD_SAS:
        return getDiskStateSAS(dev, info);
    default:
        break;
    }
    ZAV_LOG(zav::kAlert, ZAV_RC_ERR_EINVAL,
            "device's minor type is not "
            "ZAV_MINDEV_HDD_SATA/ZAV_MINDEV_HDD_SAS/ZAV_MINDEV_HDD_HWSATA. "
            "Not allowed and return ZAV_RC_ERR_EINVAL.");
    ZAV_TRACE(zav::kTraceCommand, "((dev->minor_type != ZAV_MINDEV_HDD_SATA) && "
                                  "(dev->minor_type != ZAV_MINDEV_HDD_SAS) && "
                                  "(dev->minor_type != ZAV_MINDEV_HDD_HWSATA))\n");
    ZAV_TRACE(zav::kTraceCommand, "dev->minor_type: %x.\n", static_cast<unsigned>(dev->minor_type));
    return ZAV_RC_ERR_EINVAL;
}

int getDiskStateSATA(zavDevice *dev, zavHddState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    zav::ModelConfig config;
    if (const int rc = config.read(); rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - model[0x%x], diskmax[%d]\n", __func__,
                  static_cast<unsigned>(config.model), config.diskmax);
        return rc;
    }
    // Every known model passes, also the one that the message does not name.
    if (!config.is_known()) {
        ZAV_LOG(zav::kAlert, ZAV_RC_ERR_EINVAL,
                "getDiskStateSATA just be supported on model 2740H|2860. "
                "Return ZAV_RC_ERR_EINVAL.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->disk < 1 || dev->disk > config.diskmax) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL, "dev->disk(%d) is not acceptable.", dev->disk);
        return ZAV_RC_ERR_EINVAL;
    }
    char path[50];
    if (const int rc = zavDevToStr(path, sizeof path, dev); rc != ZAV_RC_OK)
        return rc;
    ZAV_TRACE(zav::kTraceStep, "%s() - device path from zavDevToStr is:  %s\n", __func__, path);

    const zav::NodeProbe probe = zav::probe_node(__func__, path);
    if (probe.result != zav::NodeProbe::Result::kPresent)
        info->state = ZAV_HDD_ABSENT;
    if (probe.result == zav::NodeProbe::Result::kInaccessible)
        return ZAV_RC_ERR;
    if (probe.result == zav::NodeProbe::Result::kMissing) {
        zav::log_missing_node(__func__, "Device", path, probe.error);
        return ZAV_RC_OK;
    }

    char command[128];
    snprintf(command, sizeof command, "%s %s &>/dev/null", "smartctl -H -d ata", path);
    const int status = system(command);
    ZAV_TRACE(zav::kTraceStep, "%s() - Device: %s.\n", __func__, path);
    ZAV_TRACE(zav::kTraceStep, "%s() - Cmd: %s.\n", __func__, command);
    ZAV_TRACE(zav::kTraceStep, "%s() - system() returns: %d, cmd returns: %d.\n", __func__, status,
              WEXITSTATUS(status));
    const int rc = decide_health(status, &info->state);
    if (rc != ZAV_RC_OK)
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR, "system() function call returns failure.\n");
    else
        ZAV_TRACE(zav::kTraceStep, "Exit %s().\n", __func__);
    return rc;
}
