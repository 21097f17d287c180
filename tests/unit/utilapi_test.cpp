// Names of codes, trace output, return-code conversion, trimming, array names.
#include "harness.h"

#include <cstring>
#include <unistd.h>
#include <utility>

using Text = std::string;

namespace {

using Named = std::pair<int, const char *>;

Text call(char *(*function)(int, char *), int code) {
    char buffer[128];
    memset(buffer, '#', sizeof buffer);
    EXPECT_EQ(function(code, buffer), buffer);
    return buffer;
}

template <size_t count>
void expect_names(char *(*function)(int, char *), const Named (&names)[count]) {
    for (const auto &[code, name] : names)
        EXPECT_EQ(call(function, code), name) << code;
}

TEST(Names, OfRaidLevels) {
    expect_names(zav_raidleveldef_to_str, {{1, "ZAV_RAIDLVL_NONE"},
                                           {2, "ZAV_RAIDLVL_0"},
                                           {3, "ZAV_RAIDLVL_1"},
                                           {4, "ZAV_RAIDLVL_5"},
                                           {5, "ZAV_RAIDLVL_6"},
                                           {6, "ZAV_RAIDLVL_10"},
                                           {7, "ZAV_RAIDLVL_50"},
                                           {8, "ZAV_RAIDLVL_60"},
                                           {9, "ZAV_RAIDLVL_JBOD"},
                                           {0, "Not support[zav_raidleveldef_to_str()]"},
                                           {10, "Not support[zav_raidleveldef_to_str()]"}});
}

TEST(Names, OfRaidStatesRunTogetherInBrackets) {
    expect_names(zav_raidstatedef_to_str,
                 {{1, "[ZAV_RAID_NORMAL]"},
                  {2, "[ZAV_RAID_DEGRADED]"},
                  {4, "[ZAV_RAID_RESYNC]"},
                  {8, "[ZAV_RAID_FAILED]"},
                  {16, "[ZAV_RAID_NOT_EXIST]"},
                  {0x1F, "[ZAV_RAID_NORMAL][ZAV_RAID_DEGRADED][ZAV_RAID_RESYNC][ZAV_RAID_FAILED]"
                         "[ZAV_RAID_NOT_EXIST]"},
                  {0, ""},
                  {32, ""},
                  {-1, "[ZAV_RAID_NORMAL][ZAV_RAID_DEGRADED][ZAV_RAID_RESYNC][ZAV_RAID_FAILED]"
                       "[ZAV_RAID_NOT_EXIST]"}});
    EXPECT_EQ(call(zav_raidstatedef_to_str, 0x1F).size(), 90U);
}

TEST(Names, OfDiskStates) {
    expect_names(zav_diskstatedef_to_str, {{1, "[ZAV_HDD_FOUND]"},
                                           {2, "[ZAV_HDD_ABSENT]"},
                                           {4, "[ZAV_HDD_FAILED]"},
                                           {7, "[ZAV_HDD_FOUND][ZAV_HDD_ABSENT][ZAV_HDD_FAILED]"},
                                           {0, ""},
                                           {8, ""}});
}

TEST(Names, OfLvmStatesKeepTheTrailingComma) {
    expect_names(zav_lvmstatedef_to_str,
                 {{1, "ZAV_LVM_NORMAL, "},
                  {2, "ZAV_LVM_DEGRADED, "},
                  {4, "ZAV_LVM_FAILED, "},
                  {8, "ZAV_LVM_NOT_EXIST, "},
                  {16, "ZAV_LVM_FULL, "},
                  {32, "ZAV_LVM_INACTIVE, "},
                  {63, "ZAV_LVM_NORMAL, ZAV_LVM_DEGRADED, ZAV_LVM_FAILED, ZAV_LVM_NOT_EXIST, "
                       "ZAV_LVM_FULL, ZAV_LVM_INACTIVE, "},
                  {0, ""},
                  {64, ""}});
    EXPECT_EQ(call(zav_lvmstatedef_to_str, 63).size(), 101U);
}

TEST(Names, OfNetworkStatesAreSingleValues) {
    expect_names(zav_netstatedef_to_str, {{1, "ZAV_NET_UP"},
                                          {2, "ZAV_NET_DOWN"},
                                          {4, "ZAV_NET_NOT_EXIST"},
                                          {8, "ZAV_NET_ERR"},
                                          {3, "Not support[zav_netstatedef_to_str()]"},
                                          {0, "Not support[zav_netstatedef_to_str()]"}});
}

TEST(Names, OfExpansionUnitStates) {
    expect_names(zav_rbodstatedef_to_str, {{0x1101, "ZAV_RBOD_NORMAL"},
                                           {0x1102, "ZAV_RBOD_WARN"},
                                           {0x1103, "ZAV_RBOD_ALARM"},
                                           {0x1104, "ZAV_RBOD_FAIL"},
                                           {0x1105, "ZAV_RBOD_NOTEXIST"},
                                           {0x1106, "ZAV_RBOD_EXIST"},
                                           {0x1107, "Not support[zav_rbodstatedef_to_str()]"}});
}

TEST(Names, OfExpansionUnitSensorsFallBackToTheStatesText) {
    expect_names(zav_rbodid_to_str, {{0x1000, "ZAV_RBOD_EXPANDER"},
                                     {0x1001, "ZAV_RBOD_TEMP_CPU"},
                                     {0x1002, "ZAV_RBOD_VOLT_CPU"},
                                     {0x1003, "Not support[zav_rbodstatedef_to_str()]"}});
}

TEST(Names, OfVolumeGroups) {
    expect_names(zav_vgdef_to_str, {{-1, "ZAV_LVM_VG_NONE"},
                                    {0, "PrimaryOSVG"},
                                    {1, "DataVG1"},
                                    {12, "DataVG12"},
                                    {-2, "DataVG-2"},
                                    {-2147483647 - 1, "DataVG-2147483648"}});
}

TEST(Names, OfDeviceMinorAndEventTypes) {
    expect_names(zav_typedef_to_str, {{1, "ZAV_DEV_HDD"},
                                      {2, "ZAV_DEV_RAID"},
                                      {4, "ZAV_DEV_LVM"},
                                      {8, "ZAV_DEV_NIC"},
                                      {0x101, "ZAV_MINDEV_HDD_SATA"},
                                      {0x102, "ZAV_MINDEV_HDD_HWSATA"},
                                      {0x103, "ZAV_MINDEV_HDD_IUFD"},
                                      {0x104, "ZAV_MINDEV_HDD_EUFD"},
                                      {0x105, "ZAV_MINDEV_HDD_SAS"},
                                      {0x201, "ZAV_MINDEV_RAID_SW"},
                                      {0x202, "ZAV_MINDEV_RAID_HW"},
                                      {0x203, "ZAV_MINDEV_RAID_SAS"},
                                      {0x204, "ZAV_MINDEV_RAID_ISCSI"},
                                      {0x401, "ZAV_MINDEV_LVM_VG"},
                                      {0x402, "ZAV_MINDEV_LVM_PV"},
                                      {0x403, "ZAV_MINDEV_LVM_LV"},
                                      {0x801, "ZAV_MINDEV_NIC_ETH"},
                                      {0x802, "ZAV_MINDEV_NIC_BOND"},
                                      {10010, "ZAV_EVENT_INIT"},
                                      {11010, "ZAV_EVENT_FAN"},
                                      {12010, "ZAV_EVENT_THERMAL"},
                                      {13010, "ZAV_EVENT_VOLTAGE"},
                                      {14010, "ZAV_EVENT_UPS"},
                                      {15010, "ZAV_EVENT_RAID"},
                                      {16010, "ZAV_EVENT_HDD"},
                                      {17010, "ZAV_EVENT_DISC"},
                                      {18010, "ZAV_EVENT_LVM"},
                                      {19010, "ZAV_EVENT_NET"},
                                      {21010, "ZAV_EVENT_RBOD"},
                                      {20010, "Not support[zav_typedef_to_str()]"},
                                      {0, "Not support[zav_typedef_to_str()]"},
                                      {3, "Not support[zav_typedef_to_str()]"}});
}

TEST(Names, OfReturnCodes) {
    expect_names(zav_rcdef_to_str, {{0, "ZAV_RC_OK"},
                                    {2, "ZAV_RC_ERR_ENOENT"},
                                    {12, "ZAV_RC_ERR_ENOMEM"},
                                    {13, "ZAV_RC_ERR_EACCES"},
                                    {16, "ZAV_RC_ERR_EBUSY"},
                                    {19, "ZAV_RC_ERR_ENODEV"},
                                    {22, "ZAV_RC_ERR_EINVAL"},
                                    {86, "ZAV_RC_ERR_ESTRPIPE"},
                                    {128, "ZAV_RC_ERR"},
                                    {0x2000, "ZAV_RC_ERR_BIOS"},
                                    {0x2100, "ZAV_RC_ERR_BURNER"},
                                    {0x2200, "ZAV_RC_ERR_EVENT"},
                                    {0x2301, "ZAV_RC_ERR_READINFOFAIL"},
                                    {0x2400, "ZAV_RC_ERR_SENSOR"},
                                    {0x2500, "ZAV_RC_ERR_LED"},
                                    {0x2700, "ZAV_RC_ERR_HDD"},
                                    {0x2800, "ZAV_RC_ERR_LVM"},
                                    {0x2900, "ZAV_RC_ERR_NIC"}});
    for (const int unnamed : {27, 0x2101, 0x2102, 0x2103, 0x2104, 0x2106, 0x2107, 1, 0x1301})
        EXPECT_EQ(call(zav_rcdef_to_str, unnamed), "Not support[zav_rcdef_to_str()]") << unnamed;
}

TEST(Names, ANullBufferIsGivenBack) {
    for (const auto function :
         {zav_raidleveldef_to_str, zav_raidstatedef_to_str, zav_diskstatedef_to_str,
          zav_lvmstatedef_to_str, zav_netstatedef_to_str, zav_rbodstatedef_to_str,
          zav_rbodid_to_str, zav_vgdef_to_str, zav_typedef_to_str, zav_rcdef_to_str})
        EXPECT_EQ(function(1, nullptr), nullptr);
}

TEST(Codes, HaveTheirFixedValues) {
    EXPECT_EQ(ZAV_RC_ERR_EFBIG, 27);
    EXPECT_EQ(ZAV_RC_ERR_CDTOOL, 0x2101);
    EXPECT_EQ(ZAV_RC_ERR_PKTSETUP, 0x2102);
    EXPECT_EQ(ZAV_RC_ERR_BLANK, 0x2103);
    EXPECT_EQ(ZAV_RC_ERR_FORMAT, 0x2104);
    EXPECT_EQ(ZAV_RC_ERR_BADDISC, 0x2106);
    EXPECT_EQ(ZAV_RC_ERR_NODISC, 0x2107);
    EXPECT_EQ(ZAV_EVENT_SYSINFO, 20010);
    EXPECT_EQ(ZAV_LVM_VG_NONE, -1);
    EXPECT_EQ(ZAV_DVD_ROM, 1);
    EXPECT_EQ(ZAV_DVD_MINUS_R_SEQ, 2);
    EXPECT_EQ(ZAV_DVD_RAM, 3);
    EXPECT_EQ(ZAV_DVD_MINUS_RW_RES, 4);
    EXPECT_EQ(ZAV_DVD_MINUS_RW_SEQ, 5);
    EXPECT_EQ(ZAV_DVD_PLUS_RW, 6);
    EXPECT_EQ(ZAV_DVD_PLUS_R, 7);
    EXPECT_EQ(ZAV_DVD_PLUS_R_DOUBLE, 8);
    EXPECT_EQ(ZAV_CD_RW, 9);
    EXPECT_EQ(ZAV_CD_R, 10);
    EXPECT_EQ(ZAV_DISC_NONE, 11);
    EXPECT_EQ(ZAV_DISC_UNKNOWN, 12);
    EXPECT_EQ(ZAV_DISC_BLANK, 513);
    EXPECT_EQ(ZAV_DISC_COMPLETE, 514);
    EXPECT_EQ(ZAV_DISC_APPENDABLE, 515);
    EXPECT_EQ(ZAV_DISC_STATE_UNKNOWN, 516);
    EXPECT_EQ(ZAV_SENSOR_NORMAL, 1);
    EXPECT_EQ(ZAV_SENSOR_WARNING, 2);
    EXPECT_EQ(ZAV_SENSOR_CRITICAL, 3);
    EXPECT_EQ(ZAV_SENSOR_ERR, 4);
    EXPECT_EQ(ZAV_SYSINFO_NORMAL, 0x201);
    EXPECT_EQ(ZAV_SYSINFO_WARNING, 0x202);
    EXPECT_EQ(ZAV_SYSINFO_CRITICAL, 0x203);
    EXPECT_EQ(ZAV_SYSINFO_ERR, 0x204);
}

// What `function` prints to standard output.
template <typename Function>
Text printed(Function function) {
    testing::internal::CaptureStdout();
    function();
    return testing::internal::GetCapturedStdout();
}

// The pause reads one character from standard input: here a line and one more are waiting.
template <typename Function>
Text printed_with_input(Function function) {
    int ends[2];
    EXPECT_EQ(pipe(ends), 0);
    EXPECT_EQ(write(ends[1], "\nX", 2), 2);
    close(ends[1]);
    const int saved = dup(STDIN_FILENO);
    dup2(ends[0], STDIN_FILENO);
    close(ends[0]);
    clearerr(stdin);
    Text text = printed(function);
    EXPECT_EQ(getchar(), 'X');
    dup2(saved, STDIN_FILENO);
    close(saved);
    return text;
}

TEST(Trace, PassesTypesUpToTheLevel) {
    EXPECT_EQ(printed([] { zavdbgmsg(1, 1, "%s() - %d\n", "f", 7); }), "f() - 7\n");
    EXPECT_EQ(printed([] { zavdbgmsg(2, 1, "x"); }), "");
    EXPECT_EQ(printed([] { zavdbgmsg(-1, 0, "x"); }), "x");
}

TEST(Trace, AddsNothingToTheMessage) {
    EXPECT_EQ(printed([] { zavdbgmsg(1, 1, "100%% %s", "%d"); }), "100% %d");
}

TEST(Trace, TypeZeroPrintsTwice) {
    EXPECT_EQ(printed([] { zavdbgmsg(0, 1, "x"); }), "xx");
    EXPECT_EQ(printed([] { zavdbgmsg(0, 0, "x"); }), "xx");
    EXPECT_EQ(printed([] { zavdbgmsg(0, -1, "x"); }), "");
}

TEST(Trace, TypeZeroAboveLevelOneWaitsForEnter) {
    EXPECT_EQ(printed_with_input([] { zavdbgmsg(0, 2, "x"); }), "xxPress Enter to continue....\n");
}

TEST(Trace, StopReadsOneCharacterAboveLevelOne) {
    EXPECT_EQ(printed([] { zavdbgStop(1); }), "");
    EXPECT_EQ(printed_with_input([] { zavdbgStop(2); }), "Press Enter to continue....\n");
}

TEST(Trace, CutsLongMessages) {
    const Text text(1000, 'x');
    EXPECT_EQ(printed([&] { zavdbgmsg(1, 1, "%s", text.c_str()); }), Text(255, 'x'));
}

TEST(ReturnCodes, FourNumbersSurviveTheConversion) {
    for (const auto convert : {zavRCSysToZav, zavRCZavToSys}) {
        for (const int kept : {2, 19, 22, 86})
            EXPECT_EQ(convert(kept), kept);
        for (const int collapsed : {0, 1, 12, 13, 16, 27, 128, -1, 0x2700})
            EXPECT_EQ(convert(collapsed), 128) << collapsed;
    }
}

Text trimmed(const Text &text) {
    Text buffer = text + '\0';
    trim(buffer.data());
    return buffer.c_str();
}

TEST(Trimming, StripsBlanksAndTabsInFrontAndLineFeedsBehind) {
    EXPECT_EQ(trimmed("\t  abc \n"), "abc");
    EXPECT_EQ(trimmed("abc"), "abc");
    EXPECT_EQ(trimmed("a b\tc"), "a b\tc");
    EXPECT_EQ(trimmed("abc\n \t\n"), "abc");
}

TEST(Trimming, KeepsCarriageReturnsAndLeadingLineFeeds) {
    EXPECT_EQ(trimmed("abc\r\n"), "abc\r");
    EXPECT_EQ(trimmed(" \nabc"), "\nabc");
    EXPECT_EQ(trimmed("\r abc"), "\r abc");
}

TEST(Trimming, LeavesNothingOfBlanks) {
    EXPECT_EQ(trimmed(" \t "), "");
    EXPECT_EQ(trimmed("\n"), "");
    EXPECT_EQ(trimmed(""), "");
}

using Strip = void (*)(char *, char *);

Text stripped(Strip strip, const Text &text, const Text &set) {
    Text buffer = text + '\0';
    Text characters = set + '\0';
    strip(buffer.data(), characters.data());
    return buffer.c_str();
}

TEST(Trimming, OfASetAtTheEnd) {
    EXPECT_EQ(stripped(rtrim, "abc,,", ","), "abc");
    EXPECT_EQ(stripped(rtrim, "abc", ","), "abc");
    EXPECT_EQ(stripped(rtrim, ",;,", ",;"), "");
    EXPECT_EQ(stripped(rtrim, ",a", ","), ",a");
    EXPECT_EQ(stripped(rtrim, "abc", ""), "abc");
}

TEST(Trimming, OfASetAtTheStart) {
    EXPECT_EQ(stripped(ltrim, ",,abc", ","), "abc");
    EXPECT_EQ(stripped(ltrim, "abc", ","), "abc");
    EXPECT_EQ(stripped(ltrim, ",;,", ",;"), "");
    EXPECT_EQ(stripped(ltrim, "a,", ","), "a,");
}

TEST(Trimming, IgnoresNullStrings) {
    char set[] = ",";
    trim(nullptr);
    rtrim(nullptr, set);
    ltrim(nullptr, set);
    rtrim(set, nullptr);
    ltrim(set, nullptr);
    EXPECT_STREQ(set, ",");
}

TEST(ArrayNames, AreMappedFromTheirMetadata) {
    const std::pair<Text, Text> names[] = {{"/dev/md/MD0", "/dev/swraid/disk1p1"},
                                           {"/dev/md/MD1", "/dev/swraid/disk2p1"},
                                           {"/dev/md/MD2", "/dev/swraid/disk3p1"},
                                           {"/dev/md/MD3", "/dev/swraid/disk4p1"},
                                           {"/dev/md/MD10", "/dev/swraid/disk2p1"},
                                           {"ARRAY /dev/md/MD2 level", "/dev/swraid/disk3p1"},
                                           {"/dev/md/MD3 /dev/md/MD0", "/dev/swraid/disk1p1"}};
    for (auto [metadata, node] : names) {
        char path[20];
        EXPECT_EQ(trans_mdname(metadata.data(), path), 0) << metadata;
        EXPECT_EQ(path, node);
    }
}

TEST(ArrayNames, OthersAreRefused) {
    char path[20] = "untouched";
    for (Text metadata : {"", "/dev/md/MD4", "/dev/md1", "MD1", "/dev/md/md1"})
        EXPECT_EQ(trans_mdname(metadata.data(), path), 128) << metadata;
    EXPECT_EQ(trans_mdname(nullptr, path), 128);
    EXPECT_STREQ(path, "untouched");
    char known[] = "/dev/md/MD1";
    EXPECT_EQ(trans_mdname(known, nullptr), 128);
}

} // namespace
