// The exported functions, in front of the library's: a test that calls one is watched.
#include "call.h"

#include "zav_api.h"

#include <cstdarg>
#include <cstdio>
#include <dlfcn.h>
#include <linux/cdrom.h>

namespace faults {

template <>
constexpr bool is_table<sExpander> = true;

namespace {

template <class Real>
Real *library(const char *name) {
    return reinterpret_cast<Real *>(dlsym(RTLD_NEXT, name));
}

} // namespace

} // namespace faults

// WATCHED(result, function, (parameters), arguments...)
#define WATCHED(result, name, parameters, ...)                                                     \
    result name parameters {                                                                       \
        static const faults::Function &function = faults::function_named(#name);                   \
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
    static const faults::Function &function = faults::function_named("zavlogd");
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
    static const faults::Function &function = faults::function_named("zavdbgmsg");
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
