#include "library_health.h"

namespace zavctl::library {

SensorAnswer sensor_state(const Sensor &sensor) {
    SensorAnswer answer;
    switch (sensor.kind) {
    case SensorKind::thermal:
        answer.result = zavGetStateThermal(sensor.number, &answer.state);
        break;
    case SensorKind::volt:
        answer.result = zavGetStateVolt(sensor.number, &answer.state);
        break;
    case SensorKind::fan:
        answer.result = zavGetStateFan(sensor.number, &answer.state);
        break;
    }
    return answer;
}

int reset_sensor(const Sensor &sensor) {
    return sensor.kind == SensorKind::thermal ? zavResetThermal(sensor.number)
                                              : zavResetVolt(sensor.number);
}

UpsAnswer ups_state() {
    UpsAnswer answer;
    answer.result = zavGetStateUPS(&answer.state);
    return answer;
}

NicAnswer nic_state(const NicId &id) {
    NicAnswer answer;
    zavDevice device = {ZAV_DEV_NIC, id.bond ? ZAV_MINDEV_NIC_BOND : ZAV_MINDEV_NIC_ETH, id.number,
                        0};
    answer.result = zavGetStateNic(&device, &answer.state);
    return answer;
}

ProcessorAnswer processor_usage(std::chrono::seconds interval) {
    ProcessorAnswer answer;
    answer.result = cpuinfo(&answer.info, static_cast<int>(interval.count()));
    return answer;
}

UsageAnswer memory_usage() {
    constexpr int memory = 1;
    UsageAnswer answer;
    answer.result = meminfo(memory, &answer.percent);
    return answer;
}

UsageAnswer swap_usage() {
    constexpr int swap = 2;
    UsageAnswer answer;
    answer.result = meminfo(swap, &answer.percent);
    return answer;
}

UsageAnswer file_system_usage(int number) {
    UsageAnswer answer;
    answer.result = fsinfo(number, &answer.percent);
    return answer;
}

int led_state(int led) {
    return is_disk_led(led) ? zavGetHDDLED(led) : zavGetLED(led);
}

int set_led(int led, int state) {
    return is_disk_led(led) ? zavSetHDDLED(led, state) : zavSetLED(led, state);
}

int put_led_alarm(int priority, int code, int state) {
    return zavLEDAlarm(priority, code, state);
}

AlarmAnswer take_led_alarm() {
    AlarmAnswer answer;
    answer.result = zavLEDPollAlarm(&answer.alarm);
    return answer;
}

PortAnswer sensor_port() {
    unsigned char value = 0;
    PortAnswer answer;
    answer.result = zavGetSensorIn(&value);
    answer.value = value;
    return answer;
}

int set_sensor_port(int value) {
    auto byte = static_cast<unsigned char>(value);
    return zavSetSensorOut(&byte);
}

int set_uart_mode(int mode) {
    return zavUARTMode(mode);
}

int synchronise() {
    return zavSyncConf();
}

MarkAnswer unit_mark(int unit) {
    sRBOD asked{};
    asked.id = unit;
    MarkAnswer answer;
    answer.result = zavGetiRBOD(&asked, &answer.state);
    return answer;
}

int mark_unit(int unit) {
    sRBOD asked{};
    asked.id = unit;
    return zavSetiRBOD(&asked);
}

} // namespace zavctl::library
