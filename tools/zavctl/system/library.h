// The library's functions in C++ types: records and texts in and out, no buffers.
#pragma once

#include "../core/address.h"
#include "../core/answer.h"

#include "zav_api.h"

#include <optional>
#include <string>

namespace zavctl::library {

struct ModelConfig {
    int result = 0;
    int model = 0;
    int disk_slots = 0;
    int disk_count = 0;
};

struct NamedDevice {
    int result = 0;
    zavDevice device{};
};

struct DiskAnswer {
    int result = 0;
    zavHddState state{};
};

struct RaidAnswer {
    int result = 0;
    zavRaidState state{};
};

struct VolumeAnswer {
    int result = 0;
    zavLVMState state{};
};

// What the RAID controller's report says of an enclosure.
struct SetAnswer {
    int result = 0;
    sRaidSetInfo set{};
};

struct UnitsAnswer {
    int result = 0;
    sRBODSet units{};
};

struct UnitAnswer {
    int result = 0;
    zavRBODState state{};
};

struct ReadingAnswer {
    int result = 0;
    double value = 0;
};

ModelConfig model_config();
int data_raid_type();
std::optional<std::string> product_name();
std::optional<std::string> serial_number();

NamedDevice device_of(const std::string &path);
Address address_of(const zavDevice &device); // path "" if it has no name
int name_result(const zavDevice &device);    // what the library says to the conversion

DiskAnswer disk_state(const zavDevice &device);
RaidAnswer raid_state(const zavDevice &device);

// Of the enclosure that holds the device.
SetAnswer raid_set(const zavDevice &device);
UnitsAnswer expansion_units();
UnitAnswer unit_state(int unit, int sensor);
ReadingAnswer unit_reading(int unit, int item);
ReadingAnswer card_reading(int item);

// Of a group, a logical or a physical volume: see the record's `dev`.
VolumeAnswer volume_state(const zavDevice &device);
std::string mount_point(const zavDevice &volume);

// The group of the physical volume on the device, "" for one of none; nothing if the device is no
// physical volume.
std::optional<std::string> group_of_device(const std::string &path);

int ata_disk_count(); // 0 if it cannot be told

// What changes the machine: the library's codes.
int attach_disk(const zavDevice &disk);
int add_disk(const zavDevice &disk);
int remove_disk(const zavDevice &disk);
int add_to_group(const zavDevice &device, const zavDevice &group);
int remove_group(const zavDevice &group);

int save_bios(const std::string &file);
int load_bios(const std::string &file);

// The name of a result code and its meaning in words; nothing for ZAV_RC_OK.
std::optional<Failure> failure_of(int result);

} // namespace zavctl::library
