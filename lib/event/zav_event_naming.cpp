// Device addresses and the names of their device files: the one place where this grammar lives.
#include "common/text.h"
#include "zav_api.h"

#include <climits>
#include <cstdio>
#include <cstring>

namespace {

// How a name goes on after its prefix.
enum class Form {
    kDisk,        // "/dev/sata/disk" 3 ["p" 2]
    kSas,         // "/dev/sas/r" 1 "disk" 2 ["p" 3]
    kDataGroup,   // "/dev/DataVG" 2 ["/LogVol" 3]
    kSystemGroup, // "/dev/PrimaryOSVG" ["/LogVol" 1]
    kInterface,   // "eth" 0
};

struct Kind {
    const char *prefix;
    Form form;
    int type;
    int minor_type; // 0 where the rest of the name decides
};

// In the order in which a name is matched.
constexpr Kind kKinds[] = {
    {"/dev/iufd/disk", Form::kDisk, ZAV_DEV_HDD, ZAV_MINDEV_HDD_IUFD},
    {"/dev/eufd/disk", Form::kDisk, ZAV_DEV_HDD, ZAV_MINDEV_HDD_EUFD},
    {"/dev/sata/disk", Form::kDisk, ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA},
    {"/dev/hwsata/disk", Form::kDisk, ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA},
    {"/dev/sas/r", Form::kSas, ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS},
    {"/dev/swraid/disk", Form::kDisk, ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW},
    {"/dev/hwraid/disk", Form::kDisk, ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW},
    {"/dev/sasraid/r", Form::kSas, ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS},
    {"/dev/iscsiraid/disk", Form::kDisk, ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI},
    {"/dev/PrimaryOSVG", Form::kSystemGroup, ZAV_DEV_LVM, 0},
    {"/dev/DataVG", Form::kDataGroup, ZAV_DEV_LVM, 0},
    {"eth", Form::kInterface, ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH},
    {"bond", Form::kInterface, ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND},
};

constexpr const char *kVolume = "LogVol";
constexpr size_t kLongestName = 128;

const Kind *kind_of_address(const zavDevice &dev) {
    for (const Kind &kind : kKinds)
        if (kind.type == dev.type && kind.minor_type == dev.minor_type)
            return &kind;
    return nullptr;
}

const Kind *kind_of_name(const char *label) {
    for (const Kind &kind : kKinds)
        if (zav::starts_with(label, kind.prefix))
            return &kind;
    return nullptr;
}

// ---- Address to name. The prefix is followed by up to three numbers. ----

bool compose_volume(char *name, const zavDevice &dev) {
    const bool volume = dev.minor_type == ZAV_MINDEV_LVM_LV;
    if (!volume && dev.minor_type != ZAV_MINDEV_LVM_VG)
        return false; // physical volumes have no name of their own
    const int group = volume ? dev.part : dev.disk;
    char path[32] = "/dev/PrimaryOSVG";
    if (group > 0)
        snprintf(path, sizeof path, "/dev/DataVG%d", group);
    if (volume)
        snprintf(name, kLongestName, "%s/%s%d", path, kVolume, dev.disk);
    else
        zav::copy_text(name, kLongestName, path);
    return true;
}

bool compose_interface(char *name, const Kind &kind, const zavDevice &dev) {
    if (dev.disk < 1)
        return false;
    snprintf(name, kLongestName, "%s%d", kind.prefix, dev.disk - 1);
    return true;
}

bool compose_disk(char *name, const Kind &kind, const zavDevice &dev) {
    int length = kind.form == Form::kSas
                     ? snprintf(name, kLongestName, "%s%ddisk%d", kind.prefix,
                                (dev.disk >> 8) & 0xFF, dev.disk & 0xFF)
                     : snprintf(name, kLongestName, "%s%d", kind.prefix, dev.disk);
    if (dev.part > 0)
        snprintf(name + length, kLongestName - static_cast<size_t>(length), "p%d", dev.part);
    return true;
}

bool compose(char *name, const zavDevice &dev) {
    if (dev.type == ZAV_DEV_LVM)
        return compose_volume(name, dev);
    const Kind *kind = kind_of_address(dev);
    if (kind == nullptr)
        return false;
    return kind->form == Form::kInterface ? compose_interface(name, *kind, dev)
                                          : compose_disk(name, *kind, dev);
}

// ---- Name to address. ----

// A number at the start of `text`; those above INT_MAX are refused, as they are negative to the
// target.
bool number(const char *text, int &value) {
    const uint32_t read = zav::to_unsigned(text);
    if (read > INT_MAX)
        return false;
    value = static_cast<int>(read);
    return true;
}

// A number that ends at `end`, where another part of the name begins.
bool number_before(const char *text, const char *end, int &value) {
    char digits[16] = {};
    const auto length = static_cast<size_t>(end - text);
    if (length >= sizeof digits)
        return false;
    memcpy(digits, text, length);
    return number(digits, value);
}

bool only_letters_digits_slashes(const char *label) {
    return label[strspn(label, "/0123456789"
                               "abcdefghijklmnopqrstuvwxyz"
                               "ABCDEFGHIJKLMNOPQRSTUVWXYZ")] == '\0';
}

// "3" or "3p2".
bool parse_numbers(const char *rest, int &first, int &part) {
    const char *p = strchr(rest, 'p');
    if (p == nullptr)
        return number(rest, first);
    if (p == rest)
        return false;
    return number_before(rest, p, first) && number(p + 1, part);
}

bool parse_disk(const char *rest, zavDevice &dev) {
    if (*rest == '\0' || rest[strspn(rest, "0123456789p")] != '\0')
        return false;
    return parse_numbers(rest, dev.disk, dev.part);
}

// Digits and 'p' only, besides "disk", which is skipped with whatever character follows it.
bool sas_characters(const char *rest) {
    for (; *rest != '\0'; ++rest) {
        if (zav::starts_with(rest, "disk")) {
            rest += strlen("disk");
            if (*rest == '\0')
                return true;
        } else if (strchr("0123456789p", *rest) == nullptr) {
            return false;
        }
    }
    return true;
}

bool parse_sas(const char *rest, zavDevice &dev) {
    const char *disk = strstr(rest, "disk");
    if (!sas_characters(rest) || disk == nullptr)
        return false;
    int unit = 0;
    if (!number_before(rest, disk, unit))
        return false;
    int within_unit = 0;
    if (!parse_numbers(disk + strlen("disk"), within_unit, dev.part))
        return false;
    dev.disk = static_cast<int>((static_cast<unsigned>(within_unit) & 0xFFU) |
                                (static_cast<unsigned>(unit) << 8));
    return true;
}

bool parse_data_volume(const char *rest, const char *volume, zavDevice &dev) {
    if (!number(volume + strlen(kVolume), dev.disk))
        return false;
    if (volume[-1] != '/')
        return false;
    return number_before(rest, volume - 1, dev.part) && dev.part >= 1;
}

// "/dev/DataVG0" is taken, and is the address of the primary group.
bool parse_data_group(const char *rest, zavDevice &dev) {
    const char *volume = strstr(rest, kVolume);
    dev.minor_type = volume != nullptr ? ZAV_MINDEV_LVM_LV : ZAV_MINDEV_LVM_VG;
    if (*rest == '\0')
        return false;
    return volume != nullptr ? parse_data_volume(rest, volume, dev) : number(rest, dev.disk);
}

bool parse_system_group(const char *rest, zavDevice &dev) {
    if (zav::starts_with(rest, "/LogVol")) {
        dev.minor_type = ZAV_MINDEV_LVM_LV;
        return number(rest + strlen("/LogVol"), dev.disk);
    }
    dev.minor_type = ZAV_MINDEV_LVM_VG;
    return *rest == '\0';
}

bool parse_interface(const char *rest, zavDevice &dev) {
    if (*rest == '\0' || rest[strspn(rest, "0123456789")] != '\0')
        return false;
    int index = 0;
    if (!number(rest, index) || index == INT_MAX)
        return false;
    dev.disk = index + 1;
    return true;
}

bool parse_rest(const Kind &kind, const char *rest, zavDevice &dev) {
    switch (kind.form) {
    case Form::kDisk:
        return parse_disk(rest, dev);
    case Form::kSas:
        return parse_sas(rest, dev);
    case Form::kDataGroup:
        return parse_data_group(rest, dev);
    case Form::kSystemGroup:
        return parse_system_group(rest, dev);
    case Form::kInterface:
        break;
    }
    return parse_interface(rest, dev);
}

} // namespace

int zavDevToStr(char *label, size_t size, zavDevice *dev) {
    if (label == nullptr || dev == nullptr || dev->part < 0 || dev->disk < 0 || dev->type == 0)
        return ZAV_RC_ERR_EINVAL;
    if (size == 0)
        return ZAV_RC_ERR_ENOMEM;
    memset(label, 0, size);

    char name[kLongestName];
    if (!compose(name, *dev))
        return ZAV_RC_ERR_EINVAL;
    if (strlen(name) > size - 1)
        return ZAV_RC_ERR_ENOMEM;
    strcpy(label, name);
    return ZAV_RC_OK;
}

int zavStrToDev(const char *label, zavDevice *dev) {
    if (label == nullptr || dev == nullptr)
        return ZAV_RC_ERR_EINVAL;
    *dev = {};
    if (!only_letters_digits_slashes(label))
        return ZAV_RC_ERR_EINVAL;
    const Kind *kind = kind_of_name(label);
    if (kind == nullptr)
        return ZAV_RC_ERR_EINVAL;

    dev->type = kind->type;
    dev->minor_type = kind->minor_type;
    if (parse_rest(*kind, label + strlen(kind->prefix), *dev))
        return ZAV_RC_OK;
    dev->type = 0;
    return ZAV_RC_ERR_EINVAL;
}
