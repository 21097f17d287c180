// BIOS settings in a file, the board's identity, and the SMBIOS table.
#include "bios/zav_bios_smbios.h"
#include "harness.h"

#include <cstring>
#include <fcntl.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

using harness::record;
using harness::row;

std::string settings() {
    std::string bytes;
    for (int i = 0; i < 114; ++i)
        bytes += static_cast<char>(i * 7 + 1);
    return bytes;
}

struct Answer {
    int rc;
    std::string printed;
};

class BiosSettings : public harness::Appliance {
  protected:
    static Answer run(int (*function)(char *), const char *path) {
        const size_t open_before = open_descriptors();
        testing::internal::CaptureStdout();
        const int rc = function(const_cast<char *>(path));
        Answer answer = {rc, testing::internal::GetCapturedStdout()};
        EXPECT_EQ(open_descriptors(), open_before);
        return answer;
    }

    static void expect(const Answer &answer, int rc, const std::string &printed) {
        EXPECT_EQ(answer.rc, rc);
        EXPECT_EQ(answer.printed, printed);
    }
};

TEST_F(BiosSettings, AreSavedAndLoaded) {
    put("/dev/nvram", settings());
    expect(run(zavSaveBIOS, "/scratch/saved"), 0, "");
    EXPECT_EQ(get("/scratch/saved"), settings());
    put("/dev/nvram", std::string(114, '\0'));
    expect(run(zavLoadBIOS, "/scratch/saved"), 0, "");
    EXPECT_EQ(get("/dev/nvram"), settings());
}

TEST_F(BiosSettings, ReplaceALongerFile) {
    put("/dev/nvram", settings());
    put("/scratch/saved", std::string(500, 'x'));
    expect(run(zavSaveBIOS, "/scratch/saved"), 0, "");
    EXPECT_EQ(get("/scratch/saved"), settings());
}

TEST_F(BiosSettings, NeedAPath) {
    expect(run(zavSaveBIOS, nullptr), 22, "");
    expect(run(zavLoadBIOS, nullptr), 22, "");
}

TEST_F(BiosSettings, AreNotSavedWithoutTheDevice) {
    expect(run(zavSaveBIOS, "/scratch/saved"), 128, "file open error");
    EXPECT_NE(access("/scratch/saved", F_OK), 0);
}

TEST_F(BiosSettings, AreNotSavedToAnUnwritablePath) {
    put("/dev/nvram", settings());
    expect(run(zavSaveBIOS, "/scratch/no/such/directory"), 128, "fopen error");
}

TEST_F(BiosSettings, ThatDoNotFitOnTheDiskAreAnError) {
    put("/dev/nvram", settings());
    expect(run(zavSaveBIOS, "/dev/full"), 128, "fwrite error");
}

TEST_F(BiosSettings, InAFileWithoutALengthAreAnError) {
    put("/dev/nvram", settings());
    ASSERT_EQ(mkfifo("/scratch/saved", 0600), 0);
    const int reader = open("/scratch/saved", O_RDONLY | O_NONBLOCK);
    expect(run(zavSaveBIOS, "/scratch/saved"), 0x1001, "file length error, len = -1\n");
    close(reader);
}

TEST_F(BiosSettings, OfADeviceThatCannotBeReadAreSavedAsZeros) {
    remove("/dev/nvram");
    put("/dev/nvram/is/a/directory", ""); // opens, and fails to read
    expect(run(zavSaveBIOS, "/scratch/saved"), 0, "");
    EXPECT_EQ(get("/scratch/saved"), std::string(114, '\0'));
    remove("/dev/nvram");
}

TEST_F(BiosSettings, OfADeviceThatEndsEarlyAreFilledWithZeros) {
    put("/dev/nvram", "abc");
    expect(run(zavSaveBIOS, "/scratch/saved"), 0, "");
    EXPECT_EQ(get("/scratch/saved"), "abc" + std::string(111, '\0'));
}

TEST_F(BiosSettings, ThatComeInPiecesStartOverInTheBuffer) {
    ASSERT_EQ(mkfifo("/dev/nvram", 0600), 0);
    std::thread device([] {
        const int fd = open("/dev/nvram", O_WRONLY);
        EXPECT_EQ(write(fd, "abcdef", 6), 6);
        // The next piece goes in when the first was taken out.
        while (true) {
            int waiting = 0;
            ioctl(fd, FIONREAD, &waiting);
            if (waiting == 0)
                break;
            std::this_thread::yield();
        }
        EXPECT_EQ(write(fd, "XY", 2), 2);
        close(fd);
    });
    const int rc = zavSaveBIOS(const_cast<char *>("/scratch/saved"));
    device.join();
    EXPECT_EQ(rc, 0);
    EXPECT_EQ(get("/scratch/saved"), "XYcdef" + std::string(108, '\0'));
}

TEST_F(BiosSettings, AreNotLoadedFromAMissingOrShortFile) {
    put("/dev/nvram", settings());
    expect(run(zavLoadBIOS, "/scratch/saved"), 128, "fopen error");
    put("/scratch/saved", std::string(113, 'x'));
    expect(run(zavLoadBIOS, "/scratch/saved"), 128, "fread error");
    EXPECT_EQ(get("/dev/nvram"), settings());
}

TEST_F(BiosSettings, AreNotLoadedWithoutTheDevice) {
    put("/scratch/saved", settings());
    expect(run(zavLoadBIOS, "/scratch/saved"), 128, "file open error");
    // The file is looked for first.
    expect(run(zavLoadBIOS, "/scratch/missing"), 128, "fopen error");
}

TEST_F(BiosSettings, ThatTheDeviceRefusesAreNotReported) {
    put("/scratch/saved", settings());
    ASSERT_EQ(symlink("/dev/full", "/dev/nvram"), 0);
    expect(run(zavLoadBIOS, "/scratch/saved"), 0, "");
}

class Identity : public harness::Appliance {
  protected:
    static std::string model_name(int size) {
        std::string buffer(64, '#');
        EXPECT_EQ(zavGetModelBIOS(buffer.data(), size), 0);
        return buffer;
    }
};

TEST_F(Identity, IsOneLineWithoutItsEnd) {
    put("/sys/class/dmi/id/product_name", "SV-2860\nmore\n");
    put("/sys/class/dmi/id/product_serial", "AB1234\n");
    char value[20];
    EXPECT_EQ(zavGetModelBIOS(value, sizeof value), 0);
    EXPECT_STREQ(value, "SV-2860");
    EXPECT_EQ(zavGetSerialBIOS(value, sizeof value), 0);
    EXPECT_STREQ(value, "AB1234");
}

TEST_F(Identity, IsCutToTheBuffer) {
    put("/sys/class/dmi/id/product_name", "123456789012345678901234567890\n");
    EXPECT_STREQ(model_name(20).c_str(), "1234567890123456789");
    EXPECT_STREQ(model_name(1).c_str(), "");
    EXPECT_EQ(model_name(20)[20], '#');
}

TEST_F(Identity, KeepsALineFeedThatComesFirst) {
    put("/sys/class/dmi/id/product_name", "\nSV-2860\n");
    EXPECT_STREQ(model_name(20).c_str(), "\n");
}

TEST_F(Identity, OfAnEmptyFileLeavesTheBuffer) {
    put("/sys/class/dmi/id/product_name", "");
    EXPECT_EQ(model_name(20), std::string(64, '#'));
}

TEST_F(Identity, NeedsABuffer) {
    char value[4] = "abc";
    for (const auto function : {zavGetModelBIOS, zavGetSerialBIOS}) {
        EXPECT_EQ(function(nullptr, 20), 22);
        EXPECT_EQ(function(value, 0), 22);
        EXPECT_EQ(function(value, -1), 22);
    }
    EXPECT_STREQ(value, "abc");
    EXPECT_TRUE(record().log.empty());
}

TEST_F(Identity, WithoutItsFileIsLogged) {
    char value[4] = "abc";
    EXPECT_EQ(zavGetModelBIOS(value, 4), 128);
    EXPECT_EQ(zavGetSerialBIOS(value, 4), 128);
    EXPECT_STREQ(value, "abc");
    EXPECT_EQ(record().log,
              (std::vector{row("zavGetModelBIOS", 1, "[2] No such file or directory"),
                           row("zavGetSerialBIOS", 1, "[2] No such file or directory")}));
}

// ---- SMBIOS ----

// A structure: type, formatted area behind the header, strings.
std::string structure(int type, const std::string &area,
                      std::initializer_list<const char *> texts) {
    std::string bytes;
    bytes += static_cast<char>(type);
    bytes += static_cast<char>(4 + area.size());
    bytes += std::string("\1\0", 2);
    bytes += area;
    for (const char *text : texts)
        bytes += std::string(text) + '\0';
    if (texts.size() == 0)
        bytes += '\0';
    return bytes + '\0';
}

std::string table() {
    return structure(1, std::string("\1\1\1\1", 4), {"skipped: the first structure"}) +
           structure(1, std::string("\1\2\3\4", 4), {"maker", "SV-2860", "version", "AB1234"}) +
           structure(9, "", {}) +
           structure(2, std::string("\1\2\3\4", 4),
                     {"maker", "board", "v1", "BOARD-SERIAL-NUMBER-22"});
}

std::string text_of(const std::string &bytes, int type) {
    const std::string copy(bytes); // of exactly this size, so that a read past its end is caught
    const char *text = zav::smbios_text(copy.data(), copy.size(), type);
    return text == nullptr ? "(none)" : text;
}

TEST(SmbiosTable, GivesProductAndBoardSerialBehindTheFirstStructure) {
    EXPECT_EQ(text_of(table(), 1), "SV-2860");
    EXPECT_EQ(text_of(table(), 2), "BOARD-SERIAL-NUMBER-22");
    EXPECT_EQ(text_of(table(), 9), "(none)");
    EXPECT_EQ(text_of(table(), 3), "(none)");
    EXPECT_EQ(text_of("", 1), "(none)");
}

TEST(SmbiosTable, AnIndexWithoutAStringIsBad) {
    const std::string first = structure(0, "", {});
    EXPECT_EQ(text_of(first + structure(1, std::string("\1\5", 2), {"a", "b"}), 1), "Bad Index");
    EXPECT_EQ(text_of(first + structure(1, std::string("\1\0", 2), {"a", "b"}), 1), "");
    EXPECT_EQ(text_of(first + structure(1, std::string("\1\1", 2), {}), 1), "Bad Index");
}

TEST(SmbiosTable, AStructureTooShortForTheFieldIsPassedOver) {
    EXPECT_EQ(text_of(structure(0, "", {}) + structure(1, "\1", {"a"}) +
                          structure(1, std::string("\1\1", 2), {"b"}),
                      1),
              "b");
}

TEST(SmbiosTable, EndsWhereItsMemoryEnds) {
    const std::string whole = table();
    for (size_t length = 0; length < whole.size(); ++length) {
        const std::string text = text_of(whole.substr(0, length), 1);
        EXPECT_TRUE(text == "(none)" || text == "Bad Index" || text == "SV-2860") << length << text;
    }
    EXPECT_EQ(text_of(std::string("\1\2\0\0", 4), 1), "(none)"); // a length below the header's
    EXPECT_EQ(text_of(std::string("\1\377\0\0", 4), 1), "(none)");
}

TEST(SmbiosString, IsCountedFromOne) {
    std::string bytes = structure(1, "ab", {"first", "second"});
    auto *entry = reinterpret_cast<smbios_header *>(bytes.data());
    EXPECT_STREQ(smbios_string(entry, 0), "");
    EXPECT_STREQ(smbios_string(entry, 1), "first");
    EXPECT_STREQ(smbios_string(entry, 2), "second");
    EXPECT_STREQ(smbios_string(entry, 3), "Bad Index");
    EXPECT_STREQ(smbios_string(entry, -1), "Bad Index");
    std::string empty = structure(1, "ab", {});
    EXPECT_STREQ(smbios_string(reinterpret_cast<smbios_header *>(empty.data()), 1), "Bad Index");
    EXPECT_STREQ(smbios_string(nullptr, 1), "Bad Index");
}

// Physical memory with an entry point at 0xF0000 + `at` and the table at 0x1234.
class PhysicalMemory : public harness::Appliance {
  protected:
    static constexpr size_t kTable = 0x1234;

    static std::string memory(size_t at, const std::string &anchor = "_SM_",
                              const std::string &second = "_DMI_",
                              const std::string &content = table()) {
        std::string bytes(0x100000, '\0');
        const std::string behind = structure(2, std::string("\1\1\1\1", 4), {"no part of it"});
        bytes.replace(kTable, content.size() + behind.size(), content + behind);
        bytes.replace(0xF0000 + at, anchor.size() + 1, anchor + '\x77'); // a checksum follows
        const size_t half = 0xF0000 + at + 16;
        if (half + 16 <= bytes.size()) {
            bytes.replace(half, second.size() + 1, second + '\x5A');
            bytes[half + 6] = static_cast<char>(content.size());
            bytes[half + 7] = static_cast<char>(content.size() >> 8);
            bytes[half + 8] = static_cast<char>(kTable & 0xFF);
            bytes[half + 9] = static_cast<char>(kTable >> 8);
        }
        return bytes;
    }

    // The result is static: another type's answer is asked for in between, so that a stale one
    // shows.
    static std::string entry(int type) {
        const char *text = getTableEntrySMBIOS(type);
        return text == nullptr ? "(null)" : text;
    }
};

TEST_F(PhysicalMemory, HoldsTheTable) {
    for (const size_t at : {0, 0x100, 0xFF0, 0xFFE0}) { // one goes over the end of a page
        put("/dev/mem", memory(at));
        EXPECT_EQ(entry(2), "BOARD-SERIAL-NUMBER-"); // 20 characters
        EXPECT_EQ(entry(1), "SV-2860");
    }
}

TEST_F(PhysicalMemory, WithoutAnEntryPointLeavesTheResult) {
    put("/dev/mem", memory(0));
    ASSERT_EQ(entry(1), "SV-2860");
    testing::internal::CaptureStdout();
    for (const std::string &bytes :
         {memory(8), memory(0, "_XX_"), memory(0, "_SM_", "_DMX_"), memory(0xFFF0)}) {
        put("/dev/mem", bytes);
        EXPECT_EQ(entry(2), "SV-2860");
    }
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    put("/dev/mem", memory(0));
    EXPECT_EQ(entry(7), "SV-2860");
}

TEST_F(PhysicalMemory, IsReadAsFarAsTheTableIsLong) {
    put("/dev/mem", memory(0));
    ASSERT_EQ(entry(1), "SV-2860");
    put("/dev/mem", memory(0, "_SM_", "_DMI_", structure(0, "", {}) + structure(9, "", {"other"})));
    EXPECT_EQ(entry(2), "SV-2860");
}

TEST_F(PhysicalMemory, TheParagraphBehindAnAnchorIsNoAnchor) {
    std::string bytes = memory(16);
    bytes.replace(0xF0000, 4, "_SM_"); // swallows the true one
    put("/dev/mem", memory(0));
    ASSERT_EQ(entry(1), "SV-2860");
    put("/dev/mem", bytes);
    EXPECT_EQ(entry(2), "SV-2860");
}

TEST_F(PhysicalMemory, ThatCannotBeOpenedGivesNull) {
    testing::internal::CaptureStdout();
    EXPECT_EQ(entry(1), "(null)");
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "file open error");
}

TEST_F(PhysicalMemory, ThatCannotBeSoughtLeavesTheResult) {
    put("/dev/mem", memory(0));
    ASSERT_EQ(entry(1), "SV-2860");
    remove("/dev/mem");
    ASSERT_EQ(mkfifo("/dev/mem", 0600), 0);
    const int writer = open("/dev/mem", O_RDWR);
    testing::internal::CaptureStdout();
    EXPECT_EQ(entry(2), "SV-2860");
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "lseek error");
    close(writer);
}

TEST_F(PhysicalMemory, AFailedUnmappingIsToldAndHarmless) {
    put("/dev/mem", memory(0));
    record().munmap_fails = true;
    testing::internal::CaptureStdout();
    EXPECT_EQ(entry(2), "BOARD-SERIAL-NUMBER-");
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "munmap error");
}

TEST_F(PhysicalMemory, ThatIsADeviceEndsNowhere) {
    put("/dev/mem", memory(0));
    record().files_are_devices = true; // whose size is told as 0
    EXPECT_EQ(entry(2), "BOARD-SERIAL-NUMBER-");
    EXPECT_EQ(entry(1), "SV-2860");
}

TEST_F(PhysicalMemory, AnImageThatEndsBeforeTheTableIsNotTouchedBehindItsEnd) {
    std::string bytes = memory(0);
    bytes[0xF0000 + 16 + 10] = '\x7F'; // the table's address is now far behind the end
    put("/dev/mem", bytes);
    const size_t open_before = open_descriptors();
    testing::internal::CaptureStdout();
    entry(1);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "mmap error");
    EXPECT_EQ(open_descriptors(), open_before);
}

} // namespace
