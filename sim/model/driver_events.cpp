#include "model/driver_events.hpp"

#include "model/arrays.hpp"
#include "model/enclosures.hpp"
#include "model/sensors.hpp"
#include "model/ups.hpp"

#include "zav_event.h"

#include <cstring>
#include <fmt/format.h>
#include <map>

namespace zavsim {

namespace {

int disk_state(const Disk &disk) {
    return !disk.attached ? ZAV_HDD_ABSENT : disk.failing ? ZAV_HDD_FAILED : ZAV_HDD_FOUND;
}

int bay_state(const Bay &bay) {
    return bay.state == BayState::absent   ? ZAV_HDD_ABSENT
           : bay.state == BayState::failed ? ZAV_HDD_FAILED
                                           : ZAV_HDD_FOUND;
}

int array_state(const State &state, const Array &array) {
    if (is_failed(state, array))
        return ZAV_RAID_FAILED;
    const bool rebuilds = array.sync.running && array.sync.kind == SyncKind::recovery;
    return !is_degraded(array) ? ZAV_RAID_NORMAL
           : rebuilds          ? ZAV_RAID_DEGRADED | ZAV_RAID_RESYNC
                               : ZAV_RAID_DEGRADED;
}

void add_sensors(const State &state, std::vector<DriverEvent> &events) {
    for (int number = 1; number <= fans; ++number)
        events.push_back({"fan", number, fan_speed(state, number), fan_condition(state, number)});
    for (int number = 1; number <= thermal_probes; ++number)
        events.push_back(
            {"thermal", number, thermal_reading(state, number), thermal_condition(state, number)});
    for (int number = 1; number <= voltage_probes; ++number)
        events.push_back(
            {"voltage", number, voltage_reading(state, number), voltage_condition(state, number)});
}

void add_disks(const State &state, std::vector<DriverEvent> &events) {
    for (const Disk &disk : state.disks)
        events.push_back({"disk", disk.slot, 0, disk_state(disk)});
    if (state.controller)
        for (const Bay &bay : state.controller->enclosures.front().bays)
            events.push_back({"bay", bay.number, 0, bay_state(bay)});
}

int level_code(const std::string &level) {
    static const std::map<std::string, int> codes = {{"raid0", ZAV_RAIDLVL_0},
                                                     {"raid1", ZAV_RAIDLVL_1},
                                                     {"raid5", ZAV_RAIDLVL_5},
                                                     {"raid6", ZAV_RAIDLVL_6},
                                                     {"raid10", ZAV_RAIDLVL_10}};
    const auto found = codes.find(level);
    return found == codes.end() ? ZAV_RAIDLVL_NONE : found->second;
}

void add_arrays(const State &state, std::vector<DriverEvent> &events) {
    for (auto array = state.arrays.rbegin(); array != state.arrays.rend(); ++array)
        events.push_back({"array", array->minor + 1, static_cast<double>(level_code(array->level)),
                          array_state(state, *array)});
}

void add_ports(const State &state, std::vector<DriverEvent> &events) {
    int number = 0;
    for (const Port &port : state.network.ports)
        events.push_back({"port", ++number, port.link ? static_cast<double>(port.speed) : 0.0,
                          port.link ? ZAV_NET_UP : ZAV_NET_DOWN});
}

std::string key_of(const DriverEvent &event) {
    return fmt::format("{} {}", event.kind, event.number);
}

zavFanState sensor_record(int type, const DriverEvent &event) {
    return {type, event.number, static_cast<float>(event.value), event.state};
}

zavHddState disk_record(int minor_type, const DriverEvent &event) {
    return {ZAV_EVENT_HDD, {ZAV_DEV_HDD, minor_type, event.number, 0}, event.state};
}

zavRaidState array_record(const DriverEvent &event) {
    zavRaidState record = {};
    record.type = ZAV_EVENT_RAID;
    record.dev = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, event.number, 1};
    record.state = event.state;
    record.raidlevel = static_cast<int>(event.value);
    return record;
}

zavNetState port_record(const DriverEvent &event) {
    return {ZAV_EVENT_NET,
            {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, event.number, 0},
            static_cast<int>(event.value),
            event.state};
}

void fill(zavSystemEvent &record, const DriverEvent &event) {
    if (event.kind == "fan")
        record.fan = sensor_record(ZAV_EVENT_FAN, event);
    else if (event.kind == "thermal")
        record.therm = sensor_record(ZAV_EVENT_THERMAL, event);
    else if (event.kind == "voltage")
        record.volt = sensor_record(ZAV_EVENT_VOLTAGE, event);
    else if (event.kind == "ups")
        record.ups = {ZAV_EVENT_UPS, static_cast<float>(event.value), event.state};
    else if (event.kind == "disk")
        record.hdd = disk_record(ZAV_MINDEV_HDD_SATA, event);
    else if (event.kind == "bay")
        record.hdd = disk_record(ZAV_MINDEV_HDD_HWSATA, event);
    else if (event.kind == "array")
        record.raid = array_record(event);
    else
        record.net = port_record(event);
}

// The controller's disks are disks to whoever speaks of them.
bool is_meant(const DriverEvent &event, const Action &action) {
    const std::string kind = event.kind == "bay" ? "disk" : event.kind;
    return kind == action.text && event.number == action.number;
}

} // namespace

std::vector<DriverEvent> watched_states(const State &state) {
    std::vector<DriverEvent> events;
    add_sensors(state, events);
    events.push_back(
        {"ups", 0, charge_of(state), state.ups.on_battery ? ZAV_UPS_ONBATT : ZAV_UPS_ONLINE});
    add_disks(state, events);
    add_arrays(state, events);
    add_ports(state, events);
    return events;
}

void look_for_changes(State &state) {
    for (const DriverEvent &event : watched_states(state)) {
        const auto [known, is_new] = state.known_states.emplace(key_of(event), event.state);
        if (is_new || known->second != event.state)
            state.driver_events.push_back(event);
        known->second = event.state;
    }
}

void know_everything(State &state) {
    for (const DriverEvent &event : watched_states(state))
        state.known_states[key_of(event)] = event.state;
}

std::string put_event(State &state, const Action &action) {
    for (const DriverEvent &event : watched_states(state))
        if (is_meant(event, action)) {
            state.driver_events.push_back(event);
            return {};
        }
    return fmt::format("there is no {} {}", action.text, action.number);
}

std::string event_record(const DriverEvent &event) {
    zavSystemEvent record;
    std::memset(static_cast<void *>(&record), 0, sizeof record);
    fill(record, event);
    std::string bytes(sizeof record, '\0');
    std::memcpy(bytes.data(), &record, sizeof record);
    return bytes;
}

} // namespace zavsim
