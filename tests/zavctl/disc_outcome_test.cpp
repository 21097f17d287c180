// What is said once a job of the burner has ended.
#include "disc_facts.h"

using namespace zavctl;

namespace {

JobFacts burn(const DiscReport &before, const DiscReport &after) {
    JobFacts facts;
    facts.before = before;
    facts.after = after;
    facts.end.how = ChildEnd::How::answered;
    return facts;
}

JobFacts failed_burn() {
    JobFacts facts = burn(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK),
                          disc(ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 4590000, 4000000));
    facts.failure =
        Failure{ZAV_RC_ERR_BURNER, "ZAV_RC_ERR_BURNER", job_failure_meaning(ZAV_RC_ERR_BURNER)};
    return facts;
}

std::string summary_of(const JobFacts &facts) {
    return summary(change_answer(Plan(), job_outcome(facts)));
}

} // namespace

TEST(DiscOutcome, ABurnThatWasDoneTellsTheDisc) {
    const JobFacts facts = burn(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK),
                                disc(ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE, 4590000, 4000000));
    EXPECT_EQ(job_outcome(facts).word, "done");
    EXPECT_EQ(summary_of(facts),
              "OK: burned; the disc is DVD+R, appendable now, 4000000 KiB (3.8 GiB) free");
}

TEST(DiscOutcome, AFailureTellsTheReasonAndTheDisc) {
    EXPECT_EQ(job_outcome(failed_burn()).word, "failed");
    EXPECT_EQ(summary_of(failed_burn()),
              "CRITICAL: the burn failed: growisofs failed (ZAV_RC_ERR_BURNER, code 0x2100); the "
              "disc is DVD+R, appendable now, 4000000 KiB (3.8 GiB) free");
    EXPECT_EQ(job_outcome(failed_burn()).advice.size(), 1U);
}

TEST(DiscOutcome, ASpoiledRewritableDiscCanBeErased) {
    JobFacts facts = failed_burn();
    facts.before = disc(ZAV_CD_RW, ZAV_DISC_BLANK);
    facts.after = disc(ZAV_CD_RW, ZAV_DISC_COMPLETE);
    EXPECT_EQ(job_outcome(facts).advice,
              std::vector<std::string>{"'zavctl disc blank' makes the disc usable again."});
}

TEST(DiscOutcome, ADiscThatContradictsASuccessIsCritical) {
    const DiscReport blank = disc(ZAV_CD_R, ZAV_DISC_BLANK);
    EXPECT_EQ(summary_of(burn(blank, blank)),
              "CRITICAL: the library reports success, but the disc is still blank");
    JobFacts closing = burn(blank, disc(ZAV_CD_R, ZAV_DISC_APPENDABLE));
    EXPECT_EQ(job_outcome(closing).word, "done");
    closing.session = SessionType::close;
    EXPECT_EQ(job_outcome(closing).word, "incomplete");
    JobFacts erasing = burn(disc(ZAV_CD_RW, ZAV_DISC_COMPLETE), disc(ZAV_CD_RW, ZAV_DISC_COMPLETE));
    erasing.job = DiscJob::blank;
    EXPECT_EQ(job_outcome(erasing).word, "incomplete");
}

// 36600 KiB of a blank CD, and 13800 KiB of another, go to borders and reserve.
TEST(DiscOutcome, WhatAnOpenSessionPutOnACdIsSeenByItsRoom) {
    const DiscReport after = disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, 500000);
    const DiscReport blank = disc(ZAV_CD_R, ZAV_DISC_BLANK, 700000, 700000);
    const DiscReport appendable = disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, 600000);
    EXPECT_EQ(written_to_cd(burn(blank, after)), 163400);
    EXPECT_EQ(written_to_cd(burn(appendable, after)), 86200);
    EXPECT_FALSE(written_to_cd(burn(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK), after)));
}

TEST(DiscOutcome, AnImageThatEndedEarlyIsNoSuccess) {
    JobFacts facts = burn(disc(ZAV_CD_R, ZAV_DISC_BLANK, 700000, 700000),
                          disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, 500000));
    facts.image_kib = 163700;
    EXPECT_EQ(job_outcome(facts).word, "done");
    facts.image_kib = 400000;
    EXPECT_EQ(job_outcome(facts).word, "incomplete");
    EXPECT_EQ(
        summary_of(facts),
        "CRITICAL: the library reports success, but 163400 KiB (159.6 MiB) are on the disc of "
        "an image of 400000 KiB (390.6 MiB): mkisofs ended early, files are missing");
}

TEST(DiscOutcome, ADriveThatIsSilentAfterwardsIsUnknown) {
    const JobFacts facts = burn(disc(ZAV_CD_R, ZAV_DISC_BLANK), silent_drive());
    EXPECT_EQ(job_outcome(facts).word, "done");
    EXPECT_EQ(severity(change_answer(Plan(), job_outcome(facts))), Severity::unknown);
}

TEST(DiscOutcome, AProcessThatTheLibraryEndedIsNoAnswer) {
    JobFacts facts = burn(disc(ZAV_CD_R, ZAV_DISC_BLANK), disc(ZAV_CD_R, ZAV_DISC_BLANK));
    facts.end = {ChildEnd::How::exited, 1, "open: No such file or directory\n"};
    EXPECT_EQ(job_outcome(facts).word, "no_answer");
    EXPECT_EQ(severity(change_answer(Plan(), job_outcome(facts))), Severity::unknown);
    EXPECT_EQ(summary_of(facts),
              "COULD NOT TELL: the drive gave no answer: the library ended its process (exit "
              "status 1): open: No such file or directory; the disc is CD-R, blank now, "
              "4590000 KiB (4.4 GiB) free");
}

TEST(DiscOutcome, AnInterruptIsToldWithTheDisc) {
    JobFacts facts = failed_burn();
    facts.cancelled = true;
    EXPECT_EQ(job_outcome(facts).word, "cancelled");
    EXPECT_EQ(severity(change_answer(Plan(), job_outcome(facts))), Severity::critical);
    EXPECT_NE(summary_of(facts).find("the burn was stopped; the disc is DVD+R, appendable now"),
              std::string::npos);
}

TEST(DiscOutcome, AnInterruptThatCameTooLateChangesNothing) {
    JobFacts facts = burn(disc(ZAV_CD_R, ZAV_DISC_BLANK), disc(ZAV_CD_R, ZAV_DISC_APPENDABLE));
    facts.cancelled = true;
    EXPECT_EQ(job_outcome(facts).word, "done");
}

TEST(DiscOutcome, TheEndOfTheProcessIsSaid) {
    EXPECT_EQ(child_end_words({ChildEnd::How::signalled, 9, ""}),
              "its process was ended by signal 9");
    EXPECT_EQ(child_end_words({ChildEnd::How::timed_out, 0, ""}), "no answer in time");
}
