/* Tells how an array is: array_state /dev/swraid/disk2p1
 * Exit status: 0 well, 1 not well, 2 no answer. */
#include <zav_api.h>

#include <stdio.h>
#include <string.h>

static const char *words(int state) {
    if (state & ZAV_RAID_NOT_EXIST)
        return "does not exist";
    if (state & ZAV_RAID_FAILED)
        return "failed, data is lost";
    if (state & ZAV_RAID_RESYNC)
        return "rebuilding";
    if (state & ZAV_RAID_DEGRADED)
        return "degraded, a disk is missing";
    return "normal";
}

int main(int argc, char **argv) {
    zavDevice array;
    zavRaidState info;
    char name[128]; /* holds every name of a code */

    if (argc != 2 || zavStrToDev(argv[1], &array) != ZAV_RC_OK) {
        fprintf(stderr, "usage: array_state /dev/swraid/diskNp1\n");
        return 2;
    }
    const int rc = zavGetStateRaid(&array, &info);
    if (rc != ZAV_RC_OK) {
        fprintf(stderr, "%s: no answer, 0x%x %s\n", argv[1], rc, zav_rcdef_to_str(rc, name));
        return 2;
    }
    printf("%s: %s", argv[1], words(info.state));
    if (!(info.state & ZAV_RAID_NOT_EXIST)) /* then there is a level: "ZAV_RAIDLVL_5" */
        printf(", RAID %s of %d disks",
               zav_raidleveldef_to_str(info.raidlevel, name) + strlen("ZAV_RAIDLVL_"),
               info.raidcount);
    if (info.state & ZAV_RAID_RESYNC)
        printf(", %.0f %% done", (double)info.resync);
    printf("\n");
    return info.state == ZAV_RAID_NORMAL ? 0 : 1;
}
