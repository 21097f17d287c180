// LEDs and LED alarms.
#include "harness.h"

#include <climits>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;

const std::string kGpio = "/proc/zav/sys/dev/gpio/ich9/";
const char *const kPanel[] = {"38", "39", "07", "23", "21", "22"};
const char *const kDisks[][2] = {{"10", "40"}, {"04", "41"}, {"02", "42"}, {"00", "43"}};
const char *const kDiskStateDigits[][2] = {
    {"0", "0"}, {"0", "1"}, {"1", "0"}, {"2", "0"}, {"2", "1"}};
const int kDiskStates[] = {ZAV_LED_OFF, ZAV_HDDLED_SECOND_ON, ZAV_HDDLED_FIRST_ON,
                           ZAV_HDDLED_FIRST_2, ZAV_HDDLED_FIRST_2_SECOND_ON};

class Leds : public harness::Appliance {
  protected:
    Leds() {
        four_disk_model();
        for (const char *line : kPanel)
            put(kGpio + line, "0\n");
        for (const auto &pair : kDisks)
            for (const char *line : pair)
                put(kGpio + line, "0\n");
    }

    static std::string line(const std::string &name) { return get(kGpio + name); }

    static int set(int led, int state) {
        return checked([=] { return zavSetLED(led, state); });
    }
    static int set_disk(int led, int state) {
        return checked([=] { return zavSetHDDLED(led, state); });
    }
};

TEST_F(Leds, OfThePanelAreSetByTheirLines) {
    for (int led = 1; led <= 6; ++led) {
        EXPECT_EQ(set(led, ZAV_LED_ON), ZAV_RC_OK);
        EXPECT_EQ(line(kPanel[led - 1]), "1") << "a digit alone";
        EXPECT_EQ(set(led, ZAV_LED_OFF), ZAV_RC_OK);
        EXPECT_EQ(line(kPanel[led - 1]), "0");
    }
    EXPECT_EQ(set(5, ZAV_LED_VALUE2), ZAV_RC_OK);
    EXPECT_EQ(line("21"), "2");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Leds, OfThePanelAreOpenedBeforeTheStateIsLookedAt) {
    for (const int state : {0x2502, 0x2503, 0x24FF, 0, 1, -1}) {
        put(kGpio + "23", "1\n");
        EXPECT_EQ(set(4, state), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(line("23"), "");
    }
    EXPECT_EQ(set(5, 0x2503), ZAV_RC_ERR_EINVAL);
}

TEST_F(Leds, OfThePanelAreSix) {
    for (const int led : {0, 7, -1, INT_MAX, INT_MIN}) {
        EXPECT_EQ(set(led, ZAV_LED_ON), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(zavGetLED(led), ZAV_RC_ERR_EINVAL);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Leds, OfThePanelNeedTheirLine) {
    remove(kGpio);
    EXPECT_EQ(set(3, 77), ZAV_RC_ERR_ENOENT);
    EXPECT_EQ(checked([] { return zavGetLED(3); }), ZAV_RC_ERR_ENOENT);
    const std::string text = "[0] Can't open LED(" + kGpio + "07)";
    EXPECT_EQ(record().log, (std::vector{row("zavSetLED", 1, text), row("zavGetLED", 1, text)}));
}

TEST_F(Leds, ThatDoNotReachTheirLineFail) {
    remove(kGpio + "38");
    ASSERT_EQ(symlink("/dev/full", (kGpio + "38").c_str()), 0);
    EXPECT_EQ(set(1, ZAV_LED_ON), ZAV_RC_ERR);
    EXPECT_EQ(record().log,
              std::vector{row("zavSetLED", 1, "[-1] Can't write LED(" + kGpio + "38)")});
}

TEST_F(Leds, OfThePanelAreReadFromTheirLines) {
    const std::pair<const char *, int> rows[] = {{"1\n", ZAV_LED_ON},    {"0", ZAV_LED_OFF},
                                                 {" 2", ZAV_LED_VALUE2}, {"3", ZAV_RC_ERR},
                                                 {"-1", ZAV_RC_ERR},     {"x", ZAV_LED_OFF}};
    for (int led = 1; led <= 6; ++led)
        for (const auto &[text, expected] : rows) {
            put(kGpio + kPanel[led - 1], text);
            EXPECT_EQ(checked([led = led] { return zavGetLED(led); }), expected) << text;
        }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Leds, ThatHoldNothingCannotBeRead) {
    put(kGpio + "38", "");
    EXPECT_EQ(checked([] { return zavGetLED(1); }), ZAV_RC_ERR);
    EXPECT_EQ(record().log,
              std::vector{row("zavGetLED", 1, "[-1] Can't read LED(" + kGpio + "38)")});
}

TEST_F(Leds, OfDisksAreSetByTwoLines) {
    for (int led = 7; led <= 10; ++led)
        for (size_t i = 0; i < std::size(kDiskStates); ++i) {
            EXPECT_EQ(set_disk(led, kDiskStates[i]), ZAV_RC_OK);
            EXPECT_EQ(line(kDisks[led - 7][0]), kDiskStateDigits[i][0]);
            EXPECT_EQ(line(kDisks[led - 7][1]), kDiskStateDigits[i][1]);
            EXPECT_EQ(checked([led] { return zavGetHDDLED(led); }), kDiskStates[i]);
        }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Leds, OfDisksKnowTheirStates) {
    for (const int state : {0x2501, 0x2502, 0x2505, 0x2508, 0}) {
        put(kGpio + "02", "1");
        EXPECT_EQ(set_disk(9, state), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(line("02"), "");
        EXPECT_EQ(line("42"), "");
    }
    for (const int led : {0, 6, 11, -1, INT_MIN, INT_MAX}) {
        EXPECT_EQ(set_disk(led, ZAV_LED_OFF), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(zavGetHDDLED(led), ZAV_RC_ERR_EINVAL);
    }
}

TEST_F(Leds, OfDisksWithOtherDigitsHaveNoState) {
    for (const auto &[first, second] : {std::pair{"1", "1"}, {"3", "0"}, {"0", "2"}, {"-1", "0"}}) {
        put(kGpio + "10", first);
        put(kGpio + "40", second);
        EXPECT_EQ(checked([] { return zavGetHDDLED(7); }), ZAV_RC_ERR);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Leds, OfDisksNeedBothLines) {
    for (const char *missing : {"10", "40"}) {
        for (const char *each : {"10", "40"}) {
            remove(kGpio + each);
            put(kGpio + each, "0");
        }
        remove(kGpio + missing);
        ASSERT_EQ(mknod((kGpio + missing).c_str(), S_IFSOCK | 0600, 0), 0); // cannot be opened
        record().log.clear();
        EXPECT_EQ(set_disk(7, 0), ZAV_RC_ERR_ENOENT) << "before the state is looked at";
        EXPECT_EQ(checked([] { return zavGetHDDLED(7); }), ZAV_RC_ERR_ENOENT);
        const std::string text = "[0] Can't open LED(" + kGpio + missing + ")";
        EXPECT_EQ(record().log,
                  (std::vector{row("zavSetHDDLED", 1, text), row("zavGetHDDLED", 1, text)}));
    }
}

TEST_F(Leds, OfDisksWithoutANumberCannotBeRead) {
    for (const char *broken : {"10", "40"})
        for (const char *text : {"", "x", "\n"}) {
            put(kGpio + "10", "\n 0");
            put(kGpio + "40", "0");
            put(kGpio + broken, text);
            record().log.clear();
            EXPECT_EQ(checked([] { return zavGetHDDLED(7); }), ZAV_RC_ERR);
            EXPECT_EQ(
                record().log,
                std::vector{row("zavGetHDDLED", 1, "[-1] Can't read LED(" + kGpio + broken + ")")});
        }
}

TEST_F(Leds, OfDisksThatDoNotReachTheirLineFail) {
    for (const char *full : {"10", "40"}) {
        remove(kGpio + "10");
        remove(kGpio + "40");
        put(kGpio + "10", "");
        put(kGpio + "40", "");
        remove(kGpio + full);
        ASSERT_EQ(symlink("/dev/full", (kGpio + full).c_str()), 0);
        record().log.clear();
        EXPECT_EQ(set_disk(7, ZAV_LED_OFF), ZAV_RC_ERR);
        EXPECT_EQ(record().log, std::vector{row("zavSetHDDLED", 1,
                                                "[-1] Can't write LED(" + kGpio + full + ")")});
    }
}

TEST_F(Leds, OfDisksBelongToTheRaidController) {
    model("SV-2980\n", "t;0;4\n");
    EXPECT_EQ(set_disk(7, ZAV_LED_OFF), ZAV_RC_ERR);
    EXPECT_EQ(set_disk(0, 0), ZAV_RC_ERR) << "before the arguments are looked at";
    EXPECT_EQ(zavGetHDDLED(0), ZAV_RC_ERR);
    EXPECT_EQ(line("10"), "0\n");
    EXPECT_TRUE(record().log.empty());
}

// ---- Alarms ----

class LedAlarm : public harness::Appliance {
  protected:
    LedAlarm() { put("/dev/zavledevent", ""); }

    static int alarm() {
        return checked([] { return zavLEDAlarm(3, 7, 0x2501); });
    }
    int poll() {
        event = {9, 9, 9};
        return checked([this] { return zavLEDPollAlarm(&event); });
    }

    static void driver_answers(int answer) {
        record().driver = [answer](unsigned long, void *) { return answer; };
    }

    zavLEDEvent event = {};
};

TEST_F(LedAlarm, IsHandedToTheDriver) {
    record().driver = [](unsigned long, void *argument) {
        const auto *given = static_cast<const zavLEDEvent *>(argument);
        EXPECT_EQ(given->priority, 3);
        EXPECT_EQ(given->ledcode, 7);
        EXPECT_EQ(given->state, 0x2501);
        return 0;
    };
    EXPECT_EQ(alarm(), ZAV_RC_OK);
    EXPECT_EQ(record().requests, std::vector{1UL});
    EXPECT_EQ(record().driver_flags, std::vector{0x182});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LedAlarm, ThatTheDriverRefusesIsLogged) {
    driver_answers(-12);
    EXPECT_EQ(alarm(), ZAV_RC_ERR_ENOMEM);
    driver_answers(-1);
    EXPECT_EQ(alarm(), ZAV_RC_ERR);
    driver_answers(5);
    EXPECT_EQ(alarm(), ZAV_RC_ERR);
    EXPECT_EQ(record().log, (std::vector{row("zavLEDAlarm", 1, "[12] Cannot allocate memory"),
                                         row("zavLEDAlarm", 1, "[128] Unknown error"),
                                         row("zavLEDAlarm", 1, "[128] Unknown error")}));
}

TEST_F(LedAlarm, ThatIsPendingIsTaken) {
    record().driver = [](unsigned long, void *argument) {
        auto *taken = static_cast<zavLEDEvent *>(argument);
        EXPECT_EQ(taken->priority, 0) << "a cleared record";
        *taken = {1, 2, 3};
        return 0;
    };
    EXPECT_EQ(poll(), ZAV_RC_OK);
    EXPECT_EQ(event.state, 3);
    EXPECT_EQ(record().requests, std::vector{2UL});
    EXPECT_EQ(record().driver_flags, std::vector{0x182});
}

TEST_F(LedAlarm, ThatIsNotPendingIsNone) {
    EXPECT_EQ(poll(), 0x1201);
    EXPECT_EQ(event.priority, 0);
    EXPECT_EQ(event.ledcode, 0);
    EXPECT_EQ(event.state, 0);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(LedAlarm, IsRefusedByADriverThatAnswersOtherwise) {
    driver_answers(1);
    EXPECT_EQ(poll(), ZAV_RC_ERR);
    EXPECT_EQ(record().log, std::vector{row("zavLEDPollAlarm", 1, "[128] Unknown error")});
}

TEST_F(LedAlarm, NeedsTheDevice) {
    remove("/dev/zavledevent");
    EXPECT_EQ(alarm(), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(poll(), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(event.priority, 9);
    EXPECT_EQ(record().log,
              (std::vector{row("zavLEDAlarm", 1, "[2] No such file or directory"),
                           row("zavLEDPollAlarm", 1, "[2] No such file or directory")}));
    EXPECT_EQ(zavLEDPollAlarm(nullptr), ZAV_RC_ERR_EINVAL);
}

} // namespace
