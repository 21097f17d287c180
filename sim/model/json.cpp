#include "model/json.hpp"

#include <nlohmann/json.hpp>

namespace nlohmann {

template <typename Value>
struct adl_serializer<std::optional<Value>> {
    static void to_json(json &out, const std::optional<Value> &value) {
        out = value ? json(*value) : json(nullptr);
    }
    static void from_json(const json &in, std::optional<Value> &value) {
        value = in.is_null() ? std::nullopt : std::optional<Value>(in.get<Value>());
    }
};

} // namespace nlohmann

namespace zavsim {

// cppcheck-suppress unknownMacro
NLOHMANN_JSON_SERIALIZE_ENUM(Role, {{Role::in_sync, "in sync"},
                                    {Role::rebuilding, "rebuilding"},
                                    {Role::spare, "spare"},
                                    {Role::faulty, "faulty"}})
NLOHMANN_JSON_SERIALIZE_ENUM(SyncKind, {{SyncKind::none, "none"},
                                        {SyncKind::recovery, "recovery"},
                                        {SyncKind::resync, "resync"},
                                        {SyncKind::repair, "repair"},
                                        {SyncKind::check, "check"}})
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Superblock, uuid, number)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Partition, number, start, kib, superblock)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Disk, slot, host, letter, serial, inserted, attached, failing,
                                   kib, label_id, partitions, table_wiped, settles)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Member, slot, serial, letter, partition, number, raid_device,
                                   role)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Sync, kind, order, started, running, pending, done_kib)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Array, minor, name, level, metadata, raid_devices, chunk_kib,
                                   component_kib, uuid, created, updated, events, bitmap, dirty,
                                   inactive, auto_read_only, sync, members)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Ground, array, serial, partition)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(PhysicalVolume, id, ground, group, sectors, first_sector,
                                   extents)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Segment, pv, first, extents)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(FileSystem, kib, reserved_kib, used_kib)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Volume, name, id, created, active, minor, segments, file_system,
                                   mount_point, busy)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Group, name, id, seqno, volumes)
NLOHMANN_JSON_SERIALIZE_ENUM(BayState, {{BayState::found, "found"},
                                        {BayState::absent, "absent"},
                                        {BayState::failed, "failed"}})
NLOHMANN_JSON_SERIALIZE_ENUM(RaidVolumeState, {{RaidVolumeState::normal, "normal"},
                                               {RaidVolumeState::degraded, "degraded"},
                                               {RaidVolumeState::rebuilding, "rebuilding"},
                                               {RaidVolumeState::failed, "failed"}})
NLOHMANN_JSON_SERIALIZE_ENUM(ReportFault, {{ReportFault::none, "none"},
                                           {ReportFault::missing, "missing"},
                                           {ReportFault::truncated, "truncated"},
                                           {ReportFault::garbled, "garbled"}})
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Bay, number, serial, state, gb)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(RaidVolume, number, serial, name, level, gb, state, stale,
                                   rebuilt_bay, rebuild_left)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Enclosure, number, present, linked, model, serial, address,
                                   set_name, bays, volumes, readings)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Controller, enclosures, report_fault, slow_rewrites,
                                   rewrite_seconds)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(ToolFault, tool, hangs, prints, exits, fails_at, missing)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Event, at, sentence)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Probe, value, status, missing)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Sensors, temperatures, voltages, fans, input)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Load, processor, swap, file_systems, since, busy_before)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Ups, silent, on_battery, charge, since, status_at,
                                   status_on_battery, status_charge, statuses, event_at,
                                   event_state, event_charge, events)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Port, link, speed, failures)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Network, ports, bonded, active)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(DriverEvent, kind, number, value, state)
NLOHMANN_JSON_SERIALIZE_ENUM(MediumType,
                             {{MediumType::cd_rom, "CD-ROM"},
                              {MediumType::cd_r, "CD-R"},
                              {MediumType::cd_rw, "CD-RW"},
                              {MediumType::dvd_rom, "DVD-ROM"},
                              {MediumType::dvd_minus_r, "DVD-R"},
                              {MediumType::dvd_ram, "DVD-RAM"},
                              {MediumType::dvd_minus_rw_restricted, "DVD-RW restricted"},
                              {MediumType::dvd_minus_rw_sequential, "DVD-RW sequential"},
                              {MediumType::dvd_plus_rw, "DVD+RW"},
                              {MediumType::dvd_plus_r, "DVD+R"},
                              {MediumType::dvd_plus_r_double, "DVD+R double"}})
NLOHMANN_JSON_SERIALIZE_ENUM(DiscState, {{DiscState::blank, "blank"},
                                         {DiscState::appendable, "appendable"},
                                         {DiscState::complete, "complete"},
                                         {DiscState::unknown, "unknown"}})
NLOHMANN_JSON_SERIALIZE_ENUM(DiscJobKind, {{DiscJobKind::write, "write"},
                                           {DiscJobKind::overwrite, "overwrite"},
                                           {DiscJobKind::erase, "erase"},
                                           {DiscJobKind::format, "format"},
                                           {DiscJobKind::empty, "empty"}})
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(DiscFile, path, bytes)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(DiscSession, start, sectors, complete, merges, files)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(Medium, type, state, sessions)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(DiscJob, tool, process, kind, started, seconds, closes, session)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(OpticalDrive, present, attached, combo, speed, packet_device,
                                   medium, job)
NLOHMANN_DEFINE_TYPE_NON_INTRUSIVE(State, model, data_level, current_tools, hosts_below_ata,
                                   time_scale, real_start, now, rebuild_kib_per_second, next_serial,
                                   next_sync_order, next_id, disks, arrays, stopped,
                                   physical_volumes, groups, controller, sensors, registers, load,
                                   ups, network, drive, known_states, driver_events, faults,
                                   scenario, scsi_hosts, notes)

std::string to_text(const State &state) {
    // A garbled tool text may hold any bytes.
    return nlohmann::json(state).dump(2, ' ', false, nlohmann::json::error_handler_t::replace) +
           "\n";
}

State state_from_text(const std::string &text) {
    return nlohmann::json::parse(text).get<State>();
}

} // namespace zavsim
