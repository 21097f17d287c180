// The hardware model, and small configuration services.
#include "harness.h"

#include <climits>

namespace {

using harness::record;
using harness::row;

class Model : public harness::Appliance {};

TEST_F(Model, IsTheProductAndTheNumberOfDisks) {
    const struct {
        const char *product;
        const char *raidtype;
        int model;
    } cases[] = {
        {"SV-2740\n", "t=5;0;0\n", 0x100},
        {"SV-2740\n", "t=5;0;1\n", 0x100},
        {"SV-2740\n", "t=5;0;2\n", 0x102},
        {"SV-2740\n", "t=5;0;4\n", 0x104},
        {"SV-2740\n", "t=5;0;3\n", 0},
        {"SV-2740\n", "t=5;0;5\n", 0},
        {"SV-2740\n", "t=5;0;-1\n", 0},
        {"SV-2740H\n", "t=5;0;4\n", 0x104},
        {"SV-2740H\n", "t=5;0;3\n", 0},
        {"SV-2860\n", "t=5;0;0\n", 0x200},
        {"SV-2860\n", "t=5;0;2\n", 0x200},
        {"SV-2860\n", "t=5;0;4\n", 0x204},
        {"SV-2860\n", "t=5;0;1\n", 0},
        {"SV-2860\n", "t=5;0;3\n", 0},
        {"SV-2980\n", "t=5;0;4\n", 0x300},
        {"SV-2980\n", "t=5;0;77\n", 0x300},
        {"2980\n", "", 0x300},
        {"28602740\n", "t=5;0;4\n", 0x104},
        {"29802860\n", "t=5;0;4\n", 0x204},
        {"SV-3000\n", "t=5;0;4\n", 0},
        {"\n", "t=5;0;4\n", 0},
        {"", "t=5;0;4\n", 0},
        {"a very long name of 2860\n", "t=5;0;4\n", 0},
    };
    for (const auto &[product, raidtype, expected] : cases) {
        model(product, raidtype);
        EXPECT_EQ(zavGetModel(), expected) << product << raidtype;
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Model, CountsDisksInTheThirdField) {
    const std::pair<const char *, int> cases[] = {
        {"raidtype=5;0;4", 0x204},
        {";;raidtype=5;;0;;4;9\n", 0x204}, // runs of separators count as one
        {"raidtype=5;4\n", 0x200},         // two fields: no disks
        {"raidtype=5\n", 0x200},
        {"\n", 0x200},
        {"", 0x200},
        {"raidtype=5;0;four\n", 0x200},
        {"raidtype=5;0; 4\n", 0x204},
        {"raidtype=5;0;4294967300\n", 0},               // saturates, is not 4
        {"raidtype=5;0000000000000000;4\n", 0x204},     // 31 characters with the line feed
        {"raidtype=5;00000000000000000000;4\n", 0x200}, // the third field begins behind them
        {"raidtype=5;0;00000000000000000004\n", 0x200}, // and here ends there
    };
    for (const auto &[raidtype, expected] : cases) {
        model("SV-2860\n", raidtype);
        EXPECT_EQ(zavGetModel(), expected) << raidtype;
    }
}

TEST_F(Model, CountsTheFirst31CharactersOfTheLine) {
    model("SV-2860\n", "t;" + std::string(27, '0') + ";40\n"); // the 4 is the last that counts
    EXPECT_EQ(zavGetModel(), 0x204);
    model("SV-2860\n", "t;" + std::string(26, '0') + ";40\n");
    EXPECT_EQ(zavGetModel(), 0);
}

TEST_F(Model, CountsTheFirst19CharactersOfTheProduct) {
    model(std::string(15, 'x') + "2860\n", "t;0;4\n");
    EXPECT_EQ(zavGetModel(), 0x204);
    model(std::string(16, 'x') + "2860\n", "t;0;4\n");
    EXPECT_EQ(zavGetModel(), 0);
}

TEST_F(Model, IsUnknownWithoutBios) {
    EXPECT_EQ(zavGetModel(), 0);
    EXPECT_EQ(record().log,
              (std::vector{row("zavGetModelBIOS", 1, "[2] No such file or directory"),
                           row("zavGetModel", 4, "[22] Failed to call zavGetModelBIOS().")}));
}

TEST_F(Model, WithoutARaidtypeFileHasNoDisksAndIsAskedForTwice) {
    put("/sys/class/dmi/id/product_name", "SV-2860\n");
    EXPECT_EQ(zavGetModel(), 0x200);
    EXPECT_EQ(record().short_sleeps, std::vector{100U});
}

TEST_F(Model, TakesARaidtypeFileThatComesLate) {
    put("/sys/class/dmi/id/product_name", "SV-2860\n");
    record().during_short_sleep = [] { put("/etc/Kiru/raidtype", "raidtype=5;0;4\n"); };
    EXPECT_EQ(zavGetModel(), 0x204);
    EXPECT_EQ(record().short_sleeps, std::vector{100U});
}

TEST_F(Model, OfARaidtypeFileThatComesLateAndEmptyHasNoDisks) {
    put("/sys/class/dmi/id/product_name", "SV-2860\n");
    record().during_short_sleep = [] { put("/etc/Kiru/raidtype", ""); };
    EXPECT_EQ(zavGetModel(), 0x200);
    EXPECT_EQ(record().short_sleeps, std::vector{100U});
}

TEST_F(Model, ConfigurationByModel) {
    const struct {
        const char *product;
        const char *raidtype;
        int model;
        int disks;
    } cases[] = {
        {"2740\n", "t;0;1\n", 0x100, 1}, {"2740\n", "t;0;2\n", 0x102, 2},
        {"2740\n", "t;0;4\n", 0x104, 4}, {"2860\n", "t;0;2\n", 0x200, 2},
        {"2860\n", "t;0;4\n", 0x204, 4}, {"2980\n", "t;0;0\n", 0x300, 4},
    };
    for (const auto &expected : cases) {
        model(expected.product, expected.raidtype);
        int code = -1;
        int slots = -1;
        int disks = -1;
        EXPECT_EQ(zavGetModelConfig(&code, &slots, &disks), 0);
        EXPECT_EQ(code, expected.model);
        EXPECT_EQ(slots, 4);
        EXPECT_EQ(disks, expected.disks);
    }
}

TEST_F(Model, WithoutAKnownModelTheConfigurationIsUntouched) {
    model("SV-3000\n", "t;0;4\n");
    int code = -1;
    int slots = -2;
    int disks = -3;
    EXPECT_EQ(zavGetModelConfig(&code, &slots, &disks), 0x1301);
    EXPECT_EQ(code, 0);
    EXPECT_EQ(slots, -2);
    EXPECT_EQ(disks, -3);
    EXPECT_EQ(zavGetModelConfig(nullptr, &slots, &disks), 128);
    EXPECT_EQ(zavGetModelConfig(&code, nullptr, &disks), 128);
    EXPECT_EQ(zavGetModelConfig(&code, &slots, nullptr), 128);
}

class RaidType : public harness::Appliance {};

TEST_F(RaidType, IsTheFirstFieldsValue) {
    const std::pair<const char *, int> cases[] = {
        {"raidtype=5;0;4\n", 5},
        {"raidtype=10\n", 10},
        {"=raidtype=1;0\n", 1},
        {"raidtype=;7\n", 7},
        {"raidtype=\n", 0},
        {"raidtype=", -1},
        {"raidtype\n", -1},
        {"\n", -1},
        {"", -1},
        {"raidtype=x;0\n", 0},
        {"a=5=6;0\n", 5},
        {"raidtype=99999999999;0\n", INT_MAX},
        {"raidtype=-3;0\n", -3},
    };
    for (const auto &[line, expected] : cases) {
        put("/etc/Kiru/raidtype", line);
        EXPECT_EQ(zavGetDataRaidtype(), expected) << line;
    }
}

TEST_F(RaidType, CountsTheFirst79Characters) {
    put("/etc/Kiru/raidtype", std::string(77, 'k') + "=12;0;4\n");
    EXPECT_EQ(zavGetDataRaidtype(), 1);
    put("/etc/Kiru/raidtype", std::string(78, 'k') + "=12;0;4\n");
    EXPECT_EQ(zavGetDataRaidtype(), -1);
}

TEST_F(RaidType, IsUnknownWithoutTheFileAfterASecondTry) {
    EXPECT_EQ(zavGetDataRaidtype(), -1);
    EXPECT_EQ(record().short_sleeps, std::vector{100U});
    record().during_short_sleep = [] { put("/etc/Kiru/raidtype", "raidtype=5;0;4\n"); };
    EXPECT_EQ(zavGetDataRaidtype(), 5);
}

class DiskCount : public harness::Appliance {};

TEST_F(DiskCount, CountsAtaDisks) {
    put("/proc/scsi/scsi", harness::data("captures/healthy-4disk/scsi.txt"));
    int count = -1;
    EXPECT_EQ(get_diskcount(&count), 0);
    EXPECT_EQ(count, 4);
    EXPECT_EQ(record().commands,
              std::vector<std::string>{"cat /proc/scsi/scsi | grep \"Vendor: ATA\" | wc -l"});
}

TEST_F(DiskCount, IsZeroWithoutTheFile) {
    int count = -1;
    EXPECT_EQ(get_diskcount(&count), 0);
    EXPECT_EQ(count, 0);
}

TEST_F(DiskCount, FailsWithoutAShell) {
    record().popen_fails = true;
    int count = -1;
    EXPECT_EQ(get_diskcount(&count), 128);
    EXPECT_EQ(count, -1);
    EXPECT_EQ(get_diskcount(nullptr), 128);
}

class Synchronisation : public harness::Appliance {};

TEST_F(Synchronisation, RunsTheScript) {
    script("/usr/bin/syncConf.sh", "echo ran >/scratch/synced\n");
    EXPECT_EQ(zavSyncConf(), 0);
    EXPECT_EQ(get("/scratch/synced"), "ran\n");
    EXPECT_EQ(record().commands, std::vector<std::string>{"/usr/bin/syncConf.sh"});
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Synchronisation, PassesAFailureOn) {
    script("/usr/bin/syncConf.sh", "exit 3\n");
    EXPECT_EQ(zavSyncConf(), 128);
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Synchronisation, LogsAMissingScript) {
    EXPECT_EQ(zavSyncConf(), 128);
    EXPECT_TRUE(record().commands.empty());
    EXPECT_EQ(record().log, std::vector{row("zavSyncConf", 4, "[22] syncConf.sh does not exist!")});
}

class SerialPort : public harness::Appliance {
  protected:
    static constexpr const char *kGpio = "/proc/zav/sys/dev/gpio/ich9/";

    SerialPort() {
        for (const char *line : {"34", "35", "49"})
            put(std::string(kGpio) + line, "9\n");
    }

    static std::string lines() {
        return get(std::string(kGpio) + "34") + get(std::string(kGpio) + "35") +
               get(std::string(kGpio) + "49");
    }
};

TEST_F(SerialPort, IsRoutedByMode) {
    const char *expected[] = {"110", "001", "000", "010"};
    for (int mode = 1; mode <= 4; ++mode) {
        EXPECT_EQ(zavUARTMode(mode), 0);
        EXPECT_EQ(lines(), expected[mode - 1]) << mode;
    }
    EXPECT_TRUE(record().log.empty());
}

TEST_F(SerialPort, OtherModesTouchNothing) {
    for (const int mode : {0, 5, -1, INT_MAX, INT_MIN})
        EXPECT_EQ(zavUARTMode(mode), 22);
    EXPECT_EQ(lines(), "9\n9\n9\n");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(SerialPort, AMissingLineIsToldByItsPath) {
    for (const char *line : {"34", "35", "49"}) {
        const std::string path = std::string(kGpio) + line;
        record().log.clear();
        remove(path);
        put(path + "/in/the/way", "");
        const size_t open_before = open_descriptors();
        EXPECT_EQ(zavUARTMode(1), 2);
        EXPECT_EQ(open_descriptors(), open_before);
        EXPECT_EQ(record().log,
                  std::vector{row("zavUARTMode", 1, "[0] Can't open GPIO(" + path + ")")});
        remove(path);
        put(path, "9\n");
    }
}

TEST_F(SerialPort, AFailedWriteIsLogged) {
    const size_t open_before = open_descriptors();
    record().fprintf_fails = true;
    EXPECT_EQ(zavUARTMode(1), 128);
    EXPECT_EQ(record().log, std::vector{row("zavUARTMode", 1, "[-1] Can't write GPIO")});
    EXPECT_EQ(open_descriptors(), open_before);
}

class TimeZone : public harness::Appliance {
  protected:
    static void zone(const std::string &text) { put("/etc/sysconfig/clock", text); }
    static void list(const std::string &text) { put("/etc/arecaTimeZone.list", text); }
};

TEST_F(TimeZone, IsTheLineThatContainsTheCity) {
    zone("# comment\nZONE=\"Europe/Berlin\"\nUTC=true\n");
    list("London\n (GMT+01:00) Paris\n\t(GMT+01:00) Berlin \nRome\n");
    EXPECT_EQ(zavMapArcTimeZone(), 2);
    EXPECT_EQ(record().commands, std::vector<std::string>{
                                     "cat /etc/sysconfig/clock | grep \"ZONE=\" | cut -d \"\\\"\" "
                                     "-f 2 | cut -d \"/\" -f 2"});
}

TEST_F(TimeZone, WithoutAMatchIsTheLastLine) {
    zone("ZONE=\"Asia/Nowhere\"\n");
    list("0\n1\n2\n3\n4\n5\n6\n7\n8\n9\n");
    EXPECT_EQ(zavMapArcTimeZone(), 9);
    list("");
    EXPECT_EQ(zavMapArcTimeZone(), -1);
}

TEST_F(TimeZone, ZonesWithoutASlashAreTakenWhole) {
    zone("ZONE=\"UTC\"\n");
    list("GMT\nUTC\n");
    EXPECT_EQ(zavMapArcTimeZone(), 1);
}

TEST_F(TimeZone, NeedsAZoneAndAList) {
    list("GMT\n");
    EXPECT_EQ(zavMapArcTimeZone(), -1); // no clock file
    zone("UTC=true\n");
    EXPECT_EQ(zavMapArcTimeZone(), -1); // no zone in it
    zone("ZONE=\"Europe/Berlin\"\n");
    remove("/etc/arecaTimeZone.list");
    EXPECT_EQ(zavMapArcTimeZone(), -1);
    list("Berlin\n");
    record().popen_fails = true;
    EXPECT_EQ(zavMapArcTimeZone(), -1);
}

TEST_F(TimeZone, TakesAtMost128BytesOfTheZone) {
    zone("ZONE=\"" + std::string(300, 'x') + "\"\n");
    list("no\n" + std::string(126, 'x') + "\n" + std::string(126, 'x') + "xx\n");
    // Lines of the list are read in pieces of 127 characters, so that 128 are never found: the
    // answer is the number of pieces.
    EXPECT_EQ(zavMapArcTimeZone(), 3);
}

TEST_F(TimeZone, AnEmptyZoneIsFoundInTheFirstLine) {
    zone("ZONE=\"\"\n");
    list("GMT\nUTC\n");
    EXPECT_EQ(zavMapArcTimeZone(), 0);
}

} // namespace
