// Events from and to the event driver.
#include "harness.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace {

using harness::record;
using harness::row;

constexpr const char *kDevice = "/dev/zavevent0";
constexpr unsigned long kPut = 1;
constexpr unsigned long kTake = 2;
constexpr unsigned long kTakePrivate = 0x10;
constexpr unsigned long kCountPrivate = 0x20;

class Events : public harness::Appliance {
  protected:
    Events() {
        put(kDevice, "");
        memset(&event, 0x55, sizeof event);
    }

    int ask(int (*function)(zavSystemEvent *)) {
        return checked([&] { return function(&event); });
    }

    bool is_filled_with(int byte) const {
        const auto *bytes = reinterpret_cast<const unsigned char *>(&event);
        return std::all_of(bytes, bytes + sizeof event, [byte](int b) { return b == byte; });
    }

    // A driver that hands out a fan's event, and wants a cleared record for it.
    void has_an_event(unsigned long wanted) {
        record().driver = [this, wanted](unsigned long request, void *argument) {
            if (request != wanted)
                return -1;
            EXPECT_EQ(argument, &event);
            EXPECT_TRUE(is_filled_with(0));
            event.fan = {ZAV_EVENT_FAN, 3, 900.0F, ZAV_SENSOR_NORMAL};
            return 0;
        };
    }

    zavSystemEvent event;
};

using Function = int (*)(zavSystemEvent *);
struct Named {
    const char *name;
    Function function;
};
constexpr Named kAll[] = {{"zavPollEvent", zavPollEvent},
                          {"zavWaitEvent", zavWaitEvent},
                          {"zavPushEvent", zavPushEvent},
                          {"zavPollPrivateEvent", zavPollPrivateEvent}};

TEST_F(Events, AreTaken) {
    has_an_event(kTake);
    EXPECT_EQ(ask(zavPollEvent), ZAV_RC_OK);
    EXPECT_EQ(event.type, ZAV_EVENT_FAN);
    EXPECT_EQ(event.fan.value, 900.0F);
    EXPECT_EQ(record().requests, std::vector{kTake});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Events, OpenTheirDeviceWithExactlyTheseFlags) {
    for (const Named &each : kAll) {
        record().driver_flags.clear();
        record().driver = [](unsigned long, void *) { return 0; };
        each.function(&event);
        EXPECT_EQ(record().driver_flags, std::vector{0x182}) << each.name;
    }
}

TEST_F(Events, ThatAreNotThereAreToldByACodeOfTheirOwn) {
    EXPECT_EQ(ask(zavPollEvent), 0x1201);
    EXPECT_TRUE(is_filled_with(0));
    memset(&event, 0x55, sizeof event);
    EXPECT_EQ(ask(zavPollPrivateEvent), 0x1201);
    EXPECT_TRUE(is_filled_with(0));
    EXPECT_TRUE(record().log.empty()) << "an empty queue is no failure";
}

TEST_F(Events, OfADriverThatIsMissingAreLogged) {
    remove(kDevice);
    for (const Named &each : kAll) {
        record().log.clear();
        memset(&event, 0x55, sizeof event);
        EXPECT_EQ(ask(each.function), ZAV_RC_ERR_EACCES);
        EXPECT_EQ(record().log, std::vector{row(each.name, 1, "[2] No such file or directory")});
        EXPECT_TRUE(is_filled_with(each.function == zavPollPrivateEvent ? 0 : 0x55)) << each.name;
    }
    EXPECT_TRUE(record().requests.empty());
}

TEST_F(Events, NeedARecord) {
    for (const Named &each : kAll)
        EXPECT_EQ(each.function(nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(record().log, std::vector{row("zavPollPrivateEvent", 1, "[22] Invalid argument")});
    EXPECT_TRUE(record().driver_flags.empty());
}

TEST_F(Events, OfADriverThatAnswersOtherwiseAreRefused) {
    record().driver = [](unsigned long, void *) { return 7; };
    EXPECT_EQ(ask(zavPollEvent), ZAV_RC_ERR);
    EXPECT_EQ(ask(zavPollPrivateEvent), ZAV_RC_ERR);
    EXPECT_EQ(record().log,
              (std::vector{row("zavPollEvent", 1, "[1] Operation not permitted"),
                           row("zavPollPrivateEvent", 1, "[1] Operation not permitted")}));
}

TEST_F(Events, AreWaitedForSecondBySecond) {
    has_an_event(kTake);
    const auto ready = record().driver;
    record().driver = [this, ready](unsigned long request, void *argument) {
        EXPECT_TRUE(is_filled_with(0)) << "cleared before each try";
        if (record().requests.size() < 4) {
            memset(argument, 0x77, sizeof(zavSystemEvent));
            return -1;
        }
        return ready(request, argument);
    };
    EXPECT_EQ(ask(zavWaitEvent), ZAV_RC_OK);
    EXPECT_EQ(event.type, ZAV_EVENT_FAN);
    EXPECT_EQ(record().sleeps, (std::vector{1U, 1U, 1U}));
    EXPECT_EQ(record().driver_flags.size(), 1U) << "opened once";
}

TEST_F(Events, WaitedForOfADriverThatAnswersOtherwiseAreRefused) {
    record().driver = [](unsigned long, void *) {
        errno = EIO;
        return 5;
    };
    EXPECT_EQ(ask(zavWaitEvent), ZAV_RC_ERR);
    EXPECT_EQ(record().log, std::vector{row("zavWaitEvent", 1, "[5] Input/output error")});
    EXPECT_TRUE(record().sleeps.empty());
}

TEST_F(Events, ArePutAsTheyStand) {
    record().driver = [this](unsigned long, void *argument) {
        EXPECT_EQ(argument, &event);
        EXPECT_TRUE(is_filled_with(0x55));
        return 0;
    };
    EXPECT_EQ(ask(zavPushEvent), ZAV_RC_OK);
    EXPECT_EQ(record().requests, std::vector{kPut});
    EXPECT_TRUE(is_filled_with(0x55));
}

TEST_F(Events, ThatFindTheQueueFullAreToldSoByTheDriversOwnNumber) {
    record().driver = [](unsigned long, void *) { return -12; };
    EXPECT_EQ(ask(zavPushEvent), ZAV_RC_ERR_ENOMEM);
    EXPECT_EQ(record().log, std::vector{row("zavPushEvent", 1, "[12] Cannot allocate memory")});
}

TEST_F(Events, ThatTheDriverRefusesAreNotLogged) {
    for (const int answer : {-1, 1, -11}) {
        record().driver = [answer](unsigned long, void *) {
            errno = ENOMEM;
            return answer;
        };
        EXPECT_EQ(ask(zavPushEvent), ZAV_RC_ERR) << answer;
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Events, ThatArePrivateAreCountedAndTaken) {
    has_an_event(kTakePrivate);
    EXPECT_EQ(ask(zavPollPrivateEvent), ZAV_RC_OK) << "a failing count is not looked at";
    EXPECT_EQ(event.type, ZAV_EVENT_FAN);
    EXPECT_EQ(record().requests, (std::vector{kCountPrivate, kTakePrivate}));
}

} // namespace
