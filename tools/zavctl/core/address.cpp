#include "address.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>

namespace zavctl {

namespace {

constexpr std::string_view system_group = "PrimaryOSVG";
constexpr std::string_view data_group = "DataVG";

bool is_unit_device(int minor_type) {
    return minor_type == ZAV_MINDEV_HDD_SAS || minor_type == ZAV_MINDEV_RAID_SAS;
}

std::string storage_in_words(const zavDevice &device, const MinorType &minor) {
    std::string whole = fmt::format("{} {}", minor.meaning, device.disk);
    if (is_unit_device(device.minor_type))
        whole = fmt::format("{} {} of unit {}", minor.meaning, device.disk & 0xFF,
                            (device.disk >> 8) & 0xFF);
    return device.part == 0 ? whole : fmt::format("partition {} of {}", device.part, whole);
}

std::string volume_in_words(const zavDevice &device) {
    switch (device.minor_type) {
    case ZAV_MINDEV_LVM_VG:
        return "volume group " + group_name(device.disk);
    case ZAV_MINDEV_LVM_LV:
        return fmt::format("logical volume {} of group {}", device.disk, group_name(device.part));
    default:
        return fmt::format("physical volume {} of group {}", device.disk, group_name(device.part));
    }
}

} // namespace

const std::vector<MinorType> &minor_types() {
    static const std::vector<MinorType> table = {
        {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, "hdd", "sata", "SATA disk"},
        {ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, "hdd", "hwsata", "RAID controller disk"},
        {ZAV_DEV_HDD, ZAV_MINDEV_HDD_IUFD, "hdd", "iufd", "internal USB flash disk"},
        {ZAV_DEV_HDD, ZAV_MINDEV_HDD_EUFD, "hdd", "eufd", "external USB flash disk"},
        {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, "hdd", "sas", "SAS disk"},
        {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, "raid", "sw", "software array"},
        {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, "raid", "hw", "RAID controller volume"},
        {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, "raid", "sas", "SAS volume"},
        {ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, "raid", "iscsi", "iSCSI target"},
        {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, "lvm", "vg", "volume group"},
        {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, "lvm", "pv", "physical volume"},
        {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, "lvm", "lv", "logical volume"},
        {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, "nic", "eth", "Ethernet port"},
        {ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, "nic", "bond", "bond"},
    };
    return table;
}

const MinorType *find_minor_type(const std::string &type_word, const std::string &word) {
    for (const MinorType &minor : minor_types())
        if (type_word == minor.type_word && word == minor.word)
            return &minor;
    return nullptr;
}

const MinorType *find_minor_type(int code) {
    for (const MinorType &minor : minor_types())
        if (code == minor.code)
            return &minor;
    return nullptr;
}

std::vector<std::string> type_words() {
    std::vector<std::string> words;
    for (const MinorType &minor : minor_types())
        if (std::find(words.begin(), words.end(), minor.type_word) == words.end())
            words.emplace_back(minor.type_word);
    return words;
}

std::vector<std::string> minor_words(const std::string &type_word) {
    std::vector<std::string> words;
    for (const MinorType &minor : minor_types())
        if (type_word == minor.type_word)
            words.emplace_back(minor.word);
    return words;
}

std::string group_name(int number) {
    return number == 0 ? std::string(system_group) : fmt::format("{}{}", data_group, number);
}

std::optional<int> group_number(std::string_view name) {
    if (name == system_group)
        return 0;
    if (!name.starts_with(data_group))
        return std::nullopt;
    const std::string_view digits = name.substr(data_group.size());
    int number = 0;
    const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number);
    const bool whole = error == std::errc() && end == digits.data() + digits.size();
    if (!whole || number < 1 || digits.front() == '0')
        return std::nullopt;
    return number;
}

std::string in_words(const zavDevice &device) {
    const MinorType *minor = find_minor_type(device.minor_type);
    if (minor == nullptr)
        return "";
    if (minor->type == ZAV_DEV_LVM)
        return volume_in_words(device);
    if (minor->type == ZAV_DEV_NIC)
        return fmt::format("{} {}{}", minor->meaning, minor->word, device.disk - 1);
    return storage_in_words(device, *minor);
}

Json to_json(const Address &address) {
    const MinorType *minor = find_minor_type(address.device.minor_type);
    Json json;
    json["type"] = minor == nullptr ? Json(nullptr) : Json(minor->type_word);
    json["minor_type"] = minor == nullptr ? Json(nullptr) : Json(minor->word);
    json["disk"] = address.device.disk;
    json["part"] = address.device.part;
    json["path"] = address.path.empty() ? Json(nullptr) : Json(address.path);
    return json;
}

} // namespace zavctl
