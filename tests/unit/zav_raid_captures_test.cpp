// Arrays as today's kernel and mdadm show them (tests/data/captures).
#include "harness.h"

namespace {

struct Capture {
    const char *folder;
    int array;
    int rc;
    int state;
    int level;
    float resync;
    int members = 4;
    const char *detail = nullptr; // mdadm's answer, if it is not that of the array in this folder
};

std::ostream &operator<<(std::ostream &out, const Capture &capture) {
    return out << capture.folder << " array " << capture.array;
}

class CapturedArray : public harness::Appliance, public testing::WithParamInterface<Capture> {};

TEST_P(CapturedArray, IsRead) {
    const Capture &expected = GetParam();
    if (expected.members == 4)
        four_disk_model();
    else
        two_disk_model();
    const std::string folder = std::string("captures/") + expected.folder;
    const std::string name = "md" + std::to_string(expected.array - 1);
    put("/dev/swraid/disk" + std::to_string(expected.array) + "p1", "");
    put("/proc/mdstat", harness::data(folder + "/mdstat.txt"));
    tool("/sbin/mdadm",
         harness::data(expected.detail != nullptr ? std::string("captures/") + expected.detail
                                                  : folder + "/mdadm-detail-" + name + ".txt"));

    zavDevice dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, expected.array, 1};
    zavRaidState info;
    EXPECT_EQ(zavGetStateRaid(&dev, &info), expected.rc);
    EXPECT_EQ(info.state, expected.state);
    EXPECT_EQ(info.raidlevel, expected.level);
    EXPECT_EQ(info.resync, expected.resync);
    const bool filled = expected.rc == ZAV_RC_OK;
    EXPECT_EQ(info.hdddev[0].disk, filled ? 1 : 0);
    EXPECT_EQ(info.hdddev[expected.members - 1].disk, filled ? expected.members : 0);
}

constexpr int kOk = ZAV_RC_OK;
constexpr int kErr = ZAV_RC_ERR;

const Capture kCaptures[] = {
    {"healthy-4disk", 1, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_1, 0},
    {"healthy-4disk", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0},
    {"healthy-4disk", 3, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_1, 0},
    {"member-failed", 1, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_1, 0},
    {"member-failed", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 0},
    {"member-failed-after-r", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 0},
    {"degraded-3disk", 1, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_1, 0},
    {"degraded-3disk", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 0},
    {"degraded-3disk", 3, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_1, 0},
    {"disk-vanished", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_5, 0},
    {"raid5-two-lost", 2, kOk, ZAV_RAID_FAILED, ZAV_RAIDLVL_5, 0},
    {"resyncing", 1, kOk, ZAV_RAID_RESYNC, ZAV_RAIDLVL_1, 3},
    {"resyncing", 2, kOk, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 0},
    {"resyncing-data", 2, kOk, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 0},
    {"raid10-healthy", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_10, 0},
    {"raid10-one-lost", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_10, 0},
    {"raid10-two-lost", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_10, 0},
    // Today's kernel keeps three members active when a whole pair is lost.
    {"raid10-pair-lost", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_10, 0},
    {"level-raid0", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_0, 100, 4, "level-raid0/mdadm-detail.txt"},
    {"level-linear", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_JBOD, 100, 4,
     "level-linear/mdadm-detail.txt"},
    {"level-raid10", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_10, 0, 4,
     "level-raid10/mdadm-detail.txt"},
    {"level-raid6", 2, ZAV_RC_ERR_EINVAL, 0, ZAV_RAIDLVL_NONE, 0, 4,
     "level-raid6/mdadm-detail.txt"},
    {"metadata-0.90", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0, 4,
     "metadata-0.90/mdadm-detail.txt"},
    {"two-disk-healthy", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_1, 0, 2},
    {"two-disk-degraded", 2, kOk, ZAV_RAID_DEGRADED, ZAV_RAIDLVL_1, 0, 2},
    // What the appliance's own kernel never writes is refused.
    {"internal-bitmap", 2, kErr, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0},
    {"checking", 2, kErr, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0},
    {"repairing", 2, kOk, ZAV_RAID_RESYNC, ZAV_RAIDLVL_5, 0, 4, "checking/mdadm-detail-md1.txt"},
    {"two-disk-resync-pending", 2, kErr, ZAV_RAID_RESYNC, ZAV_RAIDLVL_1, 0, 2},
    {"large-120g-raid5", 2, kErr, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0, 4,
     "large-120g-raid5/mdadm-detail.txt"},
    {"large-120g-raid5-no-bitmap", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0, 4,
     "large-120g-raid5-no-bitmap/mdadm-detail.txt"},
    {"large-120g-raid10-no-bitmap", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_10, 0, 4,
     "large-120g-raid10-no-bitmap/mdadm-detail.txt"},
    {"large-3t-raid5-64k-no-bitmap", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0, 4,
     "large-3t-raid5-64k-no-bitmap/mdadm-detail.txt"},
    // A status line of 79 characters leaves its line feed for the third line.
    {"large-3t-raid5-no-bitmap", 2, kErr, ZAV_RAID_NORMAL, ZAV_RAIDLVL_5, 0, 4,
     "large-3t-raid5-no-bitmap/mdadm-detail.txt"},
    {"large-3t-raid10-no-bitmap", 2, kOk, ZAV_RAID_NORMAL, ZAV_RAIDLVL_10, 0, 4,
     "large-3t-raid10-no-bitmap/mdadm-detail.txt"},
};

INSTANTIATE_TEST_SUITE_P(Captures, CapturedArray, testing::ValuesIn(kCaptures));

} // namespace
