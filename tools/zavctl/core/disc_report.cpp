#include "disc_report.h"

#include "verdict.h"

#include "zav_api.h"

#include <fmt/format.h>

namespace zavctl {

namespace {

std::string drive_word(DriveKind drive) {
    switch (drive) {
    case DriveKind::none:
        return "none";
    case DriveKind::dvd_writer:
        return "dvd_writer";
    case DriveKind::combo:
        return "combo";
    case DriveKind::untold:
        break;
    }
    return "unknown";
}

std::string blank_word(BlankWay way) {
    switch (way) {
    case BlankWay::none:
        return "none";
    case BlankWay::nothing:
        return "nothing";
    case BlankWay::fast:
        return "fast";
    case BlankWay::empty:
        return "empty_file_system";
    case BlankWay::format:
        break;
    }
    return "full_format";
}

std::string blank_words(BlankWay way) {
    switch (way) {
    case BlankWay::none:
        return "no";
    case BlankWay::nothing:
        return "nothing to do";
    case BlankWay::fast:
        return "yes, its table of contents";
    case BlankWay::empty:
        return "yes, by an empty file system";
    case BlankWay::format:
        break;
    }
    return "yes, by a full format, up to about 16 minutes";
}

std::string room_words(const std::optional<int> &kib) {
    if (!kib)
        return "-";
    return *kib > 0 ? size_words(*kib) : "none";
}

std::vector<std::string> session_words(const DiscReport &report) {
    std::vector<std::string> words;
    for (const SessionType session : sessions_of(report))
        words.push_back(session_word(session));
    return words;
}

std::string summary_words(const DiscReport &report) {
    if (report.drive == DriveKind::none)
        return "no optical drive";
    if (!holds_disc(report))
        return "no disc in the drive";
    const std::optional<int> room = free_kib(report);
    return disc_words(report) +
           (room ? fmt::format(", {} free", *room > 0 ? size_words(*room) : "nothing") : "");
}

Json number_json(const std::optional<int> &number) {
    return number ? Json(*number) : Json(nullptr);
}

Json combo_json(DriveKind drive) {
    if (drive == DriveKind::combo || drive == DriveKind::dvd_writer)
        return drive == DriveKind::combo;
    return nullptr;
}

void add_disc_lines(const DiscReport &report, Details &details) {
    const std::vector<std::string> words = session_words(report);
    details.add("State", state_word(report), severity(report));
    details.add("Total", room_words(total_kib(report)));
    details.add("Free", room_words(free_kib(report)));
    details.add("Burn", words.empty() ? "no" : fmt::format("{}", fmt::join(words, ", ")));
    details.add("Blank", blank_words(blank_way(report)));
    details.add("Format", can_format(report) ? "yes" : "no");
}

} // namespace

Severity severity(const DiscReport &report) {
    if (report.drive == DriveKind::none)
        return Severity::ok;
    if (report.failure)
        return Severity::unknown;
    const bool told = state_known(report) || !state_matters(report);
    return holds_disc(report) && !told ? Severity::unknown : Severity::ok;
}

std::string disc_note(const DiscReport &report) {
    if (report.drive == DriveKind::none)
        return "neither /dev/scd0 nor /dev/cdrom is there";
    if (report.failure)
        return in_words(*report.failure);
    if (!holds_disc(report))
        return "";
    if (severity(report) == Severity::unknown)
        return "the media tools do not tell the state";
    if (report.media.discType == ZAV_DISC_UNKNOWN)
        return "the media tools do not name it, as a pressed CD";
    if (drive_refuses(report))
        return "a combo drive does not write it";
    return report.media.discAvailableSize < 0 ? "the sessions on it leave no room for another" : "";
}

Json disc_json(const DiscReport &report) {
    const bool told = report.drive != DriveKind::none && !report.failure;
    Json json;
    json["kind"] = "disc";
    json["drive"] = drive_word(report.drive);
    json["combo"] = combo_json(report.drive);
    json["medium"] = told ? Json(medium_word(report)) : Json(nullptr);
    json["medium_code"] = told ? Json(report.media.discType) : Json(nullptr);
    json["state"] = holds_disc(report) ? Json(state_word(report)) : Json(nullptr);
    json["state_code"] = holds_disc(report) ? Json(report.media.discState) : Json(nullptr);
    json["total_kib"] = number_json(total_kib(report));
    json["free_kib"] = number_json(free_kib(report));
    json["sessions"] = session_words(report);
    json["blank"] = blank_word(blank_way(report));
    json["format"] = can_format(report);
    add_verdict(json, severity(report), disc_note(report), "", report.failure);
    return json;
}

Section disc_section(const DiscReport &report) {
    Section section;
    section.key = "disc";
    section.records = disc_json(report);
    Details details;
    details.add("Drive", drive_words(report.drive));
    if (report.drive != DriveKind::none)
        details.add("Medium", report.failure ? "-" : medium_word(report), severity(report));
    if (holds_disc(report))
        add_disc_lines(report, details);
    add_verdict(details, disc_note(report), "");
    section.details = {details};
    section.well = summary_words(report);
    if (report.failure && report.drive != DriveKind::none)
        section.findings = {
            {Severity::unknown, "the drive gives no answer to trust: " + disc_note(report)}};
    else if (severity(report) != Severity::ok)
        section.findings = {{severity(report), fmt::format("the drive holds {}: {}",
                                                           disc_words(report), disc_note(report))}};
    return section;
}

} // namespace zavctl
