#include "event.h"

#include "address.h"
#include "slot_id.h"
#include "text.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <vector>

namespace zavctl {

namespace {

// "not_exist" is a word for files, "not exist" one for people.
std::string spoken(std::string words) {
    std::replace(words.begin(), words.end(), '_', ' ');
    return words;
}

std::string state_text(const States &states, int code) {
    std::string text;
    for (const char c : spoken(word_of(states, code)))
        text += c == ',' ? ", " : std::string(1, c);
    if (severity_of(states, code) == Severity::unknown)
        text += fmt::format(" (state {})", code);
    return text;
}

// "disk 3", "array 2-1": as the disk or array is named at the command line.
std::string slot_name(const std::string &noun, const zavDevice &device) {
    return noun + " " + in_words(slot_id(device));
}

bool is_named_by_slot(const zavDevice &device) {
    switch (device.minor_type) {
    case ZAV_MINDEV_HDD_SATA:
    case ZAV_MINDEV_HDD_HWSATA:
    case ZAV_MINDEV_HDD_SAS:
        return device.part == 0;
    case ZAV_MINDEV_RAID_SW:
    case ZAV_MINDEV_RAID_HW:
    case ZAV_MINDEV_RAID_SAS:
        return true;
    default:
        return false;
    }
}

std::string enclosure_of(const zavDevice &device) {
    switch (device.minor_type) {
    case ZAV_MINDEV_HDD_SATA:
        return "the machine";
    case ZAV_MINDEV_HDD_HWSATA:
        return "the RAID controller";
    default:
        return fmt::format("unit {}", slot_id(device).unit);
    }
}

std::string address_text(const zavDevice &device) {
    if (find_minor_type(device.minor_type) != nullptr)
        return in_words(device);
    return fmt::format("device {}/{} {} {}", device.type, device.minor_type, device.disk,
                       device.part);
}

std::string disk_subject(const zavDevice &device) {
    return is_named_by_slot(device) ? slot_name("disk", device) : address_text(device);
}

std::string disk_text(const zavHddState &disk) {
    const std::string name =
        is_named_by_slot(disk.dev)
            ? fmt::format("disk {} of {}", slot_id(disk.dev).number, enclosure_of(disk.dev))
            : address_text(disk.dev);
    return name + ": " + state_text(disk_states(), disk.state);
}

std::string array_subject(const zavDevice &device) {
    return is_named_by_slot(device) ? slot_name("array", device) : address_text(device);
}

std::string array_text(const zavRaidState &array) {
    std::string state = state_text(array_states(), array.state);
    if ((array.state & ZAV_RAID_RESYNC) != 0) {
        const std::size_t at = state.find("resync");
        state.replace(at, 6, fmt::format("rebuilding {:g} %", array.resync));
    }
    return array_subject(array.dev) + ": " + state;
}

std::string with_value(const std::string &state, float value, const char *unit) {
    return fmt::format("{}, {:g} {}", state, value, unit);
}

const char *unit_of_sensor(int type) {
    if (type == ZAV_EVENT_FAN)
        return "rpm";
    return type == ZAV_EVENT_THERMAL ? "C" : "V";
}

std::string sensor_text(const zavFanState &sensor) {
    return fmt::format("{} {}: {}", word_of(event_types(), sensor.type), sensor.id,
                       with_value(state_text(sensor_states(), sensor.state), sensor.value,
                                  unit_of_sensor(sensor.type)));
}

std::string load_subject(int probe) {
    const std::string word = word_of(load_probes(), probe);
    if (word == "unknown")
        return fmt::format("load probe {:#x}", probe);
    return word.starts_with("/") ? "file system " + word : word;
}

const zavDevice &lvm_device(const zavLVMState &lvm) {
    switch (lvm.dev.lvmtype) {
    case ZAV_MINDEV_LVM_PV:
        return lvm.dev.lvmpvdev.lvmdev;
    case ZAV_MINDEV_LVM_LV:
        return lvm.dev.lvmlvdev.lvmdev;
    default:
        return lvm.dev.lvmvgdev.lvmdev;
    }
}

std::string lvm_subject(const zavLVMState &lvm) {
    const zavDevice &device = lvm_device(lvm);
    switch (lvm.dev.lvmtype) {
    case ZAV_MINDEV_LVM_VG:
        return fmt::format("volume group {}", device.disk);
    case ZAV_MINDEV_LVM_PV:
        return fmt::format("physical volume {}-{}", device.part, device.disk);
    case ZAV_MINDEV_LVM_LV:
        return fmt::format("volume {}-{}", device.part, device.disk);
    default:
        return fmt::format("LVM object of type {}", lvm.dev.lvmtype);
    }
}

std::string lvm_text(const zavSystemEvent &event) {
    const zavLVMState &lvm = event.lvm;
    std::string text = lvm_subject(lvm) + ": " + state_text(states_of(event), lvm.state);
    if (lvm.dev.lvmtype == ZAV_MINDEV_LVM_LV)
        text += fmt::format(", {:g} % used", lvm.dev.lvmlvdev.usage);
    return text;
}

std::string network_subject(const zavDevice &device) {
    if (device.minor_type == ZAV_MINDEV_NIC_ETH || device.minor_type == ZAV_MINDEV_NIC_BOND)
        return fmt::format("{}{}", device.minor_type == ZAV_MINDEV_NIC_ETH ? "eth" : "bond",
                           static_cast<long>(device.disk) - 1);
    return address_text(device);
}

std::string network_text(const zavNetState &net) {
    const std::string text =
        network_subject(net.dev) + ": " + state_text(network_states(), net.state);
    return net.value == 0 ? text : fmt::format("{}, {} Mbit/s", text, net.value);
}

std::string unit_subject(const zavRBODState &unit) {
    if (unit.id == ZAV_RBOD_EXPANDER)
        return fmt::format("unit {}", unit.rbod.id);
    const std::string sensor = word_of(unit_sensors(), unit.id);
    return sensor == "unknown" ? fmt::format("unit {} sensor {:#x}", unit.rbod.id, unit.id)
                               : fmt::format("unit {} {}", unit.rbod.id, sensor);
}

std::string unit_text(const zavRBODState &unit) {
    std::string text = unit_subject(unit) + ": " + state_text(unit_states(), unit.state);
    if (unit.id != ZAV_RBOD_TEMP_CPU && unit.id != ZAV_RBOD_VOLT_CPU)
        return text;
    return with_value(text, unit.value, unit.id == ZAV_RBOD_TEMP_CPU ? "C" : "V");
}

std::string media_text(const zavMediaInfo &media) {
    constexpr int kilobytes_per_megabyte = 1024;
    if (media.discType == ZAV_DISC_NONE)
        return "optical drive: no disc";
    return fmt::format(
        "optical drive: {}, {}, {} MB, {} MB available", state_text(disc_types(), media.discType),
        state_text(disc_states(), media.discState), media.discTotalSize / kilobytes_per_megabyte,
        media.discAvailableSize / kilobytes_per_megabyte);
}

int *state_place(zavSystemEvent &event) {
    switch (event.type) {
    case ZAV_EVENT_INIT:
        return &event.init.state;
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        return &event.fan.state;
    case ZAV_EVENT_UPS:
        return &event.ups.state;
    case ZAV_EVENT_RAID:
        return &event.raid.state;
    case ZAV_EVENT_HDD:
        return &event.hdd.state;
    case ZAV_EVENT_DISC:
        return &event.media.discState;
    case ZAV_EVENT_LVM:
        return &event.lvm.state;
    case ZAV_EVENT_NET:
        return &event.net.state;
    case ZAV_EVENT_SYSINFO:
        return &event.sysinfo.state;
    case ZAV_EVENT_RBOD:
        return &event.rbod.state;
    default:
        return nullptr;
    }
}

// The raw words, up to the last that is not zero.
std::string unknown_text(const zavSystemEvent &event) {
    int words[sizeof event / sizeof(int)];
    std::memcpy(words, &event, sizeof words);
    const auto last =
        std::find_if(std::rbegin(words), std::rend(words) - 1, [](int word) { return word != 0; });
    return fmt::format("event of unknown type {}: {}", event.type,
                       fmt::join(std::begin(words), last.base(), " "));
}

} // namespace

std::string event_type_word(const zavSystemEvent &event) {
    return word_of(event_types(), event.type);
}

std::string event_subject(const zavSystemEvent &event) {
    switch (event.type) {
    case ZAV_EVENT_INIT:
        return "initialisation";
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        return fmt::format("{} {}", event_type_word(event), event.fan.id);
    case ZAV_EVENT_UPS:
        return "UPS";
    case ZAV_EVENT_RAID:
        return array_subject(event.raid.dev);
    case ZAV_EVENT_HDD:
        return disk_subject(event.hdd.dev);
    case ZAV_EVENT_DISC:
        return "optical drive";
    case ZAV_EVENT_LVM:
        return lvm_subject(event.lvm);
    case ZAV_EVENT_NET:
        return network_subject(event.net.dev);
    case ZAV_EVENT_SYSINFO:
        return load_subject(event.sysinfo.id);
    case ZAV_EVENT_RBOD:
        return unit_subject(event.rbod);
    default:
        return fmt::format("type {}", event.type);
    }
}

std::string event_text(const zavSystemEvent &event) {
    switch (event.type) {
    case ZAV_EVENT_INIT:
        return fmt::format("initialisation: state {}", event.init.state);
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        return sensor_text(event.fan);
    case ZAV_EVENT_UPS:
        return "UPS: " +
               with_value(state_text(ups_states(), event.ups.state), event.ups.charge, "%");
    case ZAV_EVENT_RAID:
        return array_text(event.raid);
    case ZAV_EVENT_HDD:
        return disk_text(event.hdd);
    case ZAV_EVENT_DISC:
        return media_text(event.media);
    case ZAV_EVENT_LVM:
        return lvm_text(event);
    case ZAV_EVENT_NET:
        return network_text(event.net);
    case ZAV_EVENT_SYSINFO:
        return load_subject(event.sysinfo.id) + ": " +
               with_value(state_text(load_states(), event.sysinfo.state), event.sysinfo.value, "%");
    case ZAV_EVENT_RBOD:
        return unit_text(event.rbod);
    default:
        return unknown_text(event);
    }
}

const States &states_of(const zavSystemEvent &event) {
    static const States none{{}, false};
    switch (event.type) {
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        return sensor_states();
    case ZAV_EVENT_UPS:
        return ups_states();
    case ZAV_EVENT_RAID:
        return array_states();
    case ZAV_EVENT_HDD:
        return disk_states();
    case ZAV_EVENT_LVM:
        return event.lvm.dev.lvmtype == ZAV_MINDEV_LVM_LV ? volume_states() : group_states();
    case ZAV_EVENT_NET:
        return network_states();
    case ZAV_EVENT_SYSINFO:
        return load_states();
    case ZAV_EVENT_RBOD:
        return unit_states();
    case ZAV_EVENT_DISC:
        return disc_states();
    default:
        return none;
    }
}

int state_of(const zavSystemEvent &event) {
    zavSystemEvent copy = event;
    const int *place = state_place(copy);
    return place == nullptr ? 0 : *place;
}

void set_state(zavSystemEvent &event, int state) {
    if (int *place = state_place(event); place != nullptr)
        *place = state;
}

Severity event_severity(const zavSystemEvent &event) {
    if (event.type == ZAV_EVENT_INIT)
        return Severity::ok;
    if (event.type == ZAV_EVENT_DISC && event.media.discType == ZAV_DISC_NONE)
        return Severity::ok;
    return severity_of(states_of(event), state_of(event));
}

} // namespace zavctl
