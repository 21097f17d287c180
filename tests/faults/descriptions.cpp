// What each exported function may answer, as its description in zav_api.h says.
#include "call.h"

#include "zav_api.h"

#include <cerrno>

namespace faults {

namespace {

using Codes = std::vector<long>;

Codes with(Codes codes, const Codes &others) {
    codes.insert(codes.end(), others.begin(), others.end());
    return codes;
}

// What the descriptions say of several functions at once, or of one that others refer to.
const Codes any;
const Codes done_or_error = {ZAV_RC_OK, ZAV_RC_ERR};
const Codes done_or_invalid = {ZAV_RC_OK, ZAV_RC_ERR_EINVAL};
const Codes bios = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL};
const Codes model_config = {ZAV_RC_OK, ZAV_RC_ERR, 0x1301};
const Codes report = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV,
                      ZAV_RC_ERR_READINFOFAIL};
const Codes disk = with(report, {0x1301});
const Codes array = with(disk, {ZAV_RC_ERR_ENOENT});
const Codes monitor = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT,
                       ZAV_RC_ERR_ENODEV};
const Codes units = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, EPIPE};
const Codes host = {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT, ZAV_RC_ERR_ENODEV};
const Codes volume = with(array, {ZAV_RC_ERR_ESTRPIPE, 0x2801});
const Codes group_name = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENODEV, EPIPE};
const Codes members = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOMEM, EPIPE};
const Codes member_removal = with(with(with(members, {ZAV_RC_ERR_EBUSY}), volume), group_name);
const Codes member_addition = with(with(members, model_config), array);
const Codes sensor = {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES};
const Codes state_sensor = with(sensor, {ZAV_RC_ERR_ENODEV});
const Codes memory = with(sensor, {ZAV_RC_ERR_ENOMEM});
const Codes file_system = with(memory, {ZAV_RC_ERR_ENODEV, ZAV_RC_ERR});
const Codes led = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT};
const Codes event = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_EACCES, 0x1201};
const Codes port = {ZAV_RC_OK, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ESTRPIPE, ZAV_RC_ERR_NIC,
                    ZAV_RC_ERR_ENODEV};
const Codes mark = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL};
const Codes written_mark = with(mark, {EIO, EMFILE, ENOENT, ESPIPE, ENOSPC});
const Codes disc = {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EINVAL, ZAV_RC_ERR_ENOENT};
const Codes unfit_disc = with(disc, {ZAV_RC_ERR_BADDISC, ZAV_RC_ERR_NODISC});
const Codes burn = with(unfit_disc, {ZAV_RC_ERR_EFBIG, ZAV_RC_ERR_CDTOOL, ZAV_RC_ERR_BURNER});

struct Description {
    const char *function;
    Codes codes;
};

const Description descriptions[] = {
    {"zav_raidleveldef_to_str", any},
    {"zav_raidstatedef_to_str", any},
    {"zav_diskstatedef_to_str", any},
    {"zav_lvmstatedef_to_str", any},
    {"zav_netstatedef_to_str", any},
    {"zav_rbodstatedef_to_str", any},
    {"zav_rbodid_to_str", any},
    {"zav_vgdef_to_str", any},
    {"zav_typedef_to_str", any},
    {"zav_rcdef_to_str", any},
    {"zavlogd", {0}},
    {"zavdbgmsg", any},
    {"zavdbgStop", any},
    {"zavRCSysToZav", any},
    {"zavRCZavToSys", any},
    {"trim", any},
    {"rtrim", any},
    {"ltrim", any},
    {"zavDevToStr", with(done_or_invalid, {ZAV_RC_ERR_ENOMEM})},
    {"zavStrToDev", done_or_invalid},
    {"trans_mdname", done_or_error},
    {"semaphore_get", done_or_error},
    {"set_semvalue", done_or_error},
    {"del_semvalue", done_or_error},
    {"semaphore_p", done_or_error},
    {"semaphore_v", done_or_error},
    {"semaphore_getvalue", done_or_error},
    {"zavGetModel", any},
    {"zavGetModelConfig", model_config},
    {"zavGetDataRaidtype", any},
    {"zavSyncConf", done_or_error},
    {"zavUARTMode", with(bios, {ZAV_RC_ERR_ENOENT})},
    {"zavMapArcTimeZone", any},
    {"get_diskcount", done_or_error},
    {"zavSaveBIOS", with(bios, {0x1001})},
    {"zavLoadBIOS", bios},
    {"zavGetModelBIOS", bios},
    {"zavGetSerialBIOS", bios},
    {"smbios_string", any},
    {"getTableEntrySMBIOS", any},
    {"zavGetStateDisk", disk},
    {"getDiskStateSATA", disk},
    {"getDiskStateHWSATA", disk},
    {"getDiskStateSAS", disk},
    {"zavGetStateRaid", array},
    {"getRaidStateSW", array},
    {"getRaidStateISCSI", array},
    {"getRaidStateHW", array},
    {"getRaidStateSAS", array},
    {"updateData", report},
    {"zavGetRBODHwMon", monitor},
    {"zavGetRaidCardHwMon", monitor},
    {"zavGetRBODSet", units},
    {"zavGetRBODSN", units},
    {"SetRBODID", {0}},
    {"fillinfo", bios},
    {"getsasaddr", any},
    {"zavGetStateRBOD", with(with(units, monitor), {ZAV_RC_ERR_ENOMEM})},
    {"zavDiskHotRemove", with(with(member_removal, host), model_config)},
    {"zavDiskHotAdd", with(member_addition, host)},
    {"zavRmSWRaidDev", member_removal},
    {"zavAddSWRaidDev", member_addition},
    {"zavHotCmd", host},
    {"zavScsiCmd", any},
    {"zavSATARemove", any},
    {"zavSATARescan", any},
    {"zavGetStateLVM", volume},
    {"zavgetStateLVMVG", volume},
    {"zavgetStateLVMLV", volume},
    {"zavgetStateLVMPV", volume},
    {"zavDevToMnt", done_or_invalid},
    {"zavgetFSusage", with(done_or_invalid, {0x2801})},
    {"zavMapVGToStr", done_or_invalid},
    {"zavMapStrToVG", done_or_error},
    {"zavParserLine1", any},
    {"zavGetPVsVG", group_name},
    {"zavGetPVsVGDev", group_name},
    {"zavCheckExeFile", {ZAV_RC_OK, ZAV_RC_ERR_ENOENT}},
    {"zavLVMHotAdd", bios},
    {"zavLVMHotRemove", with(volume, {ZAV_RC_ERR_ENODEV, ZAV_RC_ERR_EBUSY})},
    {"zavGetStateThermal", state_sensor},
    {"zavGetStateVolt", state_sensor},
    {"zavResetThermal", sensor},
    {"zavResetVolt", sensor},
    {"zavReadFanSpeed", sensor},
    {"zavGetStateFan", sensor},
    {"zavGetSensorIn", sensor},
    {"zavSetSensorOut", sensor},
    {"zavGetStateSysinfo", file_system},
    {"cpuinfo", sensor},
    {"meminfo", memory},
    {"fsinfo", file_system},
    {"zavSetLED", led},
    {"zavGetLED", any},
    {"zavSetHDDLED", led},
    {"zavGetHDDLED", any},
    {"zavLEDAlarm", {ZAV_RC_OK, ZAV_RC_ERR, ZAV_RC_ERR_EACCES, ZAV_RC_ERR_ENOMEM}},
    {"zavLEDPollAlarm", event},
    {"zavPollEvent", event},
    {"zavPollPrivateEvent", event},
    {"zavWaitEvent", event},
    {"zavPushEvent", with(memory, {ZAV_RC_ERR})},
    {"zavGetStateUPS", with(memory, {ZAV_RC_ERR_ENODEV, 42})},
    {"zavGetStateNic", port},
    {"getNicStateETH", port},
    {"getNicStateBOND", port},
    {"zavMapRBODCCV", mark},
    {"zavSetiRBOD", written_mark},
    {"zavGetiRBOD", written_mark},
    {"checkExternalBin", done_or_error},
    {"zavQueryDisc", disc},
    {"zavIsComboDrive", {0, 1, ZAV_RC_ERR_ENOENT}},
    {"zavEjectDVD", any},
    {"cdrom_reset", any},
    {"rm_add_odd", any},
    {"wait_cmd", any},
    {"zavCDBurn", burn},
    {"zavCDBurnEx", burn},
    {"zavCDBurnFile", burn},
    {"zavCDBurnFileEx", burn},
    {"zavCDBlank", with(unfit_disc, {ZAV_RC_ERR_BLANK})},
    {"zavCDFormat", with(unfit_disc, {ZAV_RC_ERR_PKTSETUP, ZAV_RC_ERR_FORMAT})},
    {"zavCDProgress", any},
    {"setCDBlankProgress", any},
    {"setDVDBlankProgress", any},
    {"setDVDEmptyProgress", any},
    {"zavCDBurnCancel", {ZAV_RC_OK}},
    {"zavCDBurnSyncCancel", {ZAV_RC_OK}},
    {"PIDOF", any},
    {"cleanUp", any},
};

} // namespace

const std::vector<Function> &functions() {
    static const std::vector<Function> all = [] {
        std::vector<Function> made;
        for (const Description &description : descriptions)
            made.push_back(
                {description.function, description.codes, static_cast<int>(made.size())});
        return made;
    }();
    return all;
}

const Function &function_named(const char *name) {
    for (const Function &function : functions())
        if (std::strcmp(function.name, name) == 0)
            return function;
    std::terminate();
}

} // namespace faults
