/* The device address: what every function of libzav is asked about. */
#ifndef ZAV_H
#define ZAV_H

#ifdef __cplusplus
extern "C" {
#endif

/* Device types. */
#define ZAV_DEV_HDD 1
#define ZAV_DEV_RAID 2
#define ZAV_DEV_LVM 4
#define ZAV_DEV_NIC 8

/* Minor types: the device type times 0x100 plus an ordinal. */
#define ZAV_MINDEV_HDD_SATA 0x101   /* disk on a motherboard SATA port */
#define ZAV_MINDEV_HDD_HWSATA 0x102 /* disk behind the RAID controller */
#define ZAV_MINDEV_HDD_IUFD 0x103   /* internal USB flash disk */
#define ZAV_MINDEV_HDD_EUFD 0x104   /* external USB flash disk */
#define ZAV_MINDEV_HDD_SAS 0x105    /* disk in an expansion unit */
#define ZAV_MINDEV_RAID_SW 0x201    /* Linux software array */
#define ZAV_MINDEV_RAID_HW 0x202    /* volume of the RAID controller */
#define ZAV_MINDEV_RAID_SAS 0x203   /* volume of an expansion unit */
#define ZAV_MINDEV_RAID_ISCSI 0x204 /* iSCSI target */
#define ZAV_MINDEV_LVM_VG 0x401     /* volume group */
#define ZAV_MINDEV_LVM_PV 0x402     /* physical volume */
#define ZAV_MINDEV_LVM_LV 0x403     /* logical volume */
#define ZAV_MINDEV_NIC_ETH 0x801    /* Ethernet port */
#define ZAV_MINDEV_NIC_BOND 0x802   /* bond of Ethernet ports */

/*
 * Address of a device. What `disk` and `part` mean depends on the minor type:
 *
 *   disks, arrays        disk: slot or array number from 1; part: partition, 0 for the whole
 *   SAS disks, volumes   disk: unit number << 8 | disk or volume number; part: partition or 0
 *   volume group         disk: group number, 0 for PrimaryOSVG, n for DataVGn; part: 0
 *   logical volume       disk: volume number; part: number of its group
 *   network interface    disk: interface number from 1 (1 is eth0 or bond0); part: 0
 */
typedef struct zavDevice {
    int type;       /* ZAV_DEV_* */
    int minor_type; /* ZAV_MINDEV_* */
    int disk;
    int part;
} zavDevice;

#ifdef __cplusplus
}
#endif

#endif
