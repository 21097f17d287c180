#include "reads.h"

#include "appliance.h"
#include "paired.h"
#include "require.h"
#include "texts.h"
#include "zav_api.h"

#include <algorithm>
#include <cstdio>
#include <initializer_list>
#include <string>
#include <vector>

namespace bench {

namespace {

// ---- The library's calls: each tells whether it got the right answer ----

template <class State, class Function>
bool sensor_is_normal(Function function) {
    State state;
    return function(1, &state) == ZAV_RC_OK && state.state == ZAV_SENSOR_NORMAL;
}

bool disk_is_found(int minor_type, int disk) {
    zavDevice address = {ZAV_DEV_HDD, minor_type, disk, 0};
    zavHddState state;
    return zavGetStateDisk(&address, &state) == ZAV_RC_OK && state.state == ZAV_HDD_FOUND;
}

bool volume_is_there(int minor_type, int disk) {
    zavDevice address = {ZAV_DEV_RAID, minor_type, disk, 0};
    zavRaidState state;
    return zavGetStateRaid(&address, &state) == ZAV_RC_OK && state.state != ZAV_RAID_NOT_EXIST;
}

bool load_is_told(int probe) {
    zavSysinfoState state;
    return zavGetStateSysinfo(probe, &state) == ZAV_RC_OK && state.state != ZAV_SYSINFO_ERR;
}

bool report_is_read() {
    zavDevice unit = {ZAV_DEV_RAID, ZAV_MINDEV_RAID_SAS, 0x101, 0};
    sRaidSetInfo report;
    return updateData(&unit, &report) == ZAV_RC_OK && report.sDiskInfo[3].status == 1;
}

bool configuration_is_read() {
    int model = 0;
    int slots = 0;
    int disks = 0;
    return zavGetModelConfig(&model, &slots, &disks) == ZAV_RC_OK && disks == 4;
}

bool name_is_read(int (*function)(char *, int), const char *expected) {
    char text[32] = "";
    return function(text, sizeof text) == ZAV_RC_OK && std::string(text) == expected;
}

bool monitor_is_read() {
    float degrees = 0;
    return zavGetRBODHwMon(1, 0, &degrees) == ZAV_RC_OK && degrees == 45.0F;
}

bool card_monitor_is_read() {
    double degrees = 0;
    return zavGetRaidCardHwMon(0, &degrees) == ZAV_RC_OK && degrees == 38.0;
}

bool controller_is_cool() {
    zavThermalState state;
    return zavGetStateThermal(4, &state) == ZAV_RC_OK && state.value == 38.0F;
}

bool speed_is_read() {
    float speed = 0;
    return zavReadFanSpeed(1, &speed) == ZAV_RC_OK && speed == 1500.0F;
}

bool port_is_read() {
    unsigned char bits = 0;
    return zavGetSensorIn(&bits) == ZAV_RC_OK && bits == 0x3F;
}

bool processor_is_idle() {
    CpuInfo info;
    return cpuinfo(&info, 0) == ZAV_RC_OK && info.idle == 100.0F;
}

bool ups_is_online() {
    zavUpsState state;
    return zavGetStateUPS(&state) == ZAV_RC_OK && state.state == ZAV_UPS_ONLINE;
}

bool mark_is_computed() {
    int mark = 0;
    return zavMapRBODCCV(&mark) == ZAV_RC_OK && mark == 12345679;
}

bool mark_is_compared() {
    sRBOD unit = {};
    unit.id = 1;
    int state = 0;
    return zavGetiRBOD(&unit, &state) == ZAV_RC_OK && state == ZAV_IRBOD_UNMARKED;
}

bool no_event(int (*function)(zavSystemEvent *)) {
    constexpr int kNonePending = 0x1201;
    zavSystemEvent event;
    return function(&event) == kNonePending;
}

bool no_alarm() {
    constexpr int kNonePending = 0x1201;
    zavLEDEvent event;
    return zavLEDPollAlarm(&event) == kNonePending;
}

bool board_is_named() {
    const char *name = getTableEntrySMBIOS(1);
    return name != nullptr && std::string(name) == "SV-2860";
}

// ---- Which of them are measured ----

constexpr const char *kProduct = "/sys/class/dmi/id/product_name";
constexpr const char *kSerial = "/sys/class/dmi/id/product_serial";
constexpr const char *kRaidType = "/etc/Kiru/raidtype";
constexpr const char *kReport = "/etc/Kiru/zav/.raidinfo";
constexpr const char *kFanFile = "/proc/zav/sys/sensor/fan2";
constexpr const char *kLine = "/proc/zav/sys/dev/gpio/ich9/";

struct Read {
    const char *name;
    bool (*call)();
    std::vector<std::string> files; // each once, however often the call reads it
    const char *product = kSoftwareRaid;
};

// zavSaveBIOS is left out, as it writes a file. PIDOF is measured by its growth. A probe stands for
// its kind; the readers of a minor type (getDiskStateSAS, getRaidStateHW ...) for themselves and
// for what leads to them.
const std::vector<Read> &reads() {
    static const std::vector<Read> all = {
        {"zavGetModel",
         [] { return zavGetModel() == ZAV_MODEL_SOLVANE_2860_4HDD; },
         {kProduct, kRaidType}},
        {"zavGetModelConfig", configuration_is_read, {kProduct, kRaidType}},
        {"zavGetDataRaidtype", [] { return zavGetDataRaidtype() == 5; }, {kRaidType}},
        {"zavGetModelBIOS", [] { return name_is_read(zavGetModelBIOS, "SV-2860"); }, {kProduct}},
        {"zavGetSerialBIOS", [] { return name_is_read(zavGetSerialBIOS, "12345678"); }, {kSerial}},
        {"getTableEntrySMBIOS", board_is_named, {"/dev/mem"}},
        {"zavGetStateDisk, of the controller",
         [] { return disk_is_found(ZAV_MINDEV_HDD_HWSATA, 1); },
         {kProduct, kRaidType, kReport},
         kHardwareRaid},
        {"zavGetStateDisk, of a unit",
         [] { return disk_is_found(ZAV_MINDEV_HDD_SAS, 0x101); },
         {kReport},
         kHardwareRaid},
        {"zavGetStateRaid, of the controller",
         [] { return volume_is_there(ZAV_MINDEV_RAID_HW, 1); },
         {kProduct, kRaidType, kReport},
         kHardwareRaid},
        {"zavGetStateRaid, of a unit",
         [] { return volume_is_there(ZAV_MINDEV_RAID_SAS, 0x101); },
         {kProduct, kRaidType, kReport},
         kHardwareRaid},
        {"zavGetStateRaid, iSCSI target",
         [] { return volume_is_there(ZAV_MINDEV_RAID_ISCSI, 1); },
         {kProduct, kRaidType}},
        {"updateData", report_is_read, {kReport}},
        {"zavGetRBODHwMon", monitor_is_read, {kReport}},
        {"zavGetRaidCardHwMon", card_monitor_is_read, {kReport}},
        {"zavGetStateThermal, main board",
         [] { return sensor_is_normal<zavThermalState>(zavGetStateThermal); },
         {"/proc/zav/sys/sensor/tempLT", "/proc/zav/sys/sensor/statusLT"}},
        {"zavGetStateThermal, controller",
         controller_is_cool,
         {kProduct, kRaidType, kReport},
         kHardwareRaid},
        {"zavGetStateVolt",
         [] { return sensor_is_normal<zavVoltageState>(zavGetStateVolt); },
         {"/proc/zav/sys/sensor/volVTT", "/proc/zav/sys/sensor/statusVTT"}},
        {"zavReadFanSpeed", speed_is_read, {kFanFile}},
        {"zavGetStateFan",
         [] { return sensor_is_normal<zavFanState>(zavGetStateFan); },
         {kFanFile}},
        {"zavGetSensorIn", port_is_read, {"/proc/zav/sys/dev/serio/in"}},
        {"zavGetStateSysinfo, swap (meminfo)",
         [] { return load_is_told(0x102); },
         {"/proc/meminfo"}},
        {"zavGetStateSysinfo, / (fsinfo)", [] { return load_is_told(0x103); }, {"/etc/mtab"}},
        {"cpuinfo, sleeps 0 seconds", processor_is_idle, {"/proc/stat"}},
        {"zavGetLED", [] { return zavGetLED(1) == ZAV_LED_OFF; }, {std::string(kLine) + "38"}},
        {"zavGetHDDLED",
         [] { return zavGetHDDLED(7) == ZAV_LED_OFF; },
         {kProduct, kRaidType, std::string(kLine) + "10", std::string(kLine) + "40"}},
        {"zavLEDPollAlarm", no_alarm, {"/dev/zavledevent"}},
        {"zavPollEvent", [] { return no_event(zavPollEvent); }, {"/dev/zavevent0"}},
        {"zavPollPrivateEvent", [] { return no_event(zavPollPrivateEvent); }, {"/dev/zavevent0"}},
        {"zavGetStateUPS", ups_is_online, {"/var/log/apcupsd.status"}},
        {"zavMapRBODCCV", mark_is_computed, {kSerial}},
        {"zavGetiRBOD", mark_is_compared, {kSerial, "/dev/sasraid/r1disk1"}},
        {"zavIsComboDrive", [] { return zavIsComboDrive() == 1; }, {"/proc/sys/dev/cdrom/info"}},
    };
    return all;
}

// ---- Measuring ----

constexpr std::size_t kPairs = 50;
constexpr double kSample = 1000; // microseconds, long for the clock and short for the scheduler

// As a C program reads a small file. Of the firmware's memory what is searched counts.
void read_bare(const std::string &path) {
    FILE *file = fopen(path.c_str(), "re");
    require(file != nullptr, path);
    if (path == "/dev/mem")
        fseek(file, 0xF0000, SEEK_SET);
    char text[4096];
    while (fread(text, 1, sizeof text, file) == sizeof text)
        ;
    fclose(file);
}

Comparison compare(const Read &read) {
    const Action call = [&] { require(read.call(), read.name); };
    const Action bare = [&] {
        for (const std::string &file : read.files)
            read_bare(file);
    };
    call(); // the first one finds nothing in the caches
    const double longer = std::max(microseconds(call), microseconds(bare));
    Pairs pairs(bare, call, static_cast<std::size_t>(kSample / longer) + 1);
    pairs.measure(kPairs);
    return pairs.compared();
}

} // namespace

void compare_reads() {
    printf("\nCalls that read files alone, beside reading the same files once each (medians of %zu "
           "pairs)\n%-36s %6s %10s %10s %10s\n",
           kPairs, "query", "files", "bare us", "call us", "more us");
    put("/var/log/apcupsd.status", ups_text); // counts for 90 seconds
    for (const Read &read : reads()) {
        become(read.product);
        const Comparison row = compare(read);
        printf("%-36s %6zu %10.1f %10.1f %10.1f\n", read.name, read.files.size(), row.bare,
               row.call, row.call - row.bare);
    }
    become(kSoftwareRaid);
    fflush(stdout);
}

} // namespace bench
