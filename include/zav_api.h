/*
 * libzav: every exported function, by family.
 *
 * A function checks its arguments, works in the calling thread, fills records that the caller
 * owns and returns a ZAV_RC_* code, 0 (ZAV_RC_OK) on success. It keeps nothing between calls: no
 * descriptor, no child process, no memory. Failures go to syslog (facility LOG_DAEMON) with the
 * name of the reporting function as ident. Unless said otherwise a function may be called from
 * several threads at once and blocks no longer than the files and tools it reads.
 *
 * A device that does not exist is a successful query whose state says so, not an error.
 *
 * The commands are those of the appliance's shell: /bin/sh must be bash (docs/platform.md).
 *
 * The functions called zav... are the public interface. The others serve the library's own
 * sources; they are exported for its test and support programs and are listed last in a family.
 */
#ifndef ZAV_API_H
#define ZAV_API_H

#include "zav.h"
#include "zav_event.h"
#include "zav_hwraid.h"
#include "zav_led.h"
#include "zav_rbod.h"

#include <stddef.h>

#if defined(__GNUC__)
#    define ZAV_PRINTF(fmtarg, first) __attribute__((format(printf, fmtarg, first)))
#    pragma GCC visibility push(default)
#else
#    define ZAV_PRINTF(fmtarg, first)
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* ==== Names of codes ==========================================================================
 *
 * Each writes the name of `def` into `str` and returns `str`. The buffer has no size argument:
 * 128 bytes hold every result (the longest, all six LVM states, takes 102). A value without a
 * name gives "Not support[<function>()]", except where told otherwise. No call blocks.
 */

/** Name of a ZAV_RAIDLVL_* code, such as "ZAV_RAIDLVL_5". */
char *zav_raidleveldef_to_str(int def, char *str);

/** Names of the ZAV_RAID_* bits, each in brackets and without separator:
 *  "[ZAV_RAID_DEGRADED][ZAV_RAID_RESYNC]". Unknown bits are left out; none gives "". */
char *zav_raidstatedef_to_str(int def, char *str);

/** Names of the ZAV_HDD_* bits, in brackets like the RAID states. */
char *zav_diskstatedef_to_str(int def, char *str);

/** Names of the ZAV_LVM_* bits, each followed by a comma and a blank: "ZAV_LVM_NORMAL, ". */
char *zav_lvmstatedef_to_str(int def, char *str);

/** Name of one ZAV_NET_* state; network states do not combine. */
char *zav_netstatedef_to_str(int def, char *str);

/** Name of a ZAV_RBOD_* state. */
char *zav_rbodstatedef_to_str(int def, char *str);

/** Name of an expansion-unit sensor id. Another value gives the text of
 *  zav_rbodstatedef_to_str: "Not support[zav_rbodstatedef_to_str()]". */
char *zav_rbodid_to_str(int def, char *str);

/** Name of a volume-group number: "ZAV_LVM_VG_NONE" for -1, "PrimaryOSVG" for 0, "DataVG<n>" for
 *  every other number, negative ones included. */
char *zav_vgdef_to_str(int def, char *str);

/** Name of a device type, minor type or event type. ZAV_EVENT_SYSINFO has none. */
char *zav_typedef_to_str(int def, char *str);

/** Name of a return code. The codes of the burner from 0x2101 up and ZAV_RC_ERR_EFBIG have
 *  none. */
char *zav_rcdef_to_str(int def, char *str);

/* ==== Diagnostics, return codes, text =========================================================*/

/**
 * Writes one line "[<errnm>] <message>" to syslog: ident `funcname`, options LOG_CONS | LOG_PID,
 * facility LOG_DAEMON. `priority` is a syslog priority; the library uses 1 (alert) and 4
 * (warning). Messages are cut after 511 characters. Opens and closes the log, so the caller's own
 * openlog(3) settings are gone afterwards. Returns 0 always.
 */
int zavlogd(char *funcname, int priority, int errnm, const char *errmsg, ...) ZAV_PRINTF(4, 5);

/**
 * Prints a trace message to standard output if `debugtype` is at most `debuglevel`; nothing is
 * added to it. Messages are cut after 255 characters. With type 0 the message is printed twice,
 * then zavdbgStop(debuglevel) is called. The library's own messages have level 1 nearly
 * everywhere and type 1 where a caller should see a failure, 2 to 4 for what is silent at that
 * level.
 */
void zavdbgmsg(int debugtype, int debuglevel, const char *dbgmsg, ...) ZAV_PRINTF(3, 4);

/** With a level above 1: prints "Press Enter to continue...." and reads one character from
 *  standard input, however long that takes. Otherwise does nothing. */
void zavdbgStop(int debuglevel);

/**
 * Converts an errno value to a ZAV_RC_* code, or back (the two are one mapping): 2, 19, 22 and 86
 * stay what they are, every other number becomes ZAV_RC_ERR (128), 0 included. Convert only after
 * a failure.
 */
int zavRCSysToZav(int systemerrno);
int zavRCZavToSys(int zaverrno);

/** Strips blanks and tabs from the start of `s`, and blanks, tabs and line feeds from its end, in
 *  place. Carriage returns stay. A string of nothing else becomes empty. */
void trim(char *s);

/** Strips the characters that occur in `trim` from the end (rtrim) or the start (ltrim) of
 *  `string`, in place. */
void rtrim(char *string, char *trim);
void ltrim(char *string, char *trim);

/* ==== Device naming ===========================================================================*/

/**
 * Writes the device path (or interface name) of `dev` into `label`, a buffer of `size` bytes:
 * {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 2} gives "/dev/sata/disk3p2".
 *
 * ZAV_RC_OK         the name, padded with NULs up to `size`
 * ZAV_RC_ERR_EINVAL null pointer, negative disk or part, type 0: `label` is untouched;
 *                   a pair of types without a name (physical volumes have none), an interface
 *                   number below 1: `label` is all NUL
 * ZAV_RC_ERR_ENOMEM size 0 (untouched), or the name and its terminator do not fit (all NUL)
 */
int zavDevToStr(char *label, size_t size, zavDevice *dev);

/**
 * Reads a device path (or interface name) into `dev`, the reverse of zavDevToStr. Only letters,
 * digits and '/' are accepted, and numbers up to 2147483647 (interface numbers up to 2147483646);
 * a number that is followed by another part of the name has at most 15 digits.
 *
 * ZAV_RC_OK         `dev` holds the address
 * ZAV_RC_ERR_EINVAL null pointer (untouched), or not a name of a device: `type` is 0, the other
 *                   fields may hold what was read before the refusal
 */
int zavStrToDev(const char *label, zavDevice *dev);

/**
 * Maps a software array's metadata name to its device path: a text that holds "/dev/md/MD0" to
 * "/dev/swraid/disk1p1", and so on up to MD3 and disk4p1. `zavname` must hold 20 bytes.
 *
 * ZAV_RC_OK  `zavname` holds the path
 * ZAV_RC_ERR no such name in the text, or a null pointer; `zavname` is untouched
 */
int trans_mdname(char *metaname, char *zavname);

/* ==== Cross-process semaphores ================================================================
 *
 * Binary System V semaphores, one set of one semaphore per key, created with mode 0666 on first
 * use and never removed. All return 0 on success and 128 (ZAV_RC_ERR) after a failed system call,
 * which is logged. `key` in the calls other than semaphore_get serves the log line only.
 */

/** Opens the semaphore of `key`, creating it with value 1 (free) if need be, and stores its
 *  identifier in `*sem_id`. 128 if `sem_id` is null. One that was made by a process which was
 * killed before it could set the value, and so would be waited for for ever, is made anew after a
 * second. */
int semaphore_get(int key, int *sem_id);

/** Sets the value to 1. */
int set_semvalue(int sem_id, int key);

/** Removes the semaphore; those who wait for it fail. */
int del_semvalue(int sem_id, int key);

/** Takes the lock, waiting for as long as it is held. The kernel gives it back if the holder
 *  dies. Not recursive. A signal that the program handles ends the wait (128); SIGCHLD waits. */
int semaphore_p(int sem_id, int key);

/** Releases the lock. Releasing one that is not held is logged and done all the same: the value
 *  becomes 2, and the next two lockers both enter. */
int semaphore_v(int sem_id, int key);

/** Reads the value into `*pValue`: 1 free, 0 held. 128 if `pValue` is null. */
int semaphore_getvalue(int sem_id, int key, int *pValue);

/* ==== Model and configuration =================================================================*/

/* Model codes: the high byte is the family, the low byte the number of data disks where the
 * family distinguishes it. A code with a bit of 0x300 set is a known model. */
#define ZAV_MODEL_SOLVANE_NONE 0
#define ZAV_MODEL_SOLVANE_2740 0x100
#define ZAV_MODEL_SOLVANE_2740_2HDD 0x102
#define ZAV_MODEL_SOLVANE_2740_4HDD 0x104
#define ZAV_MODEL_SOLVANE_2860 0x200 /* two disks */
#define ZAV_MODEL_SOLVANE_2860_4HDD 0x204
#define ZAV_MODEL_SOLVANE_2980 0x300 /* hardware RAID */

/**
 * The model the program runs on, from the BIOS product name (zavGetModelBIOS) and the number of
 * data disks, the third field of /etc/Kiru/raidtype. ZAV_MODEL_SOLVANE_NONE (0) when the product
 * is unknown, cannot be read (logged), or has a disk count that the model does not come with; a
 * raidtype file that is missing or short counts as 0 disks. Opening that file is tried twice,
 * 100 microseconds apart.
 */
int zavGetModel(void);

/**
 * Model code, number of disk slots and number of disks that the model's arrays are built from.
 *
 * 0      all three are stored
 * 0x1301 no known model (a value outside the ZAV_RC_* table); `*model` is 0, the rest untouched
 * 128    a model without known disk counts (rest untouched), or a null pointer (all untouched)
 */
int zavGetModelConfig(int *model, int *diskmax, int *diskcount);

/** The RAID type of the data array, from the first field of /etc/Kiru/raidtype ("raidtype=5" gives
 *  5); -1 if the file cannot be read or has no such field. */
int zavGetDataRaidtype(void);

/**
 * Runs the appliance's /usr/bin/syncConf.sh and waits for its end, however long it takes. 0 when
 * it ended with status 0; 128 when it failed or is missing (logged).
 */
int zavSyncConf(void);

/**
 * Routes the serial port through the GPIO lines 34, 35 and 49 under /proc/zav/sys/dev/gpio/ich9/.
 * The lines change one after the other, in the order in which the mode needs them.
 *
 * 0   the lines are set
 * 22  (ZAV_RC_ERR_EINVAL) `uartmode` is not 1 to 4; nothing was touched
 * 2   (ZAV_RC_ERR_ENOENT) a line cannot be opened (logged); none was changed, but those that were
 *     opened have been truncated, as their driver expects
 * 128 (ZAV_RC_ERR) a write failed (logged)
 */
int zavUARTMode(int uartmode);

/**
 * The RAID controller's index of the system's time zone: the line number, from 0, of the first
 * line of /etc/arecaTimeZone.list that contains the city of ZONE in /etc/sysconfig/clock. A zone
 * that no line contains gives the index of the last line. -1 when there is no zone or no list.
 */
int zavMapArcTimeZone(void);

/** Number of ATA disks in /proc/scsi/scsi, into `*diskcount` (0 if the file is missing). 128 if the
 *  shell cannot be started or the pointer is null; `*diskcount` is then untouched. */
int get_diskcount(int *diskcount);

/* ==== BIOS settings and identity ==============================================================*/

/**
 * Copies the BIOS settings (114 bytes of /dev/nvram) into the file `filepath`, which is created or
 * replaced. Bytes that the device does not give, because it ends early or cannot be read, are
 * saved as zeros: check the image before trusting it. Failures are told on standard output.
 *
 * 0      saved
 * 22     null path
 * 0x1001 the file came out too short (a value outside the ZAV_RC_* table)
 * 128    the device or the file cannot be opened, or writing failed (a full disk)
 */
int zavSaveBIOS(char *filepath);

/**
 * Writes a file saved by zavSaveBIOS back to /dev/nvram. Failures are told on standard output. A
 * device that takes less than 114 bytes, or refuses them, is not reported.
 *
 * 0   the file was read and handed to the device
 * 22  null path
 * 128 the file or the device cannot be opened, or the file is shorter than 114 bytes
 */
int zavLoadBIOS(char *filepath);

/**
 * Reads the board's product name (/sys/class/dmi/id/product_name), or its serial number
 * (product_serial), without the line feed, into `value`: at most `size` - 1 characters.
 *
 * 0   read; `value` is left as it was if the file was empty
 * 22  null buffer or size below 1
 * 128 the file cannot be opened (logged); `value` is untouched
 */
int zavGetModelBIOS(char *value, int size);
int zavGetSerialBIOS(char *value, int size);

struct smbios_header;

/**
 * The `index`-th string (from 1) of the SMBIOS structure `entry`, whose string set must follow its
 * formatted area in memory; index 0 gives "". "Bad Index" if the set ends before it. The result
 * points into the structure or to a constant.
 */
char *smbios_string(struct smbios_header *entry, int index);

/**
 * Product name (type 1) or board serial number (type 2), at most 20 characters, from the SMBIOS
 * table in physical memory (/dev/mem): of the first structure of that type behind the table's
 * first structure. If there is none, for any other type, and if the table cannot be found, the
 * result is what the last call left, empty at first; null if /dev/mem cannot be opened. Failures
 * are told on standard output. The result is one static buffer that the next call overwrites: one
 * thread at a time.
 */
char *getTableEntrySMBIOS(int type);

/* ==== Disk state ==============================================================================*/

/**
 * Is this disk present and healthy? `dev` is a whole disk (no partition) of minor type
 * ZAV_MINDEV_HDD_SATA, _HWSATA or _SAS.
 *
 * On the motherboard (SATA) presence is told by the device node, health by the exit status of
 * "smartctl -H -d ata". Disks of the RAID controller (HWSATA, slots 1 to 4, model 2980 only) and of
 * an expansion unit (SAS: unit 1 to 7 in bits 8 to 15 of `disk`, slot 1 to 4 in the rest) are
 * looked up in the controller's report, see updateData.
 *
 * ZAV_RC_OK          info->state is ZAV_HDD_FOUND, _ABSENT or _FAILED; smartctl's exit status 2
 *                    (cannot open the device) is absent, every other but 0 is failed. From the
 *                    report: the status it gives, as it stands; ABSENT for a disk without a size
 *                    (a SAS disk then has info->dev.type 0) and for an enclosure that the report
 *                    does not have.
 * ZAV_RC_ERR_EINVAL  null pointer, type or partition (record untouched); minor type, model without
 *                    such disks or slot number (record filled with state 0; a SAS disk's with
 *                    ZAV_HDD_FOUND)
 * 0x1301             no known model; state 0
 * ZAV_RC_ERR         the node is there but not accessible (state ZAV_HDD_ABSENT), or no shell
 *                    could be started (state 0)
 * others             as updateData returns them; state ZAV_HDD_FOUND, which then means nothing
 *
 * Blocks about 20 seconds for an empty slot on the motherboard: a missing node is looked for three
 * times, 10 seconds apart, so that a disk just inserted is found. Otherwise as long as smartctl
 * takes, or until the report is free.
 */
int zavGetStateDisk(zavDevice *dev, zavHddState *info);

/** Readers by minor type. `info` comes with everything but the state filled in; those of the
 *  report fill the rest themselves too. ZAV_RC_ERR_EINVAL for null pointers. */
int getDiskStateSATA(zavDevice *dev, zavHddState *info);
int getDiskStateHWSATA(zavDevice *dev, zavHddState *info);
int getDiskStateSAS(zavDevice *dev, zavHddState *info);

/* ==== RAID state ==============================================================================*/

/**
 * Level, state, members and rebuild progress of an array. For a software array `dev` is
 * {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, n, 1}: array n from 1 to 4 is md<n-1>, built from partition n
 * of every disk of the model. The answer comes from "mdadm --detail" and /proc/mdstat. For an
 * iSCSI target {.., ZAV_MINDEV_RAID_ISCSI, n, 0} only the device node is looked for.
 *
 * A volume of the RAID controller is {.., ZAV_MINDEV_RAID_HW, n, 0} with n 1 or 2, on model 2980;
 * an expansion unit's is {.., ZAV_MINDEV_RAID_SAS, unit << 8 | 1, 0}. Its device node must be
 * there; everything else comes from the controller's report, see updateData.
 *
 * The state of a software array is one of ZAV_RAID_NORMAL, _DEGRADED, _FAILED, _RESYNC (a rebuild
 * runs or waits; it replaces the others) and _NOT_EXIST. A mirror is never FAILED. `resync` is the
 * progress in whole percent, 100 for levels without redundancy. `raidcount` and `hdddev` give the
 * model's full layout, lost members included. An iSCSI target that exists has state 0.
 *
 * State, `resync` and `raidcount` (disks of the RAID set) of a volume are the report's numbers as
 * they stand. Its level is ZAV_RAIDLVL_5 for the report's level 3, ZAV_RAIDLVL_1 for level 1
 * (ZAV_RAIDLVL_10 in a set of four), else ZAV_RAIDLVL_0. `hdddev` has the enclosure's four slots;
 * one whose disk has no size has type and minor type 0. ZAV_RAID_NOT_EXIST if the node or the
 * report's section is missing. The report is read once for the volume and again for every disk:
 * between these it may be rewritten.
 *
 * ZAV_RC_OK          as above; ZAV_RAID_NOT_EXIST comes with level ZAV_RAIDLVL_NONE
 * ZAV_RC_ERR_EINVAL  null pointer, types or model (record untouched); array or partition number
 *                    (filled, state 0; untouched for iSCSI, for the controller's volumes and for
 *                    a unit's partition); a RAID level the appliance does not build, such as
 *                    RAID6, or none told (filled, level NONE)
 * 0x1301             no known model; record untouched
 * ZAV_RC_ERR_ENOENT  /proc/mdstat cannot be opened; level filled
 * ZAV_RC_ERR         mdadm cannot be started; the node is there but not accessible (state
 *                    ZAV_RAID_NOT_EXIST); or the array's third line in /proc/mdstat is none the
 *                    appliance's kernel writes (a bitmap, a check, a pending resync): level and
 *                    state are filled, the members are not
 * others             as updateData returns them; state 0
 *
 * Blocks about 20 seconds for a missing node, see zavGetStateDisk. Otherwise as long as mdadm
 * takes, or until the report is free.
 */
int zavGetStateRaid(zavDevice *dev, zavRaidState *info);

/** Readers by minor type; they fill the whole record. getRaidStateHW answers on every model.
 *  ZAV_RC_ERR_EINVAL for null pointers. */
int getRaidStateSW(zavDevice *dev, zavRaidState *info);
int getRaidStateISCSI(zavDevice *dev, zavRaidState *info);
int getRaidStateHW(zavDevice *dev, zavRaidState *info);
int getRaidStateSAS(zavDevice *dev, zavRaidState *info);

/* ==== RAID controller and expansion units =====================================================
 *
 * An agent on the appliance writes what the RAID controller knows into /etc/Kiru/zav/.raidinfo: a
 * section for the controller itself ("PCI") and one for each expansion unit ("RBOD#1" to
 * "RBOD#7"). It and these functions take turns by the semaphore 0x6912: as long as somebody holds
 * it they wait, without a limit. They may be called from several threads at once.
 */

/**
 * What the report says of the enclosure that holds `dev`: RAID set, volumes, disks. The controller
 * for minor types ZAV_MINDEV_HDD_HWSATA and ZAV_MINDEV_RAID_HW, an expansion unit (bits 8 to 15 of
 * `disk`) for ZAV_MINDEV_HDD_SAS and ZAV_MINDEV_RAID_SAS; the other fields are not looked at.
 *
 * Sizes, levels and statuses are the report's own numbers. Volume n stands in sVolInfo[n-1], disk n
 * in sDiskInfo[n-1]; a volume that the report lacks is all zero, a disk has its number alone. The
 * set's `status` and the volumes' `scsiId` are not filled. At most six volumes and four disks of a
 * section are read.
 *
 * The section runs from the first line that contains the marker anywhere ("RBOD#1" is also found in
 * "RBOD#12") to the first that contains "H:". Without one, what follows counts too: the last RAID
 * set wins. Lines are read in pieces of 79 characters; a field of more than 15 runs into the next
 * of its line; names are cut to fit. A volume numbered 0 lands on the set's own fields, a disk
 * numbered 0 or less on the last volumes; a number that would land outside the record is ignored.
 *
 * ZAV_RC_OK                  filled
 * ZAV_RC_ERR_EINVAL          null pointer; minor type, unit number
 * ZAV_RC_ERR                 the semaphore cannot be had (logged)
 * ZAV_RC_ERR_READINFOFAIL    the report cannot be opened (logged)
 * ZAV_RC_ERR_ENODEV          no such section, or no RAID set in it
 *
 * In every failure the record is all zero.
 */
int updateData(zavDevice *dev, sRaidSetInfo *pRaidInfo);

/**
 * One reading of the hardware monitor: of an expansion unit (items 0 to 4; 0 is the temperature of
 * its processor in degrees Celsius, 4 that processor's voltage in volts), or of the controller card
 * (items 0 to 3). It is taken from the first line behind the enclosure's marker that begins with
 * "H": a section without one is given the next section's.
 *
 * ZAV_RC_OK          `*value` is the reading; 0 if the line has fewer. A unit without any monitor
 *                    line behind its marker reads 0 as well.
 * ZAV_RC_ERR_EINVAL  null pointer; no such item, `*value` is then 0. The item is looked at last.
 * ZAV_RC_ERR         the semaphore cannot be had (logged)
 * ZAV_RC_ERR_ENOENT  the report cannot be opened
 * ZAV_RC_ERR_ENODEV  the report does not have this enclosure, or has no monitor line for the
 *                    controller card
 *
 * But for a wrong item `*value` is untouched in every failure.
 */
int zavGetRBODHwMon(int rbodid, int item, float *value);
int zavGetRaidCardHwMon(int item, double *value);

/**
 * The expansion units that hang behind the controller now, unit n in element n-1: address, serial
 * number, model, numbers of the neighbours (parentid 0 is the controller, -1 means no unit on that
 * link; the numbers follow the place in the cascade: n/2 above, 2n and 2n+1 below). The list of
 * units and addresses is also written to /etc/Kiru/zav/.RBODinfo; a disk too full for it is not
 * reported.
 *
 * The cascade is what /usr/bin/query_sas.sh prints, of which at most seven expanders are taken; one
 * that unit 1 does not lead to, or that would be numbered above 7, is left out. Serial number and
 * model come from the report and are empty where it does not have the unit.
 *
 * The record is filled with bytes 0xFF first. An element without a unit has iExist 0 and stays so
 * in the rest.
 *
 * ZAV_RC_OK          filled; no units at all, and a script that is missing or prints nothing, are
 *                    no failure
 * ZAV_RC_ERR_EINVAL  null pointer
 * 32                 no pipe to the script
 * ZAV_RC_ERR         an expander has no upstream link (logged; no unit is filled); the report
 *                    could not be read (the units before are filled); .RBODinfo cannot be opened
 *                    (all are filled)
 *
 * Blocks as long as the script takes and until the report is free.
 */
int zavGetRBODSet(sRBODSet *RBODSet);

/**
 * Serial number and model of the unit pRBOD->rbodid into `sn` and `model`, from the lines between
 * the unit's marker and the first that begins with "I" in the controller's report, which is read
 * through "cat". What is too long is cut. What the report does not say stays as it was; a missing
 * report says nothing.
 *
 * ZAV_RC_OK          read
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR         the semaphore cannot be had (logged)
 * 32                 no pipe
 */
int zavGetRBODSN(sRBODMap *pRBOD);

/**
 * Numbers the expanders of a table of seven by their places in the cascade: with id 0 from the one
 * whose `id` is 1 downwards, otherwise from the one with the address `sasaddr` on, which becomes
 * unit `id`. A link that is empty or "0000000000000000", an address that is not in the table and a
 * number outside 1 to 7 end the numbering there. Always 0.
 */
int SetRBODID(sExpander *sep, char *sasaddr, int id);

/**
 * Fills the record of unit `id` from its expander and, serial number and model, from the
 * controller's report (zavGetRBODSN). ZAV_RC_ERR if that fails, the rest is filled then;
 * ZAV_RC_ERR_EINVAL for null pointers.
 */
int fillinfo(int id, sExpander *expander, sRBOD *rbod);

/**
 * The address in a line that /usr/bin/query_sas.sh prints: its fourth field between ":", "[" and
 * "]", cut to 19 characters. A line with fewer fields leaves `sasaddr`, 20 bytes, as it was.
 */
void getsasaddr(char *line, char *sasaddr);

/**
 * State of the expansion unit rbod->id, 1 to 7, seen by the sensor `sensorid`. Everything but the
 * number is found out anew (zavGetRBODSet) and told in info->rbod; a unit that is not there has
 * iExist 0.
 *
 * ZAV_RBOD_EXPANDER  ZAV_RBOD_EXIST or ZAV_RBOD_NOTEXIST
 * ZAV_RBOD_TEMP_CPU  `value` in degrees Celsius: below 75 ZAV_RBOD_NORMAL, from 75 on
 *                    ZAV_RBOD_WARN, from 85 on ZAV_RBOD_ALARM
 * ZAV_RBOD_VOLT_CPU  `value` in volts: between 1.08 and 1.32 ZAV_RBOD_NORMAL, up to 0.96 and from
 *                    1.44 on ZAV_RBOD_ALARM, in between ZAV_RBOD_WARN. A report's 1.08 is NORMAL,
 *                    its 1.32 is WARN, its 1.44 and 0.96 are ALARM (single precision).
 * any other          ZAV_RBOD_NORMAL
 *
 * ZAV_RC_OK          as above. A value of 0 may also be a monitor line that is missing.
 * ZAV_RC_ERR_EINVAL  null pointer, number of the unit; record untouched
 * ZAV_RC_ERR_ENOMEM  no memory; record untouched
 * others             as zavGetRBODSet and zavGetRBODHwMon return them; state ZAV_RBOD_NORMAL, which
 *                    then means nothing
 *
 * Blocks as long as zavGetRBODSet does.
 */
int zavGetStateRBOD(sRBOD *rbod, int sensorid, zavRBODState *info);

/* ==== Exchanging a disk =======================================================================
 *
 * These act on the running machine; none takes a lock, and nothing is rolled back when a later
 * step fails. Do not run two of them at the same time. They trust nothing a disk says about
 * itself: an array name read from a superblock goes to the shell as one word.
 */

/**
 * Takes the disk `diskdev`, a whole motherboard SATA disk, out of service: another healthy disk
 * must remain, the disk's partitions are failed and removed from their arrays (zavRmSWRaidDev:
 * what lives on an array without redundancy is destroyed), then the kernel forgets the disk
 * (zavHotCmd). A disk that has vanished already can still be taken out of its arrays.
 *
 * The code tells how the steps went, not what the arrays look like now: with an mdadm whose scan
 * prints no level word no member is removed, and the disk is detached all the same. Ask
 * zavGetStateRaid afterwards.
 *
 * ZAV_RC_OK          done
 * ZAV_RC_ERR_EINVAL  null pointer, types, partition, model (logged); slot number, or no other
 *                    healthy disk (silent): nothing was changed
 * ZAV_RC_ERR_ENOMEM  no memory; nothing was changed
 * ZAV_RC_ERR         the remaining disk's node cannot be opened, or mdadm finds its superblocks
 *                    inconsistent ("mismatch"): nothing was changed
 * 32                 mdadm cannot be started
 * others             as zavGetModelConfig, zavRmSWRaidDev and zavHotCmd return them
 *
 * Blocks 5 seconds and as long as zavRmSWRaidDev does, and about 20 seconds for every empty slot,
 * the disk's own included, before the first other healthy disk.
 */
int zavDiskHotRemove(zavDevice *diskdev);

/**
 * Brings the new disk `diskdev` into service. THE DISK IS WIPED. The first active member of
 * /dev/md0 tells the healthy disk whose partition table is copied; the disk is attached if the
 * kernel does not know it yet, marked as the appliance's (bytes 0x4D 0x10 at offset 440) and given
 * to zavAddSWRaidDev. The healthy disk is found through mdadm --detail and udevinfo. Make sure that
 * there is a disk: where no node comes up, the tools make a plain file of its name.
 *
 * ZAV_RC_OK          every step ran. The exit statuses of the wiping, copying and marking commands
 *                    are not looked at, nor whether the arrays took the disk: ask zavGetStateRaid.
 * ZAV_RC_ERR_EINVAL  null pointer, types, partition, slot, model; no active member of /dev/md0
 *                    found, or its disk has no name here, or it is the disk to add: nothing was
 *                    changed
 * ZAV_RC_ERR_ENOMEM  no memory; nothing was changed
 * ZAV_RC_ERR         the healthy disk's node cannot be opened; nothing was changed
 * others             as zavGetModelConfig, zavHotCmd and zavAddSWRaidDev return them
 *
 * Blocks 6 seconds, 10 more if the disk has to be attached, and as long as zavAddSWRaidDev does.
 */
int zavDiskHotAdd(zavDevice *diskdev);

/**
 * Takes the partitions of disk `tdev` out of the arrays in which `sdev`, a healthy disk, has the
 * partitions of the same numbers, from 15 down to 1. Both are whole SATA disks. Which array that
 * is, and its level, is asked of "mdadm --query --examine --scan"; a partition for which mdadm
 * names no array, no level, or a name of more than 31 characters is skipped.
 *
 * raid1, raid5, raid10: the member is failed and removed. If the target's partition has vanished,
 * the faulty member's device numbers are read from mdadm --detail and a node of these numbers,
 * /dev/sata/hotrmtmp, stands in for it; an array without a faulty spare is left as it is.
 * raid0, linear: volumes are unmounted and REMOVED, the volume group and the physical volume too,
 * and the array is stopped.
 *
 * ZAV_RC_OK          done, also if no partition needed work; what mdadm answers is not looked at
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR         the data RAID type is not known, or an array cannot be stopped
 * ZAV_RC_ERR_EBUSY   an array without redundancy is in use ("Error: ..." goes to standard output)
 * ZAV_RC_ERR_ENOMEM  no memory
 * 32                 a tool cannot be started
 * others             as zavGetStateLVM and zavGetPVsVG return them
 *
 * The first error ends the work; what was done stays done. Blocks 3 seconds per redundant array,
 * 2 per other array, and as long as zavGetStateLVM does for its group.
 */
int zavRmSWRaidDev(zavDevice *sdev, zavDevice *tdev);

/**
 * Adds the partitions of disk `tdev`, prepared like disk `sdev`, to the arrays of the source's
 * partitions, from 1 up to 15. A degraded or rebuilding array gets the partition as a member. A
 * failed or missing one is CREATED ANEW once all disks of the model are present, with partition 2
 * of every disk and the name MD1 whichever array it was, and "/usr/bin/hbqSetup.sh lvmrestore"
 * makes its volumes again; their content is lost. Where the source's partition belongs to no
 * array, hbqSetup.sh sets the array (unless the data RAID type is 1) and the volumes up.
 *
 * ZAV_RC_OK          done, also if nothing needed work; what the tools answer is not looked at
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR         the data RAID type is not known
 * ZAV_RC_ERR_ENOMEM  no memory
 * 32                 mdadm cannot be started; ends the work
 * others             as zavGetModelConfig returns them, or zavGetStateRaid's of an array that could
 *                    not be asked (the work goes on, and a later success makes it 0)
 *
 * Blocks as long as the tools take, 10 seconds more for an array that is created anew, and as long
 * as zavGetStateRaid does for each array.
 */
int zavAddSWRaidDev(zavDevice *sdev, zavDevice *tdev);

/**
 * Attaches (`cmd` 1) or detaches (`cmd` 2) the SATA disk in slot dev->disk, 1 to 4. Slot N is the
 * N-th host, by number, of the controller in /sys/devices/pci0000:00/0000:00:1f.2.
 *
 * ZAV_RC_OK          the line was given to the kernel; whether it took it is only logged
 * ZAV_RC_ERR_EINVAL  null pointer, types, command or slot
 * ZAV_RC_ERR_ENOENT  the controller's directory cannot be read
 * ZAV_RC_ERR_ENODEV  the controller has fewer hosts than that; nothing was written
 *
 * Does not wait for the node to come or go.
 */
int zavHotCmd(int cmd, zavDevice *dev);

/** Writes "scsi add-single-device H C I L" (`cmd` 1) or "scsi remove-single-device H C I L" (2) to
 *  /proc/scsi/scsi. Failures are logged only. */
void zavScsiCmd(int cmd, int host, int channel, int id, int lun);

/**
 * Detaches the disk in slot dev->disk, 1 to 4, through a shell pipeline, whose outcome is not
 * looked at, and waits 10 seconds. Does nothing for another slot or a null pointer. The pipeline
 * counts hosts with one digit only and, where the controller's directory has none, reaches HOST 0:
 * prefer zavHotCmd.
 */
void zavSATARemove(zavDevice *dev);

/**
 * Attaches the disk in slot dev->disk through a shell pipeline (see zavSATARemove), waits 20
 * seconds and reads the disk's mark (offset 440). A disk that carries the appliance's mark, 0x104D,
 * is refused: it is detached again, and only the log tells.
 *
 * 0                  attached, or detached again: marked, unreadable, or the attaching took 30
 *                    seconds or more
 * ZAV_RC_ERR_EINVAL  null pointer, types, model, slot: nothing was run
 * others             zavGetModelConfig's and zavDevToStr's codes; a positive errno when the node
 *                    cannot be opened or read at (detached again); a negated errno when there is
 *                    no time of day
 *
 * Blocks at least 20 seconds, 10 more when the disk is detached again.
 */
int zavSATARescan(zavDevice *dev);

/* ==== Logical volumes =========================================================================
 *
 * Volume group 0 is the system group "PrimaryOSVG", group N the data group "DataVG<N>". Addresses:
 *   group            {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, group, 0}
 *   logical volume   {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, n, group}: LogVol<n>
 *   physical volume  {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, n, group}: pv<n-1> of the metadata
 * Sizes are in GB of 2^30 bytes, rounded down and one added: 3 GB exactly read as 4. Usages are
 * percentages of the mounted file system. The answers come from the LVM tools in /usr/sbin.
 */

/**
 * State and layout of the volume group, physical volume or logical volume `dev`.
 *
 * Group (info->dev.lvmvgdev): size, counts, volumes; state ZAV_LVM_NORMAL, with ZAV_LVM_INACTIVE
 * when one of its logical volumes is; ZAV_LVM_FAILED when it does not answer; ZAV_LVM_NOT_EXIST.
 * Counts may exceed the tables, which hold the first 9 physical and 6 logical volumes.
 * Logical volume (lvmlvdev), 1 to 6 of the system group, 1 to 4 of a data group: state 0 when
 * present and healthy (NOT ZAV_LVM_NORMAL), ZAV_LVM_FULL above 90.0 % usage, ZAV_LVM_FAILED,
 * ZAV_LVM_INACTIVE, ZAV_LVM_NOT_EXIST. Sizes saturate at 1024 GB; 0 is not known.
 * Physical volume (lvmpvdev): size, group and the disk or array under it; ZAV_LVM_NORMAL,
 * ZAV_LVM_FAILED or ZAV_LVM_NOT_EXIST, by the state of what is under it and by pvs.
 *
 * ZAV_RC_OK            as above
 * ZAV_RC_ERR_EINVAL    null pointer, types (record untouched), number out of range
 * ZAV_RC_ERR_ENOENT    one of the six LVM tools is missing (record untouched)
 * ZAV_RC_ERR_ESTRPIPE  a tool cannot be started
 * 0x2801               a logical volume's mount point cannot be measured; everything else is filled
 * ZAV_RC_ERR           a lock, a tool's report or its file is not to be had; a physical volume lies
 *                      on a device whose address is not known (its entry keeps SATA disk 0); a
 *                      logical volume's node is not accessible. What was read is filled in.
 * others               of a physical volume: as zavGetStateDisk and zavGetStateRaid return them
 *
 * Queries of groups and physical volumes keep the tools' output in files of /etc/Kiru/zav (.vgs,
 * .vgdisplay.<group>, <group>) and hold semaphore 0x6911 meanwhile, for as long as another process
 * holds it waiting before. A missing volume's node is looked for three times, 10 seconds apart: a
 * logical volume blocks up to 20 seconds, a group that for every volume without a node.
 */
int zavGetStateLVM(zavDevice *dev, zavLVMState *info);

/** Readers by minor type. A null pointer is ZAV_RC_ERR_EINVAL; other checks are the caller's. */
int zavgetStateLVMVG(zavDevice *dev, zavLVMState *info);
int zavgetStateLVMLV(zavDevice *dev, zavLVMState *info);
int zavgetStateLVMPV(zavDevice *dev, zavLVMState *info);

/**
 * The mount point of the logical volume `dev`: "/mnt/prios/disk1p<n>" in the system group,
 * "/mnt/internal/data<group>-<n>" in a data group. `mntpath` must hold 42 bytes (30 for numbers of
 * up to five digits).
 *
 * ZAV_RC_OK, or ZAV_RC_ERR_EINVAL for a null pointer.
 */
int zavDevToMnt(zavDevice *dev, char *mntpath);

/**
 * Usage of the logical volume's file system in percent: what unprivileged users cannot have of all
 * its blocks; 0 for a file system without blocks. Whatever is mounted where the volume belongs is
 * measured, the directory's own file system if nothing is.
 *
 * ZAV_RC_OK, ZAV_RC_ERR_EINVAL for a null pointer, 0x2801 when the mount point cannot be measured
 * (`usage` is untouched).
 */
int zavgetFSusage(zavDevice *dev, float *usage);

/** The group's name: number 0 is "PrimaryOSVG", N "DataVG<N>". `strVGName` must hold 18 bytes.
 *  ZAV_RC_OK; ZAV_RC_ERR_EINVAL for ZAV_LVM_VG_NONE (-1, "ZAV_LVM_VG_NONE" is written) and for
 *  a null pointer. */
int zavMapVGToStr(int iVG, char *strVGName);

/** The number of a group's name, the reverse of zavMapVGToStr. "PrimaryOSVG" may stand anywhere in
 *  the text, "DataVG" must begin it. ZAV_RC_OK; ZAV_RC_ERR for another text or a null pointer,
 *  `*iVG` is untouched. */
int zavMapStrToVG(char *strVGName, int *iVG);

/** Turns a line "key = value # comment" of LVM's metadata into its value, in place. The value is
 *  cut at 79 characters; without a value the text becomes "". */
void zavParserLine1(char *pBuf);

/**
 * The name of the volume group that the physical volume at the device path `pvname` belongs to,
 * from pvdisplay; "NONE" for one that belongs to none. `vgname` must hold 128 bytes. The name is as
 * the disk tells it, and may hold any character but a blank: quote it before a shell sees it.
 *
 * ZAV_RC_OK, ZAV_RC_ERR_EINVAL for a null pointer, ZAV_RC_ERR_ENODEV when it is no physical volume,
 * 32 when pvdisplay cannot be started, ZAV_RC_ERR when it prints no group line.
 */
int zavGetPVsVG(char *pvname, char *vgname);

/** The same as an address: {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, group, 0}, group 99 for a name that is
 *  not one of the appliance's. Codes as zavGetPVsVG; `*vgdev` is untouched unless ZAV_RC_OK. */
int zavGetPVsVGDev(char *pvname, zavDevice *vgdev);

/** Are the LVM tools vgs, lvs, pvs, vgdisplay, lvdisplay and pvdisplay in /usr/sbin? ZAV_RC_OK, or
 *  ZAV_RC_ERR_ENOENT; the first that is missing is logged. */
int zavCheckExeFile(void);

/**
 * Makes `dev`, a whole SATA disk or an array, a physical volume of the group `lvmdev`, which
 * is created if it does not exist. The device must answer its state query; the state found does not
 * matter, and what is on the device is for pvcreate to notice.
 *
 * ZAV_RC_OK          done
 * ZAV_RC_ERR_EINVAL  null pointer, types; the state query fails (a partition has none); no path;
 *                    group -1 (the device is a physical volume by then)
 * ZAV_RC_ERR         pvcreate, vgcreate or vgextend failed (logged); after the first of them the
 *                    device stays a physical volume
 *
 * What vgcreate and vgextend print goes to the caller's standard output and error. Takes no lock:
 * do not run it while zavLVMHotRemove works on the group. Blocks as long as the tools and the state
 * query do.
 */
int zavLVMHotAdd(zavDevice *dev, zavDevice *lvmdev);

/**
 * Dismantles the group `lvmdev`. ITS VOLUMES ARE DESTROYED: every logical volume is unmounted and
 * removed, then the group, then the labels of its physical volumes.
 *
 * ZAV_RC_OK          done
 * ZAV_RC_ERR_EINVAL  null pointer, types, group -1
 * ZAV_RC_ERR_ENODEV  there is no such group; nothing was changed
 * ZAV_RC_ERR_EBUSY   a volume is mounted and in use; those before it are gone
 * ZAV_RC_ERR         a lock cannot be had; vgremove failed, the labels are still there; or a volume
 *                    or label could not be removed while the rest went on
 * others             as the query of the group returns them; nothing was changed
 *
 * Holds semaphore 0x3231, during the query also 0x6911. Blocks as long as the query and the tools.
 * vgremove asks on the caller's standard input when volumes are left: leave nothing there to read.
 */
int zavLVMHotRemove(zavDevice *lvmdev);

/* ==== Sensors =================================================================================
 *
 * The sensors of the appliance's own driver, small files under /proc/zav/sys/. The records can
 * travel as events. `state` is ZAV_SENSOR_NORMAL, _WARNING, _CRITICAL (also: an alarm is latched)
 * or _ERR (not known).
 */

/**
 * A temperature in degrees Celsius: probes 1 to 3 of the main board (sensor/tempLT, tempRT1,
 * tempRT2), and 4, the RAID controller's (zavGetRaidCardHwMon, item 0; model 2980). A probe is
 * WARNING from 65, 60, 90 and 90 on, CRITICAL from 75, 70, 100 and 95 on. An alarm that is latched
 * in the probe's status file is CRITICAL whatever the temperature.
 *
 * ZAV_RC_OK          filled
 * ZAV_RC_ERR_EINVAL  null pointer, probe number; record untouched
 * ZAV_RC_ERR_EACCES  a file cannot be opened or is empty (logged); the controller gives no reading
 * ZAV_RC_ERR_ENODEV  probe 4 on another model
 *
 * After the last two the state is ZAV_SENSOR_ERR and the value 0.
 */
int zavGetStateThermal(int probeno, zavThermalState *info);

/**
 * A voltage in volts: probes 1 to 5 (sensor/volVTT, vol18V, vol5V, vol12V, volVccp). CRITICAL at or
 * beyond 0.96 and 1.44, 1.44 and 2.16, 4.0 and 6.0, 9.6 and 14.4, 0.54 and 1.76; WARNING at or
 * beyond 1.08 and 1.32, 1.62 and 1.98, 4.5 and 5.5, 10.8 and 13.2, 0.6 and 1.6. A latched alarm is
 * CRITICAL; a status file that holds neither 0 nor 1 gives ZAV_SENSOR_ERR with ZAV_RC_OK. Codes as
 * for zavGetStateThermal.
 */
int zavGetStateVolt(int probeno, zavVoltageState *info);

/**
 * Clears the latched alarm of a probe. The RAID controller (thermal probe 4) has none: there the
 * answer tells whether it can be asked.
 *
 * ZAV_RC_OK          cleared
 * ZAV_RC_ERR_EINVAL  probe number
 * ZAV_RC_ERR_EACCES  the status file cannot be opened (logged) or written; no reading of the
 *                    controller
 */
int zavResetThermal(int probeno);
int zavResetVolt(int probeno);

/**
 * Speed of a fan as its file gives it now: fans 1, 2, 3 are the files sensor/fan2, fan3 and fan1,
 * fan 4 is the GPIO line 27, which is 1 while the fan turns.
 *
 * ZAV_RC_OK          read
 * ZAV_RC_ERR_EINVAL  null pointer, fan number
 * ZAV_RC_ERR_EACCES  the file cannot be opened or is empty (logged); `*fanspeed` is untouched
 */
int zavReadFanSpeed(int fan, float *fanspeed);

/**
 * State of a fan. NORMAL above its minimum (800, 1500, 1500, 0), CRITICAL at 0 and below, else
 * WARNING. One that is not above its minimum is read up to three times, 3 seconds apart, and the
 * last reading counts; fan 4 only if it reads below 0, 1 second apart.
 *
 * ZAV_RC_OK          filled
 * ZAV_RC_ERR_EINVAL  null pointer, fan number; record untouched
 * ZAV_RC_ERR_EACCES  as zavReadFanSpeed; state ZAV_SENSOR_ERR, the value means nothing
 *
 * Blocks about 6 seconds for a fan that is slow or stands still.
 */
int zavGetStateFan(int fan, zavFanState *info);

/**
 * The byte of the digital sensor ports (/proc/zav/sys/dev/serio/in), and the one to set (out).
 *
 * ZAV_RC_OK          read, or written
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR_EACCES  the file cannot be opened (logged), holds no hexadecimal number, or does not
 *                    take the byte (logged); `*state` is untouched
 */
int zavGetSensorIn(unsigned char *state);
int zavSetSensorOut(unsigned char *state);

/* ==== System load =============================================================================*/

/**
 * Load of the appliance's own computer in percent, by probe: 0x101 processor (measured over 10
 * seconds), 0x102 swap, and file systems: 0x103 "/", 0x105 "/var", 0x106 "/tmp", 0x107
 * "/mnt/buffer". The state is ZAV_SYSINFO_CRITICAL above 95, _WARNING above 90, else _NORMAL; for
 * swap above 10 and above 0.
 *
 * ZAV_RC_OK          filled
 * ZAV_RC_ERR_EINVAL  null pointer; another probe, 0x104 among them; record untouched
 * others             as cpuinfo, meminfo and fsinfo return them; value 0, ZAV_SYSINFO_ERR
 *
 * Blocks 10 seconds for the processor.
 */
int zavGetStateSysinfo(int probeno, zavSysinfoState *info);

/**
 * Use of the processor over `sec` seconds, from the counters for user, nice, system and idle time
 * in /proc/stat; others take no part. An interval in which nothing was counted is idle.
 *
 * ZAV_RC_OK          filled
 * ZAV_RC_ERR_EINVAL  null pointer, negative time
 * ZAV_RC_ERR_EACCES  /proc/stat cannot be opened (logged); record untouched
 */
int cpuinfo(pCpuInfo info, int sec);

/**
 * Memory (1) or swap (2) in use, in percent of all there is; 0 for any other number and where there
 * is none. Buffers and caches of the kernel count as memory in use. From /proc/meminfo.
 *
 * ZAV_RC_OK          measured
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR_ENOMEM  no memory
 * ZAV_RC_ERR_EACCES  /proc/meminfo cannot be opened (logged)
 *
 * `*usage` is untouched in every failure.
 */
int meminfo(int memno, float *usage);

/**
 * How full a file system is for ordinary users, in percent: 1 "/", 2 "/etc/Kiru", 3 "/var", 4
 * "/tmp", 5 "/mnt/buffer". An empty one is 0. It has to be listed in /etc/mtab under exactly that
 * name.
 *
 * ZAV_RC_OK          measured
 * ZAV_RC_ERR_EINVAL  null pointer, number
 * ZAV_RC_ERR_ENOMEM  no memory
 * ZAV_RC_ERR_EACCES  /etc/mtab cannot be opened (logged)
 * ZAV_RC_ERR_ENODEV  not mounted
 * ZAV_RC_ERR         statfs failed
 *
 * `*usage` is untouched in every failure.
 */
int fsinfo(int fsno, float *usage);

/* ==== LEDs ====================================================================================*/

/**
 * Sets or asks LED 1 to 6 of the front panel, a GPIO line each. States are ZAV_LED_OFF, ZAV_LED_ON
 * and, to be set for LED 5 only, ZAV_LED_VALUE2. zavGetLED returns the state or a code.
 *
 * ZAV_RC_OK          set
 * ZAV_RC_ERR_EINVAL  LED; state: its line has been opened for writing all the same
 * ZAV_RC_ERR_ENOENT  the line cannot be opened (logged)
 * ZAV_RC_ERR         it cannot be written or read (logged), or holds another number
 */
int zavSetLED(int led, int state);
int zavGetLED(int led);

/**
 * The same for the LEDs of disks 1 to 4, which are LEDs 7 to 10 and have two lines each. States are
 * ZAV_LED_OFF and ZAV_HDDLED_*. On model 2980 these LEDs belong to the controller: ZAV_RC_ERR,
 * whatever the arguments are.
 */
int zavSetHDDLED(int led, int state);
int zavGetHDDLED(int led);

/**
 * Hands an alarm to the LED-event driver (/dev/zavledevent), which makes a pattern of it; takes a
 * pending one from it.
 *
 * ZAV_RC_OK          done
 * 0x1201             zavLEDPollAlarm: none is pending; the record is all zero
 * ZAV_RC_ERR_EINVAL  zavLEDPollAlarm: null pointer
 * ZAV_RC_ERR_EACCES  the device cannot be opened (logged): it is missing, or somebody else has it
 * ZAV_RC_ERR_ENOMEM  zavLEDAlarm: the driver's queue is full (logged)
 * ZAV_RC_ERR         the driver refuses (logged)
 */
int zavLEDAlarm(int priority, int ledcode, int state);
int zavLEDPollAlarm(zavLEDEvent *ledevent);

/* ==== Events ==================================================================================
 *
 * The appliance's event driver keeps a queue of records and a private one. Its device,
 * /dev/zavevent0, is opened for each call, by one caller at a time: while somebody waits in
 * zavWaitEvent all others are told ZAV_RC_ERR_EACCES.
 */

/**
 * Takes the next event, if there is one, or the next private one. The record is cleared first.
 *
 * ZAV_RC_OK          taken; event->type tells which record it is
 * 0x1201             none is there; the record is all zero
 * ZAV_RC_ERR_EINVAL  null pointer; zavPollPrivateEvent logs it
 * ZAV_RC_ERR_EACCES  the device cannot be opened (logged); zavPollEvent leaves the record untouched
 * ZAV_RC_ERR         the driver answered with a number that it does not have (logged)
 */
int zavPollEvent(zavSystemEvent *event);
int zavPollPrivateEvent(zavSystemEvent *event);

/** The same, waiting until there is one; looked for once a second, without a limit. */
int zavWaitEvent(zavSystemEvent *event);

/**
 * Puts an event into the queue, as it stands.
 *
 * ZAV_RC_OK          put
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR_EACCES  the device cannot be opened (logged)
 * ZAV_RC_ERR_ENOMEM  the queue is full, as told by a driver that answers with the error itself
 *                    (logged)
 * ZAV_RC_ERR         refused, also because the queue is full
 */
int zavPushEvent(zavSystemEvent *event);

/* ==== UPS =====================================================================================*/

/**
 * Charge and state of the UPS: from /var/log/apcupsd.status, which the UPS daemon writes, or from
 * /var/log/zavapcupsd.event, which the appliance's hook writes, whichever is newer; the hook's if
 * both are of the same second. The state is ZAV_UPS_ONBATT, _ONLINE or _OTHER, or the hook's
 * number.
 *
 * ZAV_RC_OK          filled
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR_ENOMEM  no memory (logged)
 * ZAV_RC_ERR_ENODEV  the daemon does not run: it has no status file, or both files are more than 90
 *                    seconds old (logged)
 * ZAV_RC_ERR_EACCES  a file cannot be opened, is empty, or the hook's has fewer than two fields
 *                    (logged)
 * 42                 the status file lacks LINEV, BCHARGE or STATUS (logged)
 *
 * The record is untouched in every failure.
 */
int zavGetStateUPS(zavUpsState *info);

/* ==== Network interfaces ======================================================================*/

/**
 * Link and speed of an Ethernet port ({ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, n, 0}, n from 1 to 4 is
 * eth<n-1>) as ethtool tells them, or of a bond's active port (ZAV_MINDEV_NIC_BOND, n 1 or 2 is
 * bond<n-1>). `value` is 1000, 100 or 10 Mbit/s, 0 if not known. The state is ZAV_NET_UP, _DOWN
 * (also: a bond without an active port), _NOT_EXIST, or _ERR where ethtool tells no link.
 *
 * ZAV_RC_OK           as above
 * ZAV_RC_ERR_EINVAL   null pointer, type, minor type (logged, record untouched); number
 * ZAV_RC_ERR_ESTRPIPE no pipe to a tool
 * ZAV_RC_ERR_NIC      ethtool tells another speed, such as 2500 or 10000, or a link that is neither
 *                     yes nor no; the bond's active port is none of eth0 to eth3. What was read
 *                     before is filled.
 * ZAV_RC_ERR_ENODEV   the bonding driver does not name the active port: the bond is in a mode
 *                     without one
 *
 * Otherwise the record is filled with value 0 and ZAV_NET_ERR. Blocks as long as ethtool takes,
 * twice.
 */
int zavGetStateNic(zavDevice *dev, zavNetState *info);

/** Readers by minor type. `info` comes with everything filled in. */
int getNicStateETH(zavDevice *dev, zavNetState *info);
int getNicStateBOND(zavDevice *dev, zavNetState *info);

/* ==== Identity of an expansion unit ===========================================================
 *
 * The first volume of a unit, /dev/sasraid/r<id>disk1, carries the mark of the chassis that set it
 * up: 4 bytes at offset 440, the disk signature of its master boot record.
 */

/**
 * The mark of this chassis, 1 to 100000000: the digits of the board's serial number, others read as
 * 0, modulo 100000000, plus 1. A number beyond 2147483647 is read as that.
 *
 * ZAV_RC_OK          computed
 * ZAV_RC_ERR_EINVAL  null pointer
 * others             as zavGetSerialBIOS returns them (logged); `*ccv` is untouched
 */
int zavMapRBODCCV(int *ccv);

/**
 * Writes the mark, or compares the one that is there: `*state` is ZAV_IRBOD_SAME, _UNMARKED (0) or
 * _OTHER. rbod->id names the unit.
 *
 * 0       done
 * 22      null pointer
 * others  as zavMapRBODCCV returns them, or the error number of a failed system call (logged): 2
 * for a unit without a volume, 5 for a volume that ends before the mark
 *
 * `*state` is untouched in every failure. What was written has reached the kernel, not yet the
 * disk.
 */
int zavSetiRBOD(sRBOD *rbod);
int zavGetiRBOD(sRBOD *rbod, int *state);

/* ==== Optical burner ==========================================================================
 *
 * One drive, /dev/scd0, and one job at a time: all work files have fixed names below /tmp
 * (progress.outfile, dvd.outfile, cd.outfile, burnDir, linkDir). The library opens no link of these
 * names; the tools' own redirections rely on the kernel's fs.protected_symlinks. Sizes are in
 * kilobytes of 1024 bytes. The jobs run in the caller's thread; zavCDProgress and the cancel
 * functions are meant for another thread or process.
 */

/** Are cdrecord, mkisofs, growisofs, dvd+rw-mediainfo, dvd+rw-format, cdrwtool, pktsetup and
 * mkudffs on the search path? ZAV_RC_OK, or ZAV_RC_ERR. */
int checkExternalBin(void);

/**
 * Type, state and room of the disc in the drive, from dvd+rw-mediainfo, for a CD from cdrecord and
 * the drive itself. A writable DVD has 4590000 kilobytes in all, one of two layers 8347000,
 * whatever is on it; DVD-ROM and DVD-RAM have 0: their room is not known. Of an overwritable disc
 * (DVD+RW, restricted DVD-RW) everything is room that /media/cdrom does not use. The room may be
 * negative. `flag` has no meaning.
 *
 * ZAV_RC_OK          filled; without a disc ZAV_DISC_NONE, ZAV_DISC_STATE_UNKNOWN and no sizes
 * ZAV_RC_ERR_EINVAL  null pointer
 * ZAV_RC_ERR         no node of the drive, or dvd+rw-mediainfo writes nothing: record untouched;
 *                    cdrecord cannot read the CD: what was read before is filled
 * ZAV_RC_ERR_ENOENT  a tool's report cannot be opened, or is a link
 *
 * A report that names no sectors leaves the room at 0, or the state unknown.
 *
 * THIS CALL CAN END THE CALLING PROCESS while a CD is in the drive: with status 1 when the drive
 * cannot be opened or asked, with status 0 when wait_cmd does. Call it in a child process. The same
 * holds for everything below that queries the disc: zavCDBurn and its kin, zavCDBlank, zavCDFormat.
 *
 * Blocks as long as the tools do, which is some ten seconds after a disc was inserted.
 */
int zavQueryDisc(zavMediaInfo *info, int flag);

/** 0 for a drive that writes CDs but not DVD-R, 1 for others and when the kernel does not say;
 *  ZAV_RC_ERR_ENOENT without the kernel's table of drives. */
int zavIsComboDrive(void);

/** Opens the tray. Nothing tells whether it did. */
void zavEjectDVD(void);

/** Resets the drive; prints "CDROM Resetfailed" if that is refused. */
void cdrom_reset(void);

/** Makes the kernel detach the drive from its bus and attach it again. Does nothing when the kernel
 *  names no address for it. Nothing in the library calls it. */
void rm_add_odd(void);

struct cdrom_generic_command; /* linux/cdrom.h */

/**
 * Sends one packet command to the open drive `fd`: fills the timeout, buffer, length and direction
 * (CGC_DATA_*) into `cgc`, whose command bytes are the caller's. Returns what the ioctl does, -1
 * for a null `cgc`. A failure is told on standard error unless `quiet` is set. Sense data whose
 * byte 15 has its top bit set END THE CALLING PROCESS with status 0, after a line on standard
 * output.
 */
int wait_cmd(int fd, struct cdrom_generic_command *cgc, void *buffer, int buflen, int ddir,
             int timeout, int quiet);

/**
 * Burns the contents of the directory to the root of the disc, as ISO 9660 with Rock Ridge and
 * Joliet names; what symbolic links lead to is burned. Session types: 0 closes the disc, 1 leaves
 * it open for more or adds to it, 2 overwrites it from its start.
 *
 *               blank     appendable             complete   session types taken
 *   DVD-R, DVD+R, DVD+R DL, CD-R, CD-RW
 *               0, 1      1                      -
 *   DVD-RW      0         -                      -          sequential
 *   DVD-RW      any but 0 1, 2 (both overwrite)  1, 2       restricted overwrite
 *   DVD+RW      any but 0 1, 2                   1, 2
 *
 * ZAV_RC_OK            burned
 * ZAV_RC_ERR_EINVAL    null pointer; a session type that the disc does not take
 * ZAV_RC_ERR_ENOENT    the directory cannot be opened; a tool's report cannot be opened
 * ZAV_RC_ERR_BADDISC   the disc cannot take this session, or the drive not this disc
 * ZAV_RC_ERR_NODISC    no disc
 * ZAV_RC_ERR_EFBIG     too large: for the disc's total size (session types 0 and 2) or its room
 *                      (1); also a source that du does not measure
 * ZAV_RC_ERR_CDTOOL    cdrecord or mkisofs failed (the burn itself is logged), or told no number
 * ZAV_RC_ERR_BURNER    growisofs failed (logged)
 * ZAV_RC_ERR           the progress file cannot be written
 * others               as zavQueryDisc returns them
 *
 * growisofs asks before it overwrites data when a terminal is on its standard input. Blocks as long
 * as the burn takes, 4 seconds more after it, and as long as zavQueryDisc.
 */
int zavCDBurn(char *sourceDir, int sessionType);

/** The same, with the directory's contents below a directory `destDir` of the disc; "" is the root.
 *  `sourceDir` must be an absolute path then. Also ZAV_RC_ERR_EINVAL for a null pointer, a
 * backslash or slash in `destDir`, "." and "..", and when the link cannot be made. Call cleanUp
 * before if an earlier burn may have been killed: the link would be made beside what that left. */
int zavCDBurnEx(char *sourceDir, char *destDir, int sessionType);

/** Burns one file, absolute path, to the root of the disc, or into a directory of it, as a session
 *  of type 1. Codes as for zavCDBurn and zavCDBurnEx; ZAV_RC_ERR_ENOENT also for a file that cannot
 *  be read and a path without a slash. */
int zavCDBurnFile(char *filepath);
int zavCDBurnFileEx(char *filepath, char *destDir);

/**
 * Erases a rewritable disc: a CD quickly, a DVD by an empty file system, one that asks for it by a
 * full format before. Meanwhile a thread of the library writes a simulated progress.
 *
 * ZAV_RC_OK           erased, or blank already
 * ZAV_RC_ERR_BADDISC  not a rewritable disc; a DVD in a combo drive
 * ZAV_RC_ERR_NODISC   no disc
 * ZAV_RC_ERR_BLANK    a tool failed, or there is no thread to be had
 * ZAV_RC_ERR_EINVAL   a type of disc that is not known
 * ZAV_RC_ERR          the progress file cannot be written
 * others              as zavQueryDisc returns them
 *
 * The thread ends by itself, after 24 seconds for a CD, 9 for a DVD, 16 minutes for a format, and
 * is never waited for: until then it goes on writing the progress file. The process may end, and
 * the library be unloaded (it stays in memory), at any time. Blocks as long as the tools do, 3 to 5
 * seconds more for a DVD.
 */
int zavCDBlank(void);

/**
 * Prepares a disc for packet writing through /dev/pktcdvd/pktcdvd0: a DVD+RW or CD-RW gets an empty
 * UDF file system. Writes no progress.
 *
 * ZAV_RC_OK            formatted
 * ZAV_RC_ERR_PKTSETUP  the packet device cannot be set up
 * ZAV_RC_ERR_FORMAT    mkudffs or cdrwtool failed
 * ZAV_RC_ERR_BADDISC   any other disc, or none; the packet device stays set up
 * others               as zavQueryDisc returns them
 */
int zavCDFormat(void);

/**
 * Progress of the running job in percent, counted from where the first line of the progress file
 * began; the last line of it counts. 0 when there is no such file or it tells nothing, 100 after a
 * success. A simulator that goes on after its job's end takes the 100 back.
 */
int zavCDProgress(void);

/** Simulated progress, as zavCDBlank runs it in a thread: 24 lines 1 second apart, 96 lines 10
 *  seconds apart, 9 lines 1 second apart. Each blocks for its whole course. */
void setCDBlankProgress(void);
void setDVDBlankProgress(void);
void setDVDEmptyProgress(void);

/**
 * Kills every growisofs, cdrecord, mkisofs, dvd+rw-mediainfo and dvd+rw-format of the machine. The
 * job's own call then returns its failure code. zavCDBurnSyncCancel waits until none is running,
 * without a limit, looking every 3 seconds. Both always return ZAV_RC_OK.
 */
int zavCDBurnCancel(void);
int zavCDBurnSyncCancel(void);

/**
 * The number of the `_sequence`-th running process, from 1, with exactly this name, in the order in
 * which /proc lists them. The kernel keeps 15 characters of a name: a longer one is never found.
 * 1 if there is none; 22 for a null pointer or 0; 2 when /proc cannot be opened.
 */
unsigned long PIDOF(const char *_process_name, unsigned int _sequence);

/** Removes /tmp/burnDir, /tmp/linkDir and /tmp/zav.iso. */
void cleanUp(void);

#ifdef __cplusplus
}
#endif

#if defined(__GNUC__)
#    pragma GCC visibility pop
#endif

#endif
