#include "disc.h"

#include "event_states.h"

#include "cdburn/zav_cdburn_choice.h"
#include "zav_api.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

// The library answers 1 for a table without a word of it as well.
DriveKind kind_of_drive(const DriveFacts &facts) {
    if (!facts.scd0 && !facts.cdrom)
        return DriveKind::none;
    if (facts.combo == 0)
        return DriveKind::combo;
    if (facts.combo != 1)
        return DriveKind::untold;
    return facts.table.find("Can write DVD-R:") == std::string::npos ? DriveKind::untold
                                                                     : DriveKind::dvd_writer;
}

std::string medium_word(const DiscReport &report) {
    return word_of(disc_types(), report.media.discType);
}

std::string state_word(const DiscReport &report) {
    return word_of(disc_states(), report.media.discState);
}

bool state_known(const DiscReport &report) {
    return report.media.discState != ZAV_DISC_STATE_UNKNOWN;
}

bool state_matters(const DiscReport &report) {
    return report.media.discType != ZAV_DVD_ROM && report.media.discType != ZAV_DVD_RAM;
}

bool drive_refuses(const DiscReport &report) {
    return report.drive == DriveKind::combo && zav::combo_drive_refuses(report.media.discType);
}

std::string query_failure_meaning(int code, const DriveFacts &facts) {
    if (!facts.scd0)
        return "there is no /dev/scd0";
    if (!facts.cdrom)
        return "there is no /dev/cdrom";
    if (code == ZAV_RC_ERR)
        return "dvd+rw-mediainfo tells nothing, or cdrecord cannot read the CD";
    if (code == ZAV_RC_ERR_ENOENT)
        return "/tmp/dvd.outfile or /tmp/cd.outfile cannot be opened, or is a link";
    return "the library reports a failure";
}

std::string drive_words(DriveKind drive) {
    switch (drive) {
    case DriveKind::none:
        return "none";
    case DriveKind::dvd_writer:
        return "writes DVD-R and CDs";
    case DriveKind::combo:
        return "combo drive: writes CDs, no DVD-R";
    case DriveKind::untold:
        break;
    }
    return "the kernel does not say what it writes";
}

std::string session_word(SessionType session) {
    switch (session) {
    case SessionType::close:
        return "close";
    case SessionType::open:
        return "open";
    case SessionType::overwrite:
        break;
    }
    return "overwrite";
}

const std::vector<SessionType> &all_sessions() {
    static const std::vector<SessionType> sessions = {SessionType::close, SessionType::open,
                                                      SessionType::overwrite};
    return sessions;
}

bool is_write_once(int disc_type) {
    return disc_type == ZAV_DVD_MINUS_R_SEQ || disc_type == ZAV_DVD_PLUS_R ||
           disc_type == ZAV_DVD_PLUS_R_DOUBLE || disc_type == ZAV_CD_R;
}

bool is_cd(int disc_type) {
    return disc_type == ZAV_CD_R || disc_type == ZAV_CD_RW;
}

bool holds_disc(const DiscReport &report) {
    return report.drive != DriveKind::none && !report.failure &&
           report.media.discType != ZAV_DISC_NONE;
}

std::vector<SessionType> sessions_of(const DiscReport &report) {
    std::vector<SessionType> possible;
    if (!holds_disc(report) || drive_refuses(report))
        return possible;
    for (const SessionType session : all_sessions())
        if (zav::choose(report.media.discType, report.media.discState, static_cast<int>(session))
                .recipe != zav::Recipe::none)
            possible.push_back(session);
    return possible;
}

BlankWay blank_way(const DiscReport &report) {
    const int type = report.media.discType;
    const bool blank = report.media.discState == ZAV_DISC_BLANK;
    if (!holds_disc(report) || drive_refuses(report))
        return BlankWay::none;
    switch (type) {
    case ZAV_CD_RW:
        return blank ? BlankWay::nothing : BlankWay::fast;
    case ZAV_DVD_PLUS_RW:
        return blank ? BlankWay::nothing : BlankWay::empty;
    case ZAV_DVD_MINUS_RW_RES:
        if (blank)
            return BlankWay::nothing;
        return report.media.discState == ZAV_DISC_COMPLETE ? BlankWay::empty : BlankWay::format;
    case ZAV_DVD_MINUS_RW_SEQ: // it reads as blank also when only its table of contents is
        return BlankWay::format;
    default:
        return BlankWay::none;
    }
}

bool can_format(const DiscReport &report) {
    return holds_disc(report) &&
           (report.media.discType == ZAV_DVD_PLUS_RW || report.media.discType == ZAV_CD_RW);
}

std::optional<int> total_kib(const DiscReport &report) {
    if (!holds_disc(report) || report.media.discTotalSize <= 0)
        return std::nullopt;
    return report.media.discTotalSize;
}

std::optional<int> free_kib(const DiscReport &report) {
    if (!total_kib(report) || !state_known(report))
        return std::nullopt;
    return std::max(0, report.media.discAvailableSize);
}

std::string size_words(int kib) {
    constexpr double per_unit = 1024;
    const double mib = kib / per_unit;
    if (kib < per_unit)
        return fmt::format("{} KiB", kib);
    if (mib < per_unit)
        return fmt::format("{} KiB ({:.1f} MiB)", kib, mib);
    return fmt::format("{} KiB ({:.1f} GiB)", kib, mib / per_unit);
}

std::string disc_words(const DiscReport &report) {
    const bool named = report.media.discType != ZAV_DISC_UNKNOWN;
    const std::string medium = named ? medium_word(report) : "a disc of no known type";
    if (state_known(report))
        return medium + ", " + state_word(report);
    return state_matters(report) ? medium + ", in a state that is not known" : medium;
}

} // namespace zavctl
