#include "zav_cdburn_choice.h"

#include <iterator>

namespace zav {

namespace {

constexpr Choice kInvalid = {Recipe::none, ZAV_RC_ERR_EINVAL};
constexpr Choice kBadDisc = {Recipe::none, ZAV_RC_ERR_BADDISC};

constexpr Choice with(Recipe recipe) {
    return {recipe, ZAV_RC_OK};
}

constexpr Choice kNew = with(Recipe::dvd_new);
constexpr Choice kAppend = with(Recipe::dvd_append);
constexpr Choice kClosed = with(Recipe::dvd_closed);
constexpr Choice kAtOnce = with(Recipe::dvd_at_once);
constexpr Choice kDouble = with(Recipe::dvd_double_at_once);
constexpr Choice kCdClosed = with(Recipe::cd_closed);
constexpr Choice kCdFirst = with(Recipe::cd_first_session);
constexpr Choice kCdNext = with(Recipe::cd_next_session);

// For session types 0, 1, 2 and any other.
constexpr int kSessions = 4;

struct Row {
    int type;
    Choice choices[4][kSessions]; // blank, appendable, complete, unknown
};

constexpr int kStates[] = {ZAV_DISC_BLANK, ZAV_DISC_APPENDABLE, ZAV_DISC_COMPLETE,
                           ZAV_DISC_STATE_UNKNOWN};

// An appendable restricted-overwrite disc is written from its start even for a further session.
// clang-format off
constexpr Row kRows[] = {
    {ZAV_DVD_MINUS_R_SEQ,
     {{kClosed,  kNew,     kInvalid, kInvalid},
      {kBadDisc, kAppend,  kInvalid, kInvalid},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_DVD_PLUS_R,
     {{kClosed,  kNew,     kInvalid, kInvalid},
      {kBadDisc, kAppend,  kInvalid, kInvalid},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_DVD_MINUS_RW_RES,
     {{kInvalid, kNew,     kNew,     kNew},
      {kInvalid, kNew,     kNew,     kInvalid},
      {kInvalid, kAppend,  kNew,     kInvalid},
      {kInvalid, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_DVD_MINUS_RW_SEQ,
     {{kAtOnce,  kBadDisc, kBadDisc, kInvalid},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_DVD_PLUS_RW,
     {{kInvalid, kNew,     kNew,     kNew},
      {kInvalid, kAppend,  kNew,     kInvalid},
      {kInvalid, kAppend,  kNew,     kInvalid},
      {kInvalid, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_DVD_PLUS_R_DOUBLE,
     {{kDouble,  kNew,     kInvalid, kInvalid},
      {kBadDisc, kAppend,  kInvalid, kInvalid},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc, kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_CD_RW,
     {{kCdClosed, kCdFirst, kInvalid, kInvalid},
      {kBadDisc,  kCdNext,  kInvalid, kInvalid},
      {kBadDisc,  kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc,  kBadDisc, kBadDisc, kBadDisc}}},
    {ZAV_CD_R,
     {{kCdClosed, kCdFirst, kInvalid, kInvalid},
      {kBadDisc,  kCdNext,  kInvalid, kInvalid},
      {kBadDisc,  kBadDisc, kBadDisc, kBadDisc},
      {kBadDisc,  kBadDisc, kBadDisc, kBadDisc}}},
};
// clang-format on

const Row *row_of(int disc_type) {
    for (const Row &row : kRows)
        if (row.type == disc_type)
            return &row;
    return nullptr;
}

// Of media that nothing is ever written to.
Choice refusal_of(int disc_type) {
    switch (disc_type) {
    case ZAV_DVD_ROM:
    case ZAV_DVD_RAM:
    case ZAV_DISC_UNKNOWN:
        return kBadDisc;
    case ZAV_DISC_NONE:
        return {Recipe::none, ZAV_RC_ERR_NODISC};
    default:
        return kInvalid;
    }
}

} // namespace

Choice choose(int disc_type, int disc_state, int session_type) {
    const Row *row = row_of(disc_type);
    if (row == nullptr)
        return refusal_of(disc_type);
    const bool known_session = session_type >= 0 && session_type < kSessions - 1;
    for (size_t i = 0; i < std::size(kStates); ++i)
        if (kStates[i] == disc_state)
            return row->choices[i][known_session ? session_type : kSessions - 1];
    return kInvalid;
}

bool combo_drive_refuses(int disc_type) {
    return disc_type == ZAV_DVD_ROM || disc_type == ZAV_DVD_MINUS_RW_RES ||
           disc_type == ZAV_DVD_MINUS_RW_SEQ || disc_type == ZAV_DVD_PLUS_RW;
}

bool has_room(const zavMediaInfo &disc, int session_type, int source_kilobytes) {
    switch (session_type) {
    case 0:
    case 2:
        return source_kilobytes >= 0 && disc.discTotalSize >= source_kilobytes;
    case 1:
        return source_kilobytes >= 0 && disc.discAvailableSize >= source_kilobytes;
    default:
        return true;
    }
}

} // namespace zav
