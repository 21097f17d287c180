// The load of the appliance's own computer: processor, memory, file systems.
#include "common/diag.h"
#include "common/owner.h"
#include "common/text.h"
#include "common/usage.h"
#include "zav_api.h"

#include <cstdint>
#include <cstring>
#include <iterator>
#include <sys/vfs.h>
#include <unistd.h>

namespace {

constexpr int kSampleSeconds = 10;
constexpr const char *kBlanks = " \t\n";

int no_access(const char *function, const char *path) {
    zavlogd(const_cast<char *>(function), zav::kAlert, ZAV_RC_ERR_EACCES, "Can't open \"%s\".",
            path);
    return ZAV_RC_ERR_EACCES;
}

// ---- Processor ----

// Clock ticks since the start, with the precision of the counters' own type.
struct Ticks {
    float user = 0;
    float nice = 0;
    float system = 0;
    float idle = 0;

    int64_t total() const { return static_cast<int64_t>(user + nice + system + idle); }
};

// The summary line comes first; further counters on it take no part.
int read_ticks(const char *function, Ticks &ticks) {
    constexpr const char *kStat = "/proc/stat";
    zav::File stat(kStat, "re");
    if (!stat)
        return no_access(function, kStat);
    for (char line[200]; stat.line(line, sizeof line);) {
        if (!zav::contains(line, "cpu"))
            continue;
        zav::Fields fields(line);
        fields.next(kBlanks);
        for (float *counter : {&ticks.user, &ticks.nice, &ticks.system, &ticks.idle})
            if (const char *field = fields.next(kBlanks); field != nullptr)
                *counter = static_cast<float>(zav::to_double(field));
        break;
    }
    return ZAV_RC_OK;
}

float share(float before, float after, int64_t total) {
    return (after - before) / static_cast<float>(total) * 100.0F;
}

// ---- Memory ----

struct Memory {
    int32_t total = 0; // kilobytes
    int32_t free = 0;
    int32_t swap_total = 0;
    int32_t swap_free = 0;
};

void read_memory_line(char *line, Memory &memory) {
    const struct {
        const char *name;
        int32_t &counter;
    } counters[] = {{"MemTotal:", memory.total},
                    {"MemFree:", memory.free},
                    {"SwapTotal:", memory.swap_total},
                    {"SwapFree:", memory.swap_free}};
    for (const auto &known : counters) {
        if (!zav::contains(line, known.name))
            continue;
        zav::Fields fields(line);
        fields.next(kBlanks);
        if (const char *field = fields.next(kBlanks); field != nullptr)
            zav::number_after(field, "", known.counter);
        return;
    }
}

// ---- File systems ----

constexpr const char *kFileSystems[] = {"/", "/etc/Kiru", "/var", "/tmp", "/mnt/buffer"};

bool is_mounted(zav::File &mounts, char *line, int size, const char *path) {
    while (mounts.line(line, size)) {
        zav::Fields fields(line);
        fields.next(kBlanks);
        const char *mount_point = fields.next(kBlanks);
        if (mount_point != nullptr && strcmp(mount_point, path) == 0)
            return true;
    }
    return false;
}

// ---- Probes ----

constexpr int kFirstProbe = 0x101;

int processor_usage(int /*there is one*/, float *usage) {
    CpuInfo info;
    const int rc = cpuinfo(&info, kSampleSeconds);
    if (rc == ZAV_RC_OK)
        *usage = 100.0F - info.idle;
    return rc;
}

struct Probe {
    int (*measure)(int number, float *usage); // none: refused
    int number;
    float warning; // above it
    float critical;
};

// From kFirstProbe on. /etc/Kiru has no probe.
constexpr Probe kProbes[] = {
    {processor_usage, 0, 90.0F, 95.0F}, {meminfo, 2, 0.0F, 10.0F}, {fsinfo, 1, 90.0F, 95.0F},
    {nullptr, 2, 0.0F, 0.0F},           {fsinfo, 3, 90.0F, 95.0F}, {fsinfo, 4, 90.0F, 95.0F},
    {fsinfo, 5, 90.0F, 95.0F},
};

const Probe *probe_of(int number) {
    const int64_t index = int64_t{number} - kFirstProbe;
    if (index < 0 || index >= static_cast<int64_t>(std::size(kProbes)))
        return nullptr;
    const Probe &probe = kProbes[index];
    return probe.measure != nullptr ? &probe : nullptr;
}

int load_state(const Probe &probe, float usage) {
    if (usage > probe.critical)
        return ZAV_SYSINFO_CRITICAL;
    return usage > probe.warning ? ZAV_SYSINFO_WARNING : ZAV_SYSINFO_NORMAL;
}

} // namespace

int zavGetStateSysinfo(int probeno, zavSysinfoState *info) {
    const Probe *probe = probe_of(probeno);
    if (info == nullptr || probe == nullptr)
        return ZAV_RC_ERR_EINVAL;
    float usage = 0;
    const int rc = probe->measure(probe->number, &usage);
    *info = {.type = ZAV_EVENT_SYSINFO, .id = probeno, .value = 0.0F, .state = ZAV_SYSINFO_ERR};
    if (rc == ZAV_RC_OK) {
        info->value = usage;
        info->state = load_state(*probe, usage);
    }
    return rc;
}

int cpuinfo(pCpuInfo info, int sec) {
    if (info == nullptr || sec < 0)
        return ZAV_RC_ERR_EINVAL;
    Ticks before;
    if (const int rc = read_ticks(__func__, before); rc != ZAV_RC_OK)
        return rc;
    sleep(static_cast<unsigned>(sec));
    Ticks after;
    if (const int rc = read_ticks(__func__, after); rc != ZAV_RC_OK)
        return rc;
    const int64_t total = after.total() - before.total();
    *info = {.total = static_cast<long>(total), .user = 0, .nice = 0, .system = 0, .idle = 100.0F};
    if (total != 0) { // or nothing was counted: idle
        info->user = share(before.user, after.user, total);
        info->nice = share(before.nice, after.nice, total);
        info->system = share(before.system, after.system, total);
        info->idle = share(before.idle, after.idle, total);
    }
    return ZAV_RC_OK;
}

int meminfo(int memno, float *usage) {
    constexpr const char *kMemory = "/proc/meminfo";
    if (usage == nullptr)
        return ZAV_RC_ERR_EINVAL;
    struct Work {
        char line[1024];
    };
    const zav::HeapRecord<Work> work;
    if (!work)
        return ZAV_RC_ERR_ENOMEM;
    zav::File file(kMemory, "re");
    if (!file)
        return no_access(__func__, kMemory);
    Memory memory;
    while (file.line((*work).line, 256))
        read_memory_line((*work).line, memory);
    *usage = 0.0F;
    if (memno == 1)
        *usage = zav::used_percent(memory.free, memory.total);
    else if (memno == 2)
        *usage = zav::used_percent(memory.swap_free, memory.swap_total);
    return ZAV_RC_OK;
}

int fsinfo(int fsno, float *usage) {
    constexpr const char *kMounts = "/etc/mtab";
    if (usage == nullptr)
        return ZAV_RC_ERR_EINVAL;
    struct Work {
        char line[256];
    };
    const zav::HeapRecord<Work> work;
    if (!work)
        return ZAV_RC_ERR_ENOMEM;
    if (fsno < 1 || fsno > static_cast<int>(std::size(kFileSystems)))
        return ZAV_RC_ERR_EINVAL;
    const char *path = kFileSystems[fsno - 1];
    zav::File mounts(kMounts, "re");
    if (!mounts)
        return no_access(__func__, kMounts);
    if (!is_mounted(mounts, (*work).line, sizeof(Work::line), path))
        return ZAV_RC_ERR_ENODEV;
    struct statfs system = {};
    if (statfs(path, &system) != 0)
        return ZAV_RC_ERR;
    *usage = zav::used_percent(static_cast<long double>(system.f_bavail),
                               static_cast<long double>(system.f_blocks));
    return ZAV_RC_OK;
}
