#include "platform.h"

#include "files.h"
#include "library.h"
#include "run.h"

#include <fmt/format.h>

#include <sys/ipc.h>
#include <sys/sem.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>

#include <array>
#include <cerrno>
#include <clocale>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <future>
#include <locale.h>
#include <unistd.h>

namespace zavctl {

namespace {

constexpr std::chrono::seconds tool_limit{10};
constexpr const char *controller = "/sys/devices/pci0000:00/0000:00:1f.2";
constexpr const char *no_such_disk = "/dev/sata/disk0"; // slots count from 1

struct Tool {
    const char *name;
    const char *purpose;
    const char *without;
    enum class For { all, software_raid, hardware_raid } models;
    Severity missing;
};

constexpr auto all_models = Tool::For::all;
constexpr auto software_raid = Tool::For::software_raid;
constexpr auto hardware_raid_only = Tool::For::hardware_raid;

constexpr const char *no_volumes = "no volume group and no volume can be told";
constexpr const char *no_devices = "what groups lie on cannot be told, and no disk is added";
constexpr const char *no_addition = "a disk that is added is wiped and joins nothing";
constexpr const char *no_setup = "the volumes of a data array that is created anew are not made";

// A function that needs another tool adds it here.
constexpr Tool tools[] = {
    {"smartctl", "the health of disks", "every disk that is there reads as failed", software_raid,
     Severity::critical},
    {"/sbin/mdadm", "the state of arrays", "the state of no array can be told", software_raid,
     Severity::critical},
    {"cat", "counting disks", "no disk is counted", all_models, Severity::critical},
    {"grep", "counting disks", "no disk is counted", all_models, Severity::critical},
    {"wc", "counting disks", "no disk is counted", all_models, Severity::critical},
    {"/usr/sbin/vgs", "volume groups", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/lvs", "logical volumes", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/pvs", "physical volumes", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/vgdisplay", "volume groups", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/lvdisplay", "logical volumes", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/pvdisplay", "physical volumes", no_volumes, all_models, Severity::critical},
    {"/usr/sbin/vgcfgbackup", "what groups consist of", "no volume group can be told", all_models,
     Severity::critical},
    {"/usr/bin/query_sas.sh", "the cascade of expansion units",
     "every expansion unit reads as not there", hardware_raid_only, Severity::critical},
    {"/sbin/ethtool", "link and speed of network ports", "every network port reads as not existing",
     all_models, Severity::warning},
    {"udevinfo", "the addresses of devices", no_devices, all_models, Severity::warning},
    {"/sbin/sfdisk", "adding a disk", no_addition, software_raid, Severity::warning},
    {"/bin/dd", "adding a disk", no_addition, software_raid, Severity::warning},
    {"/usr/bin/hbqSetup.sh", "setting up volumes", no_setup, software_raid, Severity::warning},
};

std::vector<ToolFact> read_tools(bool hardware_raid) {
    const Tool::For not_needed = hardware_raid ? software_raid : hardware_raid_only;
    std::vector<ToolFact> facts;
    for (const Tool &tool : tools)
        if (tool.models != not_needed)
            facts.push_back(
                {tool.name, find_tool(tool.name), tool.purpose, tool.without, tool.missing});
    return facts;
}

// Makes a file where the library makes some, and takes it away again.
int try_volume_files() {
    std::string name = "/etc/Kiru/zav/.zavctl-XXXXXX";
    const int descriptor = mkostemp(name.data(), O_CLOEXEC);
    if (descriptor < 0)
        return errno;
    close(descriptor);
    return unlink(name.c_str()) == 0 ? 0 : errno;
}

std::string resolved(const char *path) {
    std::error_code error;
    const auto target = std::filesystem::canonical(path, error);
    return error ? "" : target.string();
}

bool digits_after(const std::string &name, const std::string &word) {
    return name.starts_with(word) && name.size() > word.size() &&
           name.find_first_not_of("0123456789", word.size()) == std::string::npos;
}

std::vector<std::string> hosts_in(const std::string &directory) {
    std::vector<std::string> hosts;
    int error = 0;
    for (const std::string &name : names_in(directory, error))
        if (digits_after(name, "host"))
            hosts.push_back(name);
    return hosts;
}

void read_hosts(PlatformFacts &facts) {
    const std::vector<std::string> names = names_in(controller, facts.sata_controller.error);
    facts.sata_hosts = hosts_in(controller);
    for (const std::string &name : names)
        if (digits_after(name, "ata"))
            for (const std::string &host : hosts_in(fmt::format("{}/{}", controller, name)))
                facts.nested_hosts.push_back(fmt::format("{}/{}", name, host));
}

void read_nvram(PlatformFacts &facts) {
    const FileFact nvram = read_file("/dev/nvram");
    facts.nvram_error = nvram.error;
    facts.nvram_bytes = static_cast<int>(nvram.text.size());
}

// The setting that decides the decimal point; unset and empty ones do not.
std::string numeric_locale() {
    for (const char *name : {"LC_ALL", "LC_NUMERIC", "LANG"}) {
        const char *value = std::getenv(name);
        if (value != nullptr && *value != '\0')
            return fmt::format("{}={}", name, value);
    }
    return "";
}

void read_locale(PlatformFacts &facts) {
    facts.locale = numeric_locale();
    locale_t locale = newlocale(LC_NUMERIC_MASK, "", nullptr);
    facts.locale_known = locale != nullptr;
    if (locale == nullptr)
        locale = newlocale(LC_NUMERIC_MASK, "C", nullptr);
    const locale_t before = uselocale(locale);
    facts.decimal_point = std::localeconv()->decimal_point;
    uselocale(before);
    freelocale(locale);
}

// Creates a semaphore that nobody else knows, takes and gives it once, removes it.
int try_semaphore() {
    const int id = semget(IPC_PRIVATE, 1, IPC_CREAT | 0600);
    if (id < 0)
        return errno;
    sembuf give{0, 1, SEM_UNDO};
    sembuf take{0, -1, SEM_UNDO};
    const int error = semop(id, &give, 1) != 0 || semop(id, &take, 1) != 0 ? errno : 0;
    if (semctl(id, 0, IPC_RMID) != 0 && error == 0)
        return errno;
    return error;
}

bool is_socket(const char *path) {
    struct stat status {};
    return stat(path, &status) == 0 && S_ISSOCK(status.st_mode);
}

// The first partition of a disk: "/dev/sata/disk1p1".
std::string first_partition(const std::vector<std::string> &nodes) {
    for (const std::string &node : nodes)
        if (std::string path = "/dev/sata/" + node;
            library::device_of(path).device.part > 0 && library::device_of(path).result == 0)
            return path;
    return "";
}

RunResult examined(const std::string &partition) {
    if (partition.empty())
        return {};
    return run({"/sbin/mdadm", "--query", "--examine", "--scan", partition}, tool_limit);
}

// The three commands side by side: one that hangs costs its time once.
void run_tools(PlatformFacts &facts) {
    auto shell =
        std::async(std::launch::async, run,
                   std::vector<std::string>{"/bin/sh", "-c", "false &>/dev/null"}, tool_limit);
    auto smartctl = std::async(
        std::launch::async, run,
        std::vector<std::string>{"smartctl", "-H", "-d", "ata", no_such_disk}, tool_limit);
    facts.examine = examined(facts.examined);
    facts.shell_false = shell.get();
    facts.smartctl_no_device = smartctl.get();
}

} // namespace

PlatformFacts read_platform(const ModelReport &model) {
    PlatformFacts facts;
    int error = 0;
    facts.model = model;
    facts.shell_path = resolved("/bin/sh");
    facts.tools = read_tools(model.hardware_raid());
    facts.mdstat = read_file("/proc/mdstat");
    facts.scsi = read_file("/proc/scsi/scsi");
    facts.raidtype = read_file("/etc/Kiru/raidtype");
    facts.controller_report = read_file("/etc/Kiru/zav/.raidinfo");
    facts.sata_nodes = names_in("/dev/sata", error);
    facts.swraid_nodes = names_in("/dev/swraid", error);
    facts.examined = first_partition(facts.sata_nodes);
    facts.semaphore_error = try_semaphore();
    facts.log_socket = is_socket("/dev/log");
    facts.volume_files_error = try_volume_files();
    read_hosts(facts);
    read_nvram(facts);
    read_locale(facts);
    run_tools(facts);
    return facts;
}

} // namespace zavctl
