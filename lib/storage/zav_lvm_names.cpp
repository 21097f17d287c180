// Volume groups by number and name, the group of a physical volume, and the tools all of it needs.
#include "common/diag.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

constexpr const char *kSystemGroup = "PrimaryOSVG";
constexpr const char *kDataGroup = "DataVG";
constexpr int kForeignGroup = 99; // the number of a group that is not one of the appliance's
constexpr int kNoPipe = 32;       // a pipe that cannot be opened, to callers of old
constexpr size_t kLine = 128;

} // namespace

int zavMapVGToStr(int iVG, char *strVGName) {
    if (strVGName == nullptr)
        return ZAV_RC_ERR_EINVAL;
    if (iVG == ZAV_LVM_VG_NONE) {
        strcpy(strVGName, "ZAV_LVM_VG_NONE");
        return ZAV_RC_ERR_EINVAL;
    }
    if (iVG == 0)
        strcpy(strVGName, kSystemGroup);
    else
        sprintf(strVGName, "%s%d", kDataGroup, iVG);
    return ZAV_RC_OK;
}

// NOLINTNEXTLINE(readability-non-const-parameter): the interface's type
int zavMapStrToVG(char *strVGName, int *iVG) {
    if (strVGName == nullptr || iVG == nullptr)
        return ZAV_RC_ERR;
    if (zav::contains(strVGName, kSystemGroup)) {
        *iVG = 0;
        return ZAV_RC_OK;
    }
    return zav::number_after(strVGName, kDataGroup, *iVG) ? ZAV_RC_OK : ZAV_RC_ERR;
}

void zavParserLine1(char *pBuf) {
    if (pBuf == nullptr)
        return;
    ZAV_TRACE(zav::kTraceParser, "%s() - pBuf: %s\n", __func__, pBuf);
    zav::Fields fields(pBuf);
    fields.next("=# ");
    const char *field = fields.next(" =#");
    char value[80];
    zav::copy_text(value, sizeof value, field == nullptr ? "" : field);
    trim(value);
    strcpy(pBuf, value);
    ZAV_TRACE(zav::kTraceParser, "%s() - value is : %s\n", __func__, pBuf);
}

int zavGetPVsVG(char *pvname, char *vgname) {
    if (pvname == nullptr || vgname == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const zav::Command exists("pvdisplay -c %s >/dev/null 2>&1", {pvname});
    if (exists.run() != 0) {
        ZAV_TRACE(zav::kTraceCommand, "%s() - pv(%s) is not exist. cmd[]%s\n", __func__, pvname,
                  exists.text());
        return ZAV_RC_ERR_ENODEV;
    }
    zav::CommandOutput output(zav::Command("pvdisplay %s | grep \"VG Name\"", {pvname}));
    if (!output)
        return kNoPipe;
    char line[kLine];
    if (!output.line(line, sizeof line))
        return ZAV_RC_ERR;
    zav::Fields words(line);
    words.next(" ");
    words.next(" ");
    char *name = words.next(" ");
    trim(name);
    // A free physical volume has nothing but the line's end there.
    strcpy(vgname, name == nullptr || *name == '\0' ? "NONE" : name);
    return ZAV_RC_OK;
}

int zavGetPVsVGDev(char *pvname, zavDevice *vgdev) {
    if (pvname == nullptr || vgdev == nullptr)
        return ZAV_RC_ERR_EINVAL;
    char name[kLine];
    if (const int rc = zavGetPVsVG(pvname, name); rc != ZAV_RC_OK)
        return rc;
    int group = kForeignGroup;
    zavMapStrToVG(name, &group);
    *vgdev = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, group, 0};
    return ZAV_RC_OK;
}

int zavCheckExeFile(void) {
    for (const char *tool : {"vgs", "lvs", "pvs", "vgdisplay", "lvdisplay", "pvdisplay"}) {
        char command[64];
        snprintf(command, sizeof command, "ls /usr/sbin/%s &> /dev/null", tool);
        if (system(command) != 0) {
            ZAV_LOG(zav::kAlert, ZAV_RC_ERR_ENOENT, "Error: Utility %s doesn't exist", tool);
            return ZAV_RC_ERR_ENOENT;
        }
    }
    return ZAV_RC_OK;
}
