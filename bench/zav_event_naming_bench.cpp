// Device addresses to names and back, every form of a name.
#include "zav_api.h"

#include <benchmark/benchmark.h>
#include <string>

namespace {

struct Named {
    const char *form;
    const char *name;
    zavDevice dev;
};

constexpr Named kNames[] = {
    {"disk", "/dev/sata/disk3", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}},
    {"disk_partition", "/dev/sata/disk3p2", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 2}},
    {"controller_disk", "/dev/hwsata/disk5", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 5, 0}},
    {"internal_flash_disk", "/dev/iufd/disk1p1", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_IUFD, 1, 1}},
    {"external_flash_disk", "/dev/eufd/disk1p1", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_EUFD, 1, 1}},
    {"sas_disk", "/dev/sas/r1disk12p3", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x10c, 3}},
    {"software_array", "/dev/swraid/disk2p1", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1}},
    {"controller_volume", "/dev/hwraid/disk2p1", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 2, 1}},
    {"sas_volume", "/dev/sasraid/r2disk1p1", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 0x201, 1}},
    {"iscsi_target", "/dev/iscsiraid/disk4", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 4, 0}},
    {"system_group", "/dev/PrimaryOSVG", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 0, 0}},
    {"system_volume", "/dev/PrimaryOSVG/LogVol1", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 0}},
    {"data_group", "/dev/DataVG2", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 0}},
    {"data_volume", "/dev/DataVG2/LogVol3", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 3, 2}},
    {"ethernet", "eth3", {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 4, 0}},
    {"bond", "bond0", {ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, 1, 0}},
};

void name_of_address(benchmark::State &state, const Named &named) {
    zavDevice dev = named.dev;
    char label[50];
    for (auto _ : state) {
        if (zavDevToStr(label, sizeof label, &dev) != ZAV_RC_OK)
            state.SkipWithError("no name");
        benchmark::DoNotOptimize(label);
    }
}

void address_of_name(benchmark::State &state, const Named &named) {
    zavDevice dev;
    for (auto _ : state) {
        if (zavStrToDev(named.name, &dev) != ZAV_RC_OK)
            state.SkipWithError("no address");
        benchmark::DoNotOptimize(dev);
    }
}

void refuse_name(benchmark::State &state) {
    zavDevice dev;
    for (auto _ : state) {
        if (zavStrToDev("/dev/sata/disk3q2", &dev) != ZAV_RC_ERR_EINVAL)
            state.SkipWithError("not refused");
        benchmark::DoNotOptimize(dev);
    }
}
BENCHMARK(refuse_name)->Name("zavStrToDev/refused");

void name_of_array(benchmark::State &state) {
    char metadata[] = "ARRAY /dev/md/MD3 level=raid1 num-devices=4";
    char path[20];
    for (auto _ : state) {
        if (trans_mdname(metadata, path) != ZAV_RC_OK)
            state.SkipWithError("no name");
        benchmark::DoNotOptimize(path);
    }
}
BENCHMARK(name_of_array)->Name("trans_mdname");

bool register_forms() {
    for (const Named &named : kNames) {
        const std::string form = named.form;
        benchmark::RegisterBenchmark(("zavDevToStr/" + form).c_str(), name_of_address, named);
        benchmark::RegisterBenchmark(("zavStrToDev/" + form).c_str(), address_of_name, named);
    }
    return true;
}

[[maybe_unused]] const bool registered = register_forms();

} // namespace
