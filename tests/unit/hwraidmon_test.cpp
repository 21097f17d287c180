// Readings of the hardware monitors.
#include "harness.h"

namespace {

using harness::record;
using harness::row;

constexpr const char *kReport = "/etc/Kiru/zav/.raidinfo";
constexpr int kKey = 0x6912;

class HwMon : public harness::Appliance {
  protected:
    HwMon() {
        put(kReport, "PCI\nM:card\nH:38.5:12:5:3.3:1.1\nRBOD#1\nH:45.25:3200:12:5:1.08\n"
                     "RBOD#2\nM:unit\nRBOD#3\nH:33:1:2\n");
    }

    int unit(int id, int item) {
        value = 99;
        return checked([&] { return zavGetRBODHwMon(id, item, &value); });
    }
    int card(int item) {
        reading = 99;
        return checked([&] { return zavGetRaidCardHwMon(item, &reading); });
    }

    template <class Call>
    static int checked(const Call &call) {
        const int rc = Appliance::checked(call);
        EXPECT_EQ(semaphore_value(kKey), record().semget_fails ? -1 : 1);
        return rc;
    }

    float value = 0;
    double reading = 0;
};

TEST_F(HwMon, OfAUnitGivesFiveItems) {
    const float expected[] = {45.25F, 3200, 12, 5, 1.08F};
    for (int item = 0; item < 5; ++item) {
        EXPECT_EQ(unit(1, item), ZAV_RC_OK);
        EXPECT_EQ(value, expected[item]);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HwMon, OfTheCardGivesFourItems) {
    const double expected[] = {38.5, 12, 5, 3.3};
    for (int item = 0; item < 4; ++item) {
        EXPECT_EQ(card(item), ZAV_RC_OK);
        EXPECT_EQ(reading, expected[item]);
    }
}

TEST_F(HwMon, OfAnItemThatThereIsNotIsZeroAndRefused) {
    for (const int item : {-1, 5, INT32_MAX, INT32_MIN}) {
        EXPECT_EQ(unit(1, item), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(value, 0.0F);
    }
    for (const int item : {-1, 4, 5, INT32_MAX, INT32_MIN}) {
        EXPECT_EQ(card(item), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(reading, 0.0);
    }
}

TEST_F(HwMon, LooksAtTheItemLast) {
    EXPECT_EQ(unit(9, 77), ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(value, 99.0F);
    put(kReport, "");
    EXPECT_EQ(card(77), ZAV_RC_ERR_ENODEV);
    remove(kReport);
    EXPECT_EQ(unit(1, 77), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(card(77), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(reading, 99.0);
}

TEST_F(HwMon, WithFewerReadingsIsZero) {
    EXPECT_EQ(unit(3, 3), ZAV_RC_OK);
    EXPECT_EQ(value, 0.0F);
    EXPECT_EQ(unit(3, 4), ZAV_RC_OK);
    EXPECT_EQ(value, 0.0F);
}

TEST_F(HwMon, OfAUnitWithoutALineOfItsOwnIsTheNextOnes) {
    EXPECT_EQ(unit(2, 0), ZAV_RC_OK);
    EXPECT_EQ(value, 33.0F);
}

TEST_F(HwMon, WithoutAnyLineIsZeroForAUnitAndNoneForTheCard) {
    put(kReport, "RBOD#1\nPCI\nM:x\n");
    EXPECT_EQ(unit(1, 4), ZAV_RC_OK);
    EXPECT_EQ(value, 0.0F);
    EXPECT_EQ(card(0), ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(reading, 99.0);
}

TEST_F(HwMon, OfAUnitThatTheReportLacksIsNone) {
    for (const int id : {0, 4, 8, -1, INT32_MAX}) {
        EXPECT_EQ(unit(id, 0), ZAV_RC_ERR_ENODEV) << id;
        EXPECT_EQ(value, 99.0F);
    }
}

TEST_F(HwMon, DoesNotTestTheUnitsNumber) {
    put(kReport, "RBOD#-5 RBOD#99\nH:7\n");
    EXPECT_EQ(unit(-5, 0), ZAV_RC_OK);
    EXPECT_EQ(unit(99, 0), ZAV_RC_OK);
    EXPECT_EQ(value, 7.0F);
}

TEST_F(HwMon, WithoutAReportIsTracedAlone) {
    remove(kReport);
    testing::internal::CaptureStdout();
    EXPECT_EQ(unit(1, 0), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(card(0), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "zavGetRBODHwMon() - 1. Open /etc/Kiru/zav/.raidinfo File Error!\n"
              "zavGetRaidCardHwMon() - 1. Open /etc/Kiru/zav/.raidinfo File Error!\n");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(HwMon, NeedsAPlaceForTheValue) {
    EXPECT_EQ(zavGetRBODHwMon(1, 0, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavGetRaidCardHwMon(0, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(semaphore_value(kKey), -1) << "nothing was asked";
}

TEST_F(HwMon, WithoutTheSemaphoreIsLogged) {
    record().semget_fails = true;
    EXPECT_EQ(unit(1, 0), ZAV_RC_ERR);
    EXPECT_EQ(card(0), ZAV_RC_ERR);
    ASSERT_EQ(record().log.size(), 4U);
    EXPECT_EQ(record().log[1], row("zavGetRBODHwMon", 1, "[3] Get Semaphore [26898] failed!!"));
    EXPECT_EQ(record().log[3], row("zavGetRaidCardHwMon", 1, "[3] Get Semaphore [26898] failed!!"));
    EXPECT_EQ(value, 99.0F);
}

TEST_F(HwMon, ThatIsNotGivenItsTurnIsLogged) {
    record().semop_fails = [](short step) { return step < 0; };
    EXPECT_EQ(unit(1, 0), ZAV_RC_ERR);
    ASSERT_EQ(record().log.size(), 2U);
    EXPECT_NE(record().log[0].text.find("Failed to Lock Semaphore. key[0x6912]"),
              std::string::npos);
    EXPECT_EQ(record().log[1], row("zavGetRBODHwMon", 1, "[3] semaphore_p [26898] failed!!"));
}

TEST_F(HwMon, ThatCannotEndItsTurnAnswersAllTheSame) {
    record().semop_fails = [](short step) { return step > 0; };
    EXPECT_EQ(zavGetRBODHwMon(1, 0, &value), ZAV_RC_OK);
    EXPECT_EQ(value, 45.25F);
    ASSERT_EQ(record().log.size(), 1U);
    EXPECT_EQ(record().log[0].ident, "semaphore_v");
}

TEST_F(HwMon, GoesOnWithinALongLine) {
    put(kReport, "RBOD#1\nH" + std::string(78, 'x') + ":5:6\n");
    EXPECT_EQ(unit(1, 0), ZAV_RC_OK);
    EXPECT_EQ(value, 0.0F) << "the line's first piece has no reading";
}

} // namespace
