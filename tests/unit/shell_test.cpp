// Commands made from templates and words.
#include "common/shell.h"
#include "harness.h"

#include <cerrno>

namespace {

using harness::record;
using zav::Command;
using zav::CommandOutput;

class ShellCommand : public harness::Appliance {};

TEST_F(ShellCommand, TakesPlainWordsAsTheyStand) {
    EXPECT_STREQ(Command("ls %s &>/dev/null", {"/dev/md/MD1"}).text(),
                 "ls /dev/md/MD1 &>/dev/null");
    EXPECT_STREQ(Command("%s", {"abcxyzABCXYZ0189_./:=,+@%-"}).text(),
                 "abcxyzABCXYZ0189_./:=,+@%-");
    EXPECT_STREQ(Command("a %s b %s", {"1", "2"}).text(), "a 1 b 2");
    EXPECT_STREQ(Command("printf '%d'", {}).text(), "printf '%d'");
}

TEST_F(ShellCommand, DoesNotReadAWordAsATemplate) {
    EXPECT_STREQ(Command("%s %s", {"%s", "b"}).text(), "%s b");
}

TEST_F(ShellCommand, QuotesAnyOtherWord) {
    EXPECT_STREQ(Command("ls %s", {"a b"}).text(), "ls 'a b'");
    EXPECT_STREQ(Command("ls %s", {""}).text(), "ls ''");
    EXPECT_STREQ(Command("ls %s", {"a'b"}).text(), "ls 'a'\\''b'");
    for (const char *character :
         {" ", "\t", "\n", "\"", "$", "`", "\\", ";", "&", "|", "<", ">",   "(",
          ")", "*",  "?",  "[",  "]", "{", "}",  "~", "#", "!", "^", "\x80"}) {
        const std::string word = std::string("x") + character + "y";
        EXPECT_EQ(Command("%s", {word.c_str()}).text(), "'" + word + "'");
    }
}

TEST_F(ShellCommand, HandsEveryWordToTheToolAsItIs) {
    script("/scratch/tool", "printf '[%s]' \"$@\" >/scratch/asked\n");
    for (const std::string &word : std::vector<std::string>{
             "a b", "a'b", "''", "a\"b", "$(touch /scratch/ran)", "`touch /scratch/ran`",
             "; touch /scratch/ran", "a\nb", "a\\b", "\\`touch /scratch/ran\\`", "\\", "\\\\'",
             "$HOME", "*", "a'; touch /scratch/ran; '", "&>/scratch/ran", "%s", "\xff\xfe", ""}) {
        for (const char *form : {"/scratch/tool %s", "echo `/scratch/tool %s | cat`"}) {
            Command(form, {word.c_str()}).run();
            EXPECT_EQ(get("/scratch/asked"), "[" + word + "]") << form;
        }
    }
    EXPECT_FALSE(exists("/scratch/ran"));
}

TEST_F(ShellCommand, IsNeverRunWithAWordThatWouldBeAnOption) {
    put("/scratch/there", "");
    const Command command("rm %s /scratch/there", {"-f"});
    errno = 0;
    EXPECT_EQ(command.run(), -1);
    EXPECT_EQ(errno, EINVAL);
    errno = 0;
    const CommandOutput output(command);
    EXPECT_FALSE(output);
    EXPECT_EQ(errno, EINVAL);
    EXPECT_TRUE(record().commands.empty());
    EXPECT_STREQ(command.text(), "rm -f /scratch/there");
}

TEST_F(ShellCommand, IsNeverRunWithAnOptionForItsName) {
    EXPECT_EQ(Command("%s /scratch", {"-c"}).run(), -1);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(ShellCommand, KeepsPlacesForWhichItHasNoWord) {
    EXPECT_STREQ(Command("date +%s", {}).text(), "date +%s");
    EXPECT_STREQ(Command("%s +%s", {"date"}).text(), "date +%s");
}

TEST_F(ShellCommand, IsNeverRunCutOff) {
    const std::string longest(Command::kSize - 6, 'x');
    EXPECT_EQ(Command("true %s", {longest.c_str()}).run(), 0);
    record().commands.clear();
    const std::string longer = longest + 'x';
    EXPECT_EQ(Command("true %s", {longer.c_str()}).run(), -1);
    EXPECT_TRUE(record().commands.empty());
}

TEST_F(ShellCommand, TellsTheRawStatus) {
    EXPECT_EQ(Command("exit %s", {"3"}).run(), 3 << 8);
}

TEST_F(ShellCommand, GivesTheBeginningOfItsOutputAsAText) {
    CommandOutput output(Command("echo %s", {"abcdef"}));
    char text[4] = "zzz";
    EXPECT_EQ(output.text(text, sizeof text), 3U);
    EXPECT_STREQ(text, "abc");
}

TEST_F(ShellCommand, ThatCouldNotBeStartedMayBeClosedInEitherWay) {
    record().popen_fails = true;
    CommandOutput output("true");
    output.close();
    output.close_plain();
    EXPECT_FALSE(output);
    EXPECT_EQ(record().pcloses, 0);
}

} // namespace
