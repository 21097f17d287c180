#include "core/severity.h"
#include "core/suggest.h"
#include "core/text.h"

#include <gtest/gtest.h>

using namespace zavctl;

TEST(Printable, LeavesReadableTextAlone) {
    EXPECT_EQ(printable("SV-2860 \xc3\xa9\xe2\x82\xac"), "SV-2860 \xc3\xa9\xe2\x82\xac");
}

TEST(Printable, EscapesControlCharacters) {
    EXPECT_EQ(printable("a\033[31mb\n\x7f"), "a\\x1b[31mb\\x0a\\x7f");
    EXPECT_EQ(printable("\xc2\x9b"), "\\u{009b}"); // a terminal takes it for escape and bracket
}

TEST(Printable, EscapesBytesThatAreNoUtf8) {
    EXPECT_EQ(printable("\xff"), "\\xff");
    EXPECT_EQ(printable("\xc3"), "\\xc3");
    EXPECT_EQ(printable("\xc3("), "\\xc3(");
    EXPECT_EQ(printable("\xe0\x80\xaf"), "\\xe0\\x80\\xaf"); // longer than needed
    EXPECT_EQ(printable("\xed\xa0\x80"), "\\xed\\xa0\\x80"); // half of a pair
}

TEST(Printable, EscapesCharactersThatTurnTheDirection) {
    EXPECT_EQ(printable("\xe2\x80\xae"), "\\u{202e}");
}

TEST(Text, ColumnsCountCharactersAndNotBytes) {
    EXPECT_EQ(columns("\xc3\xa9t\xc3\xa9"), 3U);
}

TEST(Text, TrimmedTakesBlanksFromBothSides) {
    EXPECT_EQ(trimmed(" \ta b\r\n"), "a b");
    EXPECT_EQ(trimmed(" \n"), "");
}

TEST(Text, ListedJoinsWordsAsASentenceDoes) {
    EXPECT_EQ(listed({}), "");
    EXPECT_EQ(listed({"a"}), "a");
    EXPECT_EQ(listed({"a", "b"}), "a and b");
    EXPECT_EQ(listed({"a", "b", "c"}), "a, b and c");
}

TEST(Text, WrappedBreaksAtBlanksAndKeepsLongWords) {
    EXPECT_EQ(wrapped("one two three", 8), (std::vector<std::string>{"one two", "three"}));
    EXPECT_EQ(wrapped("one extraordinary", 5), (std::vector<std::string>{"one", "extraordinary"}));
    EXPECT_EQ(wrapped("not wrapped at all", 0), (std::vector<std::string>{"not wrapped at all"}));
    EXPECT_EQ(wrapped("", 10), (std::vector<std::string>{""}));
}

TEST(Text, ProgressBarFillsWithThePercentage) {
    EXPECT_EQ(progress_bar(0, 10), "[>.........]");
    EXPECT_EQ(progress_bar(50, 10), "[=====>....]");
    EXPECT_EQ(progress_bar(99.9, 10), "[=========>]");
    EXPECT_EQ(progress_bar(100, 10), "[==========]");
    EXPECT_EQ(progress_bar(250, 10), "[==========]");
    EXPECT_EQ(progress_bar(-1, 10), "[>.........]");
}

TEST(Table, AlignsColumnsAndMarksRows) {
    Table table({"N", "STATE", "NOTE"}, 1);
    table.add(Severity::ok, {"1", "found", ""});
    table.add(Severity::critical, {"22", "failed", "why"});
    EXPECT_EQ(table.text({}), "    N   STATE   NOTE\n"
                              "    1   found\n"
                              " X  22  failed  why\n");
}

TEST(Table, HasNoHeadingOverAColumnWithoutAnyText) {
    Table table({"N", "STATE", "NOTE"}, 1);
    table.add(Severity::ok, {"1", "found", ""});
    EXPECT_EQ(table.text({}), "    N  STATE\n    1  found\n");
}

TEST(Table, WrapsTheLastColumnAtTheEndOfTheScreen) {
    Table table({"N", "NOTE"}, 0);
    table.add(Severity::warning, {"1", "a rather long text for this screen"}, "below");
    EXPECT_EQ(table.text({false, 30}), "    N  NOTE\n"
                                       " !  1  a rather long text for\n"
                                       "       this screen\n"
                                       "       below\n");
}

TEST(Table, ColoursTheStateAndTheMarkOnly) {
    Table table({"N", "STATE"}, 1);
    table.add(Severity::critical, {"1", "failed"});
    const std::string text = table.text({true, 0});
    EXPECT_NE(text.find(" \033[1;31mX\033[0m  1  \033[1;31mfailed\033[0m\n"), std::string::npos)
        << text;
}

TEST(Severity, CriticalIsWorseThanUnknownWorseThanWarning) {
    EXPECT_EQ(worse(Severity::critical, Severity::unknown), Severity::critical);
    EXPECT_EQ(worse(Severity::warning, Severity::unknown), Severity::unknown);
    EXPECT_EQ(worse(Severity::warning, Severity::ok), Severity::warning);
}

TEST(Severity, ExitStatuses) {
    EXPECT_EQ(exit_status(Severity::ok), 0);
    EXPECT_EQ(exit_status(Severity::warning), 1);
    EXPECT_EQ(exit_status(Severity::critical), 2);
    EXPECT_EQ(exit_status(Severity::unknown), 3);
}

TEST(Severity, FindingsOfOneKindAreToldTogether) {
    const std::vector<Finding> findings = {
        finding_about(Severity::critical, "disk", "1", "is absent", "are absent"),
        {Severity::critical, "the fan stands still"},
        finding_about(Severity::critical, "disk", "3", "is absent", "are absent"),
        finding_about(Severity::critical, "disk", "4", "has failed", "have failed"),
    };
    EXPECT_EQ(told_together(findings),
              (std::vector<std::string>{"disks 1 and 3 are absent", "the fan stands still",
                                        "disk 4 has failed"}));
}

TEST(Suggest, CountsEditsAndSwaps) {
    EXPECT_EQ(edit_distance("disk", "disk"), 0U);
    EXPECT_EQ(edit_distance("dsik", "disk"), 1U);
    EXPECT_EQ(edit_distance("DISK", "disk"), 0U);
    EXPECT_EQ(edit_distance("", "disk"), 4U);
    EXPECT_EQ(edit_distance("lst", "list"), 1U);
}

TEST(Suggest, FindsTheNearestWord) {
    const std::vector<std::string> words = {"status", "disk", "array", "doctor"};
    EXPECT_EQ(nearest_word("dsik", words), "disk");
    EXPECT_EQ(nearest_word("arrays", words), "array");
    EXPECT_EQ(nearest_word("doc", words), "doctor"); // its beginning
}

TEST(Suggest, SaysNothingWhenNothingIsNear) {
    EXPECT_EQ(nearest_word("volume", {"status", "disk", "array"}), "");
    EXPECT_EQ(nearest_word("x", {"vg", "lv"}), "");
}
