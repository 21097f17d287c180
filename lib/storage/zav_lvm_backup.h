// What a volume group's metadata backup says of it. It is read by lines and by the words in them:
// braces are counted as told below, their nesting is not followed.
#pragma once

#include "zav_api.h"

namespace zav {

// How the block device under a physical volume is found, by its kernel name.
enum class PvKind {
    kArray,     // "md" in it: by its udev link
    kNamed,     // the name itself is an address
    kPartition, // "sd" and a 1 or 2 in it: by the partition's udev link
    kWholeDisk, // any other "sd", sda3 too: by the disk's udev link
};

PvKind classify_pv(const char *kernel_name);

// The disk of a partition: its name up to the first digit, at most 8 characters.
void disk_of_partition(const char *kernel_name, char (&disk)[9]);

// What the parser asks of its surroundings.
class BackupSource {
  public:
    enum class Found { kYes, kNo, kNoAnswer };

    // The next line, at most `size` - 1 characters of it; false at the end.
    virtual bool line(char *buffer, int size) = 0;

    // The address of a physical volume's block device. kNoAnswer ends the physical volumes.
    virtual Found find_device(const char *kernel_name, zavDevice &device) = 0;

    // The usage of a logical volume's file system.
    virtual void measure(lvmLV &volume) = 0;

  protected:
    BackupSource() = default;
    BackupSource(const BackupSource &) = default;
    BackupSource &operator=(const BackupSource &) = default;
    ~BackupSource() = default;
};

// Fills the volumes of `group`, whose counts say how many entries are read: a count beyond the
// entries there are swallows what follows them. ZAV_RC_ERR if a device was not found.
int read_backup(BackupSource &source, lvmVG &group);

} // namespace zav
