// Volume groups by number and name, the group of a physical volume, the tools.
#include "harness.h"

#include <climits>
#include <map>

namespace {

using harness::exits;
using harness::no_start;
using harness::prints;
using harness::record;
using harness::row;
using harness::ScriptedShell;

std::string name_of(int group, int expected) {
    char name[18];
    EXPECT_EQ(zavMapVGToStr(group, name), expected);
    return name;
}

TEST(VolumeGroupName, IsTheSystemGroupsOrADataGroups) {
    EXPECT_EQ(name_of(0, ZAV_RC_OK), "PrimaryOSVG");
    EXPECT_EQ(name_of(1, ZAV_RC_OK), "DataVG1");
    EXPECT_EQ(name_of(3, ZAV_RC_OK), "DataVG3");
    EXPECT_EQ(name_of(-2, ZAV_RC_OK), "DataVG-2");
    EXPECT_EQ(name_of(INT_MIN, ZAV_RC_OK), "DataVG-2147483648");
}

TEST(VolumeGroupName, OfNoGroupIsRefused) {
    EXPECT_EQ(name_of(-1, ZAV_RC_ERR_EINVAL), "ZAV_LVM_VG_NONE");
    EXPECT_EQ(zavMapVGToStr(1, nullptr), ZAV_RC_ERR_EINVAL);
}

int number_of(std::string name, int expected) {
    int number = 77;
    EXPECT_EQ(zavMapStrToVG(name.data(), &number), expected) << name;
    return number;
}

TEST(VolumeGroupNumber, IsReadFromTheName) {
    EXPECT_EQ(number_of("PrimaryOSVG", ZAV_RC_OK), 0);
    EXPECT_EQ(number_of("/dev/PrimaryOSVG", ZAV_RC_OK), 0);
    EXPECT_EQ(number_of("DataVG1 PrimaryOSVG", ZAV_RC_OK), 0);
    EXPECT_EQ(number_of("DataVG1", ZAV_RC_OK), 1);
    EXPECT_EQ(number_of("DataVG12x", ZAV_RC_OK), 12);
    EXPECT_EQ(number_of("DataVG 4", ZAV_RC_OK), 4);
    EXPECT_EQ(number_of("DataVG-3", ZAV_RC_OK), -3);
    EXPECT_EQ(number_of("DataVG+3", ZAV_RC_OK), 3);
}

TEST(VolumeGroupNumber, StaysWhereTheNameHasNone) {
    for (const char *name :
         {"", "DataVG", "DataVGx", "/dev/DataVG1", "dataVG1", "vg0", "DataVG--1"})
        EXPECT_EQ(number_of(name, ZAV_RC_ERR), 77);
    int number = 77;
    EXPECT_EQ(zavMapStrToVG(nullptr, &number), ZAV_RC_ERR);
    EXPECT_EQ(number, 77);
    char name[] = "DataVG1";
    EXPECT_EQ(zavMapStrToVG(name, nullptr), ZAV_RC_ERR);
}

std::string value_of(std::string line) {
    line.resize(200);
    zavParserLine1(line.data());
    return line.c_str();
}

TEST(MetadataLine, IsTurnedIntoItsValue) {
    EXPECT_EQ(value_of("extent_count = 32\t# 128 Megabytes\n"), "32");
    EXPECT_EQ(value_of("\t\tsegment_count = 1\n"), "1");
    EXPECT_EQ(value_of("a=b"), "b");
    EXPECT_EQ(value_of("a = \"b c\""), "\"b");
    EXPECT_EQ(value_of("a = b#c"), "b");
    EXPECT_EQ(value_of("#a = b"), "b");
    EXPECT_EQ(value_of("a == \t b"), "") << "the second field is the tabulator";
    EXPECT_EQ(value_of("a"), "");
    EXPECT_EQ(value_of("a ="), "");
    EXPECT_EQ(value_of(""), "");
    zavParserLine1(nullptr);
}

TEST(MetadataLine, ValuesAreCutAt79Characters) {
    EXPECT_EQ(value_of("a = " + std::string(79, 'x')), std::string(79, 'x'));
    EXPECT_EQ(value_of("a = " + std::string(90, 'x')), std::string(79, 'x'));
}

class GroupOfPhysicalVolume : public harness::Appliance {
  protected:
    static void pvdisplay_prints(const std::string &text) {
        record().shell = ScriptedShell{{"grep", prints(text)}};
    }

    int ask(const std::string &pv = "/dev/md1") {
        std::string path = pv;
        const size_t open_before = open_descriptors();
        char buffer[128] = "untouched";
        const int rc = zavGetPVsVG(path.data(), buffer);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_FALSE(has_children());
        name = buffer;
        return rc;
    }

    std::string name;
};

TEST_F(GroupOfPhysicalVolume, IsTheThirdWord) {
    pvdisplay_prints(harness::data("captures/lvm-commands/pvdisplay-vgname-_dev_md0.txt"));
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(name, "DataVG2");
    EXPECT_EQ(record().commands,
              (std::vector<std::string>{"pvdisplay -c /dev/md1 >/dev/null 2>&1",
                                        "pvdisplay /dev/md1 | grep \"VG Name\""}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(GroupOfPhysicalVolume, ThatIsFreeIsNone) {
    for (const std::string &line :
         {harness::data("captures/lvm-commands/pvdisplay-vgname-free.txt"), std::string("VG Name"),
          std::string("VG\n"), std::string("\n")}) {
        pvdisplay_prints(line);
        EXPECT_EQ(ask(), ZAV_RC_OK);
        EXPECT_EQ(name, "NONE");
    }
}

TEST_F(GroupOfPhysicalVolume, NameIsGivenAsItIs) {
    pvdisplay_prints("  VG Name   $(x);`y`'%s\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(name, "$(x);`y`'%s");
    pvdisplay_prints("VG Name " + std::string(200, 'x') + "\n");
    EXPECT_EQ(ask(), ZAV_RC_OK);
    EXPECT_EQ(name, std::string(119, 'x')) << "127 characters of the line are read";
}

TEST_F(GroupOfPhysicalVolume, ThatIsNoneIsNoDevice) {
    record().shell = ScriptedShell{{"-c", exits(5)}};
    EXPECT_EQ(ask(), ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(name, "untouched");
    EXPECT_EQ(record().commands.size(), 1U);
}

TEST_F(GroupOfPhysicalVolume, WithoutPipeIs32) {
    record().shell = ScriptedShell{{"grep", no_start()}};
    EXPECT_EQ(ask(), 32);
    EXPECT_EQ(name, "untouched");
}

TEST_F(GroupOfPhysicalVolume, WithoutLineIsAnError) {
    pvdisplay_prints("");
    EXPECT_EQ(ask(), ZAV_RC_ERR);
    EXPECT_EQ(name, "untouched");
}

TEST_F(GroupOfPhysicalVolume, RunsNothingThatAPathHolds) {
    script("/usr/sbin/pvdisplay", "printf '[%s]' \"$@\" >>/scratch/asked; echo '  VG Name  vg'\n");
    const std::string hostile = "/dev/md1; touch /scratch/ran $(touch /scratch/ran)'`\n\"";
    EXPECT_EQ(ask(hostile), ZAV_RC_OK);
    EXPECT_EQ(get("/scratch/asked"), "[-c][" + hostile + "][" + hostile + "]");
    EXPECT_FALSE(exists("/scratch/ran"));
    record().commands.clear();
    EXPECT_EQ(ask("-y"), ZAV_RC_ERR_ENODEV);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(GroupOfPhysicalVolume, NeedsItsArguments) {
    char text[128] = "";
    zavDevice dev = {};
    EXPECT_EQ(zavGetPVsVG(nullptr, text), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetPVsVG(text, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetPVsVGDev(nullptr, &dev), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetPVsVGDev(text, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(GroupOfPhysicalVolume, AddressHasTheGroupsNumber) {
    const std::map<std::string, int> groups = {
        {"DataVG2", 2}, {"PrimaryOSVG", 0}, {"vg0", 99}, {"", 99}};
    for (const auto &[group, number] : groups) {
        pvdisplay_prints("  VG Name               " + group + "\n");
        char path[] = "/dev/md1";
        zavDevice dev = {9, 9, 9, 9};
        EXPECT_EQ(zavGetPVsVGDev(path, &dev), ZAV_RC_OK);
        EXPECT_EQ(dev, (zavDevice{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0}));
    }
}

TEST_F(GroupOfPhysicalVolume, AddressIsUntouchedByAFailure) {
    char path[] = "/dev/md1";
    zavDevice dev = {9, 9, 9, 9};
    record().shell = ScriptedShell{{"-c", exits(5)}};
    EXPECT_EQ(zavGetPVsVGDev(path, &dev), ZAV_RC_ERR_ENODEV);
    pvdisplay_prints("");
    EXPECT_EQ(zavGetPVsVGDev(path, &dev), ZAV_RC_ERR);
    EXPECT_EQ(dev, (zavDevice{9, 9, 9, 9}));
}

class LvmTools : public harness::Appliance {};

const std::vector<std::string> kTools = {"vgs",       "lvs",       "pvs",
                                         "vgdisplay", "lvdisplay", "pvdisplay"};

TEST_F(LvmTools, AreLookedForInTheirOrder) {
    for (const std::string &tool : kTools)
        script("/usr/sbin/" + tool, "");
    testing::internal::CaptureStdout();
    EXPECT_EQ(zavCheckExeFile(), ZAV_RC_OK);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(record().commands,
              (std::vector<std::string>{
                  "ls /usr/sbin/vgs &> /dev/null", "ls /usr/sbin/lvs &> /dev/null",
                  "ls /usr/sbin/pvs &> /dev/null", "ls /usr/sbin/vgdisplay &> /dev/null",
                  "ls /usr/sbin/lvdisplay &> /dev/null", "ls /usr/sbin/pvdisplay &> /dev/null"}));
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LvmTools, TheFirstThatIsMissingIsLogged) {
    for (size_t i = 0; i < kTools.size(); ++i) {
        for (size_t j = 0; j < kTools.size(); ++j) {
            remove("/usr/sbin/" + kTools[j]);
            if (j < i)
                script("/usr/sbin/" + kTools[j], "");
        }
        record().log.clear();
        record().commands.clear();
        EXPECT_EQ(zavCheckExeFile(), ZAV_RC_ERR_ENOENT);
        EXPECT_EQ(record().commands.size(), i + 1);
        EXPECT_EQ(record().log,
                  std::vector{row("zavCheckExeFile", 1,
                                  "[2] Error: Utility " + kTools[i] + " doesn't exist")});
    }
}

} // namespace
