#include "raid_report.h"

#include "text.h"
#include "zav_api.h"

#include <cstdint>
#include <cstdio>
#include <cstring>

namespace zav {

namespace {

constexpr const char *kSeparator = ":";
constexpr const char *kEndOfSection = "H:";
constexpr size_t kMostFields = 6;     // of a line
constexpr size_t kMostDiskFields = 4; // one more than its row has: that one begins the next row

// The next field without the white space around it. A line feed is what follows the last separator,
// no field.
const char *next_field(Fields &fields) {
    char *field = fields.next(kSeparator);
    while (field != nullptr && *field == '\n')
        field = fields.next(kSeparator);
    if (field != nullptr)
        trim(field);
    return field;
}

// The character by which a line is classified; NUL for a line without any field.
char kind_of(Fields &fields) {
    const char *field = fields.next(kSeparator);
    return field == nullptr ? '\0' : *field;
}

template <class Table>
size_t store_fields(Table &table, size_t row, Fields &fields, size_t most) {
    size_t stored = 0;
    for (size_t column = 0; column < most; ++column) {
        const char *field = next_field(fields);
        if (field == nullptr || !table.store(row, column, field))
            break;
        ++stored;
    }
    return stored;
}

template <class Table>
EnclosureReader::Piece store_row(EnclosureReader::Kind kind, Table &table, size_t &lines,
                                 Fields &fields, size_t most) {
    if (lines == Table::kRows)
        return {EnclosureReader::Kind::kSurplus, 0, 0};
    const size_t row = lines++;
    return {kind, row, store_fields(table, row, fields, most)};
}

float to_float(const char *text) {
    return static_cast<float>(to_double(text));
}

// Lets `change` work on the slot of a number as written, counted from 1: a number below lands on
// what stands before the slots. What would land outside the record is left out.
template <class Slot, class Change>
void change_slot(sRaidSetInfo &info, size_t first, int32_t number, const Change &change) {
    const int64_t at =
        static_cast<int64_t>(first) + (int64_t{number} - 1) * static_cast<int64_t>(sizeof(Slot));
    if (at < 0 || at > static_cast<int64_t>(sizeof info - sizeof(Slot)))
        return;
    char *place = reinterpret_cast<char *>(&info) + at;
    Slot slot;
    memcpy(&slot, place, sizeof slot);
    change(slot);
    memcpy(place, &slot, sizeof slot);
}

void fill_set(const EnclosureReader &reader, sRaidSetInfo &info) {
    info.raidnum = to_int(reader.raid_set(0));
    copy_text(info.raidname, sizeof info.raidname, reader.raid_set(1));
    info.raidsize = to_float(reader.raid_set(2));
    info.diskcount = to_int(reader.raid_set(3));
    copy_text(info.diskmember, sizeof info.diskmember, reader.raid_set(4));
}

void fill_volume(const EnclosureReader &reader, size_t row, sRaidSetInfo &info) {
    const int32_t number = to_int(reader.volume(row, 0));
    change_slot<sVolSetInfo>(
        info, offsetof(sRaidSetInfo, sVolInfo), number, [&](sVolSetInfo &volume) {
            volume.volnum = number;
            copy_text(volume.volname, sizeof volume.volname, reader.volume(row, 1));
            volume.raidlevel = to_int(reader.volume(row, 2));
            volume.volsize = to_float(reader.volume(row, 3));
            volume.progress = to_int(reader.volume(row, 4));
            volume.status = to_int(reader.volume(row, 5));
        });
}

void fill_disk(const EnclosureReader &reader, size_t row, sRaidSetInfo &info) {
    const int32_t number = to_int(reader.disk(row, 0));
    change_slot<sPhyDiskInfo>(info, offsetof(sRaidSetInfo, sDiskInfo), number,
                              [&](sPhyDiskInfo &disk) {
                                  disk.disknum = number;
                                  disk.disksize = to_float(reader.disk(row, 1));
                                  disk.status = to_int(reader.disk(row, 2));
                              });
}

void preset_disks(sRaidSetInfo &info) {
    int number = 0;
    for (sPhyDiskInfo &disk : info.sDiskInfo)
        disk = {.disknum = ++number, .disksize = 0.0F, .status = 0};
}

} // namespace

Marker Marker::unit(int number) {
    Marker marker;
    snprintf(marker.text_, sizeof marker.text_, "RBOD#%d", number);
    return marker;
}

bool Marker::in(const char *piece) const {
    return contains(piece, text_);
}

template <size_t Rows, size_t Columns>
bool FieldTable<Rows, Columns>::store(size_t row, size_t column, const char *text) {
    row += column / Columns;
    column %= Columns;
    if (row >= Rows)
        return false;
    const size_t start = column * kFieldSize;
    copy_text(row_[row] + start, sizeof row_[row] - start, text);
    return true;
}

EnclosureReader::Piece EnclosureReader::take(char *piece) {
    if (ended_)
        return {Kind::kAfter, 0, 0};
    if (marker_.in(piece))
        started_ = true;
    if (!started_)
        return {Kind::kBefore, 0, 0};
    if (contains(piece, kEndOfSection)) {
        ended_ = true;
        return {Kind::kEnd, 0, 0};
    }
    Fields fields(piece);
    switch (kind_of(fields)) {
    case 'R': // the marker of a unit too, which has no fields to store
        return {Kind::kRaidSet, 0, store_fields(raid_set_, 0, fields, kMostFields)};
    case 'V':
        return store_row(Kind::kVolume, volumes_, volume_lines_, fields, kMostFields);
    case 'D':
        return store_row(Kind::kDisk, disks_, disk_lines_, fields, kMostDiskFields);
    default:
        return {Kind::kOther, 0, 0};
    }
}

bool EnclosureReader::fill(sRaidSetInfo &info) const {
    info = {};
    if (*raid_set(0) == '\0')
        return false;
    fill_set(*this, info);
    for (size_t row = 0; row < kVolumeRows; ++row)
        if (*volume(row, 0) != '\0')
            fill_volume(*this, row, info);
    preset_disks(info);
    for (size_t row = 0; row < kDiskRows; ++row)
        if (*disk(row, 0) != '\0')
            fill_disk(*this, row, info);
    return true;
}

bool MonitorReader::take(char *piece) {
    if (!marker_found_) {
        marker_found_ = marker_.in(piece);
        return true;
    }
    if (*piece != 'H')
        return true;
    line_found_ = true;
    constexpr const char *kSeparators = ":\n";
    Fields fields(piece);
    fields.next(kSeparators);
    for (double &reading : readings_) {
        const char *field = fields.next(kSeparators);
        if (field == nullptr)
            break;
        reading = to_double(field);
    }
    return false;
}

bool IdentityReader::take(char *piece, sRBODMap &identity) {
    if (!started_) {
        started_ = marker_.in(piece);
        return true;
    }
    Fields fields(piece);
    const char kind = kind_of(fields);
    if (kind == 'I')
        return false;
    if (kind != 'M' && kind != 'S')
        return true;
    const char *value = next_field(fields);
    if (value == nullptr)
        return true;
    if (kind == 'M')
        copy_text(identity.model, sizeof identity.model, value);
    else
        copy_text(identity.sn, sizeof identity.sn, value);
    return true;
}

} // namespace zav
