#include "library.h"

#include <array>

namespace zavctl::library {

namespace {

constexpr std::size_t name_size = 128;
constexpr int attach_command = 1;

struct CodeMeaning {
    int code;
    const char *meaning;
};

constexpr CodeMeaning meanings[] = {
    {ZAV_RC_ERR_ENOENT, "a file or device is missing"},
    {ZAV_RC_ERR_ENOMEM, "a name is too long"},
    {ZAV_RC_ERR_EACCES, "the device is in use by another program"},
    {ZAV_RC_ERR_EBUSY, "the device is busy"},
    {ZAV_RC_ERR_ENODEV, "no such device"},
    {ZAV_RC_ERR_EINVAL, "the library refuses this address"},
    {ZAV_RC_ERR_ESTRPIPE, "a tool cannot be started"},
    {32, "a tool cannot be started"},
    {ZAV_RC_ERR, "a step failed"},
    {0x1001, "the saved file came out too short"},
    {0x1301, "no known model"},
    {ZAV_RC_ERR_READINFOFAIL, "the RAID controller's report cannot be read"},
    {0x2801, "the mount point cannot be measured"},
};

std::string meaning(int code) {
    for (const CodeMeaning &entry : meanings)
        if (entry.code == code)
            return entry.meaning;
    return "the library reports a failure";
}

// A code without a name gives "Not support[...]".
std::string code_name(int code) {
    std::array<char, name_size> buffer{};
    const std::string name = zav_rcdef_to_str(code, buffer.data());
    return name.starts_with("ZAV_") ? name : "";
}

// The readers take a buffer and leave it as it was when the file is empty.
std::optional<std::string> identity(int (*read)(char *, int)) {
    std::array<char, name_size> buffer{};
    if (read(buffer.data(), static_cast<int>(buffer.size())) != ZAV_RC_OK)
        return std::nullopt;
    return std::string(buffer.data());
}

} // namespace

ModelConfig model_config() {
    ModelConfig config;
    config.result = zavGetModelConfig(&config.model, &config.disk_slots, &config.disk_count);
    return config;
}

int data_raid_type() {
    return zavGetDataRaidtype();
}

std::optional<std::string> product_name() {
    return identity(zavGetModelBIOS);
}

std::optional<std::string> serial_number() {
    return identity(zavGetSerialBIOS);
}

NamedDevice device_of(const std::string &path) {
    NamedDevice named;
    named.result = zavStrToDev(path.c_str(), &named.device);
    return named;
}

Address address_of(const zavDevice &device) {
    std::array<char, name_size> buffer{};
    zavDevice copy = device;
    if (zavDevToStr(buffer.data(), buffer.size(), &copy) != ZAV_RC_OK)
        return {device, ""};
    return {device, buffer.data()};
}

int name_result(const zavDevice &device) {
    std::array<char, name_size> buffer{};
    zavDevice copy = device;
    return zavDevToStr(buffer.data(), buffer.size(), &copy);
}

DiskAnswer disk_state(const zavDevice &device) {
    DiskAnswer answer;
    zavDevice copy = device;
    answer.result = zavGetStateDisk(&copy, &answer.state);
    return answer;
}

RaidAnswer raid_state(const zavDevice &device) {
    RaidAnswer answer;
    zavDevice copy = device;
    answer.result = zavGetStateRaid(&copy, &answer.state);
    return answer;
}

SetAnswer raid_set(const zavDevice &device) {
    SetAnswer answer;
    zavDevice copy = device;
    answer.result = updateData(&copy, &answer.set);
    return answer;
}

UnitsAnswer expansion_units() {
    UnitsAnswer answer;
    answer.result = zavGetRBODSet(&answer.units);
    return answer;
}

UnitAnswer unit_state(int unit, int sensor) {
    UnitAnswer answer;
    sRBOD asked{};
    asked.id = unit;
    answer.result = zavGetStateRBOD(&asked, sensor, &answer.state);
    return answer;
}

ReadingAnswer unit_reading(int unit, int item) {
    ReadingAnswer answer;
    float value = 0;
    answer.result = zavGetRBODHwMon(unit, item, &value);
    answer.value = static_cast<double>(value);
    return answer;
}

ReadingAnswer card_reading(int item) {
    ReadingAnswer answer;
    answer.result = zavGetRaidCardHwMon(item, &answer.value);
    return answer;
}

VolumeAnswer volume_state(const zavDevice &device) {
    VolumeAnswer answer;
    zavDevice copy = device;
    answer.result = zavGetStateLVM(&copy, &answer.state);
    return answer;
}

std::string mount_point(const zavDevice &volume) {
    std::array<char, name_size> buffer{};
    zavDevice copy = volume;
    zavDevToMnt(&copy, buffer.data());
    return buffer.data();
}

std::optional<std::string> group_of_device(const std::string &path) {
    std::array<char, name_size> buffer{};
    std::string copy = path;
    if (zavGetPVsVG(copy.data(), buffer.data()) != ZAV_RC_OK)
        return std::nullopt;
    const std::string name = buffer.data();
    return name == "NONE" ? "" : name;
}

int ata_disk_count() {
    int count = 0;
    return get_diskcount(&count) == ZAV_RC_OK ? count : 0;
}

int attach_disk(const zavDevice &disk) {
    zavDevice copy = disk;
    return zavHotCmd(attach_command, &copy);
}

int add_disk(const zavDevice &disk) {
    zavDevice copy = disk;
    return zavDiskHotAdd(&copy);
}

int remove_disk(const zavDevice &disk) {
    zavDevice copy = disk;
    return zavDiskHotRemove(&copy);
}

int add_to_group(const zavDevice &device, const zavDevice &group) {
    zavDevice device_copy = device;
    zavDevice group_copy = group;
    return zavLVMHotAdd(&device_copy, &group_copy);
}

int remove_group(const zavDevice &group) {
    zavDevice copy = group;
    return zavLVMHotRemove(&copy);
}

int save_bios(const std::string &file) {
    std::string path = file;
    return zavSaveBIOS(path.data());
}

int load_bios(const std::string &file) {
    std::string path = file;
    return zavLoadBIOS(path.data());
}

std::optional<Failure> failure_of(int result) {
    if (result == ZAV_RC_OK)
        return std::nullopt;
    return Failure{result, code_name(result), meaning(result)};
}

} // namespace zavctl::library
