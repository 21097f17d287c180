// The expansion units behind the RAID controller: which there are, and how they are.
#include "common/diag.h"
#include "common/owner.h"
#include "common/raid_report.h"
#include "common/report_turn.h"
#include "common/shell.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_hwraid_cascade.h"

#include <cstring>

namespace {

constexpr int kBrokenPipe = 32;
constexpr const char *kTopology = "/usr/bin/query_sas.sh";
constexpr const char *kUnitList = "/etc/Kiru/zav/.RBODinfo";

constexpr int kTemperatureItem = 0;
constexpr int kVoltageItem = 4;

int read_cascade(const char *function, zav::Cascade &cascade) {
    zav::CommandOutput output(kTopology);
    if (!output)
        return kBrokenPipe;
    for (char line[128]; output.line(line, sizeof line);) {
        if (!cascade.take(line)) {
            zavlogd(const_cast<char *>(function), zav::kWarning, ZAV_RC_ERR,
                    "Error!! HBQE-T500 %s can't get parent connection!",
                    cascade.expanders[cascade.current].sasaddr);
            return ZAV_RC_ERR;
        }
    }
    return ZAV_RC_OK;
}

sExpander *expander_at(sExpander *expanders, const char *address) {
    for (int i = 0; i < zav::Cascade::kExpanders; ++i)
        if (strncmp(expanders[i].sasaddr, address, sizeof expanders[i].sasaddr) == 0)
            return &expanders[i];
    return nullptr;
}

sExpander *first_unit(sExpander *expanders) {
    for (int i = 0; i < zav::Cascade::kExpanders; ++i)
        if (expanders[i].id == zav::kFirstUnit)
            return &expanders[i];
    return nullptr;
}

int fill_units(zav::Cascade &cascade, sRBODSet &set) {
    for (sRBOD &unit : set.RBOD)
        unit.iExist = 0;
    for (sExpander &expander : cascade.expanders) {
        if (expander.iExist != 1 || expander.id == 0)
            continue;
        if (const int rc = fillinfo(expander.id, &expander, &set.RBOD[expander.id - 1]);
            rc != ZAV_RC_OK)
            return rc;
    }
    return ZAV_RC_OK;
}

int publish_units(const sRBODSet &set) {
    const zav::File list(kUnitList, "w+e");
    if (!list)
        return ZAV_RC_ERR;
    for (const sRBOD &unit : set.RBOD)
        if (unit.iExist == 1)
            fprintf(list.get(), "%d:%s\n", unit.id, unit.sasaddr);
    return ZAV_RC_OK;
}

int temperature_state(float degrees) {
    if (degrees >= 85.0)
        return ZAV_RBOD_ALARM;
    return degrees >= 75.0 ? ZAV_RBOD_WARN : ZAV_RBOD_NORMAL;
}

// The limits have double precision, the reading single precision: 1.08 reads as a little more.
int voltage_state(float volts) {
    const double value = volts;
    if (value <= 0.96 || value >= 1.44)
        return ZAV_RBOD_ALARM;
    return value >= 1.32 || value <= 1.08 ? ZAV_RBOD_WARN : ZAV_RBOD_NORMAL;
}

int judge_reading(int item, int (*judge)(float), zavRBODState *info) {
    const int rc = zavGetRBODHwMon(info->rbod.id, item, &info->value);
    if (rc == ZAV_RC_OK)
        info->state = judge(info->value);
    return rc;
}

int ask_sensor(zavRBODState *info) {
    switch (info->id) {
    case ZAV_RBOD_EXPANDER:
        info->state = info->rbod.iExist == 1 ? ZAV_RBOD_EXIST : ZAV_RBOD_NOTEXIST;
        return ZAV_RC_OK;
    case ZAV_RBOD_TEMP_CPU:
        return judge_reading(kTemperatureItem, temperature_state, info);
    case ZAV_RBOD_VOLT_CPU:
        return judge_reading(kVoltageItem, voltage_state, info);
    default:
        return ZAV_RC_OK;
    }
}

} // namespace

int zavGetRBODSet(sRBODSet *RBODSet) {
    if (RBODSet == nullptr)
        return ZAV_RC_ERR_EINVAL;
    memset(RBODSet, 0xFF, sizeof *RBODSet);
    zav::Cascade cascade;
    if (const int rc = read_cascade(__func__, cascade); rc != ZAV_RC_OK)
        return rc;
    SetRBODID(cascade.expanders, nullptr, 0);
    if (const int rc = fill_units(cascade, *RBODSet); rc != ZAV_RC_OK)
        return rc;
    return publish_units(*RBODSet);
}

void getsasaddr(char *line, char *sasaddr) {
    if (line == nullptr || sasaddr == nullptr)
        return;
    constexpr const char *kSeparators = ":[]";
    const char *field = line + strspn(line, kSeparators);
    for (int skipped = 0; skipped < 3; ++skipped) {
        field += strcspn(field, kSeparators);
        field += strspn(field, kSeparators);
    }
    const size_t length = strcspn(field, kSeparators);
    if (length != 0)
        snprintf(sasaddr, sizeof(sExpander::sasaddr), "%.*s", static_cast<int>(length), field);
}

int SetRBODID(sExpander *sep, char *sasaddr, int id) {
    if (sep == nullptr)
        return ZAV_RC_OK;
    sExpander *expander = nullptr;
    if (id == 0) {
        expander = first_unit(sep);
        id = zav::kFirstUnit;
    } else if (sasaddr != nullptr && *sasaddr != '\0' && !zav::is_no_link(sasaddr) &&
               id >= zav::kFirstUnit && id <= zav::kLastUnit) { // a loop of links ends here
        expander = expander_at(sep, sasaddr);
    }
    if (expander == nullptr)
        return ZAV_RC_OK;
    expander->iExist = 1;
    expander->id = id;
    SetRBODID(sep, expander->upperchild, 2 * id);
    return SetRBODID(sep, expander->lowerchild, 2 * id + 1);
}

int fillinfo(int id, sExpander *expander, sRBOD *rbod) {
    if (expander == nullptr || rbod == nullptr)
        return ZAV_RC_ERR_EINVAL;
    rbod->iExist = 1;
    rbod->id = id;
    memcpy(rbod->sasaddr, expander->sasaddr, sizeof rbod->sasaddr);
    rbod->parentid = id / 2;
    // By the place in the cascade, whatever was found there.
    rbod->upperchildid = zav::is_no_link(expander->upperchild) ? -1 : 2 * id;
    rbod->lowerchildid = zav::is_no_link(expander->lowerchild) ? -1 : 2 * id + 1;

    sRBODMap identity = {};
    identity.rbodid = id;
    if (zavGetRBODSN(&identity) != ZAV_RC_OK)
        return ZAV_RC_ERR;
    zav::copy_text(rbod->sn, sizeof rbod->sn, identity.sn);
    zav::copy_text(rbod->model, sizeof rbod->model, identity.model);
    return ZAV_RC_OK;
}

int zavGetRBODSN(sRBODMap *pRBOD) {
    if (pRBOD == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::ReportTurn turn;
    if (const int rc = turn.take(__func__, 1); rc != ZAV_RC_OK)
        return rc;
    zav::CommandOutput report(zav::Command("cat %s", {zav::kReportPath}));
    if (!report)
        return kBrokenPipe;
    zav::IdentityReader reader(pRBOD->rbodid);
    for (char piece[zav::kIdentityPiece]; report.line(piece, sizeof piece);)
        if (!reader.take(piece, *pRBOD))
            break;
    return ZAV_RC_OK;
}

int zavGetStateRBOD(sRBOD *rbod, int sensorid, zavRBODState *info) {
    if (rbod == nullptr || info == nullptr || rbod->id < zav::kFirstUnit ||
        rbod->id > zav::kLastUnit)
        return ZAV_RC_ERR_EINVAL;
    const int id = rbod->id; // the record may be the one to fill
    const zav::HeapRecord<sRBODSet> set;
    if (!set)
        return ZAV_RC_ERR_ENOMEM;
    *info = {};
    info->type = ZAV_EVENT_RBOD;
    info->id = sensorid;
    info->state = ZAV_RBOD_NORMAL;
    info->rbod.id = id;
    if (const int rc = zavGetRBODSet(&*set); rc != ZAV_RC_OK)
        return rc;
    for (const sRBOD &unit : (*set).RBOD)
        if (unit.id == id)
            info->rbod = unit;
    return ask_sensor(info);
}
