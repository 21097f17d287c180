// What a sentence says, and what is done about it.
#pragma once

#include <string>

namespace zavsim {

// One sentence of the scenario language, taken apart.
struct Action {
    enum class Kind {
        disk_fails,
        disk_vanishes,
        disk_appears,
        disk_joins,
        disk_detaches,
        disk_attaches,
        array_checks,
        array_repairs,
        array_stops,
        volume_fills,
        volume_is_active,
        volume_is_inactive,
        volume_is_busy,
        volume_is_idle,
        tool_hangs,
        tool_prints,
        tool_exits,
        tool_fails,
        tool_is_missing,
        tool_works,
        raid_volume_degrades,
        raid_volume_fails,
        raid_volume_rebuilds,
        raid_volume_recovers,
        unit_vanishes,
        unit_appears,
        unit_loses_link,
        unit_finds_link,
        temperature_changes,
        voltage_changes,
        report_is_missing,
        report_is_truncated,
        report_is_garbled,
        report_rewrites,
        report_works,
        temperature_is,
        temperature_latches,
        temperature_faults,
        temperature_recovers,
        sensor_is_missing,
        sensor_works,
        voltage_is,
        voltage_latches,
        voltage_faults,
        voltage_recovers,
        fan_slows,
        fan_stops,
        fan_recovers,
        input_is,
        file_system_fills,
        processor_load_is,
        swap_use_is,
        power_fails,
        power_returns,
        ups_is_silent,
        ups_works,
        port_loses_link,
        port_gets_link,
        port_runs,
        bond_fails_over,
        event_is_put,
        drive_gets_disc,
        drive_loses_disc,
        drive_is_combo,
        drive_is_burner,
        drive_writes,
        drive_vanishes,
        drive_appears
    };
    Kind kind = Kind::disk_fails;
    int number = 0;   // disk, array, volume, sensor, fan or port, counted from 1
    int unit = 0;     // expansion unit; 0 for the controller
    double value = 0; // of a reading
    int group = 0;    // of the volume; 0 is the system's
    int percent = 0;
    std::string tool;
    double seconds = 0;
    std::string text;
    int status = 0;
};

} // namespace zavsim
