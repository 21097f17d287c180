// The main board's sensors in the model: what they show, what is acted, what programs write.
#include "sim_machines.hpp"

#include "model/actions.hpp"
#include "model/json.hpp"
#include "model/sensors.hpp"
#include "model/sentences.hpp"

#include <gtest/gtest.h>

using namespace zavsim;

namespace {

const std::string sensor = "/proc/zav/sys/sensor/";
const std::string device = "/proc/zav/sys/dev/";

// What a program reads there; "gone" where there is no file.
std::string shown(const State &state, const std::string &path) {
    for (const auto &files : {reading_files(state), writable_files(state)})
        for (const DriverFile &file : files)
            if (file.path == path)
                return file.text.value_or("gone");
    return "unknown";
}

State after_writing(State state, const std::string &path, const std::string &text) {
    take_written(state, path, text);
    return state;
}

TEST(Sensors, ReadAsInACoolRoomAtFirst) {
    const State state = four_disks();
    const std::vector<std::pair<std::string, std::string>> expected = {
        {"tempLT", "42\n"},   {"tempRT1", "36\n"},   {"tempRT2", "51\n"},   {"statusLT", "0\n"},
        {"statusRT1", "0\n"}, {"statusRT2", "0\n"},  {"volVTT", "1.20\n"},  {"vol18V", "1.80\n"},
        {"vol5V", "5.00\n"},  {"vol12V", "12.00\n"}, {"volVccp", "1.10\n"}, {"statusVTT", "0\n"},
        {"status18V", "0\n"}, {"status5V", "0\n"},   {"status12V", "0\n"},  {"statusVccp", "0\n"},
        {"fan1", "2100\n"},   {"fan2", "1400\n"},    {"fan3", "2100\n"},
    };
    for (const auto &[file, text] : expected)
        EXPECT_EQ(shown(state, sensor + file), text) << file;
}

TEST(Sensors, ReadWhatASentenceSays) {
    const State state = after(four_disks(), {"temperature 1 is 78", "temperature 2 is 61.5",
                                             "voltage 3 is 5.6", "input is 3f"});
    EXPECT_EQ(shown(state, sensor + "tempLT"), "78\n");
    EXPECT_EQ(shown(state, sensor + "tempRT1"), "61.5\n");
    EXPECT_EQ(shown(state, sensor + "vol5V"), "5.60\n");
    EXPECT_EQ(shown(state, device + "serio/in"), "3F\n");
}

TEST(Sensors, NumberFansOtherThanTheirFiles) {
    const State state = after(four_disks(), {"fan 1 slows 700", "fan 2 stops", "fan 3 slows 9"});
    EXPECT_EQ(shown(state, sensor + "fan2"), "700\n");
    EXPECT_EQ(shown(state, sensor + "fan3"), "0\n");
    EXPECT_EQ(shown(state, sensor + "fan1"), "9\n");
}

TEST(Sensors, HaveAFourthFanOnALineWithoutASpeed) {
    State state = after(four_disks(), {"fan 4 stops"});
    EXPECT_EQ(shown(state, device + "gpio/ich9/27"), "0\n");
    EXPECT_NE(perform_sentence(state, "fan 4 slows 700"), "");
    EXPECT_EQ(shown(after(state, {"fan 4 recovers"}), device + "gpio/ich9/27"), "1\n");
}

TEST(Sensors, Recover) {
    const State state =
        after(four_disks(),
              {"temperature 2 is 99", "temperature 2 latches", "voltage 1 faults", "fan 3 stops",
               "temperature 2 recovers", "voltage 1 recovers", "fan 3 recovers"});
    EXPECT_EQ(shown(state, sensor + "tempRT1"), "36\n");
    EXPECT_EQ(shown(state, sensor + "statusRT1"), "0\n");
    EXPECT_EQ(shown(state, sensor + "statusVTT"), "0\n");
    EXPECT_EQ(shown(state, sensor + "fan1"), "2100\n");
}

TEST(Sensors, ShowAlarmsAndFaultsBesideTheReading) {
    const State state = after(four_disks(), {"temperature 3 latches", "voltage 5 faults"});
    EXPECT_EQ(shown(state, sensor + "statusRT2"), "1\n");
    EXPECT_EQ(shown(state, sensor + "tempRT2"), "51\n");
    EXPECT_EQ(shown(state, sensor + "statusVccp"), "2\n");
}

TEST(Sensors, AreGoneWithBothFilesWhenTheDriverMissesThem) {
    const State state = after(four_disks(), {"sensor 1 is missing"});
    EXPECT_EQ(shown(state, sensor + "tempLT"), "gone");
    EXPECT_EQ(shown(state, sensor + "statusLT"), "gone");
    EXPECT_EQ(shown(state, sensor + "tempRT1"), "36\n");
    EXPECT_EQ(shown(after(state, {"sensor 1 works again"}), sensor + "tempLT"), "42\n");
}

TEST(SensorAlarms, AreClearedByAZero) {
    const State state = after(four_disks(), {"temperature 1 latches", "voltage 2 faults"});
    EXPECT_EQ(shown(after_writing(state, sensor + "statusLT", "0"), sensor + "statusLT"), "0\n");
    EXPECT_EQ(shown(after_writing(state, sensor + "status18V", "0\n"), sensor + "status18V"),
              "0\n");
}

TEST(SensorAlarms, LastAsLongAsTheirReason) {
    const State hot = after(four_disks(), {"temperature 1 is 78", "temperature 1 latches"});
    EXPECT_EQ(shown(after_writing(hot, sensor + "statusLT", "0"), sensor + "statusLT"), "1\n");
    const State low = after(four_disks(), {"voltage 4 is 10.8", "voltage 4 latches"});
    EXPECT_EQ(shown(after_writing(low, sensor + "status12V", "0"), sensor + "status12V"), "1\n");
}

TEST(SensorAlarms, AreNotMadeByPrograms) {
    EXPECT_EQ(shown(after_writing(four_disks(), sensor + "statusLT", "1"), sensor + "statusLT"),
              "0\n");
}

TEST(DriverLines, KeepADigitAndPortsAByte) {
    State state = after_writing(four_disks(), device + "gpio/ich9/21", "2");
    EXPECT_EQ(shown(state, device + "gpio/ich9/21"), "2\n");
    EXPECT_EQ(shown(after_writing(state, device + "serio/out", "3F"), device + "serio/out"),
              "3F\n");
}

TEST(DriverLines, TakeNothingElse) {
    for (const char *text : {"", "\n", "x", "10", "-1"})
        EXPECT_EQ(shown(after_writing(four_disks(), device + "gpio/ich9/21", text),
                        device + "gpio/ich9/21"),
                  "0\n")
            << text;
    EXPECT_EQ(shown(after_writing(four_disks(), device + "serio/out", "123"), device + "serio/out"),
              "00\n");
}

TEST(DriverLines, AreThoseOfTheBoard) {
    std::string names;
    for (const DriverFile &file : writable_files(four_disks()))
        if (file.path.rfind(device, 0) == 0)
            names += file.path.substr(device.size()) + " ";
    EXPECT_EQ(names, "gpio/ich9/00 gpio/ich9/02 gpio/ich9/04 gpio/ich9/07 gpio/ich9/10 "
                     "gpio/ich9/21 gpio/ich9/22 gpio/ich9/23 gpio/ich9/27 gpio/ich9/34 "
                     "gpio/ich9/35 gpio/ich9/38 gpio/ich9/39 gpio/ich9/40 gpio/ich9/41 "
                     "gpio/ich9/42 gpio/ich9/43 gpio/ich9/49 serio/out ");
}

TEST(Sensors, AreKeptInTheStateFile) {
    const State state = after(four_disks(), {"temperature 1 is 78", "fan 4 stops",
                                             "voltage 2 latches", "sensor 3 is missing"});
    EXPECT_EQ(to_text(state_from_text(to_text(state))), to_text(state));
}

TEST(SensorSentences, TellTheirRanges) {
    EXPECT_EQ(parse_sentence("temperature 4 is 78").error,
              "temperature wants a number from 1 to 3");
    EXPECT_EQ(parse_sentence("temperature 1 is 201").error,
              "temperature 1 is T (0 to 200), latches, faults or recovers");
    EXPECT_EQ(parse_sentence("voltage 6 latches").error, "voltage wants a number from 1 to 5");
    EXPECT_EQ(parse_sentence("fan 5 stops").error, "fan wants a number from 1 to 4");
    EXPECT_EQ(parse_sentence("fan 1 slows 0").error,
              "fan 1 slows R (1 to 9999), stops or recovers");
    EXPECT_EQ(parse_sentence("sensor 4 is missing").error, "sensor wants a number from 1 to 3");
    EXPECT_EQ(parse_sentence("input is 100").error, "input is HH, a byte in hexadecimal digits");
}

TEST(SensorSentences, RefuseWhatTheyDoNotMean) {
    for (const char *text : {"temperature",
                             "temperature 1",
                             "temperature 1 is",
                             "temperature 1 is hot",
                             "temperature 1 is 7.25",
                             "temperature 1 explodes",
                             "temperature 0 latches",
                             "voltage",
                             "voltage 3 is",
                             "voltage 3 is 5.555",
                             "voltage 3 is 20.01",
                             "voltage 3 burns",
                             "fan",
                             "fan 1",
                             "fan 1 slows",
                             "fan 1 slows fast",
                             "fan x slows 700",
                             "fan 1 slows 10000",
                             "sensor",
                             "sensor 1",
                             "sensor 1 is",
                             "sensor 1 works",
                             "input",
                             "input is",
                             "input is G",
                             "input is 3F now"})
        EXPECT_NE(parse_sentence(text).error, "") << text;
}

} // namespace
