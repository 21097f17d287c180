// Event records in words and as JSON.
#include "core/event_json.h"
#include "core/event_report.h"
#include "core/times.h"

#include <cmath>
#include <cstdlib>
#include <ctime>
#include <gtest/gtest.h>
#include <limits>

using namespace zavctl;

namespace {

std::string no_path(const zavDevice &) {
    return "";
}

Json json_of(const zavSystemEvent &event) {
    return event_json(event, "2026-11-22T12:03:41+01:00", no_path);
}

// What lies between the members means nothing, and need not be copied with them.
zavSystemEvent without_gaps(zavSystemEvent event) {
    if (event.type == ZAV_EVENT_RBOD)
        __builtin_clear_padding(&event.rbod);
    return event;
}

bool same(const zavSystemEvent &a, const zavSystemEvent &b) {
    const zavSystemEvent first = without_gaps(a);
    const zavSystemEvent second = without_gaps(b);
    return std::memcmp(&first, &second, sizeof first) == 0;
}

zavSystemEvent again(const zavSystemEvent &event) {
    return event_of_json(Json::parse(json_of(event).dump()));
}

constexpr zavDevice sata_disk{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 3, 0};
constexpr zavDevice sas_disk{ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 2 << 8 | 3, 0};
constexpr zavDevice own_array{ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
constexpr zavDevice group{ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, 1, 0};
constexpr zavDevice volume{ZAV_DEV_LVM, ZAV_MINDEV_LVM_LV, 2, 1};
constexpr zavDevice pv{ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 0};

zavSystemEvent fan(int number, float value, int state) {
    return event_of(zavFanState{ZAV_EVENT_FAN, number, value, state});
}

zavSystemEvent array(int state, float progress) {
    zavRaidState record{};
    record.type = ZAV_EVENT_RAID;
    record.dev = own_array;
    record.state = state;
    record.raidlevel = ZAV_RAIDLVL_5;
    record.raidcount = 4;
    record.hdddev[0] = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 1, 2};
    record.resync = progress;
    return event_of(record);
}

lvmLV logical_volume() {
    return {ZAV_MINDEV_LVM_LV, volume, 7, 95.5F, group};
}

lvmPV physical_volume() {
    return {ZAV_MINDEV_LVM_PV, pv, 0x123456789ABCULL, group, own_array};
}

zavSystemEvent group_event() {
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmvgdev.lvmtype = ZAV_MINDEV_LVM_VG;
    record.dev.lvmvgdev.lvmdev = group;
    record.dev.lvmvgdev.size = 8;
    record.dev.lvmvgdev.pvcount = 1;
    record.dev.lvmvgdev.pvdev[0] = physical_volume();
    record.dev.lvmvgdev.lvcount = 2;
    record.dev.lvmvgdev.lvdev[0] = logical_volume();
    record.dev.lvmvgdev.lvdev[1] = logical_volume();
    record.state = ZAV_LVM_NORMAL;
    return event_of(record);
}

zavSystemEvent volume_event(int state) {
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmlvdev = logical_volume();
    record.state = state;
    return event_of(record);
}

zavSystemEvent pv_event() {
    zavLVMState record{};
    record.type = ZAV_EVENT_LVM;
    record.dev.lvmpvdev = physical_volume();
    record.state = ZAV_LVM_FAILED;
    return event_of(record);
}

zavSystemEvent unit_event(int sensor, float value, int state) {
    zavRBODState record{};
    record.type = ZAV_EVENT_RBOD;
    record.rbod = {1, 2, "500A0B8", "HQ25U00302", "HBQE-T500", 1, 4, 5};
    record.id = sensor;
    record.value = value;
    record.state = state;
    record.priority = 6;
    return event_of(record);
}

zavSystemEvent net_event(const zavDevice &device, int speed, int state) {
    return event_of(zavNetState{ZAV_EVENT_NET, device, speed, state});
}

zavSystemEvent load_event(int probe) {
    return event_of(zavSysinfoState{ZAV_EVENT_SYSINFO, probe, 96.5F, ZAV_SYSINFO_CRITICAL});
}

zavSystemEvent media_event() {
    return event_of(
        zavMediaInfo{ZAV_EVENT_DISC, ZAV_DVD_PLUS_RW, ZAV_DISC_APPENDABLE, 4590208, 1228800});
}

zavSystemEvent ups_event(float charge, int state) {
    return event_of(zavUpsState{ZAV_EVENT_UPS, charge, state});
}

zavSystemEvent unknown_event() {
    zavSystemEvent event = event_of(zavInitState{4711, 0});
    const int words[] = {4711, 0, -5, 0, 7};
    std::memcpy(static_cast<void *>(&event), words, sizeof words);
    return event;
}

zavSystemEvent disk(const zavDevice &device, int state) {
    return event_of(zavHddState{ZAV_EVENT_HDD, device, state});
}

std::vector<zavSystemEvent> one_of_each() {
    return {event_of(zavInitState{ZAV_EVENT_INIT, 3}),
            fan(2, 0, ZAV_SENSOR_CRITICAL),
            event_of(zavFanState{ZAV_EVENT_THERMAL, 1, 65.3F, ZAV_SENSOR_WARNING}),
            event_of(zavFanState{ZAV_EVENT_VOLTAGE, 4, 11.97F, ZAV_SENSOR_NORMAL}),
            ups_event(98.5F, ZAV_UPS_ONBATT),
            array(ZAV_RAID_DEGRADED | ZAV_RAID_RESYNC, 37.5F),
            disk(sata_disk, ZAV_HDD_FAILED),
            disk(sas_disk, ZAV_HDD_FOUND),
            media_event(),
            group_event(),
            volume_event(ZAV_LVM_FULL),
            volume_event(0),
            pv_event(),
            net_event({ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0}, 1000, ZAV_NET_UP),
            load_event(0x105),
            unit_event(ZAV_RBOD_TEMP_CPU, 88, ZAV_RBOD_ALARM),
            unit_event(ZAV_RBOD_EXPANDER, 0, ZAV_RBOD_EXIST),
            unknown_event()};
}

std::string refusal(const std::string &text) {
    try {
        events_of_text(text);
    } catch (const NoEvent &problem) {
        return problem.what();
    }
    return "";
}

} // namespace

TEST(EventText, ASensorTellsItsStateAndReading) {
    EXPECT_EQ(event_text(fan(2, 0, ZAV_SENSOR_CRITICAL)), "fan 2: critical, 0 rpm");
    EXPECT_EQ(event_text(event_of(zavFanState{ZAV_EVENT_THERMAL, 1, 65.5F, ZAV_SENSOR_WARNING})),
              "thermal 1: warning, 65.5 C");
    EXPECT_EQ(event_text(event_of(zavFanState{ZAV_EVENT_VOLTAGE, 5, 1.05F, ZAV_SENSOR_NORMAL})),
              "volt 5: normal, 1.05 V");
}

TEST(EventText, ADiskTellsWhereItIs) {
    EXPECT_EQ(event_text(disk(sata_disk, ZAV_HDD_FAILED)), "disk 3 of the machine: failed");
    EXPECT_EQ(event_text(disk(sas_disk, ZAV_HDD_ABSENT)), "disk 3 of unit 2: absent");
    EXPECT_EQ(event_text(disk({ZAV_DEV_HDD, ZAV_MINDEV_HDD_HWSATA, 1, 0}, ZAV_HDD_FOUND)),
              "disk 1 of the RAID controller: found");
}

TEST(EventText, AnArrayTellsItsRebuild) {
    EXPECT_EQ(event_text(array(ZAV_RAID_DEGRADED | ZAV_RAID_RESYNC, 37.5F)),
              "array 2: degraded, rebuilding 37.5 %");
    EXPECT_EQ(event_text(array(ZAV_RAID_FAILED, 0)), "array 2: failed");
}

TEST(EventText, TheUpsTellsItsCharge) {
    EXPECT_EQ(event_text(ups_event(98.5F, ZAV_UPS_ONBATT)), "UPS: on battery, 98.5 %");
}

TEST(EventText, AStateOfTheUpsHookIsANumber) {
    EXPECT_EQ(event_text(ups_event(100, 12)), "UPS: unknown (state 12), 100 %");
}

TEST(EventText, VolumesAreNamedAsAtTheCommandLine) {
    EXPECT_EQ(event_text(group_event()), "volume group 1: normal");
    EXPECT_EQ(event_text(volume_event(ZAV_LVM_FULL)), "volume 1-2: full, 95.5 % used");
    EXPECT_EQ(event_text(pv_event()), "physical volume 0-1: failed");
}

TEST(EventText, AVolumeWithoutAnyStateBitIsWell) {
    EXPECT_EQ(event_text(volume_event(0)), "volume 1-2: normal, 95.5 % used");
    EXPECT_EQ(event_severity(volume_event(0)), Severity::ok);
}

TEST(EventText, APortTellsItsSpeedIfKnown) {
    EXPECT_EQ(event_text(net_event({ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0}, 1000, ZAV_NET_UP)),
              "eth0: up, 1000 Mbit/s");
    EXPECT_EQ(event_text(net_event({ZAV_DEV_NIC, ZAV_MINDEV_NIC_BOND, 2, 0}, 0, ZAV_NET_DOWN)),
              "bond1: down");
}

TEST(EventText, LoadIsAboutAProbe) {
    EXPECT_EQ(event_text(load_event(0x105)), "file system /var: critical, 96.5 %");
    EXPECT_EQ(event_text(load_event(0x101)), "processor: critical, 96.5 %");
    EXPECT_EQ(event_text(load_event(0x104)), "load probe 0x104: critical, 96.5 %");
}

TEST(EventText, AUnitTellsWhichOfItsPartsItIs) {
    EXPECT_EQ(event_text(unit_event(ZAV_RBOD_TEMP_CPU, 88, ZAV_RBOD_ALARM)),
              "unit 2 temperature: alarm, 88 C");
    EXPECT_EQ(event_text(unit_event(ZAV_RBOD_EXPANDER, 0, ZAV_RBOD_NOTEXIST)), "unit 2: missing");
}

TEST(EventText, ADiscTellsTypeStateAndSizes) {
    EXPECT_EQ(event_text(media_event()),
              "optical drive: DVD+RW, appendable, 4482 MB, 1200 MB available");
    EXPECT_EQ(event_text(event_of(
                  zavMediaInfo{ZAV_EVENT_DISC, ZAV_DISC_NONE, ZAV_DISC_STATE_UNKNOWN, 0, 0})),
              "optical drive: no disc");
}

TEST(EventText, AnUnknownTypeShowsItsNumberAndWords) {
    EXPECT_EQ(event_text(unknown_event()), "event of unknown type 4711: 4711 0 -5 0 7");
    EXPECT_EQ(event_severity(unknown_event()), Severity::unknown);
}

TEST(EventText, AStateBitWithoutANameIsUnknown) {
    EXPECT_EQ(event_text(disk(sata_disk, ZAV_HDD_FOUND | 64)),
              "disk 3 of the machine: found, unknown (state 65)");
}

TEST(EventSeverity, TheWorstStateBitDecides) {
    EXPECT_EQ(event_severity(array(ZAV_RAID_NORMAL, 0)), Severity::ok);
    EXPECT_EQ(event_severity(array(ZAV_RAID_DEGRADED | ZAV_RAID_RESYNC, 1)), Severity::warning);
    EXPECT_EQ(event_severity(array(ZAV_RAID_DEGRADED | ZAV_RAID_FAILED, 0)), Severity::critical);
}

TEST(EventJson, EveryKindIsReadBackAsItWas) {
    for (const zavSystemEvent &event : one_of_each())
        EXPECT_TRUE(same(again(event), event)) << json_of(event).dump(2);
}

TEST(EventJson, TellsTypeTextTimeAndFields) {
    const Json json = json_of(fan(2, 0, ZAV_SENSOR_CRITICAL));
    EXPECT_EQ(json.dump(), R"({"kind":"event","received":"2026-11-22T12:03:41+01:00",)"
                           R"("type":"fan","type_code":11010,"subject":"fan 2",)"
                           R"("text":"fan 2: critical, 0 rpm","severity":"critical",)"
                           R"("id":2,"value":0.0,"state":"critical","state_code":3})");
}

TEST(EventJson, AValueThatIsNoNumberIsNullAndComesBackAsNone) {
    const zavSystemEvent event = fan(1, std::numeric_limits<float>::quiet_NaN(), ZAV_SENSOR_ERR);
    EXPECT_TRUE(json_of(event)["value"].is_null());
    EXPECT_TRUE(std::isnan(again(event).fan.value));
}

TEST(EventJson, WordsAloneAreEnough) {
    const auto events = events_of_text(R"({"type": "disk", "state": "failed", "address":
        {"type": "hdd", "minor_type": "sata", "disk": 3, "part": 0}})");
    ASSERT_EQ(events.size(), 1U);
    EXPECT_TRUE(same(events[0], disk(sata_disk, ZAV_HDD_FAILED)));
}

TEST(EventJson, LinesAListAndAnAnswerAreRead) {
    const std::string one = json_of(fan(2, 0, ZAV_SENSOR_CRITICAL)).dump();
    EXPECT_EQ(events_of_text(one + "\n\n" + one + "\n").size(), 2U);
    EXPECT_EQ(events_of_text("[" + one + "," + one + "]").size(), 2U);
    EXPECT_EQ(events_of_text(R"({"command": "event poll", "events": [)" + one + "]}").size(), 1U);
}

TEST(EventJson, NothingHoldsNoEvent) {
    EXPECT_TRUE(events_of_text("").empty());
    EXPECT_TRUE(events_of_text("\n \n").empty());
}

TEST(EventJson, WhatIsNoEventIsRefusedWithTheReason) {
    EXPECT_EQ(refusal("7"), "an event is a JSON object");
    EXPECT_EQ(refusal("{}\nno JSON\n"), "line 1: 'type' is missing");
    EXPECT_EQ(refusal("no JSON"), "line 1: this is no JSON");
    EXPECT_EQ(refusal(R"({"type": "fan"})"), "'state' is missing");
    EXPECT_EQ(refusal(R"({"type": "fan", "id": 2.5, "state": "normal"})"),
              "'id' is a whole number");
    EXPECT_EQ(refusal(R"({"type": "fan", "id": 3000000000, "state": "normal"})"),
              "'id' is a whole number");
    EXPECT_EQ(refusal(R"({"type": "fan", "value": "fast", "state": "normal"})"),
              "'value' is a number");
    EXPECT_EQ(refusal(R"({"type": "fan", "state": "broken"})"),
              "'state' has no \"broken\": there are normal, warning, critical and unknown");
    EXPECT_EQ(refusal(R"({"type_code": 4711})"), "an event of type 4711 is given by its 'words'");
}

TEST(EventJson, AWordThatContradictsItsCodeIsRefused) {
    EXPECT_EQ(refusal(R"({"type": "fan", "state": "normal", "state_code": 3})"),
              "'state' \"normal\" and 'state_code' 3 contradict each other");
}

TEST(EventJson, MoreThanARecordHoldsIsRefused) {
    EXPECT_EQ(refusal(R"({"type": "array", "state": "normal", "level": "raid5",
                          "members": [{}, {}, {}, {}, {}]})"),
              "'members' is a list of at most 4");
    EXPECT_EQ(refusal(R"({"type": "unit", "sensor": "expander", "state": "normal",
                          "serial": "12345678901234567890"})"),
              "'serial' is a text of at most 19 bytes");
}

TEST(EventLine, IsTimeMarkAndText) {
    EXPECT_EQ(event_line({fan(2, 0, ZAV_SENSOR_CRITICAL), "2026-11-22T12:03:41+01:00"}, Style()),
              "2026-11-22T12:03:41+01:00  X  fan 2: critical, 0 rpm\n");
}

TEST(PushedSection, AnEventThatWasNotPutIsCritical) {
    const Section section =
        pushed_section({{fan(2, 0, ZAV_SENSOR_CRITICAL), "the driver's queue is full"}}, no_path);
    ASSERT_EQ(section.findings.size(), 1U);
    EXPECT_EQ(section.findings[0].text, "fan 2 was not pushed: the driver's queue is full");
    EXPECT_EQ(section.records[0]["pushed"], false);
}

class Times : public testing::Test {
  protected:
    static void zone(const char *name) {
        setenv("TZ", name, 1);
        tzset();
    }
    void TearDown() override {
        unsetenv("TZ");
        tzset();
    }
};

TEST_F(Times, AMomentIsLocalWithItsOffset) {
    zone("EAST-1:30");
    EXPECT_EQ(rfc3339(1795343021), "2026-11-22T11:53:41+01:30");
    EXPECT_EQ(time_of_day(1795343021), "11:53:41");
    zone("WEST3");
    EXPECT_EQ(rfc3339(1795343021), "2026-11-22T07:23:41-03:00");
}
