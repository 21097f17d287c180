/* What the RAID controller's report says: a RAID set, its volumes and its disks. Sizes, levels and
   statuses are the report's own numbers. */
#ifndef ZAV_HWRAID_H
#define ZAV_HWRAID_H

#ifdef __cplusplus
extern "C" {
#endif

typedef struct sPhyDiskInfo {
    int disknum;
    float disksize;
    int status;
} sPhyDiskInfo;

typedef struct sVolSetInfo {
    int volnum;
    char volname[17];
    int raidlevel; /* the controller's own: 0 striped, 1 mirrored, 3 with parity */
    float volsize;
    int scsiId;
    int progress;
    int status;
} sVolSetInfo;

typedef struct sRaidSetInfo {
    int raidnum;
    char raidname[17];
    float raidsize;
    int diskcount;
    char diskmember[5];
    int status;
    sVolSetInfo sVolInfo[16];
    sPhyDiskInfo sDiskInfo[4];
} sRaidSetInfo;

#ifdef __cplusplus
}
#endif

#endif
