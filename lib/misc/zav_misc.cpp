// The hardware model, and small configuration services of the appliance.
#include "common/diag.h"
#include "common/owner.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdlib>
#include <unistd.h>

namespace {

using zav::contains;

// The model code for a BIOS product name and a number of data disks.
int model_of_2740(int disks) {
    switch (disks) {
    case 0:
    case 1:
        return ZAV_MODEL_SOLVANE_2740;
    case 2:
        return ZAV_MODEL_SOLVANE_2740_2HDD;
    case 4:
        return ZAV_MODEL_SOLVANE_2740_4HDD;
    default:
        return ZAV_MODEL_SOLVANE_NONE;
    }
}

int model_of_2860(const char *product, int disks) {
    ZAV_TRACE(zav::kTraceStep, "sModel[%s], hddnm[%d].\n", product, disks);
    switch (disks) {
    case 0:
    case 2:
        ZAV_TRACE(zav::kTraceStep, "2860-1: ZAV_MODEL_SOLVANE_2860[0x%x]\n",
                  static_cast<unsigned>(ZAV_MODEL_SOLVANE_2860));
        return ZAV_MODEL_SOLVANE_2860;
    case 4:
        ZAV_TRACE(zav::kTraceStep, "2860-2: ZAV_MODEL_SOLVANE_2860_4HDD\n");
        return ZAV_MODEL_SOLVANE_2860_4HDD;
    default:
        ZAV_TRACE(zav::kTraceStep, "2860-3: ZAV_MODEL_SOLVANE_NONE\n");
        return ZAV_MODEL_SOLVANE_NONE;
    }
}

// A 2740H needs no test of its own: its name holds "2740".
int model_of(const char *product, int disks) {
    if (contains(product, "2740"))
        return model_of_2740(disks);
    if (contains(product, "2860"))
        return model_of_2860(product, disks);
    if (contains(product, "2980"))
        return ZAV_MODEL_SOLVANE_2980;
    return ZAV_MODEL_SOLVANE_NONE;
}

// The line of the raidtype file; opening it is tried once more, as its writer may replace it.
bool read_raidtype(char *line, int size) {
    constexpr const char *kPath = "/etc/Kiru/raidtype";
    zav::File file(kPath, "re");
    if (file)
        return file.line(line, size);
    usleep(100);
    zav::File again(kPath, "re");
    return again && again.line(line, size);
}

int data_disks() {
    char line[32];
    if (!read_raidtype(line, sizeof line))
        return 0;
    zav::Fields fields(line);
    fields.next(";");
    fields.next(";");
    const char *third = fields.next(";");
    return third == nullptr ? 0 : zav::to_int(third);
}

} // namespace

int zavGetModel(void) {
    char product[20] = "";
    if (zavGetModelBIOS(product, sizeof product) != ZAV_RC_OK) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL, "Failed to call zavGetModelBIOS().");
        return ZAV_MODEL_SOLVANE_NONE;
    }
    ZAV_TRACE(zav::kTraceStep, "model is %s.\n", product);
    const int disks = data_disks();
    ZAV_TRACE(zav::kTraceStep, "hddnm is %d.\n", disks);
    return model_of(product, disks);
}

int zavGetModelConfig(int *model, int *diskmax, int *diskcount) {
    static constexpr struct {
        int model;
        int slots;
        int disks;
    } kConfigs[] = {
        {ZAV_MODEL_SOLVANE_2740, 4, 1},      {ZAV_MODEL_SOLVANE_2740_2HDD, 4, 2},
        {ZAV_MODEL_SOLVANE_2740_4HDD, 4, 4}, {ZAV_MODEL_SOLVANE_2860, 4, 2},
        {ZAV_MODEL_SOLVANE_2860_4HDD, 4, 4}, {ZAV_MODEL_SOLVANE_2980, 4, 4},
    };
    if (model == nullptr || diskmax == nullptr || diskcount == nullptr)
        return ZAV_RC_ERR;
    *model = zavGetModel();
    if (*model == ZAV_MODEL_SOLVANE_NONE)
        return 0x1301;
    for (const auto &config : kConfigs) {
        if (config.model == *model) {
            *diskmax = config.slots;
            *diskcount = config.disks;
            return ZAV_RC_OK;
        }
    }
    return ZAV_RC_ERR;
}

int zavGetDataRaidtype(void) {
    char line[80];
    if (!read_raidtype(line, sizeof line))
        return -1;
    zav::Fields fields(line);
    fields.next("=");
    const char *value = fields.next(";");
    return value == nullptr ? -1 : zav::to_int(value);
}

int get_diskcount(int *diskcount) {
    constexpr const char *kCommand = "cat /proc/scsi/scsi | grep \"Vendor: ATA\" | wc -l";
    if (diskcount == nullptr)
        return ZAV_RC_ERR;
    zav::CommandOutput output(kCommand);
    if (!output) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - Command Failed [%s]\n", __func__, kCommand);
        return ZAV_RC_ERR;
    }
    char line[80] = "";
    output.line(line, sizeof line);
    trim(line);
    *diskcount = zav::to_int(line);
    return ZAV_RC_OK;
}

int zavSyncConf(void) {
    constexpr const char *kScript = "/usr/bin/syncConf.sh";
    if (!zav::File(kScript, "re")) {
        ZAV_LOG(zav::kWarning, ZAV_RC_ERR_EINVAL, "syncConf.sh does not exist!");
        return ZAV_RC_ERR;
    }
    return system(kScript) == 0 ? ZAV_RC_OK : ZAV_RC_ERR;
}

int zavMapArcTimeZone(void) {
    constexpr const char *kCommand =
        R"(cat /etc/sysconfig/clock | grep "ZONE=" | cut -d "\"" -f 2 | cut -d "/" -f 2)";
    ZAV_TRACE(zav::kTraceStep, "\nstrcmd[%s]\n", kCommand);
    char zone[128 + 1] = "";
    {
        zav::CommandOutput output(kCommand);
        if (!output || output.read(zone, sizeof zone - 1) == 0)
            return -1;
    }
    trim(zone);
    ZAV_TRACE(zav::kTraceStep, "%s() - timezone[%s]\n", __func__, zone);

    zav::File list("/etc/arecaTimeZone.list", "re");
    if (!list)
        return -1;
    int index = -1;
    for (char line[128]; list.line(line, sizeof line);) {
        ++index;
        trim(line);
        if (contains(line, zone))
            break;
    }
    return index;
}
