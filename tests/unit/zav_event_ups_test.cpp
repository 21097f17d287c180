// The UPS.
#include "harness.h"

#include <fcntl.h>
#include <sys/stat.h>

namespace {

using harness::record;
using harness::row;

constexpr const char *kStatus = "/var/log/apcupsd.status";
constexpr const char *kEvent = "/var/log/zavapcupsd.event";
constexpr time_t kNow = 1'700'000'000;

const std::string kOnline = "APC      : 001,036,0879\nDATE     : 2020-03-02\nSTATUS   : ONLINE \n"
                            "LINEV    : 230.0 Volts\nLOADPCT  :  12.0 Percent\n"
                            "BCHARGE  : 97.5 Percent\nEND APC  : 2020-03-02\n";

class Ups : public harness::Appliance {
  protected:
    Ups() { record().times = {kNow}; }

    static void written(const char *path, const std::string &text, int seconds_ago) {
        put(path, text);
        const timespec moment = {kNow - seconds_ago, 0};
        const timespec both[] = {moment, moment};
        ASSERT_EQ(utimensat(AT_FDCWD, path, both, 0), 0);
    }

    int ask() {
        info = {9, 9.0F, 9};
        const int rc = checked([&] { return zavGetStateUPS(&info); });
        if (rc != ZAV_RC_OK) {
            EXPECT_EQ(info.type, 9) << "untouched in every failure";
            EXPECT_EQ(info.charge, 9.0F);
            EXPECT_EQ(info.state, 9);
        }
        return rc;
    }

    void expect(int state, float charge) const {
        EXPECT_EQ(info.type, ZAV_EVENT_UPS);
        EXPECT_EQ(info.state, state);
        EXPECT_EQ(info.charge, charge);
    }

    void expect_refused(int rc, const std::string &text) {
        record().log.clear();
        EXPECT_EQ(ask(), rc);
        EXPECT_EQ(record().log, std::vector{row("zavGetStateUPS", 1, text)});
    }

    zavUpsState info = {};
};

const std::string kNotRunning = "[19] apcupsd don't be enable!";

TEST_F(Ups, OnlineHasItsCharge) {
    written(kStatus, kOnline, 5);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_UPS_ONLINE, 97.5F);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Ups, HasTheStateThatItsStatusLineTells) {
    struct Row {
        const char *line;
        int state;
    };
    for (const Row &row : {Row{"STATUS   : ONLINE LOWBATT", ZAV_UPS_ONLINE},
                           {"STATUS   : ONBATT", ZAV_UPS_ONBATT},
                           {"STATUS   : ONLINE ONBATT", ZAV_UPS_ONBATT},
                           {"STATUS   : COMMLOST", ZAV_UPS_OTHER},
                           {"STATUS   :\nOTHER: ONLINE", ZAV_UPS_OTHER},
                           {"STATUS : ONLINE", ZAV_UPS_ONLINE}}) {
        written(kStatus, std::string("LINEV : 1\nBCHARGE : 50\n") + row.line, 5);
        EXPECT_EQ(ask(), ZAV_RC_OK);
        expect(row.state, 50.0F);
    }
}

TEST_F(Ups, WithoutADaemonIsNoDevice) {
    expect_refused(ZAV_RC_ERR_ENODEV, kNotRunning);
    written(kEvent, "5 80\n", 1);
    expect_refused(ZAV_RC_ERR_ENODEV, kNotRunning);
}

TEST_F(Ups, IsBelievedFor90Seconds) {
    written(kStatus, kOnline, 90);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    written(kStatus, kOnline, 91);
    expect_refused(ZAV_RC_ERR_ENODEV, kNotRunning);
    written(kStatus, kOnline, -100);
    EXPECT_EQ(ask(), ZAV_RC_OK) << "a clock that was set back";
}

TEST_F(Ups, IsTheHooksWhereThatIsNewer) {
    written(kStatus, kOnline, 100);
    written(kEvent, "5 81.5\n", 10);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(5, 81.5F);
}

TEST_F(Ups, IsTheHooksWhereBothAreOfTheSameSecond) {
    written(kStatus, kOnline, 10);
    written(kEvent, "3\t42", 10);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(3, 42.0F);
}

TEST_F(Ups, IsTheDaemonsWhereThatIsNewer) {
    written(kStatus, kOnline, 10);
    written(kEvent, "3 42", 11);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_UPS_ONLINE, 97.5F);
    written(kEvent, "3 42", 5000);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_UPS_ONLINE, 97.5F);
}

TEST_F(Ups, IsNotBelievedWhereBothAreOld) {
    written(kStatus, kOnline, 91);
    written(kEvent, "3 42", 91);
    expect_refused(ZAV_RC_ERR_ENODEV, kNotRunning);
    written(kEvent, "3 42", 90);
    EXPECT_EQ(ask(), ZAV_RC_OK);
}

TEST_F(Ups, TakesTheHooksNumberAsItIs) {
    written(kStatus, kOnline, 10);
    written(kEvent, " \n\t -7 \n 1e1 more\n", 1);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(-7, 10.0F);
}

TEST_F(Ups, OfAnEmptyFileIsRefused) {
    written(kStatus, "", 5);
    expect_refused(ZAV_RC_ERR_EACCES, "[13] /var/log/apcupsd.status is NULL");
    for (const char *text : {"", " \n", "5", "5\n"}) {
        written(kEvent, text, 1);
        expect_refused(ZAV_RC_ERR_EACCES, "[13] /var/log/zavapcupsd.event is NULL");
    }
}

TEST_F(Ups, OfAFileThatCannotBeOpenedIsRefused) {
    record().times = {0};
    ASSERT_EQ(mknod(kStatus, S_IFSOCK | 0600, 0), 0);
    expect_refused(ZAV_RC_ERR_EACCES, "[6] No such device or address");
    ASSERT_EQ(mknod(kEvent, S_IFSOCK | 0600, 0), 0);
    expect_refused(ZAV_RC_ERR_EACCES, "[6] No such device or address");
}

TEST_F(Ups, NeedsAllThreeKeys) {
    const std::string lines[] = {"LINEV : 230\n", "BCHARGE : 97\n", "STATUS : ONLINE\n"};
    for (int missing = 0; missing < 3; ++missing) {
        std::string text = "APC : 1\n";
        for (int i = 0; i < 3; ++i)
            if (i != missing)
                text += lines[i];
        written(kStatus, text, 5);
        expect_refused(42, "[42] /var/log/apcupsd.status isn't correct!");
    }
    written(kStatus, "STATUS : ONLINE\nLINEV : 1\nBCHARGE :", 5);
    expect_refused(42, "[42] /var/log/apcupsd.status isn't correct!");
}

TEST_F(Ups, ReadsFieldsAcrossBlanks) {
    written(kStatus, "LINEV\t:\t\t1\nBCHARGE\n:\n 55.5\nSTATUS ONBATT", 5);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_UPS_ONBATT, 55.5F);
}

TEST_F(Ups, ReadsTheFirst4095Bytes) {
    const std::string keys = "LINEV : 1\nBCHARGE : 5\nSTATUS : ONLINE";
    written(kStatus, std::string(4095 - keys.size(), ' ') + keys + "ONBATT", 5);
    EXPECT_EQ(ask(), ZAV_RC_OK);
    expect(ZAV_UPS_ONLINE, 5.0F);
}

TEST_F(Ups, NeedsARecordAndMemory) {
    EXPECT_EQ(zavGetStateUPS(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().log.empty());
    record().calloc_fails = true;
    EXPECT_EQ(zavGetStateUPS(&info), ZAV_RC_ERR_ENOMEM);
    record().calloc_fails = false;
    EXPECT_EQ(record().log, std::vector{row("zavGetStateUPS", 1, "[12] Cannot allocate memory")});
}

} // namespace
