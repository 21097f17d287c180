#include "zav_raid_query.h"

#include "common/node.h"

namespace zav {

zavRaidState undecided_raid(const zavDevice &dev, int member_minor_type) {
    zavRaidState state = {};
    state.type = ZAV_EVENT_RAID;
    state.dev = dev;
    state.raidlevel = ZAV_RAIDLVL_NONE;
    for (zavDevice &member : state.hdddev)
        member.minor_type = member_minor_type;
    return state;
}

bool raid_node_present(const char *function, const char *kind, const char *path, int &state,
                       int &rc) {
    const NodeProbe probe = probe_node(function, path);
    if (probe.result == NodeProbe::Result::kPresent)
        return true;
    state = ZAV_RAID_NOT_EXIST;
    rc = ZAV_RC_ERR;
    if (probe.result == NodeProbe::Result::kMissing) {
        log_missing_node(function, kind, path, probe.error);
        rc = ZAV_RC_OK;
    }
    return false;
}

} // namespace zav
