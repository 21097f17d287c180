// What doctor says of the appliance's own drivers.
#include "core/driver_checks.h"

#include <cerrno>
#include <gtest/gtest.h>

using namespace zavctl;

namespace {

DriverFacts sound() {
    DriverFacts facts;
    facts.event_device = facts.led_device = true;
    return facts;
}

// The check that is not ok, and whether it says what that means.
std::string not_well(const DriverFacts &facts) {
    std::string names;
    for (const Check &check : driver_checks(facts)) {
        EXPECT_EQ(check.severity == Severity::ok, check.means.empty()) << check.name;
        EXPECT_TRUE(check.severity == Severity::ok || check.severity == Severity::warning);
        if (check.severity != Severity::ok)
            names += check.name + " ";
    }
    return names;
}

} // namespace

TEST(DriverChecks, AllThereIsWell) {
    EXPECT_EQ(not_well(sound()), "");
    EXPECT_EQ(driver_checks(sound()).size(), 4U);
}

TEST(DriverChecks, WhatIsMissingIsNamed) {
    DriverFacts facts = sound();
    facts.sensor_error = ENOENT;
    EXPECT_EQ(not_well(facts), "sensors ");
    facts = sound();
    facts.gpio_error = ENOENT;
    EXPECT_EQ(not_well(facts), "gpio ");
    facts = sound();
    facts.event_device = false;
    EXPECT_EQ(not_well(facts), "event-device ");
    facts = sound();
    facts.led_device = false;
    EXPECT_EQ(not_well(facts), "led-device ");
}
