// The mark by which a unit is known to belong to this chassis.
#include "harness.h"

#include <sys/stat.h>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;

constexpr const char *kSerial = "/sys/class/dmi/id/product_serial";
constexpr const char *kVolume = "/dev/sasraid/r3disk1";

class ChassisMark : public harness::Appliance {
  protected:
    ChassisMark() { put(kSerial, "AB1234\n"); }

    static int mark_of(const std::string &serial) {
        put(kSerial, serial);
        int mark = -1;
        EXPECT_EQ(zavMapRBODCCV(&mark), ZAV_RC_OK);
        return mark;
    }

    static void volume(const std::string &field) {
        std::string bytes(512, 'x');
        bytes.replace(440, field.size(), field);
        put(kVolume, bytes);
    }

    int set() {
        return checked([this] { return zavSetiRBOD(&unit); });
    }
    int get() {
        state = -1;
        return checked([this] { return zavGetiRBOD(&unit, &state); });
    }

    sRBOD unit = {1, 3, "", "", "", 0, 0, 0};
    int state = -1;
};

TEST_F(ChassisMark, IsTheSerialNumbersDigitsPlus1) {
    EXPECT_EQ(mark_of("AB1234\n"), 1235);
    EXPECT_EQ(mark_of("12-34\n"), 12035);
    EXPECT_EQ(mark_of("none\n"), 1);
    EXPECT_EQ(mark_of("\n"), 1);
    EXPECT_EQ(mark_of(""), 1);
    EXPECT_EQ(mark_of("-5\n"), 6);
    EXPECT_EQ(mark_of("99999999\n"), 100000000);
    EXPECT_EQ(mark_of("100000000\n"), 1);
}

TEST_F(ChassisMark, OfALongNumberIsThatOfTheLargest) {
    EXPECT_EQ(mark_of("999999999999\n"), 47483648);
    EXPECT_EQ(mark_of("2147483648\n"), 47483648);
    EXPECT_EQ(mark_of(std::string(31, '1') + "999\n"), 47483648);
}

TEST_F(ChassisMark, WithoutASerialNumberIsLogged) {
    remove(kSerial);
    int mark = 77;
    EXPECT_EQ(zavMapRBODCCV(&mark), ZAV_RC_ERR);
    EXPECT_EQ(mark, 77);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_EQ(record().log[1], row("zavMapRBODCCV", 1, "[128] zavGetSerialBIOS is failed!"));
    volume("");
    record().log.clear();
    EXPECT_EQ(set(), ZAV_RC_ERR);
    EXPECT_EQ(record().log.back(), row("zavSetiRBOD", 1, "[128] zavMapRBODCCV is failed!"));
    EXPECT_EQ(get(), ZAV_RC_ERR);
    EXPECT_EQ(record().log.back(), row("zavGetiRBOD", 1, "[128] zavMapRBODCCV is failed!"));
    EXPECT_EQ(state, -1);
}

TEST_F(ChassisMark, IsWrittenWhereADiskSignatureStands) {
    volume(std::string(4, '\0'));
    EXPECT_EQ(get(), 0);
    EXPECT_EQ(state, ZAV_IRBOD_UNMARKED);
    EXPECT_EQ(state, 0x1201);
    EXPECT_EQ(set(), 0);
    std::string expected(512, 'x');
    expected.replace(440, 4, std::string("\xD3\x04\0\0", 4)); // 1235, lowest byte first
    EXPECT_EQ(Appliance::get(kVolume), expected);
    EXPECT_EQ(get(), 0);
    EXPECT_EQ(state, ZAV_IRBOD_SAME);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(ChassisMark, OfAnotherChassisIsToldApart) {
    volume("");
    EXPECT_EQ(set(), 0);
    put(kSerial, "AB1235\n");
    EXPECT_EQ(get(), 0);
    EXPECT_EQ(state, ZAV_IRBOD_OTHER);
}

TEST_F(ChassisMark, NeedsTheUnitsFirstVolume) {
    EXPECT_EQ(set(), 2);
    EXPECT_EQ(get(), 2);
    EXPECT_EQ(state, -1);
    EXPECT_EQ(record().log, (std::vector{row("zavSetiRBOD", 1, "[2] open is failed!"),
                                         row("zavGetiRBOD", 1, "[2] open is failed!")}));
}

TEST_F(ChassisMark, NeedsAVolumeThatCanBePositioned) {
    put("/dev/sasraid/other", "");
    ASSERT_EQ(mkfifo(kVolume, 0600), 0);
    EXPECT_EQ(set(), 29);
    EXPECT_EQ(get(), 29);
    EXPECT_EQ(record().log, (std::vector{row("zavSetiRBOD", 1, "[29] lseek is failed!"),
                                         row("zavGetiRBOD", 1, "[29] lseek is failed!")}));
}

TEST_F(ChassisMark, OfAVolumeThatEndsBeforeItCannotBeRead) {
    put(kVolume, std::string(442, 'x'));
    EXPECT_EQ(get(), 5);
    EXPECT_EQ(state, -1);
    EXPECT_EQ(record().log, std::vector{row("zavGetiRBOD", 1, "[5] read is failed!")});
}

TEST_F(ChassisMark, OfAFullVolumeCannotBeWritten) {
    put("/dev/sasraid/other", "");
    ASSERT_EQ(symlink("/dev/full", kVolume), 0);
    EXPECT_EQ(set(), 28);
    EXPECT_EQ(record().log, std::vector{row("zavSetiRBOD", 1, "[28] write is failed!")});
}

TEST_F(ChassisMark, OfAVolumeThatFailsInTheEndIsLogged) {
    volume("");
    record().close_fails = true;
    const int written = zavSetiRBOD(&unit);
    const int asked = zavGetiRBOD(&unit, &state);
    record().close_fails = false;
    EXPECT_EQ(written, 5);
    EXPECT_EQ(asked, 5);
    EXPECT_EQ(state, -1);
    EXPECT_EQ(record().log, (std::vector{row("zavSetiRBOD", 1, "[5] close is failed!"),
                                         row("zavGetiRBOD", 1, "[5] close is failed!")}));
}

TEST_F(ChassisMark, NeedsItsArguments) {
    EXPECT_EQ(zavMapRBODCCV(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavSetiRBOD(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetiRBOD(nullptr, &state), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetiRBOD(&unit, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().log.empty());
}

} // namespace
