// What the library takes from each line of the RAID controller's report. The library's own readers
// are fed with the lines; what is said comes from their answers.
#pragma once

#include "enclosure_report.h"
#include "severity.h"

#include "common/raid_report.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

struct ReportRemark {
    Severity severity = Severity::ok;
    std::optional<int> unit; // the enclosure that it is about, 0: the controller
    std::string text;
};

// A line and the enclosure in whose section it stands by the last marker at the start of a line.
struct LineContext {
    std::string_view line;    // with its line feed
    std::optional<int> owner; // none before the first marker
    bool marker = false;      // the line is the owner's marker
};

// The line as fgets() hands it over: pieces of at most `size` - 1 characters, each seen up to its
// first NUL.
std::vector<std::string> pieces_of(std::string_view line, int size);

// The enclosure whose marker the line begins with; none for other lines and other numbers.
std::optional<int> marker_of(std::string_view line);

// Whether a section would take something from the line.
bool is_data(const std::string &piece);

// The three readers of one enclosure.
class EnclosureTrace {
  public:
    explicit EnclosureTrace(int unit);

    // What the readers make of the line, in the order of its pieces.
    std::vector<ReportRemark> take(const LineContext &context);

    int unit() const { return unit_; }
    bool started() const { return reader_.started() || monitor_.marker_found(); }
    bool is_open() const { return reader_.started() && !reader_.ended(); }

    // As the library would answer at the end of the report.
    EnclosureReport report() const;
    const sRBODMap &identity() const { return identity_; }
    std::vector<ReportRemark> remarks_at_end() const;

    // Its readings are those of another section, for want of own ones.
    bool borrows_readings() const { return borrows_readings_; }

  private:
    using Kind = zav::EnclosureReader::Kind;
    using Piece = zav::EnclosureReader::Piece;

    void say(std::string text, Severity severity = Severity::ok);
    void take_piece(const std::string &piece);
    void tell_marker(const std::string &piece, bool had_started);
    void tell_taken(const Piece &taken, const std::string &piece);
    void tell_set(const Piece &taken);
    void tell_row(const Piece &taken, const std::string &piece);
    void tell_fields(const Piece &taken);
    void tell_end();
    void take_reading(const std::string &piece);
    void take_identity(const std::string &piece);
    bool is_own() const { return context_.owner == unit_; }

    int unit_;
    zav::Marker marker_;
    zav::EnclosureReader reader_;
    zav::MonitorReader monitor_;
    zav::IdentityReader identity_reader_;
    sRBODMap identity_ = {};
    bool identity_open_;
    bool has_set_ = false;
    bool borrows_readings_ = false;
    std::vector<int> volumes_; // numbers of those taken
    LineContext context_;
    std::vector<ReportRemark> remarks_;
};

} // namespace zavctl
