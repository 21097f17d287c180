// What is said of LEDs, sensor ports and the serial port.
#include "core/action_report.h"
#include "core/led_report.h"

#include "zav_api.h"

#include <gtest/gtest.h>

using namespace zavctl;

namespace {

const Failure refused_by_driver{ZAV_RC_ERR, "ZAV_RC_ERR", "the driver refuses"};

std::string summary_of(const Section &section) {
    return summary(Answer{"led get", "", {section}});
}

LedChange change(int led, int wanted, int reads) {
    LedChange result;
    result.wanted = wanted;
    result.after.led = led;
    result.after.state = reads;
    return result;
}

} // namespace

TEST(Led, IsNamedByNumberOrPlace) {
    EXPECT_EQ(led_number("1"), 1);
    EXPECT_EQ(led_number("panel-6"), 6);
    EXPECT_EQ(led_number("7"), 7);
    EXPECT_EQ(led_number("disk-4"), 10);
    EXPECT_EQ(led_name(7), "disk 1");
    for (const char *word : {"", "0", "11", "panel-7", "disk-0", "disk-5", "disk 1"})
        EXPECT_FALSE(led_number(word)) << word;
}

TEST(Led, EveryStateHasItsWord) {
    for (const int state : {ZAV_LED_OFF, ZAV_LED_ON, ZAV_LED_VALUE2, ZAV_HDDLED_SECOND_ON,
                            ZAV_HDDLED_FIRST_ON, ZAV_HDDLED_FIRST_2, ZAV_HDDLED_FIRST_2_SECOND_ON})
        EXPECT_EQ(led_state(led_state_word(state).value_or("")), state);
    EXPECT_FALSE(led_state_word(ZAV_RC_ERR));
    EXPECT_FALSE(led_state("blinking"));
}

TEST(Led, HasTheStatesOfItsKind) {
    EXPECT_EQ(listed(states_of(1)), "off and on");
    EXPECT_EQ(listed(states_of(5)), "off, on and value2");
    EXPECT_EQ(listed(states_of(7)), "off, second-on, first-on, first-2 and first-2-second-on");
}

TEST(Led, TheListHasOneLinePerLed) {
    LedReport broken{2, 0, refused_by_driver};
    const Section section = led_section({{1, ZAV_LED_ON, std::nullopt}, broken});
    EXPECT_EQ(section_text(section, Style()),
              "    LED  NAME     STATE    NOTE\n"
              "    1    panel 1  on\n"
              " ?  2    panel 2  unknown  the driver refuses (ZAV_RC_ERR, code 128)\n");
    EXPECT_EQ(summary_of(section), "COULD NOT TELL: LED panel 2 cannot be read");
}

TEST(Led, TheRecordHasItsFields) {
    const Json json = led_json({8, ZAV_HDDLED_FIRST_ON, std::nullopt});
    EXPECT_EQ(json["kind"], "led");
    EXPECT_EQ(json["led"], 8);
    EXPECT_EQ(json["name"], "disk 2");
    EXPECT_EQ(json["state"], "first-on");
    EXPECT_EQ(json["severity"], "ok");
}

TEST(LedChange, IsJudgedByWhatTheLedReadsThen) {
    EXPECT_EQ(summary_of(led_change_section(change(1, ZAV_LED_ON, ZAV_LED_ON))),
              "OK: LED panel 1 is on");
    EXPECT_EQ(summary_of(led_change_section(change(1, ZAV_LED_ON, ZAV_LED_OFF))),
              "CRITICAL: LED panel 1 was set, but reads off");
}

TEST(LedChange, AFailureIsCritical) {
    LedChange failed = change(1, ZAV_LED_ON, ZAV_LED_OFF);
    failed.failure = refused_by_driver;
    EXPECT_EQ(summary_of(led_change_section(failed)),
              "CRITICAL: LED panel 1 was not set: the driver refuses (ZAV_RC_ERR, code 128)");
    LedChange unread = change(1, ZAV_LED_ON, 0);
    unread.after.failure = refused_by_driver;
    EXPECT_EQ(summary_of(led_change_section(unread)),
              "COULD NOT TELL: LED panel 1 was set, but cannot be read back");
}

TEST(LedAlarm, APendingOneIsShown) {
    const Section section = led_alarm_section({true, 2, 7, 1, std::nullopt});
    EXPECT_EQ(summary_of(section), "OK: one LED alarm taken");
    EXPECT_EQ(section.records["code"], 7);
    EXPECT_EQ(section_text(section, Style()),
              "    Priority  2\n    Code      7\n    State     1\n");
}

TEST(LedAlarm, NoneIsWellAndAFailureCannotBeTold) {
    EXPECT_EQ(summary_of(led_alarm_section({})), "OK: no LED alarm is pending");
    EXPECT_TRUE(led_alarm_section({}).records.is_null());
    LedAlarm failed;
    failed.failure = refused_by_driver;
    EXPECT_EQ(severity(Answer{"", "", {led_alarm_section(failed)}}), Severity::unknown);
}

TEST(SensorPort, TheByteIsShownByItsBits) {
    const Section section = port_section({0x3F, std::nullopt}, false);
    EXPECT_EQ(section_text(section, Style()), "    Byte  0x3F (63)\n"
                                              "    Bit   7 6 5 4 3 2 1 0\n"
                                              "          0 0 1 1 1 1 1 1\n"
                                              "    Set   0, 1, 2, 3, 4 and 5\n");
    EXPECT_EQ(summary_of(section), "OK: the sensor ports read 0x3F");
    EXPECT_EQ(section.records["set_bits"].size(), 6U);
    EXPECT_EQ(section_text(port_section({0x3F, std::nullopt}, true), Style()), "");
}

TEST(SensorPort, AFailureCannotBeTold) {
    const Section section = port_section({0, refused_by_driver}, false);
    EXPECT_EQ(severity(Answer{"", "", {section}}), Severity::unknown);
    EXPECT_TRUE(section.records["value"].is_null());
}

TEST(SensorPort, ABytesWordIsDecimalOrHexadecimal) {
    EXPECT_EQ(byte_of("0"), 0);
    EXPECT_EQ(byte_of("255"), 255);
    EXPECT_EQ(byte_of("0x3f"), 0x3F);
    EXPECT_EQ(byte_of("0XFF"), 255);
    for (const char *word : {"", "256", "0x100", "-1", "3F", "0x", "1 ", "0x-1", "+1"})
        EXPECT_FALSE(byte_of(word)) << word;
}

TEST(SensorPort, WhatIsWrittenIsToldWithItsBits) {
    const Section section = action_section(port_set_report(0x81, std::nullopt));
    EXPECT_EQ(summary_of(section), "OK: 0x81 was written to the sensor ports, bits set: 0 and 7; "
                                   "nothing can be read back");
    EXPECT_EQ(section.records["outcome"], "done");
}

TEST(Uart, EachModeHasItsLines) {
    const auto text = [](int mode) {
        std::string all;
        for (const GpioLine &line : uart_lines(mode))
            all += std::to_string(line.line) + "=" + std::to_string(line.value) + " ";
        return all;
    };
    EXPECT_EQ(text(1), "34=1 35=1 49=0 ");
    EXPECT_EQ(text(2), "34=0 35=0 49=1 ");
    EXPECT_EQ(text(3), "34=0 35=0 49=0 ");
    EXPECT_EQ(text(4), "34=0 35=1 49=0 ");
}

TEST(Action, IsDoneOrCritical) {
    EXPECT_EQ(summary_of(action_section(uart_report(1, std::nullopt))),
              "OK: serial port in mode 1: GPIO line 34 to 1, line 35 to 1 and line 49 to 0");
    const Section failed = action_section(uart_report(1, refused_by_driver));
    EXPECT_EQ(summary_of(failed), "CRITICAL: the serial port was not brought into mode 1: the "
                                  "driver refuses (ZAV_RC_ERR, code 128)");
    EXPECT_EQ(failed.records["outcome"], "failed");
    EXPECT_EQ(failed.records["error"]["code"], ZAV_RC_ERR);
}
