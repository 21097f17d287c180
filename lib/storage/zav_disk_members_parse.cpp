#include "zav_disk_members_parse.h"

#include "common/text.h"

#include <cstdio>
#include <cstring>

namespace zav {

namespace {

constexpr const char *kLevels[] = {"raid1", "raid0", "linear", "raid10", "raid5"};

bool is_level(const char *word) {
    for (const char *level : kLevels)
        if (strcmp(word, level) == 0)
            return true;
    return false;
}

} // namespace

bool ArrayQuery::is_redundant() const {
    return strcmp(level, "raid0") != 0 && strcmp(level, "linear") != 0;
}

// A name is never cut: what is left of it might be another array's.
ArrayQuery read_array_query(char *text) {
    constexpr const char *kSeparators = " =\t\r\n";
    ArrayQuery query = {};
    Fields tokens(text);
    const char *token = tokens.next(kSeparators);
    while (token != nullptr && !starts_with(token, "/dev/md"))
        token = tokens.next(kSeparators);
    if (token == nullptr || strlen(token) >= sizeof query.array)
        return query;
    copy_text(query.array, sizeof query.array, token);
    do
        token = tokens.next(kSeparators);
    while (token != nullptr && !is_level(token));
    if (token != nullptr)
        copy_text(query.level, sizeof query.level, token);
    return query;
}

bool read_member_numbers(char *row, DeviceNumbers &numbers) {
    Fields fields(row);
    fields.next(" "); // the member's number
    const char *major = fields.next(" ");
    const char *minor = fields.next(" ");
    if (minor == nullptr)
        return false;
    numbers = {to_int(major), to_int(minor)};
    return true;
}

bool creation_form(char (&form)[kLongestCreation], int disks) {
    if (disks < 2 || disks > 4)
        return false;
    char members[96] = "";
    size_t length = 0;
    for (int disk = 1; disk <= disks; ++disk)
        length += static_cast<size_t>(
            snprintf(members + length, sizeof members - length, " /dev/sata/disk%dp2", disk));
    snprintf(form, sizeof form,
             "echo 'y' | mdadm --create %%s --force --level=%%s --raid-devices=%d "
             "--metadata=1.2 --name=MD1%s &>/dev/null",
             disks, members);
    return true;
}

} // namespace zav
