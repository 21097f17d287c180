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

// The processor is measured over ten seconds.
int load() {
    constexpr int probes[] = {0x101, 0x102, 0x103, 0x105, 0x106, 0x107};
    for (const int probe : probes) {
        zavSysinfoState info = {};
        const int rc = zavGetStateSysinfo(probe, &info);
        printf("load %x: %d %.0f %x\n", static_cast<unsigned>(probe), rc,
               static_cast<double>(info.value), static_cast<unsigned>(info.state));
    }
    float usage = 0;
    const int rc = fsinfo(2, &usage);
    printf("/etc/Kiru: %d %.0f\n", rc, static_cast<double>(usage));
    return 0;
}

int ups() {
    zavUpsState info = {};
    const int rc = zavGetStateUPS(&info);
    printf("ups: %d %.1f %d\n", rc, static_cast<double>(info.charge), info.state);
    return 0;
}

void print_port(const char *name, int minor_type, int number) {
    zavDevice dev = {ZAV_DEV_NIC, minor_type, number, 0};
    zavNetState info = {};
    const int rc = zavGetStateNic(&dev, &info);
    printf("%s: %d %d %d\n", name, rc, info.value, info.state);
}

int network() {
    print_port("eth0", ZAV_MINDEV_NIC_ETH, 1);
    print_port("eth1", ZAV_MINDEV_NIC_ETH, 2);
    print_port("eth2", ZAV_MINDEV_NIC_ETH, 3);
    print_port("bond0", ZAV_MINDEV_NIC_BOND, 1);
    return 0;
}

struct Task {
    const char *word;
    int (*run)();
};

constexpr Task tasks[] = {{"sensors", sensors}, {"reset", reset}, {"leds", leds},
                          {"load", load},       {"ups", ups},     {"network", network}};

} // namespace

int main(int argc, char **argv) {
    for (const Task &task : tasks)
        if (argc == 2 && strcmp(argv[1], task.word) == 0)
            return task.run();
    fprintf(stderr, "health_probe: a word is wanted\n");
    return 2;
}
