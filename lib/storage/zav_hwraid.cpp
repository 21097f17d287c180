// Disks and volumes behind the RAID controller, from its report.
#include "common/diag.h"
#include "common/owner.h"
#include "common/raid_report.h"
#include "common/report_turn.h"
#include "zav_api.h"
#include "zav_raid_query.h"

#include <cstddef>

namespace {

constexpr int kSlots = 4;          // of every enclosure
constexpr int kLastVolume = 2;     // of the controller
constexpr int kUnitVolume = 1;     // the one of an expansion unit
constexpr int kHideMember = 0x200; // no ZAV_HDD_* state: such a member is not told

// An address behind an expansion unit holds two numbers.
struct UnitAddress {
    explicit UnitAddress(int disk) : unit(disk >> 8 & 0xFF), number(disk & ~0xFF00) {}

    bool unit_fits() const { return unit >= zav::kFirstUnit && unit <= zav::kLastUnit; }

    int unit;
    int number;
};

// ---- The report ----

// The marker of the enclosure that holds the device.
int choose_marker(const char *function, const zavDevice &dev, zav::Marker &marker) {
    switch (dev.minor_type) {
    case ZAV_MINDEV_HDD_HWSATA:
    case ZAV_MINDEV_RAID_HW:
        ZAV_TRACE(zav::kTraceStep, "%s() - enter case ZAV_MINDEV_HDD_HWSATA/ZAV_MINDEV_RAID_HW\n",
                  function);
        marker = zav::Marker::controller();
        return ZAV_RC_OK;
    case ZAV_MINDEV_RAID_SAS:
    case ZAV_MINDEV_HDD_SAS: {
        ZAV_TRACE(zav::kTraceStep, "%s() - enter case ZAV_MINDEV_RAID_SAS/ZAV_MINDEV_HDD_SAS\n",
                  function);
        const UnitAddress address(dev.disk);
        marker = zav::Marker::unit(address.unit);
        return address.unit_fits() ? ZAV_RC_OK : ZAV_RC_ERR_EINVAL;
    }
    default:
        return ZAV_RC_ERR_EINVAL;
    }
}

void trace_piece(const char *function, const zav::EnclosureReader &reader, bool started) {
    if (!started && reader.started())
        ZAV_TRACE(zav::kTraceStep, "%s() - Set bStart_Read_Info=1. bStart_Read_Info: %d\n",
                  function, 1);
    if (reader.ended())
        ZAV_TRACE(zav::kTraceStep, "%s() - H:!!. Set bEnd_Read_Info=1. bEnd_Read_Info: %d\n",
                  function, 1);
}

int read_enclosure(const char *function, zav::EnclosureReader &reader) {
    zav::ReportTurn turn;
    if (const int rc = turn.take(function, 1); rc != ZAV_RC_OK)
        return rc;
    zav::File report(zav::kReportPath, "re");
    if (!report) {
        turn.end();
        zavlogd(const_cast<char *>(function), zav::kWarning, ZAV_RC_ERR_READINFOFAIL,
                "Failed to open file %s. Return ZAV_RC_ERR_READINFOFAIL.", zav::kReportPath);
        return ZAV_RC_ERR_READINFOFAIL;
    }
    for (char piece[zav::kReportPiece]; !reader.ended() && report.line(piece, sizeof piece);) {
        const bool started = reader.started();
        reader.take(piece);
        trace_piece(function, reader, started);
    }
    ZAV_TRACE(zav::kTraceStep, "%s() - End of getting data\n", function);
    return ZAV_RC_OK;
}

#define TRACE_FIELD(form, ...) ZAV_TRACE(zav::kTraceStep, "pRaidInfo->" form "\n", __VA_ARGS__)

void trace_set(const sRaidSetInfo &info) {
    TRACE_FIELD("raidnum = %d", info.raidnum);
    TRACE_FIELD("raidname = %.16s", info.raidname);
    TRACE_FIELD("raidsize = %f", static_cast<double>(info.raidsize));
    TRACE_FIELD("diskcount = %d", info.diskcount);
    TRACE_FIELD("diskmember = %.4s", info.diskmember);
}

void trace_volume(int index, const sVolSetInfo &volume) {
    TRACE_FIELD("sVolInfo[%d].volnum = %d", index, volume.volnum);
    TRACE_FIELD("sVolInfo[%d].volname = %.16s", index, volume.volname);
    TRACE_FIELD("sVolInfo[%d].raidlevel = %d", index, volume.raidlevel);
    TRACE_FIELD("sVolInfo[%d].volsize = %f", index, static_cast<double>(volume.volsize));
    TRACE_FIELD("sVolInfo[%d].progress = %d", index, volume.progress);
    TRACE_FIELD("sVolInfo[%d].status = %d", index, volume.status);
}

void trace_disk(int index, const sPhyDiskInfo &disk) {
    TRACE_FIELD("sDiskInfo[%d].disknum = %d", index, disk.disknum);
    TRACE_FIELD("sDiskInfo[%d].disksize = %f", index, static_cast<double>(disk.disksize));
    TRACE_FIELD("sDiskInfo[%d].status = %d", index, disk.status);
}

void trace_report(const sRaidSetInfo &info) {
    trace_set(info);
    int index = 0;
    for (const sVolSetInfo &volume : info.sVolInfo)
        trace_volume(index++, volume);
    index = 0;
    for (const sPhyDiskInfo &disk : info.sDiskInfo)
        trace_disk(index++, disk);
}

// ---- Disks ----

zavHddState found_disk(const zavDevice &dev) {
    return {.type = ZAV_EVENT_HDD, .dev = dev, .state = ZAV_HDD_FOUND};
}

// An enclosure that the report does not have has no disks. False when the query ends with `rc`.
bool read_disk_report(const char *function, zavDevice *dev, sRaidSetInfo &report, int &state,
                      int &rc) {
    rc = updateData(dev, &report);
    if (rc == ZAV_RC_OK)
        return true;
    if (rc == ZAV_RC_ERR_ENODEV) {
        state = ZAV_HDD_ABSENT;
        rc = ZAV_RC_OK;
    } else {
        ZAV_TRACE(zav::kTraceFailure, "%s() - UpadteData Failed!\n", function);
    }
    return false;
}

// ---- Volumes ----

// Where a volume and the disks of its enclosure are.
struct Volume {
    int number;
    int member_minor_type;
    int first_slot; // as an address has it
};

int level_of(int reported, int disks) {
    switch (reported) {
    case 1:
        return disks == 4 ? ZAV_RAIDLVL_10 : ZAV_RAIDLVL_1;
    case 3:
        return ZAV_RAIDLVL_5;
    default:
        return ZAV_RAIDLVL_0;
    }
}

zavDevice member_in_slot(const Volume &volume, int slot, bool has_disk) {
    zavDevice member = {ZAV_DEV_HDD, volume.member_minor_type, volume.first_slot + slot, 0};
    zavHddState state;
    const bool told = has_disk && (zavGetStateDisk(&member, &state) != ZAV_RC_OK ||
                                   (state.state & kHideMember) == 0);
    if (!told)
        member.type = member.minor_type = 0;
    return member;
}

void fill_members(const Volume &volume, const sRaidSetInfo &report, zavRaidState *info) {
    for (int slot = 0; slot < kSlots; ++slot)
        info->hdddev[slot] = member_in_slot(volume, slot, report.sDiskInfo[slot].disksize != 0.0F);
}

void fill_volume(const Volume &volume, const sRaidSetInfo &report, zavRaidState *info) {
    const sVolSetInfo &reported = report.sVolInfo[volume.number - 1];
    info->raidlevel = level_of(reported.raidlevel, report.diskcount);
    fill_members(volume, report, info);
    info->raidcount = report.diskcount;
    info->resync = static_cast<float>(reported.progress);
    info->state = reported.status;
}

// Everything but the checks of the address. `info` is filled as undecided.
int read_volume(const char *function, zavDevice *dev, const Volume &volume, zavRaidState *info) {
    char path[80];
    int rc = zavDevToStr(path, sizeof path, dev);
    if (rc != ZAV_RC_OK)
        return rc;
    if (!zav::raid_node_present(function, "Device", path, info->state, rc))
        return rc;
    sRaidSetInfo report;
    rc = updateData(dev, &report);
    if (rc == ZAV_RC_ERR_ENODEV) {
        info->state = ZAV_RAID_NOT_EXIST;
        return ZAV_RC_OK;
    }
    if (rc != ZAV_RC_OK) {
        ZAV_TRACE(zav::kTraceFailure, "%s() - UpadteData Failed!\n", function);
        return rc;
    }
    fill_volume(volume, report, info);
    return ZAV_RC_OK;
}

} // namespace

int updateData(zavDevice *dev, sRaidSetInfo *pRaidInfo) {
    ZAV_TRACE(zav::kTraceStep, "Enter %s()\n", __func__);
    if (pRaidInfo == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *pRaidInfo = {};
    if (dev == nullptr)
        return ZAV_RC_ERR_EINVAL;

    zav::Marker marker = zav::Marker::controller();
    if (const int rc = choose_marker(__func__, *dev, marker); rc != ZAV_RC_OK)
        return rc;
    ZAV_TRACE(zav::kTraceStep, "%s() - strRBOD: %s\n", __func__, marker.text());
    zav::EnclosureReader reader(marker);
    if (const int rc = read_enclosure(__func__, reader); rc != ZAV_RC_OK)
        return rc;
    if (!reader.fill(*pRaidInfo))
        return ZAV_RC_ERR_ENODEV;
    trace_report(*pRaidInfo);
    return ZAV_RC_OK;
}

int getDiskStateSAS(zavDevice *dev, zavHddState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const UnitAddress address(dev->disk);
    *info = found_disk(*dev);
    ZAV_TRACE(zav::kTraceStep, "%s() - dev->disk: 0x%x, RBODnum: 0x%x, disknum: 0x%x\n", __func__,
              static_cast<unsigned>(dev->disk), static_cast<unsigned>(address.unit),
              static_cast<unsigned>(address.number));
    if (!address.unit_fits() || address.number < 1 || address.number > kSlots)
        return ZAV_RC_ERR_EINVAL;

    sRaidSetInfo report;
    int rc;
    if (!read_disk_report(__func__, dev, report, info->state, rc))
        return rc;
    const sPhyDiskInfo &disk = report.sDiskInfo[address.number - 1];
    if (disk.disksize != 0.0F) { // also a size below 0 or one that is no number
        info->state = disk.status;
    } else {
        info->dev.type = 0;
        info->state = ZAV_HDD_ABSENT;
    }
    return ZAV_RC_OK;
}

int getDiskStateHWSATA(zavDevice *dev, zavHddState *info) {
    if (dev == nullptr || info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (zavGetModel() != ZAV_MODEL_SOLVANE_2980) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL,
                "Current model is not solvane 2980. The device just can be queried under model "
                "2980.");
        return ZAV_RC_ERR_EINVAL;
    }
    if (dev->disk < 1 || dev->disk > kSlots) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL,
                "dev->disk(%d) is not acceptable. Return ZAV_RC_ERR_EINVAL.", dev->disk);
        return ZAV_RC_ERR_EINVAL;
    }

    *info = found_disk(*dev);
    sRaidSetInfo report;
    int rc;
    if (!read_disk_report(__func__, dev, report, info->state, rc))
        return rc;
    const sPhyDiskInfo &disk = report.sDiskInfo[dev->disk - 1];
    // Unlike an expansion unit's disk: a size below 0, or one that is no number, is absent.
    info->state = disk.disksize > 0.0F ? disk.status : ZAV_HDD_ABSENT;
    ZAV_TRACE(zav::kTraceStep, "%s() - sRaidInfo.sDiskInfo[%d].status: 0x%x\n", __func__,
              dev->disk - 1, static_cast<unsigned>(disk.status));
    return ZAV_RC_OK;
}

int getRaidStateSAS(zavDevice *dev, zavRaidState *info) {
    if (dev == nullptr || info == nullptr || dev->part != 0)
        return ZAV_RC_ERR_EINVAL;
    const UnitAddress address(dev->disk);
    *info = zav::undecided_raid(*dev, 0);
    if (!address.unit_fits() || address.number != kUnitVolume)
        return ZAV_RC_ERR_EINVAL;
    return read_volume(__func__, dev,
                       {.number = kUnitVolume,
                        .member_minor_type = ZAV_MINDEV_HDD_SAS,
                        .first_slot = address.unit << 8 | 1},
                       info);
}

int getRaidStateHW(zavDevice *dev, zavRaidState *VolInfo) {
    if (dev == nullptr || VolInfo == nullptr || dev->disk < 1 || dev->disk > kLastVolume ||
        dev->part != 0)
        return ZAV_RC_ERR_EINVAL;
    const int number = dev->disk;
    *VolInfo = zav::undecided_raid(*dev, 0);
    const int rc = read_volume(
        __func__, dev,
        {.number = number, .member_minor_type = ZAV_MINDEV_HDD_HWSATA, .first_slot = 1}, VolInfo);
    ZAV_TRACE(zav::kTraceStep, "%s() - sRaidInfo.sVolInfo[%d].status: %d\n", __func__, number - 1,
              VolInfo->state);
    return rc;
}
