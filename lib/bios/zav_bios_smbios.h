// The SMBIOS table as bytes: finding it and walking it.
#pragma once

#include <cstddef>
#include <cstdint>

namespace zav {

constexpr size_t kParagraph = 16;

struct SmbiosTable {
    uint32_t address;
    uint16_t length;
};

// Does this paragraph of the firmware's memory begin the entry point, or hold its second half,
// which then tells where the table is?
bool begins_entry_point(const char *paragraph);
bool locates_table(const char *paragraph, SmbiosTable &table);

// The `index`-th string (from 1) of a structure's string set, which starts at `strings`; "" for
// index 0, "Bad Index" if the set, or the memory up to `end`, ends before it. With a null `end` the
// set is trusted to be complete.
const char *smbios_string_in(const char *strings, const char *end, int index);

// The product name (type 1) or board serial number (type 2) of the first structure of that type
// behind the table's first structure; null if there is none.
const char *smbios_text(const char *table, size_t length, int type);

} // namespace zav
