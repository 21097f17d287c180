// Runs on the simulated appliance: asks the library about the machine's health, as told by the
// first word, and prints what came of it.
#include "zav_api.h"
#include "zav_led.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

const char *sensor_word(int state) {
    switch (state) {
    case ZAV_SENSOR_NORMAL:
        return "normal";
    case ZAV_SENSOR_WARNING:
        return "warning";
    case ZAV_SENSOR_CRITICAL:
        return "critical";
    default:
        return "error";
    }
}

void print_sensors(const char *what, int (*ask)(int, zavFanState *), int count) {
    for (int number = 1; number <= count; ++number) {
        zavFanState info = {};
        const int rc = ask(number, &info);
        printf("%s %d: %d %.1f %s\n", what, number, rc, static_cast<double>(info.value),
               sensor_word(info.state));
    }
}

int sensors() {
    print_sensors("thermal", zavGetStateThermal, 3);
    print_sensors("voltage", zavGetStateVolt, 5);
    print_sensors("fan", zavGetStateFan, 4);
    return 0;
}

int reset() {
    printf("reset thermal 2: %d\n", zavResetThermal(2));
    printf("reset voltage 4: %d\n", zavResetVolt(4));
    return 0;
}

int leds() {
    const int three_state = zavSetLED(5, ZAV_LED_VALUE2);
    printf("led 5: %d %x\n", three_state, static_cast<unsigned>(zavGetLED(5)));
    const int plain = zavSetLED(1, ZAV_LED_ON);
    printf("led 1: %d %x\n", plain, static_cast<unsigned>(zavGetLED(1)));
    const int disk = zavSetHDDLED(8, ZAV_HDDLED_FIRST_2_SECOND_ON);
    printf("disk led 8: %d %x\n", disk, static_cast<unsigned>(zavGetHDDLED(8)));
    unsigned char byte = 0;
    if (zavGetSensorIn(&byte) == ZAV_RC_OK)
        printf("in %02X\n", static_cast<unsigned>(byte));
    byte = 0xA5;
    printf("out %d\n", zavSetSensorOut(&byte));
    return 0;
}

struct Task {
    const char *word;
    int (*run)();
};

constexpr Task tasks[] = {{"sensors", sensors}, {"reset", reset}, {"leds", leds}};

} // namespace

int main(int argc, char **argv) {
    for (const Task &task : tasks)
        if (argc == 2 && strcmp(argv[1], task.word) == 0)
            return task.run();
    fprintf(stderr, "health_probe: a word is wanted\n");
    return 2;
}
