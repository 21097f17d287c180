/*
 * State records, the event union that carries them, and the numeric codes.
 *
 * The records are exchanged byte for byte with the appliance's event driver. They have one
 * layout on every build, that of a 32-bit x86 program: 64-bit sizes are aligned on 4 bytes.
 */
#ifndef ZAV_EVENT_H
#define ZAV_EVENT_H

#include "zav.h"
#include "zav_rbod.h"

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Return codes. The low ones equal the Linux errno of the same name. ---- */

#define ZAV_RC_OK 0
#define ZAV_RC_ERR_ENOENT 2
#define ZAV_RC_ERR_ENOMEM 12
#define ZAV_RC_ERR_EACCES 13
#define ZAV_RC_ERR_EBUSY 16
#define ZAV_RC_ERR_ENODEV 19
#define ZAV_RC_ERR_EINVAL 22
#define ZAV_RC_ERR_EFBIG 27 /* the data to burn is larger than the room on the disc */
#define ZAV_RC_ERR_ESTRPIPE 86
#define ZAV_RC_ERR 128
#define ZAV_RC_ERR_BIOS 0x2000
#define ZAV_RC_ERR_BURNER 0x2100
#define ZAV_RC_ERR_CDTOOL 0x2101   /* a run of a CD tool failed */
#define ZAV_RC_ERR_PKTSETUP 0x2102 /* setting up the packet-writing device failed */
#define ZAV_RC_ERR_BLANK 0x2103    /* a blanking step failed */
#define ZAV_RC_ERR_FORMAT 0x2104   /* UDF formatting failed */
#define ZAV_RC_ERR_BADDISC 0x2106  /* the medium cannot be used for the operation */
#define ZAV_RC_ERR_NODISC 0x2107   /* no medium in the drive */
#define ZAV_RC_ERR_EVENT 0x2200
#define ZAV_RC_ERR_READINFOFAIL 0x2301
#define ZAV_RC_ERR_SENSOR 0x2400
#define ZAV_RC_ERR_LED 0x2500
#define ZAV_RC_ERR_HDD 0x2700
#define ZAV_RC_ERR_LVM 0x2800
#define ZAV_RC_ERR_NIC 0x2900

/* ---- Event types: the first word of every state record. ---- */

#define ZAV_EVENT_INIT 10010
#define ZAV_EVENT_FAN 11010
#define ZAV_EVENT_THERMAL 12010
#define ZAV_EVENT_VOLTAGE 13010
#define ZAV_EVENT_UPS 14010
#define ZAV_EVENT_RAID 15010
#define ZAV_EVENT_HDD 16010
#define ZAV_EVENT_DISC 17010
#define ZAV_EVENT_LVM 18010
#define ZAV_EVENT_NET 19010
#define ZAV_EVENT_SYSINFO 20010
#define ZAV_EVENT_RBOD 21010

/* ---- States. Disk, RAID and LVM states are bit sets, the others single values. ---- */

#define ZAV_HDD_FOUND 1
#define ZAV_HDD_ABSENT 2
#define ZAV_HDD_FAILED 4

#define ZAV_RAID_NORMAL 1
#define ZAV_RAID_DEGRADED 2
#define ZAV_RAID_RESYNC 4
#define ZAV_RAID_FAILED 8
#define ZAV_RAID_NOT_EXIST 16

#define ZAV_LVM_NORMAL 1
#define ZAV_LVM_DEGRADED 2
#define ZAV_LVM_FAILED 4
#define ZAV_LVM_NOT_EXIST 8
#define ZAV_LVM_FULL 16
#define ZAV_LVM_INACTIVE 32

#define ZAV_NET_UP 1
#define ZAV_NET_DOWN 2
#define ZAV_NET_NOT_EXIST 4
#define ZAV_NET_ERR 8

#define ZAV_SENSOR_NORMAL 1
#define ZAV_SENSOR_WARNING 2
#define ZAV_SENSOR_CRITICAL 3
#define ZAV_SENSOR_ERR 4

#define ZAV_UPS_OTHER 2 /* neither of the next two */
#define ZAV_UPS_ONBATT 5
#define ZAV_UPS_ONLINE 7

#define ZAV_SYSINFO_NORMAL 0x201
#define ZAV_SYSINFO_WARNING 0x202
#define ZAV_SYSINFO_CRITICAL 0x203
#define ZAV_SYSINFO_ERR 0x204

/* ---- RAID levels. No level has the value 0. ---- */

#define ZAV_RAIDLVL_NONE 1
#define ZAV_RAIDLVL_0 2
#define ZAV_RAIDLVL_1 3
#define ZAV_RAIDLVL_5 4
#define ZAV_RAIDLVL_6 5
#define ZAV_RAIDLVL_10 6
#define ZAV_RAIDLVL_50 7
#define ZAV_RAIDLVL_60 8
#define ZAV_RAIDLVL_JBOD 9

/* ---- Volume-group numbers: 0 is PrimaryOSVG, n from 1 up is DataVGn. ---- */

#define ZAV_LVM_VG_NONE (-1)

/* ---- Discs (zavMediaInfo). ---- */

#define ZAV_DVD_ROM 1
#define ZAV_DVD_MINUS_R_SEQ 2   /* DVD-R Sequential */
#define ZAV_DVD_RAM 3           /* DVD-RAM */
#define ZAV_DVD_MINUS_RW_RES 4  /* DVD-RW Restricted Overwrite */
#define ZAV_DVD_MINUS_RW_SEQ 5  /* DVD-RW Sequential */
#define ZAV_DVD_PLUS_RW 6       /* DVD+RW */
#define ZAV_DVD_PLUS_R 7        /* DVD+R */
#define ZAV_DVD_PLUS_R_DOUBLE 8 /* DVD+R Double Layer */
#define ZAV_CD_RW 9             /* erasable CD */
#define ZAV_CD_R 10             /* non-erasable CD */
#define ZAV_DISC_NONE 11        /* no medium in the drive */
#define ZAV_DISC_UNKNOWN 12     /* not determined */

#define ZAV_DISC_BLANK 513
#define ZAV_DISC_COMPLETE 514
#define ZAV_DISC_APPENDABLE 515
#define ZAV_DISC_STATE_UNKNOWN 516

/* ---- Records. ---- */

/* An unsigned 64-bit size, aligned on 4 bytes on every build. */
typedef uint64_t zavSize __attribute__((aligned(4)));

typedef struct zavInitState {
    int type; /* ZAV_EVENT_INIT */
    int state;
} zavInitState;

/* Reading of one sensor: a fan, a temperature or a voltage. */
typedef struct zavFanState {
    int type;    /* ZAV_EVENT_FAN, ZAV_EVENT_THERMAL or ZAV_EVENT_VOLTAGE */
    int id;      /* sensor or fan number */
    float value; /* the reading */
    int state;   /* ZAV_SENSOR_* */
} zavFanState;

typedef zavFanState zavThermalState;
typedef zavFanState zavVoltageState;

typedef struct zavSysinfoState {
    int type; /* ZAV_EVENT_SYSINFO */
    int id;
    float value; /* usage */
    int state;   /* ZAV_SYSINFO_* */
} zavSysinfoState;

/* Use of the processor over an interval. */
typedef struct CpuInfo {
    long total; /* clock ticks in the interval */
    float user; /* percent of them */
    float nice;
    float system;
    float idle;
} CpuInfo, *pCpuInfo;

typedef struct zavUpsState {
    int type;     /* ZAV_EVENT_UPS */
    float charge; /* battery charge, percent */
    int state;    /* ZAV_UPS_*, or what the appliance's UPS hook wrote */
} zavUpsState;

typedef struct zavHddState {
    int type;      /* ZAV_EVENT_HDD */
    zavDevice dev; /* the address that was asked for */
    int state;     /* ZAV_HDD_* bits */
} zavHddState;

typedef struct zavRaidState {
    int type;            /* ZAV_EVENT_RAID */
    zavDevice dev;       /* the address that was asked for */
    int state;           /* ZAV_RAID_* bits */
    int raidlevel;       /* ZAV_RAIDLVL_* */
    int raidcount;       /* number of member disks */
    zavDevice hdddev[4]; /* the members */
    float resync;        /* rebuild progress, percent */
} zavRaidState;

typedef struct lvmPV {
    int lvmtype;      /* ZAV_MINDEV_LVM_PV */
    zavDevice lvmdev; /* the physical volume as an LVM object */
    zavSize size;
    zavDevice vgdev; /* its volume group */
    zavDevice dev;   /* the disk or array under it */
} lvmPV;

typedef struct lvmLV {
    int lvmtype; /* ZAV_MINDEV_LVM_LV */
    zavDevice lvmdev;
    zavSize size;
    float usage; /* of its file system */
    zavDevice vgdev;
} lvmLV;

typedef struct lvmVG {
    int lvmtype; /* ZAV_MINDEV_LVM_VG */
    zavDevice lvmdev;
    zavSize size;
    int pvcount;
    lvmPV pvdev[9];
    int lvcount;
    lvmLV lvdev[6];
} lvmVG;

typedef union lvmDevice {
    int lvmtype; /* tells which of the three it is */
    lvmVG lvmvgdev;
    lvmPV lvmpvdev;
    lvmLV lvmlvdev;
} lvmDevice;

typedef struct zavLVMState {
    int type; /* ZAV_EVENT_LVM */
    lvmDevice dev;
    int state; /* ZAV_LVM_* bits */
} zavLVMState;

typedef struct zavNetState {
    int type; /* ZAV_EVENT_NET */
    zavDevice dev;
    int value;
    int state; /* ZAV_NET_* */
} zavNetState;

typedef struct zavMediaInfo {
    int type;              /* ZAV_EVENT_DISC */
    int discType;          /* ZAV_DVD_*, ZAV_CD_*, ZAV_DISC_NONE or ZAV_DISC_UNKNOWN */
    int discState;         /* ZAV_DISC_BLANK to ZAV_DISC_STATE_UNKNOWN */
    int discTotalSize;     /* kilobytes */
    int discAvailableSize; /* kilobytes */
} zavMediaInfo;

typedef struct zavRBODState {
    int type; /* ZAV_EVENT_RBOD */
    sRBOD rbod;
    int id; /* ZAV_RBOD_EXPANDER, ZAV_RBOD_TEMP_CPU or ZAV_RBOD_VOLT_CPU */
    float value;
    int state; /* ZAV_RBOD_NORMAL to ZAV_RBOD_EXIST */
    int priority;
} zavRBODState;

/* Any of the records above, exchanged whole with the event driver. */
typedef union zavSystemEvent {
    int type; /* tells which record it is */
    zavInitState init;
    zavFanState fan;
    zavThermalState therm;
    zavVoltageState volt;
    zavUpsState ups;
    zavHddState hdd;
    zavRaidState raid;
    zavLVMState lvm;
    zavNetState net;
    zavMediaInfo media;
    zavSysinfoState sysinfo;
    zavRBODState rbod;
} zavSystemEvent;

/* For callers that collect events; the library neither allocates nor frees one. */
typedef struct zavSystemEventList {
    zavSystemEvent event;
    struct zavSystemEventList *next; /* null at the end */
} zavSystemEventList;

#ifdef __cplusplus
}
#endif

#endif
