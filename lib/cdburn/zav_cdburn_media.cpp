#include "zav_cdburn_media.h"

#include "common/text.h"

#include <climits>
#include <cstring>

namespace zav {

namespace {

constexpr int kSingleLayer = 4590000; // kilobytes, whatever the disc itself says
constexpr int kDoubleLayer = 8347000;
constexpr int kNoCapacity = 0;

struct MediaRow {
    const char *text;
    int type;
    int capacity;
};

constexpr MediaRow kMedia[] = {
    {" Mounted Media:         10h, DVD-ROM", ZAV_DVD_ROM, kNoCapacity},
    {" Mounted Media:         11h, DVD-R Sequential", ZAV_DVD_MINUS_R_SEQ, kSingleLayer},
    {" Mounted Media:         12h, DVD-RAM", ZAV_DVD_RAM, kNoCapacity},
    {" Mounted Media:         13h, DVD-RW Restricted Overwrite", ZAV_DVD_MINUS_RW_RES,
     kSingleLayer},
    {" Mounted Media:         14h, DVD-RW Sequential", ZAV_DVD_MINUS_RW_SEQ, kSingleLayer},
    {" Mounted Media:         1Ah, DVD+RW", ZAV_DVD_PLUS_RW, kSingleLayer},
    {" Mounted Media:         1Bh, DVD+R", ZAV_DVD_PLUS_R, kSingleLayer},
    {" Mounted Media:         2Bh, DVD+R Double Layer", ZAV_DVD_PLUS_R_DOUBLE, kDoubleLayer},
};

struct StateRow {
    const char *text;
    int state;
};

constexpr StateRow kStates[] = {
    {" Disc status:           blank", ZAV_DISC_BLANK},
    {" Disc status:           appendable", ZAV_DISC_APPENDABLE},
    {" Disc status:           complete", ZAV_DISC_COMPLETE},
};

constexpr int kDvdReserve = 4096; // kilobytes that a further session costs
constexpr int kCdReserve = 13800;

template <class Row, size_t rows>
const Row *find_in(const Row (&table)[rows], const char *line) {
    for (const Row &row : table)
        if (contains(line, row.text))
            return &row;
    return nullptr;
}

// No disc has more sectors; a larger number would turn into room where kilobytes are counted.
constexpr int kMostSectors = INT_MAX / 4;

bool read_sectors(const char *word, int &sectors) {
    return read_count(word, sectors) && sectors <= kMostSectors;
}

char *word(char *line, int number, const char *separators) {
    Fields words(line);
    char *found = nullptr;
    for (int i = 0; i < number; ++i)
        found = words.next(separators);
    return found;
}

// The disc's used sectors stand in its third word, "1000*2048=2048000". Without them there is no
// room that could be relied upon.
void read_capacity(char *line, zavMediaInfo &info) {
    int sectors = 0;
    if (info.discState == ZAV_DISC_BLANK)
        info.discAvailableSize = info.discTotalSize;
    else if (info.discState == ZAV_DISC_COMPLETE)
        info.discAvailableSize = 0;
    else if (read_sectors(word(line, 3, " "), sectors))
        info.discAvailableSize = info.discTotalSize - 2 * sectors - kDvdReserve;
}

} // namespace

bool read_count(const char *word, int &count) {
    if (word == nullptr)
        return false;
    const char *digits = word + strspn(word, " \t");
    if (*digits < '0' || *digits > '9')
        return false;
    count = to_int(digits);
    return true;
}

void read_dvd_line(char *line, zavMediaInfo &info) {
    if (const MediaRow *media = find_in(kMedia, line); media != nullptr) {
        info.discType = media->type;
        if (media->capacity != kNoCapacity)
            info.discTotalSize = media->capacity;
    } else if (const StateRow *state = find_in(kStates, line); state != nullptr) {
        info.discState = state->state;
    } else if (contains(line, "READ CAPACITY:")) {
        read_capacity(line, info);
    }
}

NoDvd read_refusal_line(const char *line) {
    if (contains(line, ":-( no media mounted, exiting..."))
        return NoDvd::no_medium;
    if (contains(line, ":-( non-DVD media mounted, exiting..."))
        return NoDvd::cd;
    return NoDvd::other;
}

void read_atip_line(char *line, zavMediaInfo &info) {
    if (contains(line, "  Is erasable")) {
        info.discType = ZAV_CD_RW;
    } else if (contains(line, "  Is not erasable")) {
        info.discType = ZAV_CD_R;
    } else if (contains(line, "  ATIP start of lead out")) {
        int sectors = 0;
        if (read_sectors(word(line, 6, " "), sectors))
            info.discTotalSize = 2 * sectors;
    }
}

bool read_disc_status(unsigned char status, zavMediaInfo &info) {
    switch (status & 3U) {
    case 0:
        info.discState = ZAV_DISC_BLANK;
        info.discAvailableSize = info.discTotalSize;
        return false;
    case 1:
        info.discState = ZAV_DISC_APPENDABLE;
        return true;
    case 2:
        info.discState = ZAV_DISC_COMPLETE;
        info.discAvailableSize = 0;
        return false;
    default:
        return false;
    }
}

void read_session_offsets(char *line, zavMediaInfo &info) {
    int next_session = 0;
    if (read_sectors(word(line, 2, ","), next_session))
        info.discAvailableSize = info.discTotalSize - 2 * next_session - kCdReserve;
    else
        info.discState = ZAV_DISC_STATE_UNKNOWN;
}

void read_used_space(char *line, zavMediaInfo &info) {
    int used = 0;
    if (read_count(word(line, 1, " "), used))
        info.discAvailableSize = info.discTotalSize - used;
    else
        info.discState = ZAV_DISC_STATE_UNKNOWN;
}

bool is_overwritable(int disc_type) {
    return disc_type == ZAV_DVD_PLUS_RW || disc_type == ZAV_DVD_MINUS_RW_RES;
}

} // namespace zav
