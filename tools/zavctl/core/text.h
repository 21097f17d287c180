// Text for people: what goes to a terminal, safe and aligned.
#pragma once

#include "severity.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

// How the screen is written: colours or not, where lines end (0: nowhere), and whether characters
// beyond ASCII can be shown.
struct Style {
    bool colour = false;
    std::size_t width = 0;
    bool unicode = false;
};

// Text that came from the system, made safe for a terminal: control characters, bytes that are no
// UTF-8 and characters that turn the writing direction become \xNN or \u{NNNN}.
std::string printable(std::string_view text);

// The text without blanks, tabs and line ends at both sides.
std::string trimmed(std::string_view text);

// Number of columns that printable UTF-8 text takes.
std::size_t columns(std::string_view text);

// Bold, green, red... around the text, if the style has colours. A severity has its colour.
std::string bold(std::string_view text, const Style &style);
std::string coloured(std::string_view text, Severity severity, const Style &style);

// The beginning of a line that may hold sequences for colours, as far as it fits `width` columns;
// 0 is no limit.
std::string cut(std::string_view line, std::size_t width);

// The one-letter mark at the start of a row: blank ok, ! warning, ? unknown, X critical.
std::string mark(Severity severity);

// "[=======>............]" with `width` places between the brackets.
std::string progress_bar(double percent, std::size_t width = 20);

// Breaks text at blanks into lines of at most `width` columns; a longer word stays whole.
std::vector<std::string> wrapped(std::string_view text, std::size_t width);

// "one", "one and two", "one, two and three".
std::string listed(const std::vector<std::string> &words);

// One step of the way from the root of a tree to a row.
enum class Branch {
    to_row,      // the row hangs here, others below it
    to_last_row, // the row hangs here, the last
    past,        // a branch goes by on its way down
    ended,       // nothing
};

// The branches before a row; each takes four columns.
std::string drawn(const std::vector<Branch> &branches, const Style &style);

// A table: one heading per column, one mark per row, and a column whose text takes the colour of
// its row's severity. The last column, and what stands below it, is wrapped at the end of the
// screen.
class Table {
  public:
    struct Row {
        Severity severity = Severity::ok;
        std::vector<std::string> cells;
        std::string below;              // a line of its own under the last column, "" for none
        std::vector<Branch> branches{}; // of the tree that leads to the row, drawn before its text
        bool changed = false;           // has a star before its mark
    };

    Table() = default;
    Table(std::vector<std::string> headings, std::size_t state_column)
        : headings_(std::move(headings)), state_column_(state_column) {}

    void add(Severity severity, std::vector<std::string> cells, std::string below = "") {
        rows_.push_back({severity, std::move(cells), std::move(below)});
    }
    void add_branch(Severity severity, std::vector<Branch> branches,
                    std::vector<std::string> cells) {
        rows_.push_back({severity, std::move(cells), "", std::move(branches)});
    }
    bool empty() const { return headings_.empty(); }
    std::string text(const Style &style) const;

    // Stars the rows that an older table does not have with the same severity and state. Rows are
    // told apart by their first cell.
    void star_changes(const Table &before);

    // The rows that are not well.
    Table unwell() const;

  private:
    std::vector<std::size_t> widths() const;
    std::size_t columns_used() const;
    void write_row(std::string &out, const Row &row, const std::vector<std::size_t> &widths,
                   const Style &style) const;

    std::vector<std::string> headings_;
    std::size_t state_column_ = 0;
    std::vector<Row> rows_;
};

// Names and values below each other: what `show` says about one thing.
class Details {
  public:
    void add(std::string name, std::string value, Severity severity = Severity::ok) {
        lines_.push_back({std::move(name), std::move(value), severity});
    }
    // Several lines below each other under one name.
    void add_lines(const std::string &name, std::string_view lines);
    std::string text(const Style &style) const;

  private:
    struct Line {
        std::string name;
        std::string value;
        Severity severity;
    };
    std::vector<Line> lines_;
};

} // namespace zavctl
