// The load of the appliance's own computer.
#include "harness.h"

#include <climits>

namespace {

using harness::record;
using harness::row;

class Load : public harness::Appliance {
  protected:
    static void stat(const std::string &line) {
        put("/proc/stat", line + "\ncpu0 9 9 9 9\nintr 1\n");
    }
    // What /proc/stat holds before and after the wait.
    static void processor(const std::string &before, const std::string &after) {
        stat(before);
        record().during_sleep = [after](size_t) { stat(after); };
    }
    static void memory(int total, int free, int swap_total, int swap_free) {
        put("/proc/meminfo", "MemTotal:       " + std::to_string(total) + " kB\nMemFree: " +
                                 std::to_string(free) + " kB\nCached: 7 kB\nSwapCached: 3 kB\n" +
                                 "SwapTotal: " + std::to_string(swap_total) +
                                 " kB\nSwapFree: " + std::to_string(swap_free) + " kB\n");
    }
    static void file_system(unsigned long blocks, unsigned long free) {
        struct statfs system = {};
        system.f_blocks = blocks;
        system.f_bavail = free;
        system.f_bfree = free + 5;
        record().file_system = system;
    }

    int ask(int probe) {
        info = {9, 9, 9.0F, 9};
        return checked([&] { return zavGetStateSysinfo(probe, &info); });
    }
    void expect(int probe, float value, int state) const {
        EXPECT_EQ(info.type, 20010);
        EXPECT_EQ(info.id, probe);
        EXPECT_FLOAT_EQ(info.value, value);
        EXPECT_EQ(info.state, state);
    }

    zavSysinfoState info = {};
    float usage = 99;
};

// ---- Processor ----

TEST_F(Load, OfTheProcessorIsTheShareOfFourCounters) {
    processor("cpu  1000 100 500 8000 77 77 77", "cpu  1100 120 580 8800 99 99 99");
    CpuInfo cpu = {};
    EXPECT_EQ(checked([&] { return cpuinfo(&cpu, 7); }), ZAV_RC_OK);
    EXPECT_EQ(cpu.total, 1000);
    EXPECT_FLOAT_EQ(cpu.user, 10.0F);
    EXPECT_FLOAT_EQ(cpu.nice, 2.0F);
    EXPECT_FLOAT_EQ(cpu.system, 8.0F);
    EXPECT_FLOAT_EQ(cpu.idle, 80.0F);
    EXPECT_EQ(record().sleeps, std::vector{7U});
}

TEST_F(Load, OfTheProcessorStandsOnTheFirstLineThatNamesIt) {
    processor("intr 5 6 7 8\ncpu 0 0 0 0", "intr 500 6 7 8\ncpu 50 0 0 50");
    CpuInfo cpu = {};
    EXPECT_EQ(cpuinfo(&cpu, 1), ZAV_RC_OK);
    EXPECT_FLOAT_EQ(cpu.user, 50.0F);
}

TEST_F(Load, OfTheProcessorCountsWholeTicks) {
    processor("cpu 0.6 0 0 10.6", "cpu 1.6 0 0 13.3");
    CpuInfo cpu = {};
    EXPECT_EQ(cpuinfo(&cpu, 1), ZAV_RC_OK);
    EXPECT_EQ(cpu.total, 3) << "14 less 11";
    EXPECT_FLOAT_EQ(cpu.user, 100.0F / 3);
}

TEST_F(Load, WithoutATickIsIdle) {
    for (const char *line : {"cpu 1 2 3 4", "cpu", "none"}) {
        processor(line, line);
        CpuInfo cpu = {9, 9, 9, 9, 9};
        EXPECT_EQ(cpuinfo(&cpu, 0), ZAV_RC_OK);
        if (line[0] == 'n')
            continue; // the line of the first core is the first that there is
        EXPECT_EQ(cpu.total, 0);
        EXPECT_EQ(cpu.user, 0.0F);
        EXPECT_EQ(cpu.idle, 100.0F);
    }
}

TEST_F(Load, OfTheProcessorBearsLargeCounters) {
    processor("cpu 0 0 0 9000000000", "cpu 0 0 0 9000100000");
    CpuInfo cpu = {};
    EXPECT_EQ(cpuinfo(&cpu, 1), ZAV_RC_OK);
    EXPECT_GE(cpu.idle, 99.0F);
    EXPECT_LE(cpu.idle, 101.0F);
}

TEST_F(Load, OfTheProcessorNeedsItsFileTwice) {
    remove("/proc/stat");
    CpuInfo cpu = {9, 9, 9, 9, 9};
    EXPECT_EQ(checked([&] { return cpuinfo(&cpu, 1); }), ZAV_RC_ERR_EACCES);
    EXPECT_TRUE(record().sleeps.empty());
    stat("cpu 1 2 3 4");
    record().during_sleep = [](size_t) { remove("/proc/stat"); };
    EXPECT_EQ(checked([&] { return cpuinfo(&cpu, 1); }), ZAV_RC_ERR_EACCES);
    const harness::LogRow expected = row("cpuinfo", 1, "[13] Can't open \"/proc/stat\".");
    EXPECT_EQ(record().log, (std::vector{expected, expected}));
    EXPECT_EQ(cpu.total, 9);
    EXPECT_EQ(cpuinfo(nullptr, 1), ZAV_RC_ERR_EINVAL);
    EXPECT_EQ(cpuinfo(&cpu, -1), ZAV_RC_ERR_EINVAL);
}

// ---- Memory ----

TEST_F(Load, OfTheMemoryIsWhatIsNotFree) {
    memory(1000, 250, 400, 390);
    EXPECT_EQ(checked([&] { return meminfo(1, &usage); }), ZAV_RC_OK);
    EXPECT_FLOAT_EQ(usage, 75.0F);
    EXPECT_EQ(meminfo(2, &usage), ZAV_RC_OK);
    EXPECT_FLOAT_EQ(usage, 2.5F);
    for (const int other : {0, 3, -1}) {
        usage = 99;
        EXPECT_EQ(meminfo(other, &usage), ZAV_RC_OK);
        EXPECT_EQ(usage, 0.0F);
    }
}

TEST_F(Load, OfNoSwapIsNone) {
    memory(1000, 250, 0, 0);
    EXPECT_EQ(meminfo(2, &usage), ZAV_RC_OK);
    EXPECT_EQ(usage, 0.0F);
    put("/proc/meminfo", "");
    EXPECT_EQ(meminfo(1, &usage), ZAV_RC_OK);
    EXPECT_EQ(usage, 0.0F);
}

TEST_F(Load, OfTheMemoryNeedsItsArgumentMemoryAndFile) {
    EXPECT_EQ(meminfo(1, nullptr), ZAV_RC_ERR_EINVAL);
    record().calloc_fails = true;
    EXPECT_EQ(meminfo(1, &usage), ZAV_RC_ERR_ENOMEM);
    record().calloc_fails = false;
    EXPECT_TRUE(record().log.empty());
    remove("/proc/meminfo");
    EXPECT_EQ(checked([&] { return meminfo(7, &usage); }), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(record().log, std::vector{row("meminfo", 1, "[13] Can't open \"/proc/meminfo\".")});
    EXPECT_EQ(usage, 99.0F);
}

// ---- File systems ----

TEST_F(Load, OfAFileSystemIsWhatUsersCannotHave) {
    put("/etc/mtab", "/dev/a / ext4 rw 0 0\n/dev/b /etc/Kiru ext4 rw 0 0\n/dev/c /var ext4 rw 0 0\n"
                     "none /tmp tmpfs rw 0 0\n/dev/d /mnt/buffer ext4 rw 0 0\n");
    file_system(1000, 80);
    const char *const paths[] = {"/", "/etc/Kiru", "/var", "/tmp", "/mnt/buffer"};
    for (int number = 1; number <= 5; ++number) {
        usage = 99;
        EXPECT_EQ(checked([&] { return fsinfo(number, &usage); }), ZAV_RC_OK);
        EXPECT_FLOAT_EQ(usage, 92.0F);
        EXPECT_EQ(record().measured, paths[number - 1]);
    }
}

TEST_F(Load, OfAnEmptyFileSystemIsNone) {
    put("/etc/mtab", "none /tmp tmpfs rw 0 0\n");
    file_system(0, 0);
    EXPECT_EQ(fsinfo(4, &usage), ZAV_RC_OK);
    EXPECT_EQ(usage, 0.0F);
}

TEST_F(Load, OfAFileSystemNeedsItsExactMountPoint) {
    put("/etc/mtab", "x /var/log ext4 rw 0 0\n/var y ext4 rw 0 0\nlonely\n\n");
    file_system(10, 5);
    EXPECT_EQ(checked([&] { return fsinfo(3, &usage); }), ZAV_RC_ERR_ENODEV);
    EXPECT_EQ(record().measured, "");
    put("/etc/mtab", "x\t/var  ext4");
    EXPECT_EQ(fsinfo(3, &usage), ZAV_RC_OK);
}

TEST_F(Load, OfAFileSystemIsRefusedInThisOrder) {
    EXPECT_EQ(fsinfo(1, nullptr), ZAV_RC_ERR_EINVAL);
    record().calloc_fails = true;
    EXPECT_EQ(fsinfo(0, &usage), ZAV_RC_ERR_ENOMEM);
    record().calloc_fails = false;
    for (const int number : {0, 6, -1, INT_MAX})
        EXPECT_EQ(fsinfo(number, &usage), ZAV_RC_ERR_EINVAL);
    EXPECT_TRUE(record().log.empty());
    EXPECT_EQ(checked([&] { return fsinfo(1, &usage); }), ZAV_RC_ERR_EACCES);
    EXPECT_EQ(record().log, std::vector{row("fsinfo", 1, "[13] Can't open \"/etc/mtab\".")});
    put("/etc/mtab", "x / ext4\n");
    EXPECT_EQ(checked([&] { return fsinfo(1, &usage); }), ZAV_RC_ERR) << "statfs fails";
    EXPECT_EQ(usage, 99.0F);
}

// ---- Probes ----

TEST_F(Load, IsMeasuredForTenSecondsByItsProbe) {
    processor("cpu 0 0 0 0", "cpu 60 5 32 3");
    EXPECT_EQ(ask(0x101), ZAV_RC_OK);
    expect(0x101, 97.0F, ZAV_SYSINFO_CRITICAL);
    EXPECT_EQ(record().sleeps, std::vector{10U});
}

TEST_F(Load, OfTheProcessorIsJudged) {
    const std::pair<int, int> rows[] = {{0, ZAV_SYSINFO_NORMAL},
                                        {90, ZAV_SYSINFO_NORMAL},
                                        {91, ZAV_SYSINFO_WARNING},
                                        {95, ZAV_SYSINFO_WARNING},
                                        {96, ZAV_SYSINFO_CRITICAL}};
    for (const auto &[busy, state] : rows) {
        processor("cpu 0 0 0 0",
                  "cpu " + std::to_string(busy) + " 0 0 " + std::to_string(100 - busy));
        EXPECT_EQ(ask(257), ZAV_RC_OK);
        expect(257, static_cast<float>(busy), state);
    }
}

TEST_F(Load, OfSwapIsJudgedMoreSeverely) {
    const std::pair<int, int> rows[] = {{1000, ZAV_SYSINFO_NORMAL},
                                        {995, ZAV_SYSINFO_WARNING},
                                        {901, ZAV_SYSINFO_WARNING},
                                        {899, ZAV_SYSINFO_CRITICAL}};
    for (const auto &[free, state] : rows) {
        memory(10, 1, 1000, free);
        EXPECT_EQ(ask(0x102), ZAV_RC_OK);
        expect(0x102, static_cast<float>(1000 - free) / 10, state);
    }
}

TEST_F(Load, OfFileSystemsIsJudgedByProbe) {
    put("/etc/mtab", "a / e\nb /etc/Kiru e\nc /var e\nd /tmp e\nf /mnt/buffer e\n");
    const std::pair<int, const char *> probes[] = {
        {0x103, "/"}, {0x105, "/var"}, {0x106, "/tmp"}, {0x107, "/mnt/buffer"}};
    const std::pair<unsigned long, int> rows[] = {
        {200, ZAV_SYSINFO_NORMAL}, {80, ZAV_SYSINFO_WARNING}, {40, ZAV_SYSINFO_CRITICAL}};
    for (const auto &[probe, path] : probes)
        for (const auto &[free, state] : rows) {
            file_system(1000, free);
            EXPECT_EQ(ask(probe), ZAV_RC_OK);
            expect(probe, static_cast<float>(1000 - free) / 10, state);
            EXPECT_EQ(record().measured, path);
        }
}

TEST_F(Load, ThatCannotBeMeasuredIsNotKnown) {
    remove("/proc/stat");
    remove("/proc/meminfo");
    EXPECT_EQ(ask(0x101), ZAV_RC_ERR_EACCES);
    expect(0x101, 0.0F, ZAV_SYSINFO_ERR);
    EXPECT_EQ(ask(0x102), ZAV_RC_ERR_EACCES);
    expect(0x102, 0.0F, ZAV_SYSINFO_ERR);
    put("/etc/mtab", "a / e\n");
    EXPECT_EQ(ask(0x107), ZAV_RC_ERR_ENODEV);
    expect(0x107, 0.0F, ZAV_SYSINFO_ERR);
}

TEST_F(Load, HasTheseProbes) {
    for (const int probe : {0, 0x100, 0x104, 0x108, -1, INT_MIN, INT_MAX}) {
        EXPECT_EQ(ask(probe), ZAV_RC_ERR_EINVAL);
        EXPECT_EQ(info.type, 9) << "untouched";
    }
    EXPECT_EQ(zavGetStateSysinfo(0x102, nullptr), ZAV_RC_ERR_EINVAL);
}

} // namespace
