// Temperatures, voltages, fans and the sensor ports.
#include "harness.h"

#include <climits>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;

const std::string kSensors = "/proc/zav/sys/sensor/";
constexpr const char *kLine27 = "/proc/zav/sys/dev/gpio/ich9/27";
constexpr const char *kPortIn = "/proc/zav/sys/dev/serio/in";
constexpr const char *kPortOut = "/proc/zav/sys/dev/serio/out";
const std::string kNoFile = "[2] No such file or directory";

class Sensors : public harness::Appliance {
  protected:
    Sensors() { four_disk_model(); }

    using Query = int (*)(int, zavFanState *);
    int ask(Query query, int probe) {
        info = {9, 9, 9.0F, 9};
        return checked([&] { return query(probe, &info); });
    }

    void expect(int type, int id, float value, int state) const {
        EXPECT_EQ(info.type, type);
        EXPECT_EQ(info.id, id);
        EXPECT_EQ(info.value, value);
        EXPECT_EQ(info.state, state);
    }
    void expect_untouched() const { expect(9, 9, 9.0F, 9); }

    static void sensor(const std::string &name, const std::string &text) {
        put(kSensors + name, text);
    }

    void expect_wrong_numbers(Query query, int probes) {
        for (const int probe : {0, -1, probes + 1, INT_MAX, INT_MIN}) {
            EXPECT_EQ(ask(query, probe), ZAV_RC_ERR_EINVAL);
            expect_untouched();
        }
        EXPECT_EQ(query(1, nullptr), ZAV_RC_ERR_EINVAL);
        EXPECT_TRUE(record().log.empty());
    }

    zavFanState info = {};
};

// ---- Temperatures ----

class Thermal : public Sensors {
  protected:
    struct Probe {
        int number;
        const char *reading;
        const char *status;
        const char *below, *warning, *above, *critical;
    };
    static constexpr Probe kProbes[] = {
        {1, "tempLT", "statusLT", "64.9", "65.0", "74.9", "75.0"},
        {2, "tempRT1", "statusRT1", "59.9", "60", "69.9", "70"},
        {3, "tempRT2", "statusRT2", "89.9", "90", "99.9", "100"},
    };

    void expect_state(const Probe &probe, const std::string &reading, const std::string &status,
                      int state) {
        sensor(probe.reading, reading);
        sensor(probe.status, status);
        EXPECT_EQ(ask(zavGetStateThermal, probe.number), ZAV_RC_OK);
        expect(ZAV_EVENT_THERMAL, probe.number, std::stof(reading), state);
    }
};

TEST_F(Thermal, IsJudgedByTheProbesLimits) {
    for (const Probe &probe : kProbes) {
        expect_state(probe, probe.below, "0\n", ZAV_SENSOR_NORMAL);
        expect_state(probe, probe.warning, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.above, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.critical, "0", ZAV_SENSOR_CRITICAL);
        expect_state(probe, "-5.5\n", "0", ZAV_SENSOR_NORMAL);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Thermal, WithALatchedAlarmIsCritical) {
    for (const Probe &probe : kProbes) {
        expect_state(probe, "20", "1", ZAV_SENSOR_CRITICAL);
        for (const char *status : {"2", "-1", "x"})
            expect_state(probe, "20", status, ZAV_SENSOR_NORMAL);
    }
}

TEST_F(Thermal, OfAProbeWithoutItsFilesIsNotKnown) {
    for (const Probe &probe : kProbes) {
        for (const bool reading : {true, false}) {
            remove(kSensors);
            sensor(reading ? probe.reading : probe.status, "20");
            record().log.clear();
            EXPECT_EQ(ask(zavGetStateThermal, probe.number), ZAV_RC_ERR_EACCES);
            expect(ZAV_EVENT_THERMAL, probe.number, 0.0F, ZAV_SENSOR_ERR);
            EXPECT_EQ(record().log, std::vector{row("zavGetStateThermal", 1, kNoFile)});
        }
    }
}

TEST_F(Thermal, OfAnEmptyFileIsNotKnown) {
    sensor("tempLT", "");
    sensor("statusLT", "0");
    EXPECT_EQ(ask(zavGetStateThermal, 1), ZAV_RC_ERR_EACCES);
    expect(ZAV_EVENT_THERMAL, 1, 0.0F, ZAV_SENSOR_ERR);
    sensor("tempLT", "20");
    sensor("statusLT", "");
    EXPECT_EQ(ask(zavGetStateThermal, 1), ZAV_RC_ERR_EACCES);
}

TEST_F(Thermal, ReadsNineteenCharacters) {
    sensor("tempLT", "0000000000000000020"
                     "99");
    sensor("statusLT", "0000000000000000001"
                       "9");
    EXPECT_EQ(ask(zavGetStateThermal, 1), ZAV_RC_OK);
    expect(ZAV_EVENT_THERMAL, 1, 20.0F, ZAV_SENSOR_CRITICAL);
}

TEST_F(Thermal, OfTheControllerComesFromItsReport) {
    model("SV-2980\n", "t;0;4\n");
    struct Row {
        const char *reading;
        int state;
    };
    for (const Row &row : {Row{"89.9", ZAV_SENSOR_NORMAL},
                           {"90", ZAV_SENSOR_WARNING},
                           {"94.9", ZAV_SENSOR_WARNING},
                           {"95", ZAV_SENSOR_CRITICAL}}) {
        put("/etc/Kiru/zav/.raidinfo", std::string("PCI\nH:") + row.reading + ":1\n");
        EXPECT_EQ(ask(zavGetStateThermal, 4), ZAV_RC_OK);
        expect(ZAV_EVENT_THERMAL, 4, std::stof(row.reading), row.state);
    }
}

TEST_F(Thermal, OfTheControllerNeedsItsModelAndItsReport) {
    EXPECT_EQ(ask(zavGetStateThermal, 4), ZAV_RC_ERR_ENODEV);
    expect(ZAV_EVENT_THERMAL, 4, 0.0F, ZAV_SENSOR_ERR);
    model("SV-2980\n", "t;0;4\n");
    EXPECT_EQ(ask(zavGetStateThermal, 4), ZAV_RC_ERR_EACCES);
    expect(ZAV_EVENT_THERMAL, 4, 0.0F, ZAV_SENSOR_ERR);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Thermal, HasFourProbes) {
    expect_wrong_numbers(zavGetStateThermal, 4);
}

// ---- Voltages ----

class Voltage : public Sensors {
  protected:
    struct Probe {
        int number;
        const char *reading;
        const char *status;
        const char *outer_low, *above_outer_low, *inner_low, *normal;
        const char *inner_high, *below_outer_high, *outer_high;
    };
    static constexpr Probe kProbes[] = {
        {1, "volVTT", "statusVTT", "0.96", "0.97", "1.08", "1.2", "1.32", "1.43", "1.44"},
        {2, "vol18V", "status18V", "1.44", "1.45", "1.62", "1.8", "1.98", "2.15", "2.16"},
        {3, "vol5V", "status5V", "4.0", "4.1", "4.5", "5.0", "5.5", "5.9", "6.0"},
        {4, "vol12V", "status12V", "9.6", "9.7", "10.8", "12", "13.2", "14.3", "14.4"},
        {5, "volVccp", "statusVccp", "0.54", "0.55", "0.6", "1.1", "1.6", "1.75", "1.76"},
    };

    void expect_state(const Probe &probe, const std::string &reading, const std::string &status,
                      int state) {
        sensor(probe.reading, reading);
        sensor(probe.status, status);
        EXPECT_EQ(ask(zavGetStateVolt, probe.number), ZAV_RC_OK);
        expect(ZAV_EVENT_VOLTAGE, probe.number, std::stof(reading), state);
    }
};

TEST_F(Voltage, IsJudgedByTheProbesBands) {
    for (const Probe &probe : kProbes) {
        expect_state(probe, "0", "0", ZAV_SENSOR_CRITICAL);
        expect_state(probe, probe.outer_low, "0", ZAV_SENSOR_CRITICAL);
        expect_state(probe, probe.above_outer_low, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.inner_low, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.normal, "0\n", ZAV_SENSOR_NORMAL);
        expect_state(probe, probe.inner_high, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.below_outer_high, "0", ZAV_SENSOR_WARNING);
        expect_state(probe, probe.outer_high, "0", ZAV_SENSOR_CRITICAL);
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Voltage, IsJudgedByItsStatusFirst) {
    for (const Probe &probe : kProbes) {
        expect_state(probe, probe.normal, "1", ZAV_SENSOR_CRITICAL);
        expect_state(probe, probe.normal, "2", ZAV_SENSOR_ERR);
        expect_state(probe, "0", "-1", ZAV_SENSOR_ERR);
    }
}

TEST_F(Voltage, OfAProbeWithoutItsFilesIsNotKnown) {
    for (const Probe &probe : kProbes) {
        remove(kSensors);
        sensor(probe.reading, "5");
        record().log.clear();
        EXPECT_EQ(ask(zavGetStateVolt, probe.number), ZAV_RC_ERR_EACCES);
        expect(ZAV_EVENT_VOLTAGE, probe.number, 0.0F, ZAV_SENSOR_ERR);
        EXPECT_EQ(record().log, std::vector{row("zavGetStateVolt", 1, kNoFile)});
    }
}

TEST_F(Voltage, HasFiveProbes) {
    expect_wrong_numbers(zavGetStateVolt, 5);
}

// ---- Alarms ----

class AlarmReset : public Sensors {};

TEST_F(AlarmReset, WritesAZero) {
    for (const char *status : {"statusLT", "statusRT1", "statusRT2", "statusVTT", "status18V",
                               "status5V", "status12V", "statusVccp"})
        sensor(status, "1\n");
    int thermal = 0;
    for (const char *status : {"statusLT", "statusRT1", "statusRT2"}) {
        EXPECT_EQ(checked([&] { return zavResetThermal(thermal + 1); }), ZAV_RC_OK);
        EXPECT_EQ(get(kSensors + status), "0");
        ++thermal;
    }
    int voltage = 0;
    for (const char *status : {"statusVTT", "status18V", "status5V", "status12V", "statusVccp"}) {
        EXPECT_EQ(get(kSensors + status), "1\n");
        EXPECT_EQ(checked([&] { return zavResetVolt(voltage + 1); }), ZAV_RC_OK);
        EXPECT_EQ(get(kSensors + status), "0");
        ++voltage;
    }
}

TEST_F(AlarmReset, NeedsTheStatusFile) {
    EXPECT_EQ(zavResetThermal(2), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(zavResetVolt(2), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(record().log,
              (std::vector{row("zavResetThermal", 1, kNoFile), row("zavResetVolt", 1, kNoFile)}));
}

TEST_F(AlarmReset, ThatDoesNotReachTheDriverFails) {
    sensor("x", "");
    ASSERT_EQ(symlink("/dev/full", (kSensors + "statusLT").c_str()), 0);
    EXPECT_EQ(checked([] { return zavResetThermal(1); }), ZAV_RC_ERR_EACCES);
}

TEST_F(AlarmReset, OfTheControllerReadsIt) {
    EXPECT_EQ(zavResetThermal(4), ZAV_RC_ERR_EACCES);
    model("SV-2980\n", "t;0;4\n");
    put("/etc/Kiru/zav/.raidinfo", "PCI\nH:99\n");
    EXPECT_EQ(zavResetThermal(4), ZAV_RC_OK);
    EXPECT_EQ(get("/etc/Kiru/zav/.raidinfo"), "PCI\nH:99\n");
}

TEST_F(AlarmReset, KnowsItsProbes) {
    for (const int probe : {0, -1, 5})
        EXPECT_EQ(zavResetThermal(probe), ZAV_RC_ERR_EINVAL);
    for (const int probe : {0, -1, 6})
        EXPECT_EQ(zavResetVolt(probe), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().log.empty());
}

// ---- Fans ----

class Fan : public Sensors {
  protected:
    static std::string file_of(int fan) {
        const char *const names[] = {"fan2", "fan3", "fan1"};
        return fan == 4 ? kLine27 : kSensors + names[fan - 1];
    }
    // What the fan's file holds from one wait to the next.
    static void readings(int fan, const std::vector<std::string> &texts) {
        put(file_of(fan), texts[0]);
        record().during_sleep = [fan, texts](size_t count) {
            if (count < texts.size())
                put(file_of(fan), texts[count]);
        };
        record().sleeps.clear();
    }
};

TEST_F(Fan, HasASpeedInACrossedFile) {
    for (int fan = 1; fan <= 4; ++fan) {
        put(file_of(fan), std::to_string(fan * 1000) + ".5\n");
        float speed = 0;
        EXPECT_EQ(checked([&] { return zavReadFanSpeed(fan, &speed); }), ZAV_RC_OK);
        EXPECT_EQ(speed, static_cast<float>(fan) * 1000 + 0.5F);
    }
}

TEST_F(Fan, WithoutItsFileHasNoSpeed) {
    float speed = 99;
    EXPECT_EQ(zavReadFanSpeed(1, &speed), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(record().log, std::vector{row("zavReadFanSpeed", 1, kNoFile)});
    put(file_of(1), "");
    EXPECT_EQ(zavReadFanSpeed(1, &speed), ZAV_RC_ERR_EACCES);
    for (const int fan : {0, -1, 5})
        EXPECT_EQ(zavReadFanSpeed(fan, &speed), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(zavReadFanSpeed(1, nullptr), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(speed, 99.0F);
}

TEST_F(Fan, ThatIsFastEnoughIsReadOnce) {
    const std::pair<int, std::string> fast[] = {{1, "801"}, {2, "1501"}, {3, "1501"}, {4, "1"}};
    for (const auto &[fan, speed] : fast) {
        readings(fan, {speed, "0"});
        EXPECT_EQ(ask(zavGetStateFan, fan), ZAV_RC_OK);
        expect(ZAV_EVENT_FAN, fan, std::stof(speed), ZAV_SENSOR_NORMAL);
        EXPECT_TRUE(record().sleeps.empty());
    }
}

TEST_F(Fan, ThatIsSlowIsReadThreeTimes) {
    const std::pair<int, std::string> slow[] = {{1, "800"}, {2, "1500"}, {3, "1500"}};
    for (const auto &[fan, speed] : slow) {
        readings(fan, {"1", "0", speed});
        EXPECT_EQ(ask(zavGetStateFan, fan), ZAV_RC_OK);
        expect(ZAV_EVENT_FAN, fan, std::stof(speed), ZAV_SENSOR_WARNING);
        EXPECT_EQ(record().sleeps, (std::vector{3U, 3U}));
    }
}

TEST_F(Fan, ThatComesUpIsReadNoMore) {
    readings(1, {"0", "900", "0"});
    EXPECT_EQ(ask(zavGetStateFan, 1), ZAV_RC_OK);
    expect(ZAV_EVENT_FAN, 1, 900.0F, ZAV_SENSOR_NORMAL);
    EXPECT_EQ(record().sleeps, std::vector{3U});
}

TEST_F(Fan, ThatStandsStillIsCritical) {
    for (const char *speed : {"0", "-5", "x"}) {
        readings(2, {speed});
        EXPECT_EQ(ask(zavGetStateFan, 2), ZAV_RC_OK);
        EXPECT_EQ(info.state, ZAV_SENSOR_CRITICAL);
        EXPECT_EQ(record().sleeps, (std::vector{3U, 3U}));
    }
}

TEST_F(Fan, ThatIsALineCountsAtOnceUnlessNegative) {
    readings(4, {"0", "1"});
    EXPECT_EQ(ask(zavGetStateFan, 4), ZAV_RC_OK);
    expect(ZAV_EVENT_FAN, 4, 0.0F, ZAV_SENSOR_CRITICAL);
    EXPECT_TRUE(record().sleeps.empty());
    readings(4, {"-1", "-1", "1"});
    EXPECT_EQ(ask(zavGetStateFan, 4), ZAV_RC_OK);
    expect(ZAV_EVENT_FAN, 4, 1.0F, ZAV_SENSOR_NORMAL);
    EXPECT_EQ(record().sleeps, (std::vector{1U, 1U}));
    readings(4, {"-1"});
    EXPECT_EQ(ask(zavGetStateFan, 4), ZAV_RC_OK);
    expect(ZAV_EVENT_FAN, 4, -1.0F, ZAV_SENSOR_CRITICAL);
    EXPECT_EQ(record().sleeps, (std::vector{1U, 1U}));
}

TEST_F(Fan, ThatCannotBeReadIsNotKnown) {
    EXPECT_EQ(ask(zavGetStateFan, 1), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(info.state, ZAV_SENSOR_ERR);
    EXPECT_EQ(info.id, 1);
    readings(1, {"0"});
    record().during_sleep = [](size_t) { remove(file_of(1)); };
    EXPECT_EQ(ask(zavGetStateFan, 1), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(info.state, ZAV_SENSOR_ERR);
    EXPECT_EQ(record().sleeps, std::vector{3U});
}

TEST_F(Fan, IsOneOfFour) {
    expect_wrong_numbers(zavGetStateFan, 4);
}

// ---- Ports ----

class SensorPort : public Sensors {};

TEST_F(SensorPort, IsReadAsAHexadecimalByte) {
    const std::pair<const char *, int> rows[] = {
        {"A", 0x0A}, {"ff\n", 0xFF}, {" 0x1F", 0x1F},    {"123", 0x23},
        {"0", 0},    {"\n 7", 7},    {"100000001", 0xFF}};
    for (const auto &[text, expected] : rows) {
        put(kPortIn, text);
        unsigned char byte = 0x55;
        EXPECT_EQ(checked([&] { return zavGetSensorIn(&byte); }), ZAV_RC_OK);
        EXPECT_EQ(byte, expected) << text;
    }
}

TEST_F(SensorPort, WithoutANumberIsRefused) {
    unsigned char byte = 0x55;
    for (const char *text : {"", "xyz"}) {
        put(kPortIn, text);
        EXPECT_EQ(zavGetSensorIn(&byte), ZAV_RC_ERR_EACCES);
    }
    EXPECT_TRUE(record().log.empty());
    remove(kPortIn);
    EXPECT_EQ(zavGetSensorIn(&byte), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(record().log, std::vector{row("zavGetSensorIn", 1, "[13] Can't open \"serio/in\".")});
    EXPECT_EQ(byte, 0x55);
    EXPECT_EQ(zavGetSensorIn(nullptr), ZAV_RC_ERR_EINVAL);
}

TEST_F(SensorPort, IsWrittenAsAHexadecimalByte) {
    put(kPortOut, "old text");
    for (const auto &[value, expected] : {std::pair{0x0A, "A"}, {0xFF, "FF"}, {0, "0"}}) {
        auto byte = static_cast<unsigned char>(value);
        EXPECT_EQ(checked([&] { return zavSetSensorOut(&byte); }), ZAV_RC_OK);
        EXPECT_EQ(get(kPortOut), expected);
    }
}

TEST_F(SensorPort, ThatTakesNothingIsRefused) {
    unsigned char byte = 1;
    put(kPortIn, "");
    ASSERT_EQ(symlink("/dev/full", kPortOut), 0);
    EXPECT_EQ(checked([&] { return zavSetSensorOut(&byte); }), ZAV_RC_ERR_EACCES);
    remove("/proc/zav/sys/dev/serio");
    EXPECT_EQ(zavSetSensorOut(&byte), ZAV_RC_ERR_EACCES);
    const harness::LogRow expected = row("zavSetSensorOut", 1, "[13] Can't open \"serio/out\".");
    EXPECT_EQ(record().log, (std::vector{expected, expected}));
    EXPECT_EQ(zavSetSensorOut(nullptr), ZAV_RC_ERR_EINVAL);
}

} // namespace
