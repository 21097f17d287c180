// The choice of a burn's command, compared with the rules as a burner's user would tell them.
#include "cdburn/zav_cdburn_choice.h"

#include <gtest/gtest.h>

namespace zav {

std::ostream &operator<<(std::ostream &out, const Choice &choice) {
    return out << "recipe " << static_cast<int>(choice.recipe) << " refusal " << std::hex
               << choice.refusal;
}

} // namespace zav

namespace {

using zav::Choice;
using zav::choose;
using zav::Recipe;

Choice recipe(Recipe which) {
    return {which, ZAV_RC_OK};
}
Choice refused(int code) {
    return {Recipe::none, code};
}

// Discs that are written once: new when blank, added to when appendable.
Choice once(int state, int session, Recipe closed, Recipe open, Recipe further) {
    if (state != ZAV_DISC_BLANK && state != ZAV_DISC_APPENDABLE)
        return refused(ZAV_RC_ERR_BADDISC);
    if (session != 0 && session != 1)
        return refused(ZAV_RC_ERR_EINVAL);
    if (state == ZAV_DISC_BLANK)
        return recipe(session == 0 ? closed : open);
    return session == 0 ? refused(ZAV_RC_ERR_BADDISC) : recipe(further);
}

// Discs that are written over: never closed.
Choice over(bool plus, int state, int session) {
    if (session == 0)
        return refused(ZAV_RC_ERR_EINVAL);
    if (state == ZAV_DISC_STATE_UNKNOWN)
        return refused(ZAV_RC_ERR_BADDISC);
    if (state == ZAV_DISC_BLANK || session == 2)
        return recipe(Recipe::dvd_new);
    if (session != 1)
        return refused(ZAV_RC_ERR_EINVAL);
    return recipe(state == ZAV_DISC_APPENDABLE && !plus ? Recipe::dvd_new : Recipe::dvd_append);
}

Choice sequential_rewritable(int state, int session) {
    if (state != ZAV_DISC_BLANK)
        return refused(ZAV_RC_ERR_BADDISC);
    if (session == 0)
        return recipe(Recipe::dvd_at_once);
    return refused(session == 1 || session == 2 ? ZAV_RC_ERR_BADDISC : ZAV_RC_ERR_EINVAL);
}

Choice expected(int type, int state, int session) {
    switch (type) {
    case ZAV_DVD_ROM:
    case ZAV_DVD_RAM:
    case ZAV_DISC_UNKNOWN:
        return refused(ZAV_RC_ERR_BADDISC);
    case ZAV_DISC_NONE:
        return refused(ZAV_RC_ERR_NODISC);
    case ZAV_DVD_MINUS_R_SEQ:
    case ZAV_DVD_PLUS_R:
        return once(state, session, Recipe::dvd_closed, Recipe::dvd_new, Recipe::dvd_append);
    case ZAV_DVD_PLUS_R_DOUBLE:
        return once(state, session, Recipe::dvd_double_at_once, Recipe::dvd_new,
                    Recipe::dvd_append);
    case ZAV_CD_R:
    case ZAV_CD_RW:
        return once(state, session, Recipe::cd_closed, Recipe::cd_first_session,
                    Recipe::cd_next_session);
    case ZAV_DVD_PLUS_RW:
    case ZAV_DVD_MINUS_RW_RES:
        return over(type == ZAV_DVD_PLUS_RW, state, session);
    case ZAV_DVD_MINUS_RW_SEQ:
        return sequential_rewritable(state, session);
    default:
        return refused(ZAV_RC_ERR_EINVAL);
    }
}

TEST(BurnChoice, IsMadeForEveryDiscStateAndSession) {
    for (int type = ZAV_DVD_ROM; type <= ZAV_DISC_UNKNOWN; ++type)
        for (int state = ZAV_DISC_BLANK; state <= ZAV_DISC_STATE_UNKNOWN; ++state)
            for (const int session : {0, 1, 2, 3, 4, 5, -1, 1000})
                EXPECT_EQ(choose(type, state, session), expected(type, state, session))
                    << "type " << type << " state " << state << " session " << session;
}

TEST(BurnChoice, IsInvalidForTypesThatAreNotKnown) {
    for (const int type : {0, -1, 13, 1000})
        EXPECT_EQ(choose(type, ZAV_DISC_BLANK, 0), refused(ZAV_RC_ERR_EINVAL)) << type;
}

TEST(BurnChoice, IsInvalidForStatesThatAreNotKnown) {
    for (const int state : {0, ZAV_DISC_BLANK - 1, ZAV_DISC_STATE_UNKNOWN + 1})
        for (const int type : {ZAV_DVD_PLUS_R, ZAV_DVD_PLUS_RW, ZAV_CD_R})
            EXPECT_EQ(choose(type, state, 1), refused(ZAV_RC_ERR_EINVAL)) << state;
}

TEST(BurnChoice, OfAComboDriveLeavesOutRewritableAndReadOnlyDvds) {
    for (int type = ZAV_DVD_ROM; type <= ZAV_DISC_UNKNOWN; ++type)
        EXPECT_EQ(zav::combo_drive_refuses(type),
                  type == ZAV_DVD_ROM || type == ZAV_DVD_MINUS_RW_RES ||
                      type == ZAV_DVD_MINUS_RW_SEQ || type == ZAV_DVD_PLUS_RW)
            << type;
}

TEST(BurnRoom, IsTheWholeDiscForAnOnlySession) {
    const zavMediaInfo disc = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_R, ZAV_DISC_BLANK, 1000, 500};
    for (const int session : {0, 2}) {
        EXPECT_TRUE(zav::has_room(disc, session, 1000));
        EXPECT_FALSE(zav::has_room(disc, session, 1001));
    }
}

TEST(BurnRoom, IsWhatIsLeftForAFurtherSession) {
    zavMediaInfo disc = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 1000, 500};
    EXPECT_TRUE(zav::has_room(disc, 1, 500));
    EXPECT_FALSE(zav::has_room(disc, 1, 501));
    disc.discAvailableSize = -1;
    EXPECT_FALSE(zav::has_room(disc, 1, 0));
}

TEST(BurnRoom, IsThereForAnEmptySourceOnAFullDisc) {
    const zavMediaInfo disc = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 0, 0};
    for (const int session : {0, 1, 2})
        EXPECT_TRUE(zav::has_room(disc, session, 0));
}

TEST(BurnRoom, IsNotAskedForOtherSessions) {
    const zavMediaInfo disc = {};
    EXPECT_TRUE(zav::has_room(disc, 3, 1000));
    EXPECT_TRUE(zav::has_room(disc, -1, -1));
}

TEST(BurnRoom, IsNotThereForASourceThatCouldNotBeMeasured) {
    const zavMediaInfo disc = {ZAV_EVENT_DISC, ZAV_DVD_PLUS_R, ZAV_DISC_BLANK, 1000, 500};
    for (const int session : {0, 1, 2})
        EXPECT_FALSE(zav::has_room(disc, session, -1));
}

} // namespace
