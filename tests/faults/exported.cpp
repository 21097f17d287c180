// The exported functions, in front of the library's: a test that calls one is watched. What each
// may answer is what its description in zav_api.h says.
#include "call.h"

#include "zav_api.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <dlfcn.h>
#include <linux/cdrom.h>

namespace faults {

template <>
constexpr bool is_table<sExpander> = true;

std::vector<Function> &functions() {
    static std::vector<Function> all = [] {
        std::vector<Function> made = {
            {"zav_raidleveldef_to_str", {}, 0},
            {"zav_raidstatedef_to_str", {}, 0},
            {"zav_diskstatedef_to_str", {}, 0},
            {"zav_lvmstatedef_to_str", {}, 0},
            {"zav_netstatedef_to_str", {}, 0},
            {"zav_rbodstatedef_to_str", {}, 0},
            {"zav_rbodid_to_str", {}, 0},
            {"zav_vgdef_to_str", {}, 0},
            {"zav_typedef_to_str", {}, 0},
            {"zav_rcdef_to_str", {}, 0},
            {"zavlogd", {0}, 0},
            {"zavdbgmsg", {}, 0},
            {"zavdbgStop", {}, 0},
            {"zavRCSysToZav", {}, 0},
            {"zavRCZavToSys", {}, 0},
            {"trim", {}, 0},
            {"rtrim", {}, 0},
            {"ltrim", {}, 0},
            {"zavDevToStr", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM}, 0},
            {"zavStrToDev", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL}, 0},
            {"trans_mdname", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"semaphore_get", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"set_semvalue", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"del_semvalue", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"semaphore_p", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"semaphore_v", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"semaphore_getvalue", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"zavGetModel", {}, 0},
            {"zavGetModelConfig", {ZAV_RC_OK, ZAV_RC_ERR, 0x1301}, 0},
            {"zavGetDataRaidtype", {}, 0},
            {"zavSyncConf", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"zavUARTMode", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT}, 0},
            {"zavMapArcTimeZone", {}, 0},
            {"get_diskcount", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"zavSaveBIOS", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1001}, 0},
            {"zavLoadBIOS", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL}, 0},
            {"zavGetModelBIOS", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL}, 0},
            {"zavGetSerialBIOS", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL}, 0},
            {"smbios_string", {}, 0},
            {"getTableEntrySMBIOS", {}, 0},
            {"zavGetStateDisk",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL},
             0},
            {"getDiskStateSATA",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL},
             0},
            {"getDiskStateHWSATA",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL},
             0},
            {"getDiskStateSAS",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL},
             0},
            {"zavGetStateRaid",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_ERR_ENOENT},
             0},
            {"getRaidStateSW",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_ERR_ENOENT},
             0},
            {"getRaidStateISCSI",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_ERR_ENOENT},
             0},
            {"getRaidStateHW",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_ERR_ENOENT},
             0},
            {"getRaidStateSAS",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, 0x1301, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_ERR_ENOENT},
             0},
            {"updateData",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_READINFOFAIL},
             0},
            {"zavGetRBODHwMon",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENODEV},
             0},
            {"zavGetRaidCardHwMon",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENODEV},
             0},
            {"zavGetRBODSet", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, EPIPE}, 0},
            {"zavGetRBODSN", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, EPIPE}, 0},
            {"SetRBODID", {0}, 0},
            {"fillinfo", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL}, 0},
            {"getsasaddr", {}, 0},
            {"zavGetStateRBOD",
             {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, EPIPE, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ENODEV},
             0},
            {"zavDiskHotRemove",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EBUSY, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_ESTRPIPE, EPIPE,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavDiskHotAdd",
             {0x1301, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ENOMEM, EPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavRmSWRaidDev",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EBUSY, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_ESTRPIPE, EPIPE,
              ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavAddSWRaidDev",
             {0x1301, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ENOMEM, EPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavHotCmd", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENODEV}, 0},
            {"zavScsiCmd", {}, 0},
            {"zavSATARemove", {}, 0},
            {"zavSATARescan", {}, 0},
            {"zavGetStateLVM",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavgetStateLVMVG",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavgetStateLVMLV",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavgetStateLVMPV",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavDevToMnt", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL}, 0},
            {"zavgetFSusage", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, 0x2801}, 0},
            {"zavMapVGToStr", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL}, 0},
            {"zavMapStrToVG", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"zavParserLine1", {}, 0},
            {"zavGetPVsVG",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, EPIPE, ZAV_RC_ERR},
             0},
            {"zavGetPVsVGDev",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, EPIPE, ZAV_RC_ERR},
             0},
            {"zavCheckExeFile", {ZAV_RC_OK, ZAV_RC_ERR_ENOENT}, 0},
            {"zavLVMHotAdd", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR}, 0},
            {"zavLVMHotRemove",
             {0x1301, 0x2801, ZAV_RC_ERR, ZAV_RC_ERR_EBUSY, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_READINFOFAIL, ZAV_RC_OK},
             0},
            {"zavGetStateThermal",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENODEV},
             0},
            {"zavGetStateVolt",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENODEV},
             0},
            {"zavResetThermal", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavResetVolt", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavReadFanSpeed", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavGetStateFan", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavGetSensorIn", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavSetSensorOut", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"zavGetStateSysinfo",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR},
             0},
            {"cpuinfo", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES}, 0},
            {"meminfo", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_EACCES}, 0},
            {"fsinfo",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENODEV,
              ZAV_RC_ERR},
             0},
            {"zavSetLED", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR}, 0},
            {"zavGetLED", {}, 0},
            {"zavSetHDDLED", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR}, 0},
            {"zavGetHDDLED", {}, 0},
            {"zavLEDAlarm", {ZAV_RC_OK, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR}, 0},
            {"zavLEDPollAlarm",
             {ZAV_RC_OK, 0x1201, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR},
             0},
            {"zavPollEvent",
             {ZAV_RC_OK, 0x1201, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR},
             0},
            {"zavPollPrivateEvent",
             {ZAV_RC_OK, 0x1201, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR},
             0},
            {"zavWaitEvent",
             {ZAV_RC_OK, 0x1201, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR},
             0},
            {"zavPushEvent",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR},
             0},
            {"zavGetStateUPS",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_EACCES,
              42},
             0},
            {"zavGetStateNic",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_NIC, ZAV_RC_ERR_ENODEV},
             0},
            {"getNicStateETH",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_NIC, ZAV_RC_ERR_ENODEV},
             0},
            {"getNicStateBOND",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_NIC, ZAV_RC_ERR_ENODEV},
             0},
            {"zavMapRBODCCV", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR}, 0},
            {"zavSetiRBOD",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR, EIO, EMFILE, ENOENT, ESPIPE, ENOSPC},
             0},
            {"zavGetiRBOD",
             {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR, EIO, EMFILE, ENOENT, ESPIPE, ENOSPC},
             0},
            {"checkExternalBin", {ZAV_RC_OK, ZAV_RC_ERR}, 0},
            {"zavQueryDisc", {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR, ZAV_RC_ERR_ENOENT}, 0},
            {"zavIsComboDrive", {0, 1, ZAV_RC_ERR_ENOENT}, 0},
            {"zavEjectDVD", {}, 0},
            {"cdrom_reset", {}, 0},
            {"rm_add_odd", {}, 0},
            {"wait_cmd", {}, 0},
            {"zavCDBurn",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_BURNER, ZAV_RC_ERR_CDTOOL,
              ZAV_RC_ERR_EFBIG, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_NODISC, ZAV_RC_OK},
             0},
            {"zavCDBurnEx",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_BURNER, ZAV_RC_ERR_CDTOOL,
              ZAV_RC_ERR_EFBIG, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_NODISC, ZAV_RC_OK},
             0},
            {"zavCDBurnFile",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_BURNER, ZAV_RC_ERR_CDTOOL,
              ZAV_RC_ERR_EFBIG, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_NODISC, ZAV_RC_OK},
             0},
            {"zavCDBurnFileEx",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_BURNER, ZAV_RC_ERR_CDTOOL,
              ZAV_RC_ERR_EFBIG, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_NODISC, ZAV_RC_OK},
             0},
            {"zavCDBlank",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_BLANK, ZAV_RC_ERR_EINVAL,
              ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_NODISC, ZAV_RC_OK},
             0},
            {"zavCDFormat",
             {ZAV_RC_ERR, ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT,
              ZAV_RC_ERR_FORMAT, ZAV_RC_ERR_PKTSETUP, ZAV_RC_OK},
             0},
            {"zavCDProgress", {}, 0},
            {"setCDBlankProgress", {}, 0},
            {"setDVDBlankProgress", {}, 0},
            {"setDVDEmptyProgress", {}, 0},
            {"zavCDBurnCancel", {ZAV_RC_OK}, 0},
            {"zavCDBurnSyncCancel", {ZAV_RC_OK}, 0},
            {"PIDOF", {}, 0},
            {"cleanUp", {}, 0},
        };
        for (std::size_t i = 0; i < made.size(); ++i)
            made[i].number = static_cast<int>(i);
        return made;
    }();
    return all;
}

namespace {

const Function &function(const char *name) {
    for (const Function &known : functions())
        if (std::strcmp(known.name, name) == 0)
            return known;
    std::terminate();
}

template <class Real>
Real *library(const char *name) {
    return reinterpret_cast<Real *>(dlsym(RTLD_NEXT, name));
}

} // namespace

} // namespace faults

// WATCHED(result, function, (parameters), arguments...)
#define WATCHED(result, name, parameters, ...)                                                     \
    result name parameters {                                                                       \
        static const faults::Function &function = faults::function(#name);                         \
        static const auto real = faults::library<result parameters>(#name);                        \
        return faults::watched(function, real __VA_OPT__(, ) __VA_ARGS__);                         \
    }

extern "C" {

int zavlogd(char *funcname, int priority, int errnm, const char *errmsg, ...) {
    char text[1024];
    va_list arguments;
    va_start(arguments, errmsg);
    std::vsnprintf(text, sizeof text, errmsg, arguments);
    va_end(arguments);
    static const faults::Function &function = faults::function("zavlogd");
    const faults::Watch watch(function);
    const auto real = faults::library<int(char *, int, int, const char *, ...)>("zavlogd");
    return real(funcname, priority, errnm, "%s", text);
}

void zavdbgmsg(int debugtype, int debuglevel, const char *dbgmsg, ...) {
    char text[1024];
    va_list arguments;
    va_start(arguments, dbgmsg);
    std::vsnprintf(text, sizeof text, dbgmsg, arguments);
    va_end(arguments);
    static const faults::Function &function = faults::function("zavdbgmsg");
    const faults::Watch watch(function);
    const auto real = faults::library<void(int, int, const char *, ...)>("zavdbgmsg");
    real(debugtype, debuglevel, "%s", text);
}

WATCHED(char *, zav_raidleveldef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_raidstatedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_diskstatedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_lvmstatedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_netstatedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_rbodstatedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_rbodid_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_vgdef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_typedef_to_str, (int def, char *str), def, str)
WATCHED(char *, zav_rcdef_to_str, (int def, char *str), def, str)
WATCHED(void, zavdbgStop, (int debuglevel), debuglevel)
WATCHED(int, zavRCSysToZav, (int systemerrno), systemerrno)
WATCHED(int, zavRCZavToSys, (int zaverrno), zaverrno)
WATCHED(void, trim, (char *s), s)
WATCHED(void, rtrim, (char *string, char *trim), string, trim)
WATCHED(void, ltrim, (char *string, char *trim), string, trim)
WATCHED(int, zavDevToStr, (char *label, size_t size, zavDevice *dev), label, size, dev)
WATCHED(int, zavStrToDev, (const char *label, zavDevice *dev), label, dev)
WATCHED(int, trans_mdname, (char *metaname, char *zavname), metaname, zavname)
WATCHED(int, semaphore_get, (int key, int *sem_id), key, sem_id)
WATCHED(int, set_semvalue, (int sem_id, int key), sem_id, key)
WATCHED(int, del_semvalue, (int sem_id, int key), sem_id, key)
WATCHED(int, semaphore_p, (int sem_id, int key), sem_id, key)
WATCHED(int, semaphore_v, (int sem_id, int key), sem_id, key)
WATCHED(int, semaphore_getvalue, (int sem_id, int key, int *pValue), sem_id, key, pValue)
WATCHED(int, zavGetModel, (void))
WATCHED(int, zavGetModelConfig, (int *model, int *diskmax, int *diskcount), model, diskmax,
        diskcount)
WATCHED(int, zavGetDataRaidtype, (void))
WATCHED(int, zavSyncConf, (void))
WATCHED(int, zavUARTMode, (int uartmode), uartmode)
WATCHED(int, zavMapArcTimeZone, (void))
WATCHED(int, get_diskcount, (int *diskcount), diskcount)
WATCHED(int, zavSaveBIOS, (char *filepath), filepath)
WATCHED(int, zavLoadBIOS, (char *filepath), filepath)
WATCHED(int, zavGetModelBIOS, (char *value, int size), value, size)
WATCHED(int, zavGetSerialBIOS, (char *value, int size), value, size)
WATCHED(char *, smbios_string, (struct smbios_header * entry, int index), entry, index)
WATCHED(char *, getTableEntrySMBIOS, (int type), type)
WATCHED(int, zavGetStateDisk, (zavDevice * dev, zavHddState *info), dev, info)
WATCHED(int, getDiskStateSATA, (zavDevice * dev, zavHddState *info), dev, info)
WATCHED(int, getDiskStateHWSATA, (zavDevice * dev, zavHddState *info), dev, info)
WATCHED(int, getDiskStateSAS, (zavDevice * dev, zavHddState *info), dev, info)
WATCHED(int, zavGetStateRaid, (zavDevice * dev, zavRaidState *info), dev, info)
WATCHED(int, getRaidStateSW, (zavDevice * dev, zavRaidState *info), dev, info)
WATCHED(int, getRaidStateISCSI, (zavDevice * dev, zavRaidState *info), dev, info)
WATCHED(int, getRaidStateHW, (zavDevice * dev, zavRaidState *info), dev, info)
WATCHED(int, getRaidStateSAS, (zavDevice * dev, zavRaidState *info), dev, info)
WATCHED(int, updateData, (zavDevice * dev, sRaidSetInfo *pRaidInfo), dev, pRaidInfo)
WATCHED(int, zavGetRBODHwMon, (int rbodid, int item, float *value), rbodid, item, value)
WATCHED(int, zavGetRaidCardHwMon, (int item, double *value), item, value)
WATCHED(int, zavGetRBODSet, (sRBODSet * RBODSet), RBODSet)
WATCHED(int, zavGetRBODSN, (sRBODMap * pRBOD), pRBOD)
WATCHED(int, SetRBODID, (sExpander * sep, char *sasaddr, int id), sep, sasaddr, id)
WATCHED(int, fillinfo, (int id, sExpander *expander, sRBOD *rbod), id, expander, rbod)
WATCHED(void, getsasaddr, (char *line, char *sasaddr), line, sasaddr)
WATCHED(int, zavGetStateRBOD, (sRBOD * rbod, int sensorid, zavRBODState *info), rbod, sensorid,
        info)
WATCHED(int, zavDiskHotRemove, (zavDevice * diskdev), diskdev)
WATCHED(int, zavDiskHotAdd, (zavDevice * diskdev), diskdev)
WATCHED(int, zavRmSWRaidDev, (zavDevice * sdev, zavDevice *tdev), sdev, tdev)
WATCHED(int, zavAddSWRaidDev, (zavDevice * sdev, zavDevice *tdev), sdev, tdev)
WATCHED(int, zavHotCmd, (int cmd, zavDevice *dev), cmd, dev)
WATCHED(void, zavScsiCmd, (int cmd, int host, int channel, int id, int lun), cmd, host, channel, id,
        lun)
WATCHED(void, zavSATARemove, (zavDevice * dev), dev)
WATCHED(int, zavSATARescan, (zavDevice * dev), dev)
WATCHED(int, zavGetStateLVM, (zavDevice * dev, zavLVMState *info), dev, info)
WATCHED(int, zavgetStateLVMVG, (zavDevice * dev, zavLVMState *info), dev, info)
WATCHED(int, zavgetStateLVMLV, (zavDevice * dev, zavLVMState *info), dev, info)
WATCHED(int, zavgetStateLVMPV, (zavDevice * dev, zavLVMState *info), dev, info)
WATCHED(int, zavDevToMnt, (zavDevice * dev, char *mntpath), dev, mntpath)
WATCHED(int, zavgetFSusage, (zavDevice * dev, float *usage), dev, usage)
WATCHED(int, zavMapVGToStr, (int iVG, char *strVGName), iVG, strVGName)
WATCHED(int, zavMapStrToVG, (char *strVGName, int *iVG), strVGName, iVG)
WATCHED(void, zavParserLine1, (char *pBuf), pBuf)
WATCHED(int, zavGetPVsVG, (char *pvname, char *vgname), pvname, vgname)
WATCHED(int, zavGetPVsVGDev, (char *pvname, zavDevice *vgdev), pvname, vgdev)
WATCHED(int, zavCheckExeFile, (void))
WATCHED(int, zavLVMHotAdd, (zavDevice * dev, zavDevice *lvmdev), dev, lvmdev)
WATCHED(int, zavLVMHotRemove, (zavDevice * lvmdev), lvmdev)
WATCHED(int, zavGetStateThermal, (int probeno, zavThermalState *info), probeno, info)
WATCHED(int, zavGetStateVolt, (int probeno, zavVoltageState *info), probeno, info)
WATCHED(int, zavResetThermal, (int probeno), probeno)
WATCHED(int, zavResetVolt, (int probeno), probeno)
WATCHED(int, zavReadFanSpeed, (int fan, float *fanspeed), fan, fanspeed)
WATCHED(int, zavGetStateFan, (int fan, zavFanState *info), fan, info)
WATCHED(int, zavGetSensorIn, (unsigned char *state), state)
WATCHED(int, zavSetSensorOut, (unsigned char *state), state)
WATCHED(int, zavGetStateSysinfo, (int probeno, zavSysinfoState *info), probeno, info)
WATCHED(int, cpuinfo, (pCpuInfo info, int sec), info, sec)
WATCHED(int, meminfo, (int memno, float *usage), memno, usage)
WATCHED(int, fsinfo, (int fsno, float *usage), fsno, usage)
WATCHED(int, zavSetLED, (int led, int state), led, state)
WATCHED(int, zavGetLED, (int led), led)
WATCHED(int, zavSetHDDLED, (int led, int state), led, state)
WATCHED(int, zavGetHDDLED, (int led), led)
WATCHED(int, zavLEDAlarm, (int priority, int ledcode, int state), priority, ledcode, state)
WATCHED(int, zavLEDPollAlarm, (zavLEDEvent * ledevent), ledevent)
WATCHED(int, zavPollEvent, (zavSystemEvent * event), event)
WATCHED(int, zavPollPrivateEvent, (zavSystemEvent * event), event)
WATCHED(int, zavWaitEvent, (zavSystemEvent * event), event)
WATCHED(int, zavPushEvent, (zavSystemEvent * event), event)
WATCHED(int, zavGetStateUPS, (zavUpsState * info), info)
WATCHED(int, zavGetStateNic, (zavDevice * dev, zavNetState *info), dev, info)
WATCHED(int, getNicStateETH, (zavDevice * dev, zavNetState *info), dev, info)
WATCHED(int, getNicStateBOND, (zavDevice * dev, zavNetState *info), dev, info)
WATCHED(int, zavMapRBODCCV, (int *ccv), ccv)
WATCHED(int, zavSetiRBOD, (sRBOD * rbod), rbod)
WATCHED(int, zavGetiRBOD, (sRBOD * rbod, int *state), rbod, state)
WATCHED(int, checkExternalBin, (void))
WATCHED(int, zavQueryDisc, (zavMediaInfo * info, int flag), info, flag)
WATCHED(int, zavIsComboDrive, (void))
WATCHED(void, zavEjectDVD, (void))
WATCHED(void, cdrom_reset, (void))
WATCHED(void, rm_add_odd, (void))
WATCHED(int, wait_cmd,
        (int fd, struct cdrom_generic_command *cgc, void *buffer, int buflen, int ddir, int timeout,
         int quiet),
        fd, cgc, buffer, buflen, ddir, timeout, quiet)
WATCHED(int, zavCDBurn, (char *sourceDir, int sessionType), sourceDir, sessionType)
WATCHED(int, zavCDBurnEx, (char *sourceDir, char *destDir, int sessionType), sourceDir, destDir,
        sessionType)
WATCHED(int, zavCDBurnFile, (char *filepath), filepath)
WATCHED(int, zavCDBurnFileEx, (char *filepath, char *destDir), filepath, destDir)
WATCHED(int, zavCDBlank, (void))
WATCHED(int, zavCDFormat, (void))
WATCHED(int, zavCDProgress, (void))
WATCHED(void, setCDBlankProgress, (void))
WATCHED(void, setDVDBlankProgress, (void))
WATCHED(void, setDVDEmptyProgress, (void))
WATCHED(int, zavCDBurnCancel, (void))
WATCHED(int, zavCDBurnSyncCancel, (void))
WATCHED(unsigned long, PIDOF, (const char *_process_name, unsigned int _sequence), _process_name,
        _sequence)
WATCHED(void, cleanUp, (void))
}
