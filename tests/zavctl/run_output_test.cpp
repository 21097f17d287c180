// Where output goes, and what happens when it cannot.
#include "run.h"

#include <regex>

TEST(RunOutput, StandardOutputHoldsTheAnswerAlone) {
    // The library prints its failures, the tools their results.
    const Outcome run = on_zav("rm /dev/nvram; zavsim act tool smartctl prints '\"noise\\n\"'; "
                               "zavctl disk list --jsonl; zavctl bios save f --json");
    EXPECT_FALSE(holds(run.out, "noise")) << run.out;
    EXPECT_FALSE(holds(run.out, "open error")) << run.out;
}

TEST(RunOutput, ToolsDoNotEatTheCallersInput) {
    const Outcome run = on_zav("printf 'a\\nb\\n' | while read x; do zavctl name eth0 >/dev/null; "
                               "echo $x; done");
    EXPECT_EQ(run.out, "a\nb\n");
}

TEST(RunOutput, AFullDiskIsToldAndExitsWithThree) {
    const Outcome run = on_zav("zavctl name eth0 > /dev/full; echo $?");
    EXPECT_EQ(run.out, "3\n");
    EXPECT_TRUE(holds(run.err, "cannot write the answer: No space left on device")) << run.err;
}

TEST(RunOutput, AClosedOutputIsToldAndExitsWithThree) {
    const Outcome run = on_zav("zavctl name eth0 >&-; echo $?");
    EXPECT_EQ(run.out, "3\n");
    EXPECT_TRUE(holds(run.err, "cannot write the answer")) << run.err;
}

TEST(RunOutput, AClosedPipeExitsWithThreeAndIsNoSignal) {
    const Outcome run = on_zav("mkfifo p; (exec 3<p; exec 3<&-) & exec 4>p; wait; "
                               "zavctl name eth0 >&4; echo $?");
    EXPECT_EQ(run.out, "3\n");
    EXPECT_EQ(run.err, "");
}

TEST(RunOutput, ThereIsNoColourAndNoWaitingLineWithoutATerminal) {
    const Outcome run =
        on_zav("zavsim act disk 3 vanishes; zavctl disk list", {"--time-scale", "10"});
    EXPECT_FALSE(holds(run.out, "\033")) << run.out;
    EXPECT_EQ(run.err, "");
}

TEST(RunOutput, ATerminalHasColours) {
    const char *show = "TERM=xterm script -qec 'zavctl disk list' /dev/null";
    EXPECT_TRUE(holds(on_zav(show).out, "\033[32mfound\033[0m"));
    // What a slow command waits for is erased without colour too; nothing else is not plain.
    const std::string out = on_zav(std::string("NO_COLOR=1 ") + show).out;
    const std::string plain = std::regex_replace(out, std::regex("\r\033\\[K"), "");
    EXPECT_FALSE(holds(plain, "\033")) << out;
    EXPECT_TRUE(holds(on_zav("zavctl disk list --color always").out, "\033[32mfound"));
}

TEST(RunOutput, ATerminalSaysWhatIsWaitedForAndErasesIt) {
    // The three looks of the library take 4 s of real time here.
    const Outcome run = on_zav("zavsim act disk 3 vanishes; "
                               "TERM=xterm script -qec 'zavctl disk list' /dev/null",
                               {"--time-scale", "5"});
    EXPECT_TRUE(holds(run.out, "Waiting for disk 3: ")) << run.out;
    EXPECT_TRUE(holds(run.out, " s of 20 s\r\033[K\033[1m    DISK")) << run.out;
}

TEST(RunOutput, HostileBytesReachNeitherTerminalNorJson) {
    const std::string hostile =
        "printf 'SV-2860\\033[31m\\377\\n' > /sys/class/dmi/id/product_name; ";
    const Outcome text = on_zav(hostile + "zavctl model");
    EXPECT_TRUE(holds(text.out, "SV-2860\\x1b[31m\\xff")) << text.out << text.err;
    const Outcome json = on_zav(hostile + "zavctl model --json");
    EXPECT_EQ(parsed(json.out)["model"]["product_name"], "SV-2860\033[31m\xef\xbf\xbd");
}
