// What the appliance's driver tells of, and its records.
#include "sim_machines.hpp"

#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/driver_events.hpp"
#include "model/json.hpp"
#include "model/sentences.hpp"

#include "zav_event.h"

#include <cstring>
#include <fmt/format.h>
#include <gtest/gtest.h>

using namespace zavsim;

namespace {

// "fan 1: 3; ups 0: 5"
std::string told(const State &state) {
    std::string text;
    for (const DriverEvent &event : state.driver_events)
        text += fmt::format("{}{} {}: {}", text.empty() ? "" : "; ", event.kind, event.number,
                            event.state);
    return text;
}

std::string told_of(const std::vector<std::string> &sentences) {
    return told(after(four_disks(), sentences));
}

zavSystemEvent record_of(const std::vector<std::string> &sentences) {
    const State state = after(four_disks(), sentences);
    zavSystemEvent record = {};
    const std::string bytes = event_record(state.driver_events.at(0));
    EXPECT_EQ(bytes.size(), sizeof record);
    std::memcpy(static_cast<void *>(&record), bytes.data(), sizeof record);
    return record;
}

TEST(DriverEvents, AreNotThereAtFirst) {
    for (const State &state : {four_disks(), with_units(2), appliance("2740")})
        EXPECT_EQ(told(state), "");
}

TEST(DriverEvents, TellWhenASensorChangesItsState) {
    EXPECT_EQ(told_of({"temperature 1 is 66"}), "thermal 1: 2");
    EXPECT_EQ(told_of({"temperature 1 is 64"}), "");
    EXPECT_EQ(told_of({"temperature 2 is 70", "temperature 2 recovers"}),
              "thermal 2: 3; thermal 2: 1");
    EXPECT_EQ(told_of({"temperature 3 latches"}), "thermal 3: 3");
    EXPECT_EQ(told_of({"sensor 1 is missing"}), "thermal 1: 4");
    EXPECT_EQ(told_of({"voltage 3 is 5.6"}), "voltage 3: 2");
    EXPECT_EQ(told_of({"voltage 5 is 0.5"}), "voltage 5: 3");
    EXPECT_EQ(told_of({"voltage 1 faults"}), "voltage 1: 4");
    EXPECT_EQ(told_of({"fan 1 slows 700", "fan 1 slows 600", "fan 1 stops"}), "fan 1: 2; fan 1: 3");
    EXPECT_EQ(told_of({"fan 4 stops"}), "fan 4: 3");
}

TEST(DriverEvents, TellOfPowerAndLinks) {
    EXPECT_EQ(told_of({"power fails", "power returns"}), "ups 0: 5; ups 0: 7");
    EXPECT_EQ(told_of({"port 2 loses its link", "port 2 gets its link"}), "port 2: 2; port 2: 1");
}

TEST(DriverEvents, TellOfDisksAndTheirArrays) {
    EXPECT_EQ(told_of({"disk 3 fails"}), "disk 3: 4; array 1: 2; array 2: 2; array 3: 2");
    EXPECT_EQ(told(after(with_units(1), {"disk 2 vanishes"})), "bay 2: 2");
}

TEST(DriverEvents, TellOfARebuildAndItsEnd) {
    State state = after(appliance("2860-2"), {"disk 2 vanishes", "disk 2 appears", "disk 2 joins"});
    state.driver_events.clear();
    advance(state, 2000);
    EXPECT_EQ(told(state).rfind("array 1: 6; array 1: 1; array 2: 6", 0), 0U) << told(state);
    EXPECT_NE(told(state).find("array 3: 1"), std::string::npos) << told(state);
}

TEST(DriverEvents, TellWhatAScenarioDoesWhileNobodyLooks) {
    State state = four_disks();
    state.scenario =
        parse_scenario("at 1s fan 1 stops\nat 2s fan 1 recovers\nat 3s fan 1 stops\n", "").events;
    advance(state, 10);
    EXPECT_EQ(told(state), "fan 1: 3; fan 1: 1; fan 1: 3");
}

TEST(DriverEvents, ArePutByASentenceAsThingsAre) {
    EXPECT_EQ(told_of({"event fan 1", "event thermal 2", "event voltage 3", "event ups",
                       "event disk 4", "event array 2", "event port 1", "event \"fan 2\""}),
              "fan 1: 1; thermal 2: 1; voltage 3: 1; ups 0: 7; disk 4: 1; array 2: 1; port 1: 1; "
              "fan 2: 1");
    State state = four_disks();
    EXPECT_EQ(perform_sentence(state, "event disk 5"), "there is no disk 5");
    EXPECT_EQ(told(after(with_units(1), {"event disk 2"})), "bay 2: 1");
}

TEST(DriverEvents, AreKeptInTheStateFile) {
    const State state = after(four_disks(), {"fan 1 stops", "disk 2 fails"});
    EXPECT_EQ(to_text(state_from_text(to_text(state))), to_text(state));
}

TEST(EventRecords, HoldTheReadingOfASensor) {
    const zavSystemEvent fan = record_of({"fan 2 slows 700"});
    EXPECT_EQ(fan.type, ZAV_EVENT_FAN);
    EXPECT_EQ(fan.fan.id, 2);
    EXPECT_FLOAT_EQ(fan.fan.value, 700);
    EXPECT_EQ(fan.fan.state, ZAV_SENSOR_WARNING);
    EXPECT_EQ(record_of({"event thermal 1"}).type, ZAV_EVENT_THERMAL);
    EXPECT_FLOAT_EQ(record_of({"event voltage 4"}).volt.value, 12);
}

TEST(EventRecords, HoldTheChargeOfTheUps) {
    const zavSystemEvent ups = record_of({"power fails"});
    EXPECT_EQ(ups.type, ZAV_EVENT_UPS);
    EXPECT_FLOAT_EQ(ups.ups.charge, 100);
    EXPECT_EQ(ups.ups.state, ZAV_UPS_ONBATT);
}

TEST(EventRecords, HoldTheAddressesOfDisksArraysAndPorts) {
    const zavSystemEvent disk = record_of({"event disk 3"});
    EXPECT_EQ(disk.type, ZAV_EVENT_HDD);
    EXPECT_EQ(disk.hdd.dev.minor_type, ZAV_MINDEV_HDD_SATA);
    EXPECT_EQ(disk.hdd.dev.disk, 3);
    const zavSystemEvent array = record_of({"event array 2"});
    EXPECT_EQ(array.type, ZAV_EVENT_RAID);
    EXPECT_EQ(array.raid.dev.type, ZAV_DEV_RAID);
    EXPECT_EQ(array.raid.dev.disk, 2);
    EXPECT_EQ(array.raid.raidlevel, ZAV_RAIDLVL_5);
    const zavSystemEvent port = record_of({"port 2 loses its link"});
    EXPECT_EQ(port.type, ZAV_EVENT_NET);
    EXPECT_EQ(port.net.dev.disk, 2);
    EXPECT_EQ(port.net.state, ZAV_NET_DOWN);
}

TEST(EventSentences, RefuseWhatTheyDoNotMean) {
    for (const char *text : {"event", "event fan", "event fan 0", "event lamp 1", "event ups 1",
                             "event fan 1 2", "event \"\"", "event \"fan\""})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

} // namespace
