#include "questions.h"

#include "zav_api.h"

#include <cstring>

namespace concurrency {

namespace {

// What an answer is worth, byte by byte; equal if the answers are.
template <class Record>
std::string bytes_of(int rc, const Record &record) {
    return std::to_string(rc) + ":" +
           std::string(reinterpret_cast<const char *>(&record), sizeof record);
}

template <class Record>
std::string answer(int (*ask)(zavDevice *, Record *), zavDevice device) {
    Record record;
    std::memset(&record, 0, sizeof record);
    const int rc = ask(&device, &record);
    return bytes_of(rc, record);
}

// How full a mounted file system is changes by itself.
std::string group_answer(int number) {
    zavDevice device = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_VG, number, 0};
    zavLVMState state;
    std::memset(&state, 0, sizeof state);
    const int rc = zavGetStateLVM(&device, &state);
    for (lvmLV &volume : state.dev.lvmvgdev.lvdev)
        volume.usage = 0;
    return bytes_of(rc, state);
}

std::string monitor_answer(int unit) {
    float value = 0;
    const int rc = zavGetRBODHwMon(unit, 0, &value);
    return bytes_of(rc, value);
}

std::string unit_answer(int unit) {
    sRBODMap map = {};
    map.rbodid = unit;
    const int rc = zavGetRBODSN(&map);
    return bytes_of(rc, map);
}

// The reading itself wanders.
std::string temperature_answer() {
    zavThermalState state = {};
    const int rc = zavGetStateThermal(1, &state);
    return bytes_of(rc, state.state);
}

std::string model_answer() {
    int config[3] = {};
    const int rc = zavGetModelConfig(&config[0], &config[1], &config[2]);
    return bytes_of(rc, config);
}

std::vector<Question> all_questions() {
    const zavDevice disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SATA, 2, 0};
    const zavDevice array = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SW, 2, 1};
    const zavDevice pv = {ZAV_DEV_LVM, ZAV_MINDEV_LVM_PV, 1, 1};
    const zavDevice unit_disk = {ZAV_DEV_HDD, ZAV_MINDEV_HDD_SAS, 2 << 8 | 1, 0};
    const zavDevice card_volume = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_HW, 1, 0};
    const zavDevice port = {ZAV_DEV_NIC, ZAV_MINDEV_NIC_ETH, 1, 0};
    return {
        {"disk", [=] { return answer(zavGetStateDisk, disk); }, {}},
        {"array", [=] { return answer(zavGetStateRaid, array); }, {}},
        {"system group", [] { return group_answer(0); }, {}},
        {"data group", [] { return group_answer(1); }, {}},
        {"physical volume", [=] { return answer(zavGetStateLVM, pv); }, {}},
        {"unit's disk", [=] { return answer(zavGetStateDisk, unit_disk); }, {}},
        {"controller's volume", [=] { return answer(zavGetStateRaid, card_volume); }, {}},
        {"unit's monitor", [] { return monitor_answer(2); }, {}},
        {"unit's identity", [] { return unit_answer(1); }, {}},
        {"network port", [=] { return answer(zavGetStateNic, port); }, {}},
        {"temperature", temperature_answer, {}},
        {"model", model_answer, {}},
    };
}

} // namespace

std::vector<Question> questions() {
    std::vector<Question> answered;
    for (Question &question : all_questions()) {
        question.right = question.ask();
        if (question.right.starts_with("0:"))
            answered.push_back(std::move(question));
    }
    return answered;
}

void change(unsigned number) {
    zavSystemEvent event = {};
    event.type = ZAV_EVENT_FAN;
    switch (number % 5) {
    case 0:
        zavSetLED(1, ZAV_LED_ON);
        break;
    case 1:
        zavSetLED(1, ZAV_LED_OFF);
        break;
    case 2:
        zavPushEvent(&event);
        break;
    case 3:
        zavPollEvent(&event);
        break;
    default: // not of the sensor that is asked for: its file is empty for a moment, unlike a
             // kernel's
        zavResetThermal(2);
    }
}

} // namespace concurrency
