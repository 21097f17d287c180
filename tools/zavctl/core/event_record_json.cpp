#include "event_record_json.h"

#include "event_fields.h"

#include <algorithm>
#include <iterator>
#include <span>

namespace zavctl {

namespace {

// ---- Arrays. ----

void add_array(Json &json, const zavRaidState &array, const PathOf &path_of) {
    json["address"] = device_json(array.dev, path_of);
    add_coded(json, "level", array_levels(), array.raidlevel);
    json["member_count"] = array.raidcount;
    json["members"] = Json::array();
    const auto last = std::find_if(std::rbegin(array.hdddev), std::rend(array.hdddev),
                                   [](const zavDevice &member) { return member.type != 0; });
    for (const zavDevice *member = array.hdddev; member != last.base(); ++member)
        json["members"].push_back(device_json(*member, path_of));
    json["progress"] = number(array.resync);
}

void read_array(const Json &json, zavRaidState &array) {
    array.dev = device_of(json, "address");
    array.raidlevel = coded(json, "level", array_levels());
    array.raidcount = integer(json, "member_count");
    array.resync = real(json, "progress");
    const Json &members = list_in(json, "members", std::size(array.hdddev));
    for (std::size_t i = 0; i < members.size(); ++i)
        array.hdddev[i] = device_of(members[i]);
}

// ---- Volume groups and volumes. ----

Json pv_json(const lvmPV &pv, const PathOf &path_of) {
    return {{"object_code", pv.lvmtype},
            {"address", device_json(pv.lvmdev, path_of)},
            {"size", static_cast<std::uint64_t>(pv.size)},
            {"group", device_json(pv.vgdev, path_of)},
            {"device", device_json(pv.dev, path_of)}};
}

Json lv_json(const lvmLV &lv, const PathOf &path_of) {
    return {{"object_code", lv.lvmtype},
            {"address", device_json(lv.lvmdev, path_of)},
            {"size", static_cast<std::uint64_t>(lv.size)},
            {"usage", number(lv.usage)},
            {"group", device_json(lv.vgdev, path_of)}};
}

// As many entries as the count tells, of those that there can be.
template <class Entry, std::size_t size>
std::span<const Entry> counted_entries(const Entry (&table)[size], int count) {
    return {table, static_cast<std::size_t>(std::clamp(count, 0, static_cast<int>(size)))};
}

Json vg_json(const lvmVG &vg, const PathOf &path_of) {
    Json json = {{"object_code", vg.lvmtype},
                 {"address", device_json(vg.lvmdev, path_of)},
                 {"size", static_cast<std::uint64_t>(vg.size)},
                 {"physical_volume_count", vg.pvcount},
                 {"physical_volumes", Json::array()},
                 {"logical_volume_count", vg.lvcount},
                 {"logical_volumes", Json::array()}};
    for (const lvmPV &pv : counted_entries(vg.pvdev, vg.pvcount))
        json["physical_volumes"].push_back(pv_json(pv, path_of));
    for (const lvmLV &lv : counted_entries(vg.lvdev, vg.lvcount))
        json["logical_volumes"].push_back(lv_json(lv, path_of));
    return json;
}

void add_lvm(Json &json, const lvmDevice &device, const PathOf &path_of) {
    json["object"] = find_minor_type(device.lvmtype)->word;
    if (device.lvmtype == ZAV_MINDEV_LVM_VG)
        json.update(vg_json(device.lvmvgdev, path_of));
    else if (device.lvmtype == ZAV_MINDEV_LVM_PV)
        json.update(pv_json(device.lvmpvdev, path_of));
    else
        json.update(lv_json(device.lvmlvdev, path_of));
}

lvmPV read_pv(const Json &json, int type) {
    const int given = integer(json, "object_code");
    return {given == 0 ? type : given, device_of(json, "address"), size_in(json, "size"),
            device_of(json, "group"), device_of(json, "device")};
}

lvmLV read_lv(const Json &json, int type) {
    const int given = integer(json, "object_code");
    return {given == 0 ? type : given, device_of(json, "address"), size_in(json, "size"),
            real(json, "usage"), device_of(json, "group")};
}

void read_vg(const Json &json, lvmVG &vg) {
    const Json &pvs = list_in(json, "physical_volumes", std::size(vg.pvdev));
    const Json &lvs = list_in(json, "logical_volumes", std::size(vg.lvdev));
    vg.lvmdev = device_of(json, "address");
    vg.size = size_in(json, "size");
    vg.pvcount = integer(json, "physical_volume_count");
    vg.lvcount = integer(json, "logical_volume_count");
    for (std::size_t i = 0; i < pvs.size(); ++i)
        vg.pvdev[i] = read_pv(pvs[i], ZAV_MINDEV_LVM_PV);
    for (std::size_t i = 0; i < lvs.size(); ++i)
        vg.lvdev[i] = read_lv(lvs[i], ZAV_MINDEV_LVM_LV);
}

int lvm_type(const Json &json) {
    if (const int given = integer(json, "object_code"); given != 0)
        return given;
    const Json *object = field_of(json, "object");
    const MinorType *type = object != nullptr && object->is_string()
                                ? find_minor_type("lvm", object->get<std::string>())
                                : nullptr;
    if (type == nullptr)
        throw NoEvent("'object' is vg, pv or lv");
    return type->code;
}

void read_lvm(const Json &json, lvmDevice &device) {
    device.lvmtype = lvm_type(json);
    if (device.lvmtype == ZAV_MINDEV_LVM_VG)
        read_vg(json, device.lvmvgdev);
    else if (device.lvmtype == ZAV_MINDEV_LVM_PV)
        device.lvmpvdev = read_pv(json, ZAV_MINDEV_LVM_PV);
    else
        device.lvmlvdev = read_lv(json, ZAV_MINDEV_LVM_LV);
}

// ---- Expansion units. ----

void add_unit(Json &json, const zavRBODState &unit) {
    json["unit"] = unit.rbod.id;
    add_coded(json, "sensor", unit_sensors(), unit.id);
    json["value"] = number(unit.value);
    json["priority"] = unit.priority;
    json["present"] = unit.rbod.iExist;
    json["sas_address"] = text(unit.rbod.sasaddr);
    json["serial"] = text(unit.rbod.sn);
    json["model"] = text(unit.rbod.model);
    json["parent"] = unit.rbod.parentid;
    json["upper_child"] = unit.rbod.upperchildid;
    json["lower_child"] = unit.rbod.lowerchildid;
}

void read_unit(const Json &json, zavRBODState &unit) {
    unit.rbod.id = integer(json, "unit");
    unit.id = coded(json, "sensor", unit_sensors());
    unit.value = real(json, "value");
    unit.priority = integer(json, "priority");
    unit.rbod.iExist = integer(json, "present");
    read_text(json, "sas_address", unit.rbod.sasaddr);
    read_text(json, "serial", unit.rbod.sn);
    read_text(json, "model", unit.rbod.model);
    unit.rbod.parentid = integer(json, "parent");
    unit.rbod.upperchildid = integer(json, "upper_child");
    unit.rbod.lowerchildid = integer(json, "lower_child");
}

// ---- Discs. ----

void add_media(Json &json, const zavMediaInfo &media) {
    add_coded(json, "disc", disc_types(), media.discType);
    json["total_kb"] = media.discTotalSize;
    json["available_kb"] = media.discAvailableSize;
}

void read_media(const Json &json, zavMediaInfo &media) {
    media.discType = coded(json, "disc", disc_types());
    media.discTotalSize = integer(json, "total_kb");
    media.discAvailableSize = integer(json, "available_kb");
}

} // namespace

void add_record(Json &json, const zavSystemEvent &event, const PathOf &path_of) {
    switch (event.type) {
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        json["id"] = event.fan.id;
        json["value"] = number(event.fan.value);
        break;
    case ZAV_EVENT_UPS:
        json["charge"] = number(event.ups.charge);
        break;
    case ZAV_EVENT_RAID:
        add_array(json, event.raid, path_of);
        break;
    case ZAV_EVENT_HDD:
        json["address"] = device_json(event.hdd.dev, path_of);
        break;
    case ZAV_EVENT_DISC:
        add_media(json, event.media);
        break;
    case ZAV_EVENT_LVM:
        add_lvm(json, event.lvm.dev, path_of);
        break;
    case ZAV_EVENT_NET:
        json["address"] = device_json(event.net.dev, path_of);
        json["speed"] = event.net.value;
        break;
    case ZAV_EVENT_SYSINFO:
        add_coded(json, "probe", load_probes(), event.sysinfo.id);
        json["value"] = number(event.sysinfo.value);
        break;
    case ZAV_EVENT_RBOD:
        add_unit(json, event.rbod);
        break;
    default: // what has started has a number alone
        json["state"] = event.init.state;
        return;
    }
    add_coded(json, "state", states_of(event), state_of(event));
}

void read_record(const Json &json, zavSystemEvent &event) {
    switch (event.type) {
    case ZAV_EVENT_FAN:
    case ZAV_EVENT_THERMAL:
    case ZAV_EVENT_VOLTAGE:
        event.fan.id = integer(json, "id");
        event.fan.value = real(json, "value");
        break;
    case ZAV_EVENT_UPS:
        event.ups.charge = real(json, "charge");
        break;
    case ZAV_EVENT_RAID:
        read_array(json, event.raid);
        break;
    case ZAV_EVENT_HDD:
        event.hdd.dev = device_of(json, "address");
        break;
    case ZAV_EVENT_DISC:
        read_media(json, event.media);
        break;
    case ZAV_EVENT_LVM:
        read_lvm(json, event.lvm.dev);
        break;
    case ZAV_EVENT_NET:
        event.net.dev = device_of(json, "address");
        event.net.value = integer(json, "speed");
        break;
    case ZAV_EVENT_SYSINFO:
        event.sysinfo.id = coded(json, "probe", load_probes());
        event.sysinfo.value = real(json, "value");
        break;
    case ZAV_EVENT_RBOD:
        read_unit(json, event.rbod);
        break;
    default:
        event.init.state = integer(json, "state");
        return;
    }
    set_state(event, coded(json, "state", states_of(event)));
}

} // namespace zavctl
