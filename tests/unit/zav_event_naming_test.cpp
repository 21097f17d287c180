// Device addresses and the names of their device files.
#include "harness.h"

#include <cctype>
#include <cstring>

namespace {

struct Pair {
    zavDevice dev;
    const char *name;
};

// Names that convert both ways.
const Pair kPairs[] = {
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 2}, "/dev/sata/disk3p2"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0}, "/dev/sata/disk3"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 0, 0}, "/dev/sata/disk0"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0}, "/dev/hwsata/disk1"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 4}, "/dev/hwsata/disk1p4"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_IUFD, 1, 1}, "/dev/iufd/disk1p1"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_IUFD, 1, 0}, "/dev/iufd/disk1"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_EUFD, 2, 0}, "/dev/eufd/disk2"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_EUFD, 2, 9}, "/dev/eufd/disk2p9"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 258, 0}, "/dev/sas/r1disk2"},
    {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0xFFFF, 3}, "/dev/sas/r255disk255p3"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 1, 1}, "/dev/swraid/disk1p1"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 4, 0}, "/dev/swraid/disk4"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0}, "/dev/hwraid/disk1"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 2}, "/dev/hwraid/disk1p2"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 517, 1}, "/dev/sasraid/r2disk5p1"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 517, 0}, "/dev/sasraid/r2disk5"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 1, 0}, "/dev/iscsiraid/disk1"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_ISCSI, 1, 1}, "/dev/iscsiraid/disk1p1"},
    {{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2147483647, 2147483647},
     "/dev/swraid/disk2147483647p2147483647"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 0, 0}, "/dev/PrimaryOSVG"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0}, "/dev/DataVG1"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 0}, "/dev/DataVG2"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 0}, "/dev/PrimaryOSVG/LogVol1"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 1, 1}, "/dev/DataVG1/LogVol1"},
    {{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 3, 2}, "/dev/DataVG2/LogVol3"},
    {{ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0}, "eth0"},
    {{ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 12, 0}, "eth11"},
    {{ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 123456790, 0}, "eth123456789"},
    {{ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, 1, 0}, "bond0"},
};

TEST(DeviceNames, ConvertBothWays) {
    for (Pair pair : kPairs) {
        char label[64];
        EXPECT_EQ(zavDevToStr(label, sizeof label, &pair.dev), ZAV_RC_OK) << pair.name;
        EXPECT_STREQ(label, pair.name);
        zavDevice dev = {7, 7, 7, 7};
        EXPECT_EQ(zavStrToDev(pair.name, &dev), ZAV_RC_OK) << pair.name;
        EXPECT_EQ(dev, pair.dev) << pair.name;
    }
}

// ---- Address to name ----

constexpr char kUntouched = '#';

struct Label {
    char text[64];
    int rc;
};

Label name_of(zavDevice dev, size_t size = sizeof(Label::text)) {
    Label label;
    memset(label.text, kUntouched, sizeof label.text);
    label.rc = zavDevToStr(label.text, size, &dev);
    return label;
}

bool all(const Label &label, char character, size_t from, size_t to) {
    for (size_t i = from; i < to; ++i)
        if (label.text[i] != character)
            return false;
    return true;
}

TEST(DeviceNames, FillTheWholeBufferWithNuls) {
    const Label label = name_of({ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0}, 40);
    EXPECT_STREQ(label.text, "eth0");
    EXPECT_TRUE(all(label, '\0', 4, 40));
    EXPECT_TRUE(all(label, kUntouched, 40, 64));
}

TEST(DeviceNames, BadArgumentsLeaveTheBufferUntouched) {
    const zavDevice bad[] = {{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, -1},
                             {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, -1, 0},
                             {0, ZAV_MINDEV_HDD_SATA, 1, 0}};
    for (const zavDevice &dev : bad) {
        const Label label = name_of(dev);
        EXPECT_EQ(label.rc, ZAV_RC_ERR_EINVAL) << dev;
        EXPECT_TRUE(all(label, kUntouched, 0, 64)) << dev;
    }
    zavDevice good = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
    char label[8];
    EXPECT_EQ(zavDevToStr(nullptr, 8, &good), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavDevToStr(label, sizeof label, nullptr), ZAV_RC_ERR_EINVAL);
}

TEST(DeviceNames, ArgumentsAreCheckedBeforeTheSize) {
    EXPECT_EQ(name_of({0, 0, 1, 0}, 0).rc, ZAV_RC_ERR_EINVAL);
    const Label label = name_of({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0}, 0);
    EXPECT_EQ(label.rc, ZAV_RC_ERR_ENOMEM);
    EXPECT_TRUE(all(label, kUntouched, 0, 64));
}

TEST(DeviceNames, UnnamedPairsOfTypesEmptyTheBuffer) {
    const zavDevice unnamed[] = {{ZAV_DEV_HDD, ZAV_MINDEV_RAID_SW, 1, 0},
                                 {ZAV_DEV_HDD, 0x106, 1, 0},
                                 {ZAV_DEV_RAID, ZAV_MINDEV_HDD_SATA, 1, 0},
                                 {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 0},
                                 {ZAV_DEV_LVM, ZAV_MINDEV_NIC_ETH, 1, 0},
                                 {ZAV_DEV_LVM, 0, 1, 0},
                                 {ZAV_DEV_NIC, ZAV_MINDEV_LVM_VG, 1, 0},
                                 {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 0, 0},
                                 {ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, 0, 0},
                                 {3, ZAV_MINDEV_HDD_SATA, 1, 0},
                                 {-1, ZAV_MINDEV_HDD_SATA, 1, 0}};
    for (const zavDevice &dev : unnamed) {
        const Label label = name_of(dev);
        EXPECT_EQ(label.rc, ZAV_RC_ERR_EINVAL) << dev;
        EXPECT_TRUE(all(label, '\0', 0, 64)) << dev;
    }
}

TEST(DeviceNames, MustFitWithTheirTerminator) {
    const zavDevice disk1 = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 0};
    for (const size_t size : {1U, 10U, 15U}) {
        const Label label = name_of(disk1, size);
        EXPECT_EQ(label.rc, ZAV_RC_ERR_ENOMEM) << size;
        EXPECT_TRUE(all(label, '\0', 0, size)) << size;
        EXPECT_TRUE(all(label, kUntouched, size, 64)) << size;
    }
    const Label label = name_of(disk1, 16);
    EXPECT_EQ(label.rc, ZAV_RC_OK);
    EXPECT_STREQ(label.text, "/dev/sata/disk1");
}

TEST(DeviceNames, PackUnitAndDiskNumberInOneByteEach) {
    EXPECT_STREQ(name_of({ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 0x12345, 0}).text, "/dev/sas/r35disk69");
    EXPECT_STREQ(name_of({ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 5, 0}).text, "/dev/sasraid/r0disk5");
}

TEST(DeviceNames, IgnoreThePartitionWhereThereIsNone) {
    EXPECT_STREQ(name_of({ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 9}).text, "/dev/DataVG2");
    EXPECT_STREQ(name_of({ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, 2, 9}).text, "bond1");
}

// ---- Name to address ----

struct Parsed {
    int rc;
    zavDevice dev;
};

Parsed parse(const std::string &name) {
    Parsed parsed = {0, {7, 7, 7, 7}};
    parsed.rc = zavStrToDev(name.c_str(), &parsed.dev);
    return parsed;
}

void expect_address(const std::string &name, const zavDevice &dev) {
    const Parsed parsed = parse(name);
    EXPECT_EQ(parsed.rc, ZAV_RC_OK) << name;
    EXPECT_EQ(parsed.dev, dev) << name;
}

void expect_refused(std::initializer_list<const char *> names) {
    for (const char *name : names) {
        const Parsed parsed = parse(name);
        EXPECT_EQ(parsed.rc, ZAV_RC_ERR_EINVAL) << name;
        EXPECT_EQ(parsed.dev.type, 0) << name;
    }
}

TEST(Addresses, NullPointersAreRefused) {
    zavDevice dev = {7, 7, 7, 7};
    EXPECT_EQ(zavStrToDev(nullptr, &dev), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(dev, (zavDevice{7, 7, 7, 7}));
    EXPECT_EQ(zavStrToDev("eth0", nullptr), ZAV_RC_ERR_EINVAL);
}

TEST(Addresses, OtherCharactersAreRefusedBeforeAnythingIsRead) {
    for (const char *name : {"/dev/sata/disk-1", "/dev/sata/disk1 ", "/dev/sata/disk1\n",
                             "/dev/sata/disk_1", "/dev/sata/disk1.", "/dev/sata/d\xC3\xADsk1"}) {
        const Parsed parsed = parse(name);
        EXPECT_EQ(parsed.rc, ZAV_RC_ERR_EINVAL) << name;
        EXPECT_EQ(parsed.dev, (zavDevice{0, 0, 0, 0})) << name;
    }
}

TEST(Addresses, UnknownPrefixesAreRefused) {
    for (const char *name : {"", "/", "/dev/sda", "sata/disk1", "/dev/sata/dis", "Eth0", "ETH0",
                             "xeth0", "/dev/eth0", "/dev/mdX", "/dev/primaryOSVG"}) {
        const Parsed parsed = parse(name);
        EXPECT_EQ(parsed.rc, ZAV_RC_ERR_EINVAL) << name;
        EXPECT_EQ(parsed.dev, (zavDevice{0, 0, 0, 0})) << name;
    }
}

TEST(Addresses, OfDisksHoldDigitsAndOneLetterOnly) {
    expect_refused({"/dev/sata/disk", "/dev/sata/diskp1", "/dev/sata/diskp", "/dev/sata/diskx",
                    "/dev/sata/disk1P2", "/dev/sata/disk1/2", "/dev/swraid/disk", "/dev/iufd/diska",
                    "/dev/eufd/disk", "/dev/hwsata/disk1s1", "/dev/hwraid/disk", "/dev/hwraid/r1",
                    "/dev/iscsiraid/disk"});
}

TEST(Addresses, OfDisksTakeTheFirstPartition) {
    const auto sata = [](int disk, int part) {
        return zavDevice{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, disk, part};
    };
    expect_address("/dev/sata/disk1p", sata(1, 0));
    expect_address("/dev/sata/disk1p2p3", sata(1, 2));
    expect_address("/dev/sata/disk1pp3", sata(1, 0));
    expect_address("/dev/sata/disk007p08", sata(7, 8));
}

TEST(Addresses, NumbersFrom2147483648UpAreRefused) {
    expect_address("/dev/sata/disk2147483647", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 2147483647, 0});
    expect_refused(
        {"/dev/sata/disk2147483648", "/dev/sata/disk4294967295", "/dev/sata/disk4294967296",
         "/dev/sata/disk99999999999999999999999", "/dev/sata/disk2147483648p1",
         "/dev/sata/disk1p2147483648", "/dev/sata/disk1p18446744073709551617",
         "/dev/sas/r2147483648disk1", "/dev/sas/r1disk2147483648", "/dev/sas/r1disk1p2147483648",
         "/dev/DataVG2147483648", "/dev/DataVG2147483648/LogVol1", "/dev/DataVG1/LogVol2147483648",
         "/dev/PrimaryOSVG/LogVol2147483648", "eth2147483648", "eth4294967296", "bond2147483648"});
}

TEST(Addresses, InterfaceNumbersMustHaveASuccessor) {
    expect_address("eth2147483646", {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 2147483647, 0});
    expect_refused({"eth2147483647", "bond2147483647"});
}

TEST(Addresses, LongNumbersBetweenMarkersAreRefusedNotCut) {
    expect_address("/dev/sata/disk000000000000001p1", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 1});
    expect_refused({"/dev/sata/disk0000000000000001p1", "/dev/sas/r0000000000000001disk1",
                    "/dev/sas/r1disk0000000000000001p1", "/dev/DataVG0000000000000001/LogVol1",
                    "/dev/sata/disk11111111111111111111111111111111111111111p1"});
}

TEST(Addresses, KeepWhatWasReadBeforeTheRefusal) {
    EXPECT_EQ(parse("/dev/sata/disk5p2147483648").dev, (zavDevice{0, ZAV_MINDEV_HDD_SATA, 5, 0}));
    EXPECT_EQ(parse("/dev/DataVG0/LogVol1").dev, (zavDevice{0, ZAV_MINDEV_LVM_LV, 1, 0}));
}

TEST(Addresses, OfSasDisksNeedUnitAndDisk) {
    expect_refused({"/dev/sas/r", "/dev/sas/r1", "/dev/sas/r1p2", "/dev/sas/r1dis2",
                    "/dev/sas/r1diskp2", "/dev/sasraid/r1diskp", "/dev/sas/rxdisk1",
                    "/dev/sas/r1disk1x", "/dev/sas/r1/disk1"});
}

TEST(Addresses, OfSasDisksDropTheHighBitsOfTheNumber) {
    expect_address("/dev/sas/r1disk258", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 256 + 2, 0});
    expect_address("/dev/sasraid/r256disk1", {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 65536 + 1, 0});
}

TEST(Addresses, TakeEveryLetterAndDigitAsACharacter) {
    for (char c = 1; c > 0; ++c) {
        const bool accepted = isalnum(c) != 0 ? c != 'p' : c == '/';
        const Parsed parsed = parse(std::string("/dev/sas/r1disk") + c);
        EXPECT_EQ(parsed.rc, accepted ? ZAV_RC_OK : ZAV_RC_ERR_EINVAL) << c;
        if (c == 127)
            break;
    }
}

TEST(Addresses, OfSasDisksLetTheCharacterBehindDiskEscapeTheCheck) {
    expect_address("/dev/sas/r1diskx", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 256, 0});
    expect_address("/dev/sas/r1disk/2", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 256, 0});
    expect_address("/dev/sas/r1disk", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 256, 0});
    expect_address("/dev/sas/r1disk2disk3", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 258, 0});
    expect_address("/dev/sas/rdisk2", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 2, 0});
    expect_address("/dev/sas/r1p7disk2p3", {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 258, 3});
    expect_refused({"/dev/sas/r1diskxy"});
}

TEST(Addresses, OfDataGroups) {
    expect_refused({"/dev/DataVG"});
    expect_address("/dev/DataVG0", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 0, 0});
    expect_address("/dev/DataVG2abc", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 0});
    expect_address("/dev/DataVG2/", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 2, 0});
}

TEST(Addresses, OfDataVolumesNeedAGroupFromOneUp) {
    expect_refused({"/dev/DataVG0/LogVol1", "/dev/DataVG/LogVol1", "/dev/DataVGLogVol1",
                    "/dev/DataVG2LogVol1", "/dev/DataVGx/LogVol1"});
    expect_address("/dev/DataVG2/LogVol", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, 2});
    expect_address("/dev/DataVG12/LogVol34", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 34, 12});
}

TEST(Addresses, OfTheSystemGroup) {
    expect_refused({"/dev/PrimaryOSVG/", "/dev/PrimaryOSVG1", "/dev/PrimaryOSVGLogVol1",
                    "/dev/PrimaryOSVG/logVol1", "/dev/PrimaryOSVG/LogVo"});
    expect_address("/dev/PrimaryOSVG/LogVol", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 0, 0});
    expect_address("/dev/PrimaryOSVG/LogVol7", {ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 7, 0});
}

TEST(Addresses, OfInterfacesHoldDigitsOnly) {
    expect_refused({"eth", "bond", "eth0p1", "ethx", "eth0/1", "bond0x"});
}

} // namespace
