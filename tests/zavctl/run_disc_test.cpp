// The optical drive: what is told of a disc, and of the running job.
#include "run.h"

namespace {

nlohmann::json disc_after(const std::string &script, const std::vector<std::string> &options = {}) {
    const Outcome run = on_zav(script + "zavctl disc info --json", options);
    EXPECT_EQ(run.status, 0) << run.out << run.err;
    return parsed(run.out)["disc"];
}

nlohmann::json disc_in_drive(const std::string &disc) {
    return disc_after("zavsim act drive gets " + disc + "; ");
}

} // namespace

TEST(RunDisc, EveryMediumIsToldInWords) {
    const std::vector<std::vector<std::string>> media = {{"CD-R", "CD-R"},
                                                         {"CD-RW", "CD-RW"},
                                                         {"DVD-R", "DVD-R"},
                                                         {"DVD-RW sequential", "DVD-RW sequential"},
                                                         {"DVD+RW", "DVD+RW"},
                                                         {"DVD+R", "DVD+R"},
                                                         {"DVD+R double", "DVD+R double layer"}};
    for (const std::vector<std::string> &medium : media) {
        const nlohmann::json disc = disc_in_drive("blank " + medium[0]);
        EXPECT_EQ(disc["medium"], medium[1]);
        EXPECT_EQ(disc["state"], "blank") << disc;
        EXPECT_EQ(disc["drive"], "dvd_writer");
        EXPECT_EQ(disc["free_kib"], disc["total_kib"]) << disc;
    }
}

TEST(RunDisc, TheStateDecidesWhatCanBeBurned) {
    EXPECT_EQ(disc_in_drive("appendable DVD+R with 100 MB used")["sessions"].dump(), R"(["open"])");
    EXPECT_EQ(disc_in_drive("complete CD-R with 100 MB used")["sessions"].dump(), "[]");
    EXPECT_EQ(disc_in_drive("complete DVD+RW with 100 MB used")["sessions"].dump(),
              R"(["open","overwrite"])");
}

TEST(RunDisc, ADvdRomHasNoRoomToTell) {
    const nlohmann::json disc = disc_in_drive("complete DVD-ROM with 100 MB used");
    EXPECT_EQ(disc["medium"], "DVD-ROM");
    EXPECT_TRUE(disc["total_kib"].is_null()) << disc;
    EXPECT_TRUE(disc["free_kib"].is_null()) << disc;
}

TEST(RunDisc, AnAppendableCdHasLessRoom) {
    const nlohmann::json disc = disc_in_drive("appendable CD-RW with 100 MB used");
    EXPECT_EQ(disc["state"], "appendable");
    EXPECT_LT(disc["free_kib"], disc["total_kib"]);
    EXPECT_EQ(disc["blank"], "fast");
    EXPECT_EQ(disc["format"], true);
}

TEST(RunDisc, AnEmptyDriveAndNoDriveAreWell) {
    EXPECT_EQ(disc_after("zavsim act drive loses its disc; ")["medium"], "none");
    const nlohmann::json disc = disc_after("zavsim act drive vanishes; ");
    EXPECT_EQ(disc["drive"], "none");
    EXPECT_TRUE(disc["medium"].is_null());
}

TEST(RunDisc, AComboDriveIsTold) {
    const nlohmann::json disc =
        disc_after("zavsim act drive gets complete DVD+RW; zavsim act drive is a combo; ");
    EXPECT_EQ(disc["combo"], true);
    EXPECT_EQ(disc["sessions"].dump(), "[]");
    EXPECT_EQ(disc["blank"], "none");
}

// The tools tell of a CD, and what stands at the drive's node takes no packet command.
TEST(RunDisc, ALibraryThatEndsItsProcessIsNoAnswer) {
    const Outcome run =
        on_zav("mkdir bin; PATH=$PWD/bin:$PATH; ln -s /bin/true bin/cdrecord; "
               "printf '#!/bin/sh\\necho \":-( non-DVD media mounted, exiting...\"; exit 239\\n' "
               ">bin/dvd+rw-mediainfo; chmod +x bin/*; touch /dev/scd0 /dev/cdrom; "
               "zavctl disc info --json",
               {"--bare"});
    EXPECT_EQ(run.status, 3) << run.out;
    const nlohmann::json disc = parsed(run.out)["disc"];
    EXPECT_EQ(disc["error"]["code"], -1);
    EXPECT_TRUE(
        holds(disc["error"]["meaning"], "the library ended its process (exit status 1): ioctl!: "))
        << disc;
}

TEST(RunDisc, AMissingNodeIsWhyThereIsNoAnswer) {
    const Outcome run = on_zav("touch /dev/scd0; zavctl disc info", {"--bare"});
    EXPECT_EQ(run.status, 3) << run.out;
    EXPECT_TRUE(holds(run.out, "there is no /dev/cdrom")) << run.out;
}

TEST(RunDisc, ATimeLimitEndsTheQuery) {
    const Outcome run = on_zav("zavsim act drive gets blank DVD+R; zavsim act tool "
                               "dvd+rw-mediainfo hangs 1000s; zavctl disc info --timeout 1",
                               {"--time-scale", "1"});
    EXPECT_EQ(run.status, 3) << run.out;
    EXPECT_TRUE(holds(run.out, "no answer within 1 s")) << run.out;
}

TEST(RunDisc, WithoutAJobThereIsNoProgress) {
    const Outcome run = on_zav("zavctl disc progress");
    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "OK: no tool of the burner runs\n");
    EXPECT_EQ(run.err, "");
    const Outcome left = on_zav("echo 100 >/tmp/progress.outfile; zavctl disc progress");
    EXPECT_EQ(left.out, "OK: no tool of the burner runs; the last job left 100 %\n");
}

TEST(RunDisc, WithoutAJobThereIsNothingToCancel) {
    const Outcome run = on_zav("zavctl disc cancel --wait --json");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(parsed(run.out)["cancel"]["tools"].size(), 0U);
    const Outcome without = on_zav("zavsim act tool killall is missing; zavctl disc cancel");
    EXPECT_EQ(without.status, 2);
    EXPECT_TRUE(holds(without.out, "killall is not on the PATH")) << without.out;
}

TEST(RunDisc, TheTrayOpens) {
    const Outcome run = on_zav("zavsim act drive gets blank CD-R; zavctl disc eject && zavctl disc "
                               "info --json");
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(holds(run.out, "the drive was told to open its tray")) << run.out;
    EXPECT_EQ(parsed(run.out.substr(run.out.find('{')))["disc"]["medium"], "none");
    const Outcome without = on_zav("zavsim act tool cdrecord is missing; zavctl disc eject");
    EXPECT_EQ(without.status, 2);
    EXPECT_TRUE(holds(without.out, "cdrecord is not on the PATH")) << without.out;
}

TEST(RunDisc, DoctorKnowsWhatBurningNeeds) {
    const auto severity = [](const std::string &script, const std::string &name,
                             const std::vector<std::string> &options = {}) {
        const nlohmann::json answer = parsed(on_zav(script + "zavctl doctor --json", options).out);
        for (const nlohmann::json &check : answer["checks"])
            if (check["check"] == name)
                return check["severity"].get<std::string>();
        return std::string("none");
    };
    EXPECT_EQ(severity("", "growisofs"), "ok");
    EXPECT_EQ(severity("zavsim act tool growisofs is missing; ", "growisofs"), "warning");
    EXPECT_EQ(severity("touch /dev/scd0; ", "drive-link", {"--bare"}), "warning");
    EXPECT_EQ(severity("zavsim act drive vanishes; ", "optical-drive"), "ok");
    EXPECT_EQ(severity("zavsim act drive vanishes; ", "growisofs"), "none");
}
