// The library's functions about the machine besides its storage, in C++ types.
#pragma once

#include "../core/led_report.h"
#include "../core/nic_report.h"
#include "../core/sensor.h"

#include "zav_api.h"

#include <chrono>

namespace zavctl::library {

struct SensorAnswer {
    int result = 0;
    zavFanState state{};
};

struct NicAnswer {
    int result = 0;
    zavNetState state{};
};

struct UpsAnswer {
    int result = 0;
    zavUpsState state{};
};

struct ProcessorAnswer {
    int result = 0;
    CpuInfo info{};
};

struct UsageAnswer {
    int result = 0;
    float percent = 0;
};

SensorAnswer sensor_state(const Sensor &sensor);
int reset_sensor(const Sensor &sensor); // of one that latches

NicAnswer nic_state(const NicId &id);
UpsAnswer ups_state();

ProcessorAnswer processor_usage(std::chrono::seconds interval);
UsageAnswer memory_usage();
UsageAnswer swap_usage();
UsageAnswer file_system_usage(int number);

// LEDs of the panel and of the disks by their number, 1 to 10. The state, or a code.
int led_state(int led);
int set_led(int led, int state);

struct AlarmAnswer {
    int result = 0;
    zavLEDEvent alarm{};
};
constexpr int no_alarm_pending = 0x1201;
int put_led_alarm(int priority, int code, int state);
AlarmAnswer take_led_alarm();

struct PortAnswer {
    int result = 0;
    int value = 0;
};
PortAnswer sensor_port();
int set_sensor_port(int value);

int set_uart_mode(int mode);
int synchronise();

struct MarkAnswer {
    int result = 0;
    int state = 0; // ZAV_IRBOD_*
};
MarkAnswer unit_mark(int unit);
int mark_unit(int unit);

} // namespace zavctl::library
