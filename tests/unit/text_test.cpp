// Fields, numbers and copies of text.
#include "common/text.h"

#include <climits>
#include <clocale>
#include <cmath>
#include <gtest/gtest.h>
#include <limits>

namespace {

TEST(FieldsOfText, SkipRunsOfSeparators) {
    char text[] = ";;a;;b;";
    zav::Fields fields(text);
    EXPECT_STREQ(fields.next(";"), "a");
    EXPECT_STREQ(fields.next(";"), "b");
    EXPECT_EQ(fields.next(";"), nullptr);
    EXPECT_EQ(fields.next(";"), nullptr);
}

TEST(FieldsOfText, EachMayUseOtherSeparators) {
    char text[] = "key=value;rest";
    zav::Fields fields(text);
    EXPECT_STREQ(fields.next("="), "key");
    EXPECT_STREQ(fields.next(";"), "value");
    EXPECT_STREQ(fields.next(""), "rest");
}

TEST(FieldsOfText, AnEmptyTextHasNone) {
    char text[] = "";
    zav::Fields fields(text);
    EXPECT_EQ(fields.next(";"), nullptr);
}

TEST(Numbers, SaturateAt32Bits) {
    EXPECT_EQ(zav::to_int("2147483647"), INT32_MAX);
    EXPECT_EQ(zav::to_int("2147483648"), INT32_MAX);
    EXPECT_EQ(zav::to_int("99999999999999999999"), INT32_MAX);
    EXPECT_EQ(zav::to_int("-2147483649"), INT32_MIN);
    EXPECT_EQ(zav::to_unsigned("4294967295"), UINT32_MAX);
    EXPECT_EQ(zav::to_unsigned("4294967296"), UINT32_MAX);
    EXPECT_EQ(zav::to_unsigned("99999999999999999999"), UINT32_MAX);
}

TEST(Numbers, StopAtTheFirstOtherCharacter) {
    EXPECT_EQ(zav::to_int(" \t12abc"), 12);
    EXPECT_EQ(zav::to_int("-3 "), -3);
    EXPECT_EQ(zav::to_int("+3"), 3);
    EXPECT_EQ(zav::to_int("abc"), 0);
    EXPECT_EQ(zav::to_int(""), 0);
    EXPECT_EQ(zav::to_int("010"), 10);
    EXPECT_EQ(zav::to_unsigned("12p3"), 12U);
    EXPECT_EQ(zav::to_unsigned("p3"), 0U);
    EXPECT_EQ(zav::to_unsigned("- 3"), 0U);
}

TEST(Numbers, AnUnsignedMinusWrapsAt32Bits) {
    EXPECT_EQ(zav::to_unsigned("-1"), UINT32_MAX);
    EXPECT_EQ(zav::to_unsigned("+1"), 1U);
}

TEST(Numbers, DoNotDependOnTheCallersLocale) {
    ASSERT_NE(setlocale(LC_ALL, "de_DE.UTF-8"), nullptr);
    ASSERT_STREQ(localeconv()->decimal_point, ",");
    const double number = zav::to_double(" 65.5%");
    setlocale(LC_ALL, "C");
    EXPECT_EQ(number, 65.5);
}

TEST(Numbers, KeepTheirWholePart) {
    EXPECT_EQ(zav::whole_part(12.9), 12);
    EXPECT_EQ(zav::whole_part(-12.9), -12);
    EXPECT_EQ(zav::whole_part(2147483647.5), INT32_MAX);
}

TEST(Numbers, WithoutAWholePartBecomeTheSmallestInt) {
    EXPECT_EQ(zav::whole_part(2147483648.0), INT32_MIN);
    EXPECT_EQ(zav::whole_part(-1e30), INT32_MIN);
    EXPECT_EQ(zav::whole_part(std::numeric_limits<double>::infinity()), INT32_MIN);
    EXPECT_EQ(zav::whole_part(std::nan("")), INT32_MIN);
}

TEST(Copies, AreCutToFit) {
    char to[4] = "###";
    zav::copy_text(to, sizeof to, "abcdef");
    EXPECT_STREQ(to, "abc");
    zav::copy_text(to, sizeof to, "x");
    EXPECT_STREQ(to, "x");
}

} // namespace
