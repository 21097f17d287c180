#include "disc_plan.h"

#include "cdburn/zav_cdburn_choice.h"
#include "zav_api.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr int seconds_of_fast_blank = 24;
constexpr int seconds_of_empty_file_system = 12;
constexpr int seconds_of_full_format = 960;

bool takes(const DiscReport &disc, SessionType session) {
    const std::vector<SessionType> possible = sessions_of(disc);
    return std::find(possible.begin(), possible.end(), session) != possible.end();
}

std::string sessions_words(const DiscReport &disc) {
    std::vector<std::string> words;
    for (const SessionType session : sessions_of(disc))
        words.push_back(session_word(session));
    return listed(words);
}

void refuse(Plan &plan, std::string text) {
    plan.refusals.push_back({std::move(text)});
}

// ---- What holds for every job ----

void refuse_tools(const BurnerFacts &facts, Plan &plan) {
    if (!facts.missing_tools.empty())
        refuse(plan, fmt::format("not on the PATH: {}; the library needs all tools of the burner",
                                 listed(facts.missing_tools)));
    else if (!facts.tools_complete)
        refuse(plan, "the library does not find all tools of the burner (it asks `which`)");
}

// True if there is a disc of which more can be said.
bool refuse_drive(const BurnerFacts &facts, Plan &plan) {
    const DiscReport &disc = facts.disc;
    refuse_tools(facts, plan);
    if (!facts.running.empty())
        refuse(plan, fmt::format("the burner is at work: {}; see 'zavctl disc progress'",
                                 tools_words(facts.running)));
    if (disc.drive == DriveKind::none)
        refuse(plan, "there is no optical drive: " + disc_note(disc));
    else if (disc.failure)
        refuse(plan, "the drive gives no answer to trust: " + disc_note(disc));
    else if (!holds_disc(disc))
        refuse(plan, "there is no disc in the drive");
    return plan.refusals.empty();
}

// The library refuses some DVDs in such a drive, and hands the others to the tool.
void warn_of_combo_drive(const DiscReport &disc, Plan &plan) {
    if (disc.drive == DriveKind::combo && !is_cd(disc.media.discType) && !plan.refused())
        plan.warnings.push_back(fmt::format(
            "the kernel says that this drive writes CDs alone, and this is a {}: the tool "
            "will likely fail",
            medium_word(disc)));
}

std::string combo_refusal(const DiscReport &disc) {
    return fmt::format("this is a combo drive, which does not write a {}", medium_word(disc));
}

// ---- Burning ----

zav::Choice choice_of(const DiscReport &disc, SessionType session) {
    return zav::choose(disc.media.discType, disc.media.discState, static_cast<int>(session));
}

bool erases(const DiscReport &disc, SessionType session) {
    return choice_of(disc, session).recipe == zav::Recipe::dvd_new &&
           disc.media.discState != ZAV_DISC_BLANK;
}

bool leaves_closed(const DiscReport &disc, SessionType session) {
    return session == SessionType::close && disc.media.discState == ZAV_DISC_BLANK;
}

std::string why_not(const DiscReport &disc, SessionType session) {
    if (drive_refuses(disc))
        return combo_refusal(disc);
    if (sessions_of(disc).empty())
        return fmt::format("this disc takes no burn: {}{}", disc_words(disc),
                           blank_way(disc) == BlankWay::none ? ""
                                                             : "; 'zavctl disc blank' erases it");
    return fmt::format("session '{}' is not for this disc ({}), which takes {}",
                       session_word(session), disc_words(disc), sessions_words(disc));
}

std::string too_large(const SourceFact &source, const BurnRoom &room) {
    if (!room.source)
        return fmt::format("du does not measure the source ({}): nobody knows whether it fits",
                           source.trouble.empty() ? "no number" : printable(source.trouble));
    const int counts = (room.free_counts ? room.free : room.total).value_or(0);
    return fmt::format("the source takes {}, and the disc has {} {}, which is what counts here",
                       size_words(*room.source), counts > 0 ? size_words(counts) : "nothing",
                       room.free_counts ? "free" : "in all");
}

void refuse_burn(const BurnRequest &request, const DiscReport &disc, Plan &plan) {
    const SessionType session = chosen_session(request, disc);
    if (drive_refuses(disc) || !takes(disc, session))
        refuse(plan, why_not(disc, session));
    else if (const BurnRoom room = burn_room(request, disc); !room.fits)
        refuse(plan, too_large(request.source, room));
}

std::string place_words(const BurnRequest &request) {
    const std::string what = printable(request.source.path);
    const std::string size = size_words(request.source.kib.value_or(0));
    const std::string place =
        request.name.empty() ? "the root of the disc" : "directory " + printable(request.name);
    if (request.source.is_file)
        return fmt::format("{}, {}, is burned into {}", what, size, place);
    return fmt::format("what {} holds, {}, is burned into {}; of a link, what it leads to", what,
                       size, place);
}

PlanStep room_step(const BurnRoom &room) {
    const auto words = [](const std::optional<int> &kib) {
        return kib ? size_words(*kib) : std::string("-");
    };
    return {"measure", fmt::format("room: {} in all, {} free; the {} counts", words(room.total),
                                   words(room.free), room.free_counts ? "free room" : "total")};
}

PlanStep session_step(const DiscReport &disc, SessionType session) {
    const zav::Recipe recipe = choice_of(disc, session).recipe;
    const std::string medium = medium_word(disc);
    if (erases(disc, session))
        return {"overwrite", "EVERYTHING on the " + medium + " is overwritten", 0, std::nullopt,
                Severity::critical};
    if (leaves_closed(disc, session))
        return {"close", fmt::format("the {} is closed: nothing more can be added", medium), 0,
                std::nullopt,
                is_write_once(disc.media.discType) ? Severity::warning : Severity::ok};
    if (recipe == zav::Recipe::dvd_append || recipe == zav::Recipe::cd_next_session)
        return {"append", fmt::format("what is on the {} stays, more can be added later", medium)};
    return {"first_session", fmt::format("the {} stays open, more can be added later", medium)};
}

void plan_burn(const BurnRequest &request, const DiscReport &disc, Plan &plan) {
    const SessionType session = chosen_session(request, disc);
    plan.steps.push_back(room_step(burn_room(request, disc)));
    plan.steps.push_back({"burn", place_words(request)});
    plan.steps.push_back(session_step(disc, session));
    if (is_write_once(disc.media.discType))
        plan.warnings.push_back("a write-once disc: what is burned cannot be undone");
    if (!request.source.trouble.empty())
        plan.warnings.push_back("not all of the source can be read: " +
                                printable(request.source.trouble));
    warn_of_combo_drive(disc, plan);
}

} // namespace

SessionType chosen_session(const BurnRequest &request, const DiscReport &disc) {
    if (request.source.is_file)
        return SessionType::open;
    if (request.session)
        return *request.session;
    const std::vector<SessionType> possible = sessions_of(disc);
    return possible.empty() || takes(disc, SessionType::open) ? SessionType::open
                                                              : possible.front();
}

BurnRoom burn_room(const BurnRequest &request, const DiscReport &disc) {
    const SessionType session = chosen_session(request, disc);
    BurnRoom room;
    room.source = request.source.kib;
    room.total = total_kib(disc);
    room.free = free_kib(disc);
    room.free_counts = session == SessionType::open;
    room.fits = zav::has_room(disc.media, static_cast<int>(session), room.source.value_or(-1));
    return room;
}

Plan burn_plan(const BurnRequest &request, const BurnerFacts &facts) {
    Plan plan;
    plan.command = "disc burn";
    plan.heading = "Burn " + printable(request.source.path);
    if (!refuse_drive(facts, plan))
        return plan;
    plan.heading += fmt::format(" to the {}, session {}", medium_word(facts.disc),
                                session_word(chosen_session(request, facts.disc)));
    refuse_burn(request, facts.disc, plan);
    if (!plan.refused())
        plan_burn(request, facts.disc, plan);
    return plan;
}

Section room_section(const BurnRoom &room, SessionType session) {
    const auto number = [](const std::optional<int> &kib) {
        return kib ? Json(*kib) : Json(nullptr);
    };
    Section section;
    section.key = "room";
    section.records = {{"kind", "room"},
                       {"session", session_word(session)},
                       {"source_kib", number(room.source)},
                       {"total_kib", number(room.total)},
                       {"free_kib", number(room.free)},
                       {"counts", room.free_counts ? "free" : "total"},
                       {"fits", room.fits}};
    return section;
}

// ---- Erasing and formatting ----

namespace {

PlanStep erasing(const std::string &does, const std::string &text) {
    return {does, text, 0, std::nullopt, Severity::critical};
}

void plan_blank(const DiscReport &disc, Plan &plan) {
    const std::string all = fmt::format("EVERYTHING on the {} is lost", medium_word(disc));
    switch (blank_way(disc)) {
    case BlankWay::none:
        refuse(plan, drive_refuses(disc)
                         ? combo_refusal(disc)
                         : fmt::format("it cannot be erased: {}", disc_words(disc)));
        break;
    case BlankWay::nothing:
        plan.steps.push_back({"none", "the disc is blank already"});
        break;
    case BlankWay::fast:
        plan.steps.push_back(erasing("blank", all + ": its table of contents is erased"));
        plan.seconds = seconds_of_fast_blank;
        break;
    case BlankWay::empty:
        plan.steps.push_back(erasing("blank", all + ": an empty file system is written"));
        plan.seconds = seconds_of_empty_file_system;
        break;
    case BlankWay::format:
        plan.steps.push_back(erasing("blank", all + ": a full format, then an empty file system"));
        plan.seconds = seconds_of_full_format;
        break;
    }
}

} // namespace

Plan blank_plan(const BurnerFacts &facts) {
    Plan plan;
    plan.command = "disc blank";
    plan.heading = "Erase the disc in the drive";
    if (!refuse_drive(facts, plan))
        return plan;
    plan.heading = "Erase the " + disc_words(facts.disc);
    plan_blank(facts.disc, plan);
    return plan;
}

Plan format_plan(const BurnerFacts &facts) {
    const DiscReport &disc = facts.disc;
    Plan plan;
    plan.command = "disc format";
    plan.heading = "Format the disc in the drive for packet writing";
    if (!refuse_drive(facts, plan))
        return plan;
    plan.heading = fmt::format("Format for packet writing: {}", disc_words(disc));
    if (!can_format(disc)) {
        refuse(plan,
               fmt::format("only a DVD+RW or a CD-RW can be formatted: {}", disc_words(disc)));
        return plan;
    }
    plan.steps.push_back(
        erasing("format", fmt::format("EVERYTHING on the {} is lost: an empty UDF file system "
                                      "is made through /dev/pktcdvd/pktcdvd0",
                                      medium_word(disc))));
    plan.steps.push_back({"wait", "it takes minutes, and no progress is told"});
    warn_of_combo_drive(disc, plan);
    return plan;
}

} // namespace zavctl
