// What a job of the burner would do, and when it is refused.
#include "disc_facts.h"

using namespace zavctl;

namespace {

BurnRequest directory(int kib) {
    BurnRequest request;
    request.source.path = "/srv/export";
    request.source.kib = kib;
    return request;
}

BurnRequest with(BurnRequest request, SessionType session) {
    request.session = session;
    return request;
}

BurnRequest file(int kib) {
    BurnRequest request = directory(kib);
    request.source.path = "/srv/image.tar";
    request.source.is_file = true;
    return request;
}

BurnerFacts burner(const DiscReport &disc) {
    BurnerFacts facts;
    facts.disc = disc;
    return facts;
}

std::string refusal(const Plan &plan) {
    EXPECT_EQ(plan.refusals.size(), 1U);
    EXPECT_TRUE(plan.steps.empty());
    return plan.refusals.empty() ? "" : plan.refusals.front().text;
}

std::string burn_refusal(const BurnRequest &request, const DiscReport &disc) {
    return refusal(burn_plan(request, burner(disc)));
}

std::vector<std::string> done_by(const Plan &plan) {
    EXPECT_FALSE(plan.refused());
    std::vector<std::string> does;
    for (const PlanStep &step : plan.steps)
        does.push_back(step.does);
    return does;
}

using Words = std::vector<std::string>;

constexpr SessionType close_session = SessionType::close;
constexpr SessionType open_session = SessionType::open;
constexpr SessionType overwrite = SessionType::overwrite;

} // namespace

TEST(BurnPlan, TheSessionIsOpenWhereTheDiscTakesIt) {
    EXPECT_EQ(chosen_session(directory(1), disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK)), open_session);
    EXPECT_EQ(chosen_session(directory(1), disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE)), open_session);
    EXPECT_EQ(chosen_session(directory(1), disc(ZAV_DVD_MINUS_RW_SEQ, ZAV_DISC_BLANK)),
              close_session);
    EXPECT_EQ(
        chosen_session(with(directory(1), overwrite), disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE)),
        overwrite);
}

TEST(BurnPlan, AFileIsAnOpenSession) {
    EXPECT_EQ(chosen_session(file(1), disc(ZAV_DVD_MINUS_RW_SEQ, ZAV_DISC_BLANK)), open_session);
}

TEST(BurnPlan, TellsTheRoomAndWhatCounts) {
    const DiscReport report = disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, 300000);
    const Plan plan = burn_plan(directory(2048), burner(report));
    EXPECT_EQ(done_by(plan), (Words{"measure", "burn", "append"}));
    EXPECT_EQ(plan.steps[0].text, "room: 700000 KiB (683.6 MiB) in all, 300000 KiB (293.0 MiB) "
                                  "free; the free room counts");
    EXPECT_EQ(plan.steps[1].text, "what /srv/export holds, 2048 KiB (2.0 MiB), is burned into the "
                                  "root of the disc; of a link, what it leads to");
}

TEST(BurnPlan, AWriteOnceDiscIsWarnedOf) {
    const Plan plan = burn_plan(directory(1), burner(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK)));
    ASSERT_EQ(plan.warnings.size(), 1U);
    EXPECT_EQ(plan.warnings.front(), "a write-once disc: what is burned cannot be undone");
    EXPECT_TRUE(
        burn_plan(directory(1), burner(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_BLANK))).warnings.empty());
}

TEST(BurnPlan, ClosingIsSaid) {
    const Plan plan =
        burn_plan(with(directory(1), close_session), burner(disc(ZAV_CD_R, ZAV_DISC_BLANK)));
    EXPECT_EQ(done_by(plan), (Words{"measure", "burn", "close"}));
    EXPECT_EQ(plan.steps.back().severity, Severity::warning);
}

TEST(BurnPlan, WhatIsLostIsSaidAlsoForAnOpenSession) {
    const DiscReport rewritable = disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE);
    EXPECT_EQ(done_by(burn_plan(with(directory(1), overwrite), burner(rewritable))).back(),
              "overwrite");
    EXPECT_EQ(done_by(burn_plan(directory(1), burner(rewritable))).back(), "append");
    const DiscReport restricted = disc(ZAV_DVD_MINUS_RW_RES, ZAV_DISC_APPENDABLE);
    const Plan plan = burn_plan(directory(1), burner(restricted));
    EXPECT_EQ(done_by(plan).back(), "overwrite");
    EXPECT_EQ(plan.steps.back().severity, Severity::critical);
}

TEST(BurnPlan, TheFreeRoomCountsForAnOpenSessionTheTotalElse) {
    const DiscReport report = disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 1000);
    EXPECT_EQ(burn_refusal(directory(1001), report),
              "the source takes 1001 KiB, and the disc has 1000 KiB free, which is what counts "
              "here");
    EXPECT_FALSE(burn_plan(directory(1000), burner(report)).refused());
    EXPECT_FALSE(burn_plan(with(directory(1001), overwrite), burner(report)).refused());
    EXPECT_EQ(burn_refusal(with(directory(4590001), overwrite), report),
              "the source takes 4590001 KiB (4.4 GiB), and the disc has 4590000 KiB (4.4 GiB) in "
              "all, which is what counts here");
}

TEST(BurnPlan, ADiscWithoutRoomIsRefused) {
    EXPECT_EQ(burn_refusal(directory(1), disc(ZAV_CD_R, ZAV_DISC_APPENDABLE, 700000, -20)),
              "the source takes 1 KiB, and the disc has nothing free, which is what counts here");
}

TEST(BurnPlan, ASourceThatIsNotMeasuredIsRefused) {
    BurnRequest request = directory(0);
    request.source.kib.reset();
    request.source.trouble = "du: not started";
    EXPECT_EQ(burn_refusal(request, disc(ZAV_CD_R, ZAV_DISC_BLANK)),
              "du does not measure the source (du: not started): nobody knows whether it fits");
}

TEST(BurnPlan, WhatCannotBeReadOfTheSourceIsAWarning) {
    BurnRequest request = directory(1);
    request.source.trouble = "du: cannot read directory '/srv/export/a'";
    EXPECT_EQ(burn_plan(request, burner(disc(ZAV_CD_RW, ZAV_DISC_BLANK))).warnings.size(), 1U);
}

TEST(BurnPlan, AFullDiscIsRefusedWithTheWayOut) {
    EXPECT_EQ(burn_refusal(directory(1), disc(ZAV_CD_R, ZAV_DISC_COMPLETE)),
              "this disc takes no burn: CD-R, complete");
    EXPECT_EQ(burn_refusal(directory(1), disc(ZAV_CD_RW, ZAV_DISC_COMPLETE)),
              "this disc takes no burn: CD-RW, complete; 'zavctl disc blank' erases it");
}

TEST(BurnPlan, ASessionThatTheDiscDoesNotTakeIsRefusedWithThoseThatItTakes) {
    EXPECT_EQ(burn_refusal(with(directory(1), overwrite), disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK)),
              "session 'overwrite' is not for this disc (DVD+R, blank), which takes close and "
              "open");
    EXPECT_EQ(
        burn_refusal(with(directory(1), close_session), disc(ZAV_DVD_PLUS_R, ZAV_DISC_APPENDABLE)),
        "session 'close' is not for this disc (DVD+R, appendable), which takes open");
}

TEST(BurnPlan, AComboDriveIsRefusedOrWarnedOf) {
    EXPECT_EQ(burn_refusal(directory(1), in_combo_drive(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE))),
              "this is a combo drive, which does not write a DVD+RW");
    const Plan plan =
        burn_plan(directory(1), burner(in_combo_drive(disc(ZAV_DVD_PLUS_R, ZAV_DISC_BLANK))));
    EXPECT_FALSE(plan.refused());
    EXPECT_EQ(plan.warnings.size(), 2U);
}

TEST(BurnPlan, AnEmptyDriveIsRefused) {
    EXPECT_EQ(burn_refusal(directory(1), no_disc()), "there is no disc in the drive");
}

TEST(BurnPlan, NoDriveIsRefused) {
    EXPECT_EQ(burn_refusal(directory(1), DiscReport()),
              "there is no optical drive: neither /dev/scd0 nor /dev/cdrom is there");
}

TEST(BurnPlan, ADriveWithoutAnAnswerIsRefused) {
    EXPECT_NE(burn_refusal(directory(1), silent_drive()).find("gives no answer to trust"),
              std::string::npos);
}

TEST(BurnPlan, AMissingToolIsRefusedByItsName) {
    BurnerFacts facts = burner(disc(ZAV_CD_R, ZAV_DISC_BLANK));
    facts.tools_complete = false;
    facts.missing_tools = {"mkisofs", "mkudffs"};
    EXPECT_EQ(refusal(burn_plan(directory(1), facts)),
              "not on the PATH: mkisofs and mkudffs; the library needs all tools of the burner");
    facts.missing_tools.clear();
    EXPECT_TRUE(burn_plan(directory(1), facts).refused());
}

TEST(BurnPlan, ABurnerAtWorkIsRefused) {
    BurnerFacts facts = burner(disc(ZAV_CD_R, ZAV_DISC_BLANK));
    facts.running = {{"growisofs", 812}};
    EXPECT_EQ(refusal(burn_plan(directory(1), facts)),
              "the burner is at work: growisofs (812); see 'zavctl disc progress'");
}

TEST(BurnPlan, TheRoomIsARecord) {
    const DiscReport report = disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE, 4590000, 1000);
    const Section section = room_section(burn_room(directory(2000), report), open_session);
    EXPECT_EQ(section.records["source_kib"], 2000);
    EXPECT_EQ(section.records["free_kib"], 1000);
    EXPECT_EQ(section.records["counts"], "free");
    EXPECT_EQ(section.records["fits"], false);
}

TEST(BlankPlan, TellsWhatIsLostAndHowLongItTakes) {
    const Plan cd = blank_plan(burner(disc(ZAV_CD_RW, ZAV_DISC_COMPLETE)));
    ASSERT_EQ(done_by(cd), Words{"blank"});
    EXPECT_EQ(cd.steps.front().severity, Severity::critical);
    EXPECT_EQ(cd.seconds, 24);
    EXPECT_EQ(blank_plan(burner(disc(ZAV_DVD_MINUS_RW_SEQ, ZAV_DISC_COMPLETE))).seconds, 960);
}

TEST(BlankPlan, ABlankDiscIsLeftAlone) {
    EXPECT_EQ(done_by(blank_plan(burner(disc(ZAV_CD_RW, ZAV_DISC_BLANK)))), Words{"none"});
}

TEST(BlankPlan, AWriteOnceDiscIsRefused) {
    EXPECT_EQ(refusal(blank_plan(burner(disc(ZAV_CD_R, ZAV_DISC_COMPLETE)))),
              "it cannot be erased: CD-R, complete");
    EXPECT_EQ(refusal(blank_plan(burner(in_combo_drive(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_COMPLETE))))),
              "this is a combo drive, which does not write a DVD+RW");
}

TEST(FormatPlan, IsForTwoKindsOfDiscs) {
    EXPECT_EQ(done_by(format_plan(burner(disc(ZAV_CD_RW, ZAV_DISC_COMPLETE)))),
              (Words{"format", "wait"}));
    EXPECT_EQ(done_by(format_plan(burner(disc(ZAV_DVD_PLUS_RW, ZAV_DISC_BLANK)))),
              (Words{"format", "wait"}));
    EXPECT_EQ(refusal(format_plan(burner(disc(ZAV_DVD_MINUS_RW_RES, ZAV_DISC_COMPLETE)))),
              "only a DVD+RW or a CD-RW can be formatted: DVD-RW restricted overwrite, complete");
}
