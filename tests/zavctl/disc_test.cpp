// What is said of the disc in the drive, and what burning needs of the system.
#include "core/disc_checks.h"
#include "disc_facts.h"

using namespace zavctl;

namespace {

std::string summary_of(const DiscReport &report) {
    return summary(Answer{"disc info", "", {disc_section(report)}});
}

std::string words(const DiscReport &report) {
    return disc_json(report)["sessions"].dump();
}

DriveFacts drive(int combo, const std::string &table) {
    return {true, true, combo, table};
}

Severity verdict(const BurnerPlatform &facts, const std::string &name) {
    for (const Check &check : burner_checks(facts))
        if (check.name == name)
            return check.severity;
    ADD_FAILURE() << "no check " << name;
    return Severity::unknown;
}

BurnerPlatform sound() {
    BurnerPlatform facts;
    facts.drive = drive(1, "Can write DVD-R:\t1\n");
    facts.tools = {{"growisofs", "/usr/bin/growisofs", "DVDs", "no DVD is burned"}};
    return facts;
}

} // namespace

TEST(Disc, ABlankWriteOnceDiscTakesTwoSessions) {
    const DiscReport report = disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK);
    EXPECT_EQ(summary_of(report), "OK: DVD+R, blank, 4590000 KiB (4.4 GiB) free");
    EXPECT_EQ(section_text(disc_section(report), Style()), "    Drive   writes DVD-R and CDs\n"
                                                           "    Medium  DVD+R\n"
                                                           "    State   blank\n"
                                                           "    Total   4590000 KiB (4.4 GiB)\n"
                                                           "    Free    4590000 KiB (4.4 GiB)\n"
                                                           "    Burn    close, open\n"
                                                           "    Blank   no\n"
                                                           "    Format  no\n");
}

TEST(Disc, TheSessionsAreTheLibrarysOwnChoice) {
    EXPECT_EQ(words(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE)), R"(["open","overwrite"])");
    EXPECT_EQ(words(disc(ZAV_DVD_MINUS_RW_SEQ, ZAV_DISC_BLANK)), R"(["close"])");
    EXPECT_EQ(words(disc(ZAV_CD_R, ZAV_DISC_APPENDABLE)), R"(["open"])");
    EXPECT_EQ(words(disc(ZAV_CD_R, ZAV_DISC_COMPLETE)), "[]");
    EXPECT_EQ(words(disc(ZAV_DVD_RAM, ZAV_DISC_COMPLETE)), "[]");
}

TEST(Disc, AComboDriveWritesNoRewritableDvd) {
    EXPECT_EQ(words(in_combo_drive(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE))), "[]");
    EXPECT_EQ(blank_way(in_combo_drive(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE))), BlankWay::none);
    EXPECT_EQ(words(in_combo_drive(disc(ZAV_CD_RW, ZAV_DISC_BLANK))), R"(["close","open"])");
}

TEST(Disc, RoomThatIsNotToldIsNone) {
    const DiscReport report = disc(ZAV_DVD_RAM, ZAV_DISC_COMPLETE, 0, 0);
    EXPECT_TRUE(disc_json(report)["total_kib"].is_null());
    EXPECT_TRUE(disc_json(report)["free_kib"].is_null());
    EXPECT_EQ(summary_of(report), "OK: DVD-RAM, complete");
}

TEST(Disc, RoomBelowNothingIsNone) {
    const DiscReport report = disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, -3000);
    EXPECT_EQ(disc_json(report)["free_kib"], 0);
    EXPECT_EQ(summary_of(report), "OK: CD-R, appendable, nothing free");
    EXPECT_TRUE(section_text(disc_section(report), Style()).find("Free    none") !=
                std::string::npos);
}

TEST(Disc, AnEmptyDriveAndNoDriveAreWell) {
    EXPECT_EQ(summary_of(no_disc()), "OK: no disc in the drive");
    EXPECT_EQ(disc_json(no_disc())["medium"], "none");
    EXPECT_TRUE(disc_json(no_disc())["state"].is_null());
    EXPECT_EQ(summary_of(DiscReport()), "OK: no optical drive");
    EXPECT_EQ(disc_json(DiscReport())["drive"], "none");
}

TEST(Disc, WhatIsNotToldIsUnknown) {
    EXPECT_EQ(severity(silent_drive()), Severity::unknown);
    EXPECT_TRUE(disc_json(silent_drive())["medium"].is_null());
    const DiscReport report = disc(ZAV_CD_RW, ZAV_DISC_STATE_UNKNOWN);
    EXPECT_EQ(severity(report), Severity::unknown);
    EXPECT_TRUE(disc_json(report)["free_kib"].is_null());
    EXPECT_EQ(summary_of(report), "COULD NOT TELL: the drive holds CD-RW, in a state that is not "
                                  "known: the media tools do not tell the state");
}

TEST(Disc, TheStateOfWhatIsNeverBurnedDoesNotMatter) {
    for (const int type : {ZAV_DVD_ROM, ZAV_DVD_RAM})
        EXPECT_EQ(severity(disc(type, ZAV_DISC_STATE_UNKNOWN, 0, 0)), Severity::ok);
    EXPECT_EQ(summary_of(disc(ZAV_DVD_ROM, ZAV_DISC_STATE_UNKNOWN, 0, 0)), "OK: DVD-ROM");
}

TEST(Disc, ADiscWithoutANameButWithAStateIsWell) {
    const DiscReport report = disc(ZAV_DISC_UNKNOWN, ZAV_DISC_COMPLETE, 0, 0);
    EXPECT_EQ(summary_of(report), "OK: a disc of no known type, complete");
}

TEST(Disc, ErasingDependsOnTypeAndState) {
    EXPECT_EQ(blank_way(disc(ZAV_CD_RW, ZAV_DISC_COMPLETE)), BlankWay::fast);
    EXPECT_EQ(blank_way(disc(ZAV_CD_RW, ZAV_DISC_BLANK)), BlankWay::nothing);
    EXPECT_EQ(blank_way(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE)), BlankWay::empty);
    EXPECT_EQ(blank_way(disc(ZAV_DVD_MINUS_RW_RES, ZAV_DISC_COMPLETE)), BlankWay::empty);
    EXPECT_EQ(blank_way(disc(ZAV_DVD_MINUS_RW_RES, ZAV_DISC_APPENDABLE)), BlankWay::format);
    EXPECT_EQ(blank_way(disc(ZAV_DVD_MINUS_RW_SEQ, ZAV_DISC_BLANK)), BlankWay::format);
    EXPECT_EQ(blank_way(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK)), BlankWay::none);
    EXPECT_EQ(blank_way(no_disc()), BlankWay::none);
}

TEST(Drive, IsTheKernelsAndTheLibrarysWord) {
    EXPECT_EQ(kind_of_drive({}), DriveKind::none);
    EXPECT_EQ(kind_of_drive(drive(0, "Can write DVD-R:\t0\n")), DriveKind::combo);
    EXPECT_EQ(kind_of_drive(drive(1, "Can write DVD-R:\t1\n")), DriveKind::dvd_writer);
    EXPECT_EQ(kind_of_drive(drive(1, "drive name:\tsr0\n")), DriveKind::untold);
    EXPECT_EQ(kind_of_drive(drive(ZAV_RC_ERR_ENOENT, "")), DriveKind::untold);
    EXPECT_TRUE(disc_json(DiscReport{DriveKind::untold, {}, {}})["combo"].is_null());
}

TEST(Drive, AMissingNodeIsWhyAQueryFails) {
    DriveFacts facts = drive(1, "");
    facts.cdrom = false;
    EXPECT_EQ(query_failure_meaning(ZAV_RC_ERR, facts), "there is no /dev/cdrom");
    facts.cdrom = true;
    EXPECT_EQ(query_failure_meaning(ZAV_RC_ERR, facts),
              "dvd+rw-mediainfo tells nothing, or cdrecord cannot read the CD");
}

TEST(BurnerChecks, AMachineWithoutADriveNeedsNothing) {
    BurnerPlatform facts = sound();
    facts.drive = {};
    facts.tools.front().found = "";
    facts.table_error = ENOENT;
    EXPECT_EQ(burner_checks(facts).size(), 1U);
    EXPECT_EQ(verdict(facts, "optical-drive"), Severity::ok);
}

TEST(BurnerChecks, WhatADriveLacksIsAWarning) {
    for (const Check &check : burner_checks(sound()))
        EXPECT_EQ(check.severity, Severity::ok) << check.name;
    BurnerPlatform facts = sound();
    facts.drive.cdrom = false;
    EXPECT_EQ(verdict(facts, "drive-link"), Severity::warning);
    facts = sound();
    facts.table_error = ENOENT;
    EXPECT_EQ(verdict(facts, "drive-table"), Severity::warning);
    facts = sound();
    facts.drive.table = "drive name:\n";
    EXPECT_EQ(verdict(facts, "drive-table"), Severity::warning);
    facts = sound();
    facts.tools.front().found = "";
    EXPECT_EQ(verdict(facts, "growisofs"), Severity::warning);
}
