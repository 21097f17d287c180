// What a volume group's metadata backup says of it.
#include "storage/zav_lvm_backup.h"

#include "harness.h"

#include <climits>
#include <map>

namespace {

using zav::BackupSource;
using zav::PvKind;

// A backup as a text, and what the parser asked.
class Source final : public BackupSource {
  public:
    explicit Source(std::string text) : text_(std::move(text)) {}

    bool line(char *buffer, int size) override {
        if (at_ >= text_.size())
            return false;
        const size_t end = text_.find('\n', at_);
        const size_t whole = (end == std::string::npos ? text_.size() : end + 1) - at_;
        const size_t length = std::min(whole, static_cast<size_t>(size) - 1);
        buffer[text_.copy(buffer, length, at_)] = '\0';
        at_ += length;
        return true;
    }

    Found find_device(const char *kernel_name, zavDevice &device) override {
        names.emplace_back(kernel_name);
        device.disk = static_cast<int>(names.size());
        const auto found = answers.find(kernel_name);
        return found == answers.end() ? Found::kYes : found->second;
    }

    void measure(lvmLV &volume) override {
        volume.usage = static_cast<float>(volume.lvmdev.disk) + 0.5F;
        measured.push_back(volume.lvmdev.disk);
    }

    std::map<std::string, Found> answers;
    std::vector<std::string> names;
    std::vector<int> measured;

  private:
    std::string text_;
    size_t at_ = 0;
};

lvmVG group_of(int physical, int logical) {
    lvmVG group = {};
    group.pvcount = physical;
    group.lvcount = logical;
    return group;
}

struct Parsed {
    lvmVG group;
    int rc;
    std::vector<std::string> names;
    std::vector<int> measured;

    // By value: the field is aligned for 32-bit programs.
    unsigned long long pv_size(int index) const { return group.pvdev[index].size; }
    unsigned long long lv_size(int index) const { return group.lvdev[index].size; }
};

Parsed parse(const std::string &text, int physical, int logical,
             const std::map<std::string, BackupSource::Found> &answers = {}) {
    Source source(text);
    source.answers = answers;
    Parsed parsed = {group_of(physical, logical), 0, {}, {}};
    parsed.rc = zav::read_backup(source, parsed.group);
    parsed.names = source.names;
    parsed.measured = source.measured;
    return parsed;
}

std::string pv(const std::string &name, const std::string &device, const std::string &sectors) {
    return name + " {\ndevice = \"" + device + "\" # Hint only\ndev_size = " + sectors +
           " # some\n}\n";
}

std::string lv(const std::string &name, const std::vector<std::string> &extents) {
    std::string text = name + " {\nsegment_count = " + std::to_string(extents.size()) + "\n";
    for (const std::string &count : extents)
        text += "segment1 {\nextent_count = " + count + "\t# some\nstripes = [\n\"pv0\", 0\n]\n}\n";
    return text + "}\n";
}

const std::string kExtents4M = "extent_size = 8192\t\t# 4 Megabytes\n";
const std::string kPhysical = "physical_volumes {\n";
const std::string kLogical = "logical_volumes {\n";

TEST(Backup, OfARealGroupIsRead) {
    const Parsed parsed =
        parse(harness::data("captures/healthy-4disk/vgcfgbackup-file-DataVG1.txt"), 1, 2);
    EXPECT_EQ(parsed.rc, ZAV_RC_OK);
    EXPECT_EQ(parsed.names, std::vector<std::string>{"md1"});
    EXPECT_EQ(parsed.group.pvdev[0].lvmdev.disk, 1);
    EXPECT_EQ(parsed.pv_size(0), 1U);
    EXPECT_EQ(parsed.group.lvdev[0].lvmdev.disk, 1);
    EXPECT_EQ(parsed.lv_size(0), 1U);
    EXPECT_EQ(parsed.group.lvdev[0].usage, 1.5F);
    EXPECT_EQ(parsed.group.lvdev[1].lvmdev.disk, 2);
    EXPECT_EQ(parsed.measured, (std::vector{1, 2}));
}

TEST(Backup, OfARealGroupOfTwoPhysicalVolumesIsRead) {
    const Parsed parsed =
        parse(harness::data("captures/lvm-commands/vgcfgbackup-file-DataVG2.txt"), 2, 2);
    EXPECT_EQ(parsed.rc, ZAV_RC_OK);
    EXPECT_EQ(parsed.names, (std::vector<std::string>{"md0", "sdb3"}));
    EXPECT_EQ(parsed.group.pvdev[0].lvmdev.disk, 1);
    EXPECT_EQ(parsed.group.pvdev[1].lvmdev.disk, 2);
    EXPECT_EQ(parsed.group.lvdev[1].lvmdev.disk, 2);
}

TEST(Backup, NumbersPhysicalVolumesFromOneAndLogicalOnesAsNamed) {
    const Parsed parsed =
        parse(kPhysical + pv("pv0", "/dev/md1", "1") + pv("pv7", "/dev/md2", "1") + "}\n" +
                  kLogical + lv("LogVol2", {"1"}),
              2, 1);
    EXPECT_EQ(parsed.group.pvdev[0].lvmdev.disk, 1);
    EXPECT_EQ(parsed.group.pvdev[1].lvmdev.disk, 8);
    EXPECT_EQ(parsed.group.lvdev[0].lvmdev.disk, 2);
}

TEST(Backup, SizesArePhysicalSectorsInGbAndOneMore) {
    const std::map<std::string, unsigned long long> sizes = {{"4194304", 3},
                                                             {"2097152", 2},
                                                             {"2097151", 1},
                                                             {"0", 1},
                                                             {"4398046511104", 2097153},
                                                             {"-1", 1},
                                                             {"-4194304", static_cast<zavSize>(-1)},
                                                             {"none", 1}};
    for (const auto &[sectors, gb] : sizes)
        EXPECT_EQ(parse(kPhysical + pv("pv0", "/dev/md1", sectors), 1, 0).pv_size(0), gb)
            << sectors;
}

TEST(Backup, SizesAreLogicalExtentsInGbAndOneMore) {
    const auto size = [](const std::vector<std::string> &extents) {
        return parse(kExtents4M + kLogical + lv("LogVol1", extents), 0, 1).lv_size(0);
    };
    EXPECT_EQ(size({"256", "768"}), 5U);
    EXPECT_EQ(size({"256"}), 2U);
    EXPECT_EQ(size({"255"}), 1U);
    EXPECT_EQ(size({"262144", "1"}), 1025U);
}

TEST(Backup, ExtentSizesWrapIn32Bits) {
    const auto size = [](const std::string &sectors) {
        return parse("extent_size = " + sectors + "\n" + kLogical + lv("LogVol1", {"1024"}), 0, 1)
            .lv_size(0);
    };
    EXPECT_EQ(size("4194304"), (2ULL << 30) * 1024 / (1ULL << 30) + 1); // 2 GB: the largest power
    EXPECT_EQ(size("8388608"), 1U);                                     // 4 GB: 0
    EXPECT_EQ(size("8388609"), 1U);                                     // 4 GB + 512: 512
    EXPECT_EQ(size("99999999999"), ((0xFFFFFE00ULL * 1024) >> 30) + 1); // saturates, then wraps
}

TEST(Backup, WithoutExtentSizeGivesOneGb) {
    EXPECT_EQ(parse(kLogical + lv("LogVol1", {"1024"}), 0, 1).lv_size(0), 1U);
}

TEST(Backup, SegmentsEndAtClosingBraces) {
    // Two segments, the second of which the file no longer has.
    const std::string text =
        kExtents4M + kLogical + "LogVol1 {\nsegment_count = 2\nsegment1 {\nextent_count = 256\n}\n";
    EXPECT_EQ(parse(text, 0, 1).lv_size(0), 2U);
    // None: the next closing brace is the volume's.
    const Parsed none = parse(kExtents4M + kLogical + "LogVol1 {\nsegment_count = 0\n}\n" +
                                  "LogVol2 {\nsegment_count = 1\nextent_count = 512\n}\n}\n",
                              0, 2);
    EXPECT_EQ(none.lv_size(0), 1U);
    EXPECT_EQ(none.lv_size(1), 3U);
    EXPECT_EQ(parse(kExtents4M + kLogical + "LogVol1 {\nsegment_count = -5\n}\n", 0, 1).lv_size(0),
              1U);
}

TEST(Backup, OfManySegmentsThatAreMissingEndsAtOnce) {
    const std::string text = kLogical + "LogVol1 {\nsegment_count = 2147483647\n";
    EXPECT_EQ(parse(text, 0, 1).lv_size(0), 1U);
}

TEST(Backup, ALongerCountSwallowsWhatFollows) {
    // Three physical volumes are told, there are two: the third entry ends at the closing brace of
    // the section, and the logical volumes are found all the same.
    const std::string two = kPhysical + pv("pv0", "/dev/md1", "1") + pv("pv1", "/dev/md2", "1");
    const Parsed three = parse(two + "}\n" + kLogical + lv("LogVol1", {"1"}), 3, 1);
    EXPECT_EQ(three.group.lvdev[0].lvmdev.disk, 1);
    // With a fourth the head of the section goes with it.
    const Parsed four = parse(two + "}\n" + kLogical + lv("LogVol1", {"1"}), 4, 1);
    EXPECT_EQ(four.group.lvdev[0].lvmdev.disk, 0);
}

TEST(Backup, CountsOutsideTheTablesStayInside) {
    std::string text = kPhysical;
    for (int i = 0; i < 12; ++i)
        text += pv("pv" + std::to_string(i), "/dev/md" + std::to_string(i), "1");
    text += "}\n" + kLogical;
    for (int i = 1; i <= 9; ++i)
        text += lv("LogVol" + std::to_string(i), {"1"});
    Parsed parsed = parse(text, 12, 9);
    EXPECT_EQ(parsed.names.size(), 9U);
    EXPECT_EQ(parsed.group.pvdev[8].lvmdev.disk, 9);
    EXPECT_EQ(parsed.measured, (std::vector{1, 2, 3, 4, 5, 6}));
    EXPECT_EQ(parsed.group.pvcount, 12);
    EXPECT_EQ(parsed.group.lvcount, 9);
    parsed = parse(text, INT_MAX, INT_MAX);
    EXPECT_EQ(parsed.names.size(), 9U);
    parsed = parse(text, -1, -1);
    EXPECT_TRUE(parsed.names.empty());
    EXPECT_TRUE(parsed.measured.empty());
}

TEST(Backup, WithoutVolumesSkipsTheirSections) {
    const Parsed parsed = parse(
        kPhysical + pv("pv0", "/dev/md1", "1") + "}\n" + kLogical + lv("LogVol1", {"1"}), 0, 0);
    EXPECT_TRUE(parsed.names.empty());
    EXPECT_TRUE(parsed.measured.empty());
}

TEST(Backup, DeviceLinesGiveTheKernelName) {
    const std::map<std::string, std::string> names = {
        {"device = \"/dev/sda3\"\t# Hint only", "sda3"},
        {"\t\tdevice = \"/dev/md127\"", "md127"},
        {"device = \"/dev/mapper/x-y\"", "mapper/x-y"},
        {"device=\"/dev/md1\"", "md1"},
        {"device = \" /dev/md1\"", "md1"},
        {"device = \"\t/dev/md1\"", "md1"},
        {"device = \"/dev/md1 md2\"", "md1"},
        {"device = \"/dev/md1\tmd2\"", "md1"},
        {"device = \"/dev/a$(x)`y`;'z\"", "a$(x)`y`;'z"},
        {"device = \"unknown device\"", ""},
        {"device = \"\"", ""},
        {"device", ""},
        {"device =", ""}};
    for (const auto &[line, name] : names) {
        const Parsed parsed = parse(kPhysical + "pv0 {\n" + line + "\n}\n", 1, 0);
        EXPECT_EQ(parsed.names, std::vector<std::string>{name}) << line;
    }
}

TEST(Backup, GoesOnAfterADeviceThatIsNotFound) {
    const Parsed parsed =
        parse(kPhysical + pv("pv0", "/dev/md1", "4194304") + pv("pv1", "/dev/md2", "4194304") +
                  "}\n" + kLogical + lv("LogVol1", {"1"}),
              2, 1, {{"md1", BackupSource::Found::kNo}});
    EXPECT_EQ(parsed.rc, ZAV_RC_ERR);
    EXPECT_EQ(parsed.group.pvcount, 2);
    EXPECT_EQ(parsed.pv_size(0), 3U);
    EXPECT_EQ(parsed.group.pvdev[1].lvmdev.disk, 2);
    EXPECT_EQ(parsed.group.lvdev[0].lvmdev.disk, 1);
}

TEST(Backup, EndsThePhysicalVolumesAtADeviceWithoutAnswer) {
    const Parsed parsed =
        parse(kPhysical + pv("pv0", "/dev/md1", "4194304") + pv("pv1", "/dev/md2", "4194304") +
                  "}\n" + kLogical + lv("LogVol1", {"1"}),
              2, 1, {{"md1", BackupSource::Found::kNoAnswer}});
    EXPECT_EQ(parsed.rc, ZAV_RC_ERR);
    EXPECT_EQ(parsed.group.pvcount, 0);
    EXPECT_EQ(parsed.pv_size(0), 3U) << "the entry itself is read to its end";
    EXPECT_EQ(parsed.names, std::vector<std::string>{"md1"});
    EXPECT_EQ(parsed.group.lvdev[0].lvmdev.disk, 1);
}

TEST(Backup, OddNumbersAreTakenAsScanned) {
    const auto pv_number = [](const std::string &name) {
        return parse(kPhysical + pv(name, "/dev/md1", "1"), 1, 0).group.pvdev[0].lvmdev.disk;
    };
    EXPECT_EQ(pv_number("pvx"), 1); // nothing scanned, one added all the same
    EXPECT_EQ(pv_number("my_pv3"), 1);
    EXPECT_EQ(pv_number("pv99999999999"), INT_MIN);
    const auto lv_number = [](const std::string &name) {
        return parse(kLogical + lv(name, {"1"}), 0, 1).group.lvdev[0].lvmdev.disk;
    };
    EXPECT_EQ(lv_number("LogVol"), 0);
    EXPECT_EQ(lv_number("OldLogVol3"), 0);
    EXPECT_EQ(lv_number("LogVol 3"), 3);
    EXPECT_EQ(lv_number("LogVol99999999999"), INT_MAX);
}

TEST(Backup, EntriesBeginWhereNameAndBraceStandInOneLine) {
    const Parsed parsed = parse(kPhysical + "pv0 {\npv5\nother {\n}\n}\n" + kLogical +
                                    "LogVol1 {\nLogVol5\nother {\n}\n}\n",
                                1, 1);
    EXPECT_EQ(parsed.group.pvdev[0].lvmdev.disk, 1);
    EXPECT_EQ(parsed.measured, std::vector{1});
}

TEST(Backup, ThatIsCutOffGivesWhatIsThere) {
    const std::string whole = harness::data("captures/lvm-commands/vgcfgbackup-file-DataVG2.txt");
    for (size_t length = 0; length < whole.size(); length += 7) {
        const Parsed parsed = parse(whole.substr(0, length), 2, 2);
        EXPECT_EQ(parsed.rc, ZAV_RC_OK);
        EXPECT_LE(parsed.names.size(), 2U);
    }
}

TEST(Backup, LongLinesAreReadInPieces) {
    // The number stands in the piece that the key is not in.
    const std::string text =
        kPhysical + "pv0 {\n" + std::string(110, ' ') + "dev_size = 4194304\n}\n";
    EXPECT_EQ(parse(text, 1, 0).pv_size(0), 1U);
}

TEST(PhysicalVolumeName, KindIsToldByTheKernelName) {
    EXPECT_EQ(zav::classify_pv("md1"), PvKind::kArray);
    EXPECT_EQ(zav::classify_pv("sdmd1"), PvKind::kArray);
    EXPECT_EQ(zav::classify_pv("hda1"), PvKind::kNamed);
    EXPECT_EQ(zav::classify_pv("sata/disk1"), PvKind::kNamed);
    EXPECT_EQ(zav::classify_pv(""), PvKind::kNamed);
    EXPECT_EQ(zav::classify_pv("sda1"), PvKind::kPartition);
    EXPECT_EQ(zav::classify_pv("sda2"), PvKind::kPartition);
    EXPECT_EQ(zav::classify_pv("sdb12"), PvKind::kPartition);
    EXPECT_EQ(zav::classify_pv("sda"), PvKind::kWholeDisk);
    EXPECT_EQ(zav::classify_pv("sda3"), PvKind::kWholeDisk) << "coarse, and known to be";
}

TEST(PhysicalVolumeName, DiskOfAPartitionIsTheNameUpToTheFirstDigit) {
    const auto disk = [](const char *name) {
        char text[9];
        zav::disk_of_partition(name, text);
        return std::string(text);
    };
    EXPECT_EQ(disk("sdb12"), "sdb");
    EXPECT_EQ(disk("sda1b2"), "sda");
    EXPECT_EQ(disk("sdabcdefghij1"), "sdabcdef");
    EXPECT_EQ(disk("1sd"), "");
}

} // namespace
