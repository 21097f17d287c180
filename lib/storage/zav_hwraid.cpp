// Disks and volumes behind the hardware RAID controller. Its report is not read yet: until then
// these readers know none of them and refuse.
#include "zav_api.h"

int getDiskStateHWSATA(zavDevice *, zavHddState *) {
    return ZAV_RC_ERR_EINVAL;
}

int getDiskStateSAS(zavDevice *, zavHddState *) {
    return ZAV_RC_ERR_EINVAL;
}

int getRaidStateHW(zavDevice *, zavRaidState *) {
    return ZAV_RC_ERR_EINVAL;
}

int getRaidStateSAS(zavDevice *, zavRaidState *) {
    return ZAV_RC_ERR_EINVAL;
}
