#include "zav_bios_smbios.h"

#include "zav_private.h"

#include <cstring>

namespace zav {

namespace {

// Formatted-area offset of the string index that answers for a structure type; 0 for none.
size_t string_field(int type) {
    switch (type) {
    case 1:
        return 5; // product name
    case 2:
        return 7; // serial number
    default:
        return 0;
    }
}

// The end of the string set that starts at `strings`: behind the empty string that closes it.
const char *end_of_strings(const char *strings, const char *end) {
    const char *at = strings;
    while (at + 1 < end && (at[0] != '\0' || at[1] != '\0'))
        ++at;
    return at + 1 < end ? at + 2 : end;
}

// Is there a string at `text` that ends before `end`? A null `end` vouches for it.
bool terminated(const char *text, const char *end) {
    return end == nullptr ||
           (text < end && memchr(text, '\0', static_cast<size_t>(end - text)) != nullptr);
}

} // namespace

bool begins_entry_point(const char *paragraph) {
    return memcmp(paragraph, "_SM_", 4) == 0;
}

bool locates_table(const char *paragraph, SmbiosTable &table) {
    if (memcmp(paragraph, "_DMI_", 5) != 0)
        return false;
    memcpy(&table.length, paragraph + 6, sizeof table.length);
    memcpy(&table.address, paragraph + 8, sizeof table.address);
    return true;
}

const char *smbios_string_in(const char *strings, const char *end, int index) {
    if (index == 0)
        return "";
    const char *string = strings;
    for (int skip = index - 1; terminated(string, end) && *string != '\0'; --skip) {
        if (skip == 0)
            return string;
        string += strlen(string) + 1;
    }
    return "Bad Index";
}

const char *smbios_text(const char *table, size_t length, int type) {
    const size_t field = string_field(type);
    const char *end = table + length;
    bool first = true;
    for (const char *at = table; static_cast<size_t>(end - at) >= sizeof(smbios_header);) {
        smbios_header header;
        memcpy(&header, at, sizeof header);
        if (header.length < sizeof header || header.length > end - at)
            return nullptr;
        const char *strings = at + header.length;
        if (!first && header.type == type && field != 0 && field < header.length)
            return smbios_string_in(strings, end, static_cast<uint8_t>(at[field]));
        first = false;
        at = end_of_strings(strings, end);
    }
    return nullptr;
}

} // namespace zav
