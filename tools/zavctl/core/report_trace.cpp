#include "report_trace.h"

#include "raid_set.h"
#include "report_row.h"

#include "common/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstring>

namespace zavctl {

namespace {

constexpr std::size_t field_size = 15;
constexpr std::size_t set_fields = 5; // that the library uses
constexpr std::size_t volume_fields = 6;
constexpr std::size_t disk_fields = 3;
constexpr int card_readings = 4;

zav::Marker marker_for(int unit) {
    return unit == controller ? zav::Marker::controller() : zav::Marker::unit(unit);
}

// What the library takes to be a line of the report.
std::string shown(std::string_view line) {
    return printable(trimmed(line));
}

std::string text_of(const char *text, std::size_t size) {
    return {text, strnlen(text, size)};
}

} // namespace

std::vector<std::string> pieces_of(std::string_view line, int size) {
    std::vector<std::string> pieces;
    while (!line.empty()) {
        const std::string_view piece = line.substr(0, static_cast<std::size_t>(size) - 1);
        pieces.emplace_back(piece.substr(0, piece.find('\0')));
        line.remove_prefix(piece.size());
    }
    return pieces;
}

std::optional<int> marker_of(std::string_view line) {
    for (int unit = controller; unit <= last_unit; ++unit) {
        const zav::Marker wanted = marker_for(unit);
        const std::string_view marker = wanted.text();
        const bool whole = line.size() <= marker.size() ||
                           std::isalnum(static_cast<unsigned char>(line[marker.size()])) == 0;
        if (line.starts_with(marker) && whole)
            return unit;
    }
    return std::nullopt;
}

bool is_data(const std::string &piece) {
    zav::EnclosureReader reader(zav::Marker::controller());
    std::string marker = "PCI\n";
    std::string copy = piece;
    reader.take(marker.data());
    const zav::EnclosureReader::Piece taken = reader.take(copy.data());
    using Kind = zav::EnclosureReader::Kind;
    return taken.kind == Kind::kEnd || taken.kind == Kind::kVolume || taken.kind == Kind::kDisk ||
           (taken.kind == Kind::kRaidSet && taken.fields > 0);
}

EnclosureTrace::EnclosureTrace(int unit)
    : unit_(unit), marker_(marker_for(unit)), reader_(marker_), monitor_(marker_),
      identity_reader_(unit), identity_open_(unit != controller) {}

std::vector<ReportRemark> EnclosureTrace::take(const LineContext &context) {
    context_ = context;
    remarks_.clear();
    for (const std::string &piece : pieces_of(context.line, zav::kReportPiece)) {
        take_piece(piece);
        take_reading(piece);
    }
    for (const std::string &piece : pieces_of(context.line, zav::kIdentityPiece))
        take_identity(piece);
    return std::move(remarks_);
}

EnclosureReport EnclosureTrace::report() const {
    EnclosureReport report;
    sRaidSetInfo info;
    if (reader_.fill(info))
        report.set = info;
    else
        report.no_set = "no RAID set in the section";
    const bool answers = unit_ == controller ? monitor_.line_found() : monitor_.marker_found();
    const int items = unit_ == controller ? card_readings : zav::MonitorReader::kReadings;
    for (int item = 0; answers && item < items; ++item)
        report.readings.emplace_back(monitor_.reading(item));
    return report;
}

void EnclosureTrace::say(std::string text, Severity severity) {
    remarks_.push_back({severity, unit_, std::move(text)});
}

void EnclosureTrace::take_piece(const std::string &piece) {
    const bool had_started = reader_.started();
    const bool had_ended = reader_.ended();
    std::string copy = piece;
    const Piece taken = reader_.take(copy.data());
    if (marker_.in(piece.c_str()))
        tell_marker(piece, had_started);
    if (!had_ended)
        tell_taken(taken, piece);
}

void EnclosureTrace::tell_marker(const std::string &piece, bool had_started) {
    const bool own = context_.marker && is_own();
    if (!own)
        say(fmt::format("{} is also found in this line ({}){}", marker_.text(), shown(piece),
                        had_started ? ": without effect, the section has begun before"
                                    : ": the section begins here"),
            Severity::warning);
    else if (!had_started)
        say("the section begins");
    else
        say(reader_.ended() ? "a second section: ignored"
                            : "begins once more, before the section has ended",
            Severity::warning);
}

void EnclosureTrace::tell_taken(const Piece &taken, const std::string &piece) {
    switch (taken.kind) {
    case Kind::kRaidSet:
        tell_set(taken);
        break;
    case Kind::kVolume:
    case Kind::kDisk:
        tell_row(taken, piece);
        break;
    case Kind::kSurplus:
        say(piece.starts_with('D') ? "ignored: a fifth disk" : "ignored: a seventh volume",
            Severity::warning);
        break;
    case Kind::kEnd:
        tell_end();
        break;
    default:
        break;
    }
}

void EnclosureTrace::tell_set(const Piece &taken) {
    if (taken.fields == 0) // the marker of a unit, or nothing behind the R
        return;
    sRaidSetInfo info;
    if (!reader_.fill(info))
        return say("a RAID set without a number: not taken", Severity::warning);
    say(fmt::format("RAID set {} {}", info.raidnum, in_words(info)));
    if (has_set_)
        say("replaces the RAID set before: the last one wins", Severity::warning);
    has_set_ = true;
    tell_fields(taken);
}

void EnclosureTrace::tell_row(const Piece &taken, const std::string &piece) {
    sRaidSetInfo info;
    reader_.fill(info);
    const bool volume = taken.kind == Kind::kVolume;
    const char *first = volume ? reader_.volume(taken.row, 0) : reader_.disk(taken.row, 0);
    const int number = zav::to_int(first);
    const ReportRow row =
        volume ? row_of_volume(piece, number, info.diskcount) : row_of_disk(piece, number);
    if (taken.fields == 0)
        return say("nothing in it", Severity::warning);
    say(row.text, row.severity);
    if (volume && std::find(volumes_.begin(), volumes_.end(), number) != volumes_.end())
        say(fmt::format("replaces the volume {} before", number), Severity::warning);
    if (volume)
        volumes_.push_back(number);
    tell_fields(taken);
}

void EnclosureTrace::tell_fields(const Piece &taken) {
    const std::size_t wanted = taken.kind == Kind::kRaidSet  ? set_fields
                               : taken.kind == Kind::kVolume ? volume_fields
                                                             : disk_fields;
    for (std::size_t column = 0; column < std::min(wanted, taken.fields); ++column) {
        const char *field = taken.kind == Kind::kRaidSet  ? reader_.raid_set(column)
                            : taken.kind == Kind::kVolume ? reader_.volume(taken.row, column)
                                                          : reader_.disk(taken.row, column);
        if (std::strlen(field) > field_size)
            say("field of more than 15 characters runs into the next", Severity::warning);
    }
    if (taken.fields < wanted)
        say(fmt::format("only {} of {} fields", taken.fields, wanted), Severity::warning);
    if (taken.kind == Kind::kDisk && taken.fields > wanted)
        say("its fourth field begins the next disk's row", Severity::warning);
    if (!is_own())
        say(fmt::format("taken although it stands behind the marker of {}: the section has no end",
                        context_.owner ? enclosure_words(*context_.owner) : "nothing"),
            Severity::warning);
}

void EnclosureTrace::tell_end() {
    const bool monitor_line = context_.line.starts_with('H');
    say(fmt::format("ends the section of {}", enclosure_words(unit_)),
        monitor_line ? Severity::ok : Severity::warning);
}

void EnclosureTrace::take_reading(const std::string &piece) {
    const bool had_line = monitor_.line_found();
    std::string copy = piece;
    if (had_line)
        return; // the library reads no further
    monitor_.take(copy.data());
    if (!monitor_.line_found())
        return;
    borrows_readings_ = !is_own();
    if (borrows_readings_)
        say("this section has no monitor line: the next one's is read", Severity::warning);
    say("readings " + readings_text(report()));
    for (const int item : {0, 4})
        if (unit_ != controller &&
            (monitor_.reading(item) == 0 || !std::isfinite(monitor_.reading(item))))
            say(fmt::format("reading {} ({}) is no answer", item,
                            item == 0 ? "temperature" : "voltage"),
                Severity::warning);
}

void EnclosureTrace::take_identity(const std::string &piece) {
    if (!identity_open_)
        return;
    const sRBODMap before = identity_;
    std::string copy = piece;
    identity_open_ = identity_reader_.take(copy.data(), identity_);
    const std::string model = text_of(identity_.model, sizeof identity_.model);
    const std::string serial = text_of(identity_.sn, sizeof identity_.sn);
    const bool new_model = model != text_of(before.model, sizeof before.model);
    const bool new_serial = serial != text_of(before.sn, sizeof before.sn);
    if (new_model)
        say(fmt::format("model \"{}\"", printable(model)));
    if (new_serial)
        say(fmt::format("serial number \"{}\"", printable(serial)));
    if ((new_model || new_serial) && !is_own())
        say("taken although another section has begun: no line with I has ended the identity",
            Severity::warning);
    if (!identity_open_)
        say("ends the model and serial number");
}

std::vector<ReportRemark> EnclosureTrace::remarks_at_end() const {
    if (!started())
        return {};
    std::vector<ReportRemark> remarks;
    const auto add = [&](Severity severity, const char *text) {
        remarks.push_back({severity, unit_, text});
    };
    sRaidSetInfo info;
    if (!reader_.fill(info))
        add(Severity::critical, "has no RAID set: its disks and volumes cannot be told");
    if (!reader_.ended())
        add(Severity::warning, "has no end: no line with H: follows");
    if (!monitor_.line_found())
        add(Severity::warning, "has no monitor line, nor has any behind it");
    return remarks;
}

} // namespace zavctl
