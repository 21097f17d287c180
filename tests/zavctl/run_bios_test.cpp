// Saving and loading BIOS settings.
#include "run.h"

namespace {

// Settings that can be told from zeros.
const std::string with_settings = "head -c 114 /dev/zero | tr '\\0' 'A' > /dev/nvram; ";

} // namespace

TEST(RunBios, ASavedFileHoldsTheSettings) {
    const Outcome run = on_zav(with_settings + "zavctl bios save f && cmp f /dev/nvram && ls -A");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(run.out.ends_with("\nf\n")) << run.out; // no temporary file beside it
}

TEST(RunBios, AnExistingFileIsKeptWithoutForce) {
    const Outcome run = on_zav(with_settings + "echo mine > f; zavctl bios save f; echo $?; cat f");
    EXPECT_EQ(run.out, "64\nmine\n");
    EXPECT_TRUE(holds(run.err, "--force")) << run.err;
    EXPECT_EQ(on_zav(with_settings + "echo mine > f; zavctl bios save --force f; cat f").out,
              "OK: 114 bytes of BIOS settings saved in f\n" + std::string(114, 'A'));
}

TEST(RunBios, SettingsThatReadAsZerosAreNotSaved) {
    const Outcome run =
        on_zav("head -c 114 /dev/zero > /dev/nvram; echo mine > f; zavctl bios save --force f; "
               "echo $?; cat f; zavctl bios save g; echo $?; ls -A");
    EXPECT_TRUE(holds(run.out, "\n3\nmine\n")) << run.out;
    EXPECT_TRUE(run.out.ends_with("\n3\nf\n")) << run.out;
}

TEST(RunBios, AMissingDeviceCannotBeTold) {
    const Outcome run = on_zav("rm -f /dev/nvram; zavctl bios save f; echo $?; ls -A");
    EXPECT_TRUE(run.out.ends_with("\n3\n")) << run.out;
}

TEST(RunBios, AnUnwritableDirectoryIsCritical) {
    EXPECT_EQ(on_zav(with_settings + "zavctl bios save /no/such/f").status, 2);
}

TEST(RunBios, LoadingWritesTheSettingsBack) {
    const Outcome run = on_zav(with_settings + "head -c 114 /dev/zero | tr '\\0' 'B' > f; "
                                               "zavctl bios load --yes f && cmp f /dev/nvram");
    EXPECT_EQ(run.status, 0);
    EXPECT_TRUE(holds(run.err, "114 of 114 bytes change")) << run.err;
}

TEST(RunBios, WithoutATerminalLoadingNeedsYes) {
    const Outcome run = on_zav(with_settings + "head -c 114 /dev/zero | tr '\\0' 'B' > f; "
                                               "echo y | zavctl bios load f; echo $?; "
                                               "head -c 1 /dev/nvram");
    EXPECT_EQ(run.out, "64\nA");
    EXPECT_TRUE(holds(run.err, "--yes")) << run.err;
}

TEST(RunBios, AFileOfAnotherSizeIsNotLoaded) {
    for (const char *size : {"113", "115", "0"}) {
        const Outcome run = on_zav(with_settings + "head -c " + size +
                                   " /dev/zero | tr '\\0' 'B' > f; zavctl bios load --yes f; "
                                   "echo $?; head -c 1 /dev/nvram");
        EXPECT_EQ(run.out, "64\nA") << size;
    }
}

TEST(RunBios, AWriteThatDoesNotReachTheDeviceIsCritical) {
    // What is written to this device is lost, and reading it gives other bytes.
    const Outcome run = on_zav("head -c 114 /dev/zero | tr '\\0' 'B' > f; "
                               "rm /dev/nvram; ln -s /dev/zero /dev/nvram; "
                               "zavctl bios load --yes f; echo $?");
    EXPECT_FALSE(holds(run.out, "OK")) << run.out;
    EXPECT_FALSE(run.out.ends_with("\n0\n")) << run.out;
}

TEST(RunBios, ShowTellsWhetherTheSettingsAreReadable) {
    const Outcome good = on_zav(with_settings + "zavctl bios show --json");
    EXPECT_EQ(good.status, 0);
    EXPECT_EQ(parsed(good.out)["bios"]["settings_readable"], true);
    EXPECT_EQ(parsed(good.out)["bios"]["serial"], "AB1234");
    const Outcome bad = on_zav("rm /dev/nvram; zavctl bios show --json");
    EXPECT_EQ(bad.status, 1);
    EXPECT_EQ(parsed(bad.out)["bios"]["settings_readable"], false);
}
