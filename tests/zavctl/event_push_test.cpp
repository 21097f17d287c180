// Events made of the command line's words.
#include "core/event_push.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

EventWords words(std::vector<std::string> given, const char *state = nullptr) {
    EventWords all;
    all.words = std::move(given);
    if (state != nullptr)
        all.state = state;
    return all;
}

std::string text_of(const EventWords &given, bool hardware_raid = false) {
    return event_text(event_of_words(given, hardware_raid));
}

std::string refusal(const EventWords &given) {
    try {
        event_of_words(given, false);
    } catch (const NoEvent &problem) {
        return problem.what();
    }
    return "";
}

} // namespace

TEST(EventPush, ASensorHasNumberValueAndState) {
    EventWords given = words({"thermal", "2"}, "warning");
    given.value = 61.5;
    EXPECT_EQ(text_of(given), "thermal 2: warning, 61.5 C");
    EXPECT_EQ(text_of(words({"fan", "2"}, "critical")), "fan 2: critical, 0 rpm");
    EXPECT_EQ(text_of(words({"volt", "1"}, "normal")), "volt 1: normal, 0 V");
}

TEST(EventPush, TheUpsHasACharge) {
    EventWords given = words({"ups"}, "on-battery");
    given.charge = 55;
    EXPECT_EQ(text_of(given), "UPS: on battery, 55 %");
}

TEST(EventPush, ADiskIsTheMachinesOrAUnits) {
    EXPECT_EQ(text_of(words({"disk", "3"}, "failed")), "disk 3 of the machine: failed");
    EXPECT_EQ(text_of(words({"disk", "3"}, "failed"), true),
              "disk 3 of the RAID controller: failed");
    EXPECT_EQ(text_of(words({"disk", "2-3"}, "absent"), true), "disk 3 of unit 2: absent");
}

TEST(EventPush, StatesOfAnArrayCombine) {
    EventWords given = words({"array", "2"}, "degraded,resync");
    given.progress = 37.5;
    EXPECT_EQ(text_of(given), "array 2: degraded, rebuilding 37.5 %");
}

TEST(EventPush, ASoftwareArrayIsNamedByItsPartition) {
    const zavDevice device = event_of_words(words({"array", "2"}, "normal"), false).raid.dev;
    EXPECT_EQ(device.minor_type, ZAV_MINDEV_RAID_SW);
    EXPECT_EQ(device.part, 1);
}

TEST(EventPush, VolumesAreNamedByGroupAndNumber) {
    EXPECT_EQ(text_of(words({"vg", "1"}, "failed")), "volume group 1: failed");
    EXPECT_EQ(text_of(words({"pv", "0-1"}, "failed")), "physical volume 0-1: failed");
    EventWords given = words({"lv", "1-2"}, "full");
    given.value = 96;
    EXPECT_EQ(text_of(given), "volume 1-2: full, 96 % used");
}

TEST(EventPush, APortIsNamedAsTheSystemDoes) {
    EventWords given = words({"nic", "eth0"}, "down");
    given.speed = 1000;
    EXPECT_EQ(text_of(given), "eth0: down, 1000 Mbit/s");
    EXPECT_EQ(event_of_words(given, false).net.dev.disk, 1);
    EXPECT_EQ(text_of(words({"nic", "bond1"}, "up")), "bond1: up");
}

TEST(EventPush, LoadIsOfAProbeOrAFileSystem) {
    EventWords given = words({"load", "/var"}, "critical");
    given.value = 96;
    EXPECT_EQ(text_of(given), "file system /var: critical, 96 %");
}

TEST(EventPush, AUnitHasSensors) {
    EventWords given = words({"unit", "2", "temperature"}, "alarm");
    given.value = 88;
    EXPECT_EQ(text_of(given), "unit 2 temperature: alarm, 88 C");
    EXPECT_EQ(text_of(words({"unit", "2"}, "missing")), "unit 2: missing");
}

TEST(EventPush, AnInitialisationHasANumberAlone) {
    EXPECT_EQ(text_of(words({"init", "3"})), "initialisation: state 3");
}

TEST(EventPush, WhatIsWrongWithTheWordsIsSaid) {
    EXPECT_EQ(refusal(words({"toaster", "1"}, "hot")).substr(0, 57),
              "'toaster' is no kind of event: there are fan, thermal, vo");
    EXPECT_EQ(refusal(words({"fan", "two"}, "critical")),
              "it takes: zavctl event push fan|thermal|volt N --value NUMBER --state STATE");
    EXPECT_EQ(refusal(words({"fan", "2"})),
              "--state is missing: there are normal, warning, critical and unknown");
    EXPECT_EQ(refusal(words({"disk", "3"}, "tired")),
              "'tired' is no state of it: there are found, absent and failed");
    EXPECT_EQ(refusal(words({"nic", "wlan0"}, "up")),
              "it takes: zavctl event push nic ethN|bondN --state STATE [--speed MBIT]");
    EXPECT_EQ(refusal(words({"unit", "2", "door"}, "normal")).substr(0, 40),
              "it takes: zavctl event push unit N [temp");
}

TEST(EventPush, AnOptionThatSaysNothingAboutTheKindIsRefused) {
    EventWords given = words({"disk", "3"}, "failed");
    given.charge = 5;
    EXPECT_EQ(refusal(given), "--charge says nothing about 'disk'");
}
