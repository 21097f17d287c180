// The exchange of a disk: what the library will do to this machine, decided before it does it.
// Facts in, a plan or the reasons against it out. Nothing here touches the system.
#pragma once

#include "array_report.h"
#include "array_table.h"
#include "disk_report.h"
#include "doctor.h"
#include "group_report.h"
#include "plan.h"
#include "volume_report.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// A volume, and who keeps it from being unmounted.
struct VolumeFact {
    VolumeReport report;
    std::string used_by; // "bash (812)", "" if nobody is known to
};

// What is known of one partition number of the healthy disk that the library compares with.
struct PartitionFact {
    int number = 0;
    bool on_target = false;           // the disk to be exchanged has a node of this number too
    std::string scan;                 // what mdadm says of the healthy disk's partition
    bool mismatch = false;            // mdadm calls its superblock inconsistent with its array
    std::string leads_to;             // the kernel's name of the array that the scan names: "md1"
    std::string holder;               // the kernel's name of the running array that it is in
    ArrayTable table;                 // of the holder
    ArrayReport array;                // what the library says about array `number`
    std::optional<GroupReport> group; // that lies on it
    std::vector<VolumeFact> volumes;  // of that group
};

// What a disk that comes in holds already, and how large it is.
struct TargetContent {
    std::vector<int> partitions;
    bool superblocks = false; // of an array
    bool marked = false;      // as a disk of an appliance
    bool smaller = false;     // than the disk whose partition table it gets
};

// What /proc/mdstat alone tells: mdadm may be silent about it.
struct Membership {
    int partition = 0;
    std::string array; // "md1"
};

struct ExchangeFacts {
    PlatformFacts platform;
    DiskReport target;
    std::vector<DiskReport> disks; // the others that the model's arrays use, by slot
    int source = 0;                // slot of the healthy disk that the library compares with
    std::vector<PartitionFact> partitions; // of the source, ascending
    std::vector<Membership> memberships;   // of the target
    TargetContent content;
    std::vector<std::string> groups_on_target; // that lie on the disk itself
    std::vector<std::string> missing_tools;    // that this exchange needs
    int ata_disks = 0;                         // in /proc/scsi/scsi
};

// What the user allows beyond an ordinary exchange.
struct Consent {
    bool destroy = false;  // volumes on arrays without redundancy
    bool recreate = false; // an empty data array in place of a failed one
};

Plan removal_plan(const ExchangeFacts &facts, const Consent &consent);
Plan addition_plan(const ExchangeFacts &facts, const Consent &consent);

// Why neither can be done on this machine, whatever its arrays are: the library would miss.
void refuse_unfit_machine(const ExchangeFacts &facts, Plan &plan);

// What the machine shows once the library has returned.
struct Aftermath {
    bool node_present = false;
    TargetContent content;
    std::vector<PartitionFact> partitions; // of the source, as far as the kernel and mdadm tell
    std::vector<int> groups;               // that vgs names
};

// What came of it. The library's code says how its steps went; arrays, device and mark decide.
Outcome removal_outcome(const Plan &plan, const ExchangeFacts &before, const Aftermath &after,
                        const std::optional<Failure> &failure);
Outcome addition_outcome(const Plan &plan, const ExchangeFacts &before, const Aftermath &after,
                         const std::optional<Failure> &failure);

// "array 2 (md1, RAID5)".
std::string array_words(const PartitionFact &partition);

// "1-1 (<3 GB, 40 % used, mounted at /mnt/internal/data1-1) and 1-2 (<2 GB, not mounted)".
std::string volumes_words(const std::vector<VolumeFact> &volumes);

} // namespace zavctl
