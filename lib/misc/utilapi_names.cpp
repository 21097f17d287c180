// Names of codes.
#include "zav_api.h"

#include <cstdio>
#include <cstring>

namespace {

struct Name {
    int code;
    const char *text;
};

#define NAME(code)                                                                                 \
    { code, #code }

constexpr Name kRaidLevels[] = {
    NAME(ZAV_RAIDLVL_NONE), NAME(ZAV_RAIDLVL_0),  NAME(ZAV_RAIDLVL_1),
    NAME(ZAV_RAIDLVL_5),    NAME(ZAV_RAIDLVL_6),  NAME(ZAV_RAIDLVL_10),
    NAME(ZAV_RAIDLVL_50),   NAME(ZAV_RAIDLVL_60), NAME(ZAV_RAIDLVL_JBOD),
};

constexpr Name kRaidStates[] = {
    NAME(ZAV_RAID_NORMAL), NAME(ZAV_RAID_DEGRADED),  NAME(ZAV_RAID_RESYNC),
    NAME(ZAV_RAID_FAILED), NAME(ZAV_RAID_NOT_EXIST),
};

constexpr Name kDiskStates[] = {
    NAME(ZAV_HDD_FOUND),
    NAME(ZAV_HDD_ABSENT),
    NAME(ZAV_HDD_FAILED),
};

constexpr Name kLvmStates[] = {
    NAME(ZAV_LVM_NORMAL),    NAME(ZAV_LVM_DEGRADED), NAME(ZAV_LVM_FAILED),
    NAME(ZAV_LVM_NOT_EXIST), NAME(ZAV_LVM_FULL),     NAME(ZAV_LVM_INACTIVE),
};

constexpr Name kNetStates[] = {
    NAME(ZAV_NET_UP),
    NAME(ZAV_NET_DOWN),
    NAME(ZAV_NET_NOT_EXIST),
    NAME(ZAV_NET_ERR),
};

constexpr Name kUnitStates[] = {
    NAME(ZAV_RBOD_NORMAL), NAME(ZAV_RBOD_WARN),     NAME(ZAV_RBOD_ALARM),
    NAME(ZAV_RBOD_FAIL),   NAME(ZAV_RBOD_NOTEXIST), NAME(ZAV_RBOD_EXIST),
};

constexpr Name kUnitSensors[] = {
    NAME(ZAV_RBOD_EXPANDER),
    NAME(ZAV_RBOD_TEMP_CPU),
    NAME(ZAV_RBOD_VOLT_CPU),
};

// Device, minor and event types share one value space. ZAV_EVENT_SYSINFO has no name.
constexpr Name kTypes[] = {
    NAME(ZAV_DEV_HDD),           NAME(ZAV_DEV_RAID),        NAME(ZAV_DEV_LVM),
    NAME(ZAV_DEV_NIC),           NAME(ZAV_MINDEV_HDD_SATA), NAME(ZAV_MINDEV_HDD_HWSATA),
    NAME(ZAV_MINDEV_HDD_IUFD),   NAME(ZAV_MINDEV_HDD_EUFD), NAME(ZAV_MINDEV_HDD_SAS),
    NAME(ZAV_MINDEV_RAID_SW),    NAME(ZAV_MINDEV_RAID_HW),  NAME(ZAV_MINDEV_RAID_SAS),
    NAME(ZAV_MINDEV_RAID_ISCSI), NAME(ZAV_MINDEV_LVM_VG),   NAME(ZAV_MINDEV_LVM_PV),
    NAME(ZAV_MINDEV_LVM_LV),     NAME(ZAV_MINDEV_NIC_ETH),  NAME(ZAV_MINDEV_NIC_BOND),
    NAME(ZAV_EVENT_INIT),        NAME(ZAV_EVENT_FAN),       NAME(ZAV_EVENT_THERMAL),
    NAME(ZAV_EVENT_VOLTAGE),     NAME(ZAV_EVENT_UPS),       NAME(ZAV_EVENT_RAID),
    NAME(ZAV_EVENT_HDD),         NAME(ZAV_EVENT_DISC),      NAME(ZAV_EVENT_LVM),
    NAME(ZAV_EVENT_NET),         NAME(ZAV_EVENT_RBOD),
};

// The burner's own codes and ZAV_RC_ERR_EFBIG have no name.
constexpr Name kReturnCodes[] = {
    NAME(ZAV_RC_OK),
    NAME(ZAV_RC_ERR_ENOENT),
    NAME(ZAV_RC_ERR_ENOMEM),
    NAME(ZAV_RC_ERR_EACCES),
    NAME(ZAV_RC_ERR_EBUSY),
    NAME(ZAV_RC_ERR_ENODEV),
    NAME(ZAV_RC_ERR_EINVAL),
    NAME(ZAV_RC_ERR_ESTRPIPE),
    NAME(ZAV_RC_ERR),
    NAME(ZAV_RC_ERR_BIOS),
    NAME(ZAV_RC_ERR_BURNER),
    NAME(ZAV_RC_ERR_EVENT),
    NAME(ZAV_RC_ERR_READINFOFAIL),
    NAME(ZAV_RC_ERR_SENSOR),
    NAME(ZAV_RC_ERR_LED),
    NAME(ZAV_RC_ERR_HDD),
    NAME(ZAV_RC_ERR_LVM),
    NAME(ZAV_RC_ERR_NIC),
};

#undef NAME

template <size_t count>
char *one_name(const Name (&names)[count], int code, const char *otherwise, char *str) {
    if (str == nullptr)
        return nullptr;
    for (const Name &name : names)
        if (name.code == code)
            return strcpy(str, name.text);
    return strcpy(str, otherwise);
}

template <size_t count>
char *all_names(const Name (&names)[count], int bits, const char *before, const char *after,
                char *str) {
    if (str == nullptr)
        return nullptr;
    *str = '\0';
    for (const Name &name : names)
        if ((bits & name.code) != 0)
            strcat(strcat(strcat(str, before), name.text), after);
    return str;
}

} // namespace

char *zav_raidleveldef_to_str(int def, char *str) {
    return one_name(kRaidLevels, def, "Not support[zav_raidleveldef_to_str()]", str);
}

char *zav_raidstatedef_to_str(int def, char *str) {
    return all_names(kRaidStates, def, "[", "]", str);
}

char *zav_diskstatedef_to_str(int def, char *str) {
    return all_names(kDiskStates, def, "[", "]", str);
}

char *zav_lvmstatedef_to_str(int def, char *str) {
    return all_names(kLvmStates, def, "", ", ", str);
}

char *zav_netstatedef_to_str(int def, char *str) {
    return one_name(kNetStates, def, "Not support[zav_netstatedef_to_str()]", str);
}

char *zav_rbodstatedef_to_str(int def, char *str) {
    return one_name(kUnitStates, def, "Not support[zav_rbodstatedef_to_str()]", str);
}

// The text names the state function: callers know it so.
char *zav_rbodid_to_str(int def, char *str) {
    return one_name(kUnitSensors, def, "Not support[zav_rbodstatedef_to_str()]", str);
}

char *zav_vgdef_to_str(int def, char *str) {
    if (str == nullptr)
        return nullptr;
    if (def == ZAV_LVM_VG_NONE)
        return strcpy(str, "ZAV_LVM_VG_NONE");
    if (def == 0)
        return strcpy(str, "PrimaryOSVG");
    sprintf(str, "DataVG%d", def);
    return str;
}

char *zav_typedef_to_str(int def, char *str) {
    return one_name(kTypes, def, "Not support[zav_typedef_to_str()]", str);
}

char *zav_rcdef_to_str(int def, char *str) {
    return one_name(kReturnCodes, def, "Not support[zav_rcdef_to_str()]", str);
}
