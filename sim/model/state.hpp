// The one model of the appliance's state. Plain values only: whatever acts on it is a function of
// (state, time), whatever shows it a function from state to text.
#pragma once

#include "model/health.hpp"
#include "model/optical.hpp"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace zavsim {

// What an array leaves on its members: by it a partition tells where it belonged.
struct Superblock {
    std::string uuid;
    int number = 0;
};

struct Partition {
    int number = 0;
    std::uint64_t start = 0; // first sector on the disk
    std::uint64_t kib = 0;
    std::optional<Superblock> superblock;
};

struct Disk {
    int slot = 0;          // 1 to 4, as on the front
    int host = 0;          // SCSI host of the slot's port
    std::string letter;    // kernel name without "sd"
    int serial = 0;        // tells a replacement from its predecessor
    bool inserted = false; // stands in the slot
    bool attached = false; // known to the kernel
    bool failing = false;  // health check fails
    std::uint64_t kib = 0;
    std::uint32_t label_id = 0;        // bytes 440 to 443, lowest first; the mark is the first two
    std::vector<Partition> partitions; // as the kernel knows them
    bool table_wiped = false;          // the table is gone, which the kernel has not noticed
    double settles = 0; // until this time udev reads the table again: no partition has a node
};

enum class Role { in_sync, rebuilding, spare, faulty };

// An array's hold on a partition; outlives the disk's node.
struct Member {
    int slot = 0;
    int serial = 0;
    std::string letter;
    int partition = 0;
    int number = 0;       // descriptor number, the [n] of mdstat
    int raid_device = -1; // place in the layout; -1 for none
    Role role = Role::in_sync;
};

enum class SyncKind { none, recovery, resync, repair, check };

struct Sync {
    SyncKind kind = SyncKind::none;
    int order = 0;      // who asked first runs first
    double started = 0; // appliance time at which it began to run; meaningful once running
    bool running = false;
    bool pending = false; // waits for the first write, the array being auto-read-only
    double done_kib = 0;
};

struct Array {
    int minor = 0;
    std::string name;  // in the superblock: MD0
    std::string level; // raid1, ...
    std::string metadata = "1.2";
    int raid_devices = 0;
    int chunk_kib = 0;
    std::uint64_t component_kib = 0;
    std::string uuid;
    double created = 0; // appliance time; negative: before this start
    double updated = 0;
    int events = 0;
    bool bitmap = false;
    bool dirty = false; // writes are under way
    bool inactive = false;
    bool auto_read_only = false;
    Sync sync;
    std::vector<Member> members; // in the kernel's order, newest first
};

// What a physical volume lies on: an array by its identifier, else a disk or a partition of one.
struct Ground {
    std::string array;
    int serial = 0;
    int partition = 0; // 0 for the whole disk
};

struct PhysicalVolume {
    std::string id;
    Ground ground;
    std::string group; // empty: belongs to none
    std::uint64_t sectors = 0;
    std::uint64_t first_sector = 0; // of the first extent
    int extents = 0;
};

struct Segment {
    std::string pv; // by identifier
    int first = 0;
    int extents = 0;
};

struct FileSystem {
    std::uint64_t kib = 0;
    std::uint64_t reserved_kib = 0; // not for ordinary users
    std::uint64_t used_kib = 0;
};

struct Volume {
    std::string name;
    std::string id;
    double created = 0;
    bool active = false;
    int minor = -1; // of the device-mapper node while active
    std::vector<Segment> segments;
    std::optional<FileSystem> file_system;
    std::string mount_point; // empty: not mounted
    bool busy = false;       // somebody works in the mounted file system
};

struct Group {
    std::string name;
    std::string id;
    int seqno = 1;
    std::vector<Volume> volumes;
};

// A place for a disk in an enclosure behind the RAID controller.
enum class BayState { found, absent, failed };

struct Bay {
    int number = 0; // 1 to 4
    int serial = 0; // of the disk, or of the last one that stood there
    BayState state = BayState::found;
    double gb = 0;
};

enum class RaidVolumeState { normal, degraded, rebuilding, failed };

// A volume that the RAID controller makes of an enclosure's disks.
struct RaidVolume {
    int number = 0;
    int serial = 0; // tells its node from every other
    std::string name;
    std::string level; // raid0, raid1, raid5, raid10
    double gb = 0;
    RaidVolumeState state = RaidVolumeState::normal;
    std::vector<int> stale;  // bays whose part of the volume is lost, or not rebuilt yet
    int rebuilt_bay = 0;     // whose part a rebuild restores; 0 when no bay's in particular
    double rebuild_left = 0; // appliance seconds
};

// Disks with a hardware monitor: the controller's own, or those of an expansion unit.
struct Enclosure {
    int number = 0;      // 0 is the controller's own; 1 to 7, a unit's place in the cascade
    bool present = true; // of itself, whatever it hangs on
    bool linked = true;  // its expander knows the upstream one
    std::string model;
    std::string serial;
    std::string address; // of a unit's expander
    std::string set_name;
    std::vector<Bay> bays;
    std::vector<RaidVolume> volumes;
    std::vector<double> readings; // of the hardware monitor
};

enum class ReportFault { none, missing, truncated, garbled };

// The hardware-RAID model's controller and what hangs on it.
struct Controller {
    std::vector<Enclosure> enclosures; // by number, also those that are not present
    ReportFault report_fault = ReportFault::none;
    int slow_rewrites = 0;      // of the report, asked for so far
    double rewrite_seconds = 0; // of the latest
};

struct ToolFault {
    std::string tool;
    double hangs = 0; // appliance seconds, each run
    std::optional<std::string> prints;
    std::optional<int> exits;
    std::optional<int> fails_at; // percent of its work
    bool missing = false;
};

struct Event {
    double at = 0;
    std::string sentence;
};

struct State {
    std::string model;
    std::string data_level; // of the data array that the setup script makes
    bool current_tools = false;
    bool hosts_below_ata = false; // in sysfs
    double time_scale = 1;
    double real_start = 0; // monotonic clock of the machine when the appliance started
    double now = 0;        // appliance time, seconds since start; the state holds for this moment
    double rebuild_kib_per_second = 0;
    int next_serial = 1;
    int next_sync_order = 1;
    int next_id = 1;            // of what gets an identifier while the appliance runs
    std::vector<Disk> disks;    // in the order in which the kernel found them
    std::vector<Array> arrays;  // newest first
    std::vector<Array> stopped; // known by what they left on their members
    std::vector<PhysicalVolume> physical_volumes; // a group's in the order in which it got them
    std::vector<Group> groups;                    // in the order in which they were made
    std::optional<Controller> controller;
    Sensors sensors;
    Registers registers;
    Load load;
    Ups ups;
    Network network;
    OpticalDrive drive;
    std::map<std::string, int> known_states; // that the driver last saw, by kind and number
    std::vector<DriverEvent> driver_events;  // that are not in the driver's queue yet
    std::vector<ToolFault> faults;
    std::vector<Event> scenario; // what is still to come, soonest first
    std::vector<int> scsi_hosts; // hosts with a device, in the order in which the kernel found them
    std::vector<std::string> notes; // what happened, not yet written to the log
};

} // namespace zavsim
