// Level, state, members and rebuild progress of an array.
#include "common/diag.h"
#include "common/model.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_raid_parse.h"
#include "zav_raid_query.h"

#include <cstdio>
#include <iterator>

namespace {

constexpr int kLine = 80; // lines are read in pieces of at most 79 characters
constexpr int kMaxArrays = 4;

int refuse(const char *function, const char *message) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EINVAL, "%s", message);
    return ZAV_RC_ERR_EINVAL;
}

// Level and number of active members, from mdadm. The record ends up with the level and the
// model's member count, whatever number mdadm gives.
int read_detail(const char *function, const char *mdname, int members, zavRaidState *info,
                int &active) {
    char command[64];
    snprintf(command, sizeof command, "/sbin/mdadm --detail /dev/%s", mdname);
    ZAV_TRACE(zav::kTraceStep, "%s() - cmd[%s]\n", function, command);
    zav::CommandOutput output(command);
    if (!output) {
        zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_ENOENT,
                "command failed! [%s]", command);
        return ZAV_RC_ERR;
    }
    zav::RaidDetail detail = {ZAV_RAIDLVL_NONE, 0, 0};
    for (char line[kLine]; output.line(line, sizeof line);) {
        ZAV_TRACE(zav::kTraceParser, "%s() - buf[%s]\n", function, line);
        const bool supported = zav::read_detail_line(line, detail);
        info->raidlevel = detail.level;
        info->raidcount = detail.raid_devices;
        if (!supported) {
            output.close_plain();
            return ZAV_RC_ERR_EINVAL;
        }
    }
    info->raidcount = members;
    active = detail.active_devices;
    ZAV_TRACE(zav::kTraceStep, "%s() -- raidlevel[%d], raidcount[%d], cur_raidcount[%d]\n",
              function, info->raidlevel, info->raidcount, active);
    return ZAV_RC_OK;
}

// Stops behind the first line that contains the array's name; md1 is also found in md127's line.
bool find_array(const char *function, zav::File &mdstat, const char *mdname) {
    for (char line[kLine]; mdstat.line(line, sizeof line);) {
        ZAV_TRACE(zav::kTraceParser, "%s() -- 1st line of mdstat [%s]\n", function, line);
        if (zav::contains(line, mdname))
            return true;
    }
    return false;
}

int apply_status_line(const char *function, const char *line, int active, zavRaidState *info) {
    const zav::RaidDecision decision =
        zav::decide_raid_state(info->raidlevel, info->raidcount, active, line);
    if (!decision.known)
        return ZAV_RC_ERR_EINVAL;
    info->state = decision.state;
    info->resync = decision.resync;
    if (decision.trace != nullptr)
        ZAV_TRACE(zav::kTraceStep, "(%s) : %s: buf[%s], state[0x%x]\n", function, decision.trace,
                  line, static_cast<unsigned>(info->state));
    return ZAV_RC_OK;
}

int apply_rebuild_line(const char *line, zavRaidState *info) {
    int percent = 0;
    switch (zav::read_rebuild_line(line, percent)) {
    case zav::RebuildLine::kIdle:
        return ZAV_RC_OK;
    case zav::RebuildLine::kDelayed:
        info->state = ZAV_RAID_RESYNC;
        return ZAV_RC_OK;
    case zav::RebuildLine::kRunning:
        info->state = ZAV_RAID_RESYNC;
        info->resync = static_cast<float>(percent);
        return ZAV_RC_OK;
    case zav::RebuildLine::kUnreadable:
        info->state = ZAV_RAID_RESYNC;
        return ZAV_RC_ERR;
    case zav::RebuildLine::kUnexpected:
        break;
    }
    return ZAV_RC_ERR;
}

// The two lines behind the array's own. Those that the file no longer has are empty.
int read_array_block(const char *function, zav::File &mdstat, int active, zavRaidState *info) {
    info->state = ZAV_RAID_NORMAL;

    char line[kLine] = "";
    mdstat.line(line, sizeof line);
    ZAV_TRACE(zav::kTraceParser, "(%s) : buf [%s]\n", function, line);
    if (const int rc = apply_status_line(function, line, active, info); rc != ZAV_RC_OK)
        return rc;

    if (!mdstat.line(line, sizeof line))
        line[0] = '\0';
    ZAV_TRACE(zav::kTraceParser, "(%s) : 3rd line[%s]\n", function, line);
    return apply_rebuild_line(line, info);
}

// Array N is built from partition N of every disk.
void fill_members(zavRaidState *info) {
    for (int i = 0; i < info->raidcount && i < static_cast<int>(std::size(info->hdddev)); ++i)
        info->hdddev[i] = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, i + 1, info->dev.disk};
}

int read_mdstat(const char *function, const char *mdname, int active, zavRaidState *info) {
    zav::File mdstat("/proc/mdstat", "re");
    if (!mdstat) {
        zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_ENOENT,
                "open /proc/mdstat failed!");
        return ZAV_RC_ERR_ENOENT;
    }
    const bool found = find_array(function, mdstat, mdname);
    if (found) {
        if (const int rc = read_array_block(function, mdstat, active, info); rc != ZAV_RC_OK)
            return rc;
    }
    fill_members(info);
    if (!found) {
        info->raidlevel = ZAV_RAIDLVL_NONE;
        info->state = ZAV_RAID_NOT_EXIST;
        ZAV_TRACE(zav::kTraceStep, "=====>zav_raid.c->%s(): ZAV_RAID_NOT_EXIST\n", function);
    }
    return ZAV_RC_OK;
}

} // namespace

int zavGetStateRaid(zavDevice *dev, zavRaidState *info) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (dev == nullptr || info == nullptr)
        return refuse(__func__, "Arguments can't be null.");
    if (dev->type != ZAV_DEV_RAID)
        return refuse(__func__,
                      "Input device's type is not ZAV_DEV_RAID. Return ZAV_RC_ERR_EINVAL.");
    const int model = zavGetModel();
    if (model == ZAV_MODEL_SOLVANE_NONE)
        return 0x1301;

    switch (dev->minor_type) {
    case ZAV_MINDEV_RAID_SW:
        if ((model & zav::kKnownModel) != 0)
            return getRaidStateSW(dev, info);
        return refuse(__func__, "Get SW raid state just be supported on model 2740H|2860. "
                                "Return ZAV_RC_ERR_EINVAL.");
    case ZAV_MINDEV_RAID_HW:
        if (zavGetModel() == ZAV_MODEL_SOLVANE_2980)
            return getRaidStateHW(dev, info);
        return refuse(__func__, "Get HW raid state just be supported on model 2980. "
                                "Return ZAV_RC_ERR_EINVAL.");
    case ZAV_MINDEV_RAID_SAS:
        return getRaidStateSAS(dev, info);
    case ZAV_MINDEV_RAID_ISCSI:
        return getRaidStateISCSI(dev, info);
    default:
        return ZAV_RC_ERR_EINVAL;
    }
}

int getRaidStateSW(zavDevice *dev, zavRaidState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    zav::ModelConfig config;
    if (const int rc = config.read(); rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - model[0x%x], raidcount[%d]\n", __func__,
                  static_cast<unsigned>(config.model), config.raidcount);
        return rc;
    }
    if (!config.is_known())
        return refuse(__func__, "just be supported on model 2740H|2860. Return ZAV_RC_ERR_EINVAL.");

    *info = zav::undecided_raid(*dev, ZAV_MINDEV_HDD_SATA);
    if (dev->disk < 1 || dev->disk > kMaxArrays) // the message names the lower bound only
        return refuse(__func__, "Input device's disk argu. < 1! Return ZAV_RC_ERR_EINVAL.");
    if (dev->part != 1)
        return ZAV_RC_ERR_EINVAL;

    char path[80] = ""; // stays so for an address without a name
    zavDevToStr(path, sizeof path, dev);
    ZAV_TRACE(zav::kTraceStep, "%s() - device path from zavDevToStr is:  %s\n", __func__, path);
    int rc = ZAV_RC_OK;
    if (!zav::raid_node_present(__func__, "md", path, info->state, rc))
        return rc;

    char mdname[16];
    snprintf(mdname, sizeof mdname, "md%d", dev->disk - 1);
    ZAV_TRACE(zav::kTraceStep, "%s() - mdname:  %s\n", __func__, mdname);
    int active = 0;
    rc = read_detail(__func__, mdname, config.raidcount, info, active);
    return rc == ZAV_RC_OK ? read_mdstat(__func__, mdname, active, info) : rc;
}

int getRaidStateISCSI(zavDevice *dev, zavRaidState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    ZAV_TRACE(zav::kTraceStep, "Enter %s().\n", __func__);
    if (dev->disk < 1 || dev->part != 0)
        return ZAV_RC_ERR_EINVAL;
    *info = zav::undecided_raid(*dev, 0);

    char path[50];
    if (const int rc = zavDevToStr(path, sizeof path, dev); rc != ZAV_RC_OK)
        return rc;
    ZAV_TRACE(zav::kTraceStep, "%s() - device path from zavDevToStr is:  %s\n", __func__, path);
    // A target that exists has no state bits set.
    int rc = ZAV_RC_OK;
    zav::raid_node_present(__func__, "Device", path, info->state, rc);
    return rc;
}
