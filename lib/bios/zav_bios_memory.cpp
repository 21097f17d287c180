// The SMBIOS table, read from physical memory.
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"
#include "zav_bios_smbios.h"
#include "zav_private.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using zav::kParagraph;
using zav::SmbiosTable;

constexpr long kFirmwareStart = 0xF0000;
constexpr long kFirmwareEnd = 0xFFFFE;

struct Free {
    void operator()(char *memory) const { free(memory); }
};
using Buffer = std::unique_ptr<char, Free>;

// The firmware's memory by paragraphs, from the current position on. It is read by pages: a call of
// the kernel for each paragraph is what takes most of the search.
class Paragraphs {
  public:
    explicit Paragraphs(int memory) : memory_(memory) {}

    // The next one, or null behind the last that is whole.
    const char *next() {
        if (at_ == length_) {
            const ssize_t count = read(memory_, page_, sizeof page_);
            length_ = count < 0 ? 0 : static_cast<size_t>(count);
            at_ = 0;
        }
        if (length_ - at_ < kParagraph)
            return nullptr;
        const char *paragraph = page_ + at_;
        at_ += kParagraph;
        return paragraph;
    }

  private:
    int memory_;
    char page_[4096] = {};
    size_t length_ = 0;
    size_t at_ = 0;
};

// Finds the table's place in the firmware's memory, from the current position on.
bool find_table(int memory, SmbiosTable &table) {
    Paragraphs paragraphs(memory);
    const char *paragraph;
    for (long at = kFirmwareStart; at < kFirmwareEnd && (paragraph = paragraphs.next()) != nullptr;
         at += kParagraph) {
        if (!zav::begins_entry_point(paragraph))
            continue;
        at += kParagraph;
        paragraph = paragraphs.next();
        if (paragraph != nullptr && zav::locates_table(paragraph, table))
            return true;
    }
    return false;
}

// An image file that ends early must not be touched behind its end, nor one that may.
bool may_end_before(int memory, const SmbiosTable &table) {
    struct stat status;
    if (fstat(memory, &status) != 0)
        return true;
    return S_ISREG(status.st_mode) &&
           status.st_size < static_cast<long long>(table.address) + table.length;
}

Buffer copy_table(int memory, const SmbiosTable &table) {
    Buffer copy(static_cast<char *>(malloc(table.length)));
    if (!copy) {
        printf("malloc error");
        return nullptr;
    }
    const auto page = static_cast<uint32_t>(sysconf(_SC_PAGESIZE));
    const uint32_t offset = table.address % page;
    const size_t size = size_t{offset} + table.length;
    // The table may lie above 2 GiB, which a 32-bit file offset does not reach.
    void *map = may_end_before(memory, table)
                    ? MAP_FAILED
                    : mmap64(nullptr, size, PROT_READ, MAP_SHARED, memory,
                             static_cast<off64_t>(table.address) - offset);
    if (map == MAP_FAILED) {
        printf("mmap error");
        return nullptr;
    }
    memcpy(copy.get(), static_cast<const char *>(map) + offset, table.length);
    if (munmap(map, size) != 0)
        printf("munmap error");
    return copy;
}

} // namespace

char *smbios_string(struct smbios_header *entry, int index) {
    if (entry == nullptr)
        return const_cast<char *>("Bad Index");
    const char *strings = reinterpret_cast<const char *>(entry) + entry->length;
    return const_cast<char *>(zav::smbios_string_in(strings, nullptr, index));
}

char *getTableEntrySMBIOS(int type) {
    static char result[21];
    const zav::Descriptor memory(open("/dev/mem", O_RDONLY | O_CLOEXEC));
    if (!memory) {
        printf("file open error");
        return nullptr;
    }
    if (lseek(memory.get(), kFirmwareStart, SEEK_SET) < 0) {
        printf("lseek error");
        return result;
    }
    SmbiosTable table = {};
    if (!find_table(memory.get(), table))
        return result;
    if (const Buffer copy = copy_table(memory.get(), table)) {
        const char *text = zav::smbios_text(copy.get(), table.length, type);
        if (text != nullptr)
            zav::copy_text(result, sizeof result, text);
    }
    return result;
}
