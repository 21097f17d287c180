#include "text.h"

#include "utf8.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <utility>

namespace zavctl {

namespace {

constexpr std::string_view blanks = " \t\r\n";
constexpr std::size_t indent = 4; // " X  " before every row
constexpr std::size_t gap = 2;
constexpr std::size_t narrowest = 20; // a last column is not squeezed below this

std::string padded(std::string text, std::size_t used, std::size_t width) {
    text.append(width > used ? width - used : 0, ' ');
    return text;
}

std::string sequence(std::string_view code, std::string_view text, const Style &style) {
    return style.colour ? fmt::format("\033[{}m{}\033[0m", code, text) : std::string(text);
}

std::string_view colour_code(Severity severity) {
    switch (severity) {
    case Severity::ok:
        return "32";
    case Severity::warning:
        return "33";
    case Severity::unknown:
        return "35";
    case Severity::critical:
        break;
    }
    return "1;31";
}

// The columns left for text that starts at column `start`.
std::size_t room(const Style &style, std::size_t start) {
    if (style.width == 0)
        return 0;
    return std::max(narrowest, style.width > start ? style.width - start : 0);
}

std::size_t column_start(const std::vector<std::size_t> &widths, std::size_t column) {
    std::size_t start = indent;
    for (std::size_t i = 0; i < column; ++i)
        start += widths[i] + gap;
    return start;
}

constexpr std::size_t branch_width = 4;

struct Drawing {
    const char *lines; // with box-drawing characters
    const char *ascii;
};

Drawing drawing_of(Branch branch) {
    switch (branch) {
    case Branch::to_row:
        return {"├── ", "|-- "};
    case Branch::to_last_row:
        return {"└── ", "`-- "};
    case Branch::past:
        return {"│   ", "|   "};
    case Branch::ended:
        break;
    }
    return {"    ", "    "};
}

void strip_line_end(std::string &out) {
    while (!out.empty() && out.back() == ' ')
        out.pop_back();
    out += '\n';
}

} // namespace

std::string printable(std::string_view text) {
    std::string result;
    while (!text.empty()) {
        const Utf8Char next = first_char(text);
        if (!next.valid)
            result += fmt::format("\\x{:02x}", static_cast<unsigned char>(text[0]));
        else if (disturbs_terminal(next.code))
            result += next.code < 0x80 ? fmt::format("\\x{:02x}", next.code)
                                       : fmt::format("\\u{{{:04x}}}", next.code);
        else
            result += text.substr(0, next.length);
        text.remove_prefix(next.length);
    }
    return result;
}

std::string trimmed(std::string_view text) {
    const std::size_t first = text.find_first_not_of(blanks);
    if (first == std::string_view::npos)
        return "";
    return std::string(text.substr(first, text.find_last_not_of(blanks) - first + 1));
}

std::size_t columns(std::string_view text) {
    return static_cast<std::size_t>(std::count_if(text.begin(), text.end(), [](char c) {
        return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    }));
}

std::string bold(std::string_view text, const Style &style) {
    return sequence("1", text, style);
}

std::string coloured(std::string_view text, Severity severity, const Style &style) {
    return sequence(colour_code(severity), text, style);
}

std::string cut(std::string_view line, std::size_t width) {
    constexpr char escape = '\033';
    std::string result;
    std::size_t used = 0;
    while (!line.empty()) {
        const bool sequence = line[0] == escape;
        const std::size_t end = line.find('m');
        const std::size_t length = !sequence                       ? first_char(line).length
                                   : end == std::string_view::npos ? line.size()
                                                                   : end + 1;
        if (sequence || width == 0 || used < width)
            result += line.substr(0, length);
        used += sequence ? 0 : 1;
        line.remove_prefix(length);
    }
    return result;
}

std::string mark(Severity severity) {
    switch (severity) {
    case Severity::ok:
        return " ";
    case Severity::warning:
        return "!";
    case Severity::unknown:
        return "?";
    case Severity::critical:
        break;
    }
    return "X";
}

std::string progress_bar(double percent, std::size_t width) {
    const double share = std::clamp(percent, 0.0, 100.0) / 100.0;
    const auto done = static_cast<std::size_t>(share * static_cast<double>(width));
    std::string bar(width, '.');
    bar.replace(0, done, done, '=');
    if (done < width)
        bar[done] = '>';
    return "[" + bar + "]";
}

std::vector<std::string> wrapped(std::string_view text, std::size_t width) {
    std::vector<std::string> lines;
    std::string line;
    while (width > 0 && columns(text) > 0) {
        const std::size_t end = std::min(text.find(' '), text.size());
        const std::string_view next = text.substr(0, end);
        if (!line.empty() && columns(line) + 1 + columns(next) > width)
            lines.push_back(std::exchange(line, ""));
        line += (line.empty() ? "" : " ") + std::string(next);
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    lines.push_back(width > 0 ? line : std::string(text));
    return lines;
}

std::string listed(const std::vector<std::string> &words) {
    std::string result;
    for (std::size_t i = 0; i < words.size(); ++i) {
        if (i > 0)
            result += i + 1 == words.size() ? " and " : ", ";
        result += words[i];
    }
    return result;
}

std::string drawn(const std::vector<Branch> &branches, const Style &style) {
    std::string text;
    for (const Branch branch : branches)
        text += style.unicode ? drawing_of(branch).lines : drawing_of(branch).ascii;
    return text;
}

std::vector<std::size_t> Table::widths() const {
    std::vector<std::size_t> result;
    for (std::size_t i = 0; i < headings_.size(); ++i) {
        result.push_back(columns(headings_[i]));
        for (const Row &row : rows_)
            result[i] = std::max(result[i], columns(row.cells[i]) +
                                                (i == 0 ? row.branches.size() * branch_width : 0));
    }
    return result;
}

void Table::write_row(std::string &out, const Row &row, const std::vector<std::size_t> &widths,
                      const Style &style) const {
    const std::size_t last = headings_.size() - 1;
    const std::size_t start = column_start(widths, last);
    const std::vector<std::string> lines = wrapped(row.cells[last], room(style, start));
    out += row.changed ? bold("*", style) : " ";
    out += coloured(mark(row.severity), row.severity, style) + "  ";
    for (std::size_t i = 0; i <= last; ++i) {
        const std::string text = i == last ? lines[0] : row.cells[i];
        const std::string cell = i == 0 ? drawn(row.branches, style) + text : text;
        const std::string shown = i == state_column_ ? coloured(cell, row.severity, style) : cell;
        out += padded(shown, columns(cell), i == last ? 0 : widths[i] + gap);
    }
    strip_line_end(out);
    for (std::size_t i = 1; i < lines.size(); ++i)
        out += std::string(start, ' ') + lines[i] + "\n";
    if (!row.below.empty())
        for (const std::string &line : wrapped(row.below, room(style, start)))
            out += std::string(start, ' ') + line + "\n";
}

// A last column in which no row has anything to say gets no heading.
std::size_t Table::columns_used() const {
    const bool said = std::any_of(rows_.begin(), rows_.end(),
                                  [](const Row &row) { return !row.cells.back().empty(); });
    return said || rows_.empty() ? headings_.size() : headings_.size() - 1;
}

std::string Table::text(const Style &style) const {
    const std::vector<std::size_t> widths = this->widths();
    std::string heading(indent, ' ');
    for (std::size_t i = 0; i < columns_used(); ++i)
        heading += padded(headings_[i], columns(headings_[i]), widths[i] + gap);
    strip_line_end(heading);
    heading.pop_back();
    std::string out = bold(heading, style) + "\n";
    for (const Row &row : rows_)
        write_row(out, row, widths, style);
    return out;
}

void Table::star_changes(const Table &before) {
    for (Row &row : rows_) {
        const auto old =
            std::find_if(before.rows_.begin(), before.rows_.end(), [&row](const Row &other) {
                return other.cells.front() == row.cells.front();
            });
        row.changed = old == before.rows_.end() || old->severity != row.severity ||
                      old->cells[state_column_] != row.cells[state_column_];
    }
}

Table Table::unwell() const {
    Table table(headings_, state_column_);
    std::copy_if(rows_.begin(), rows_.end(), std::back_inserter(table.rows_),
                 [](const Row &row) { return row.severity != Severity::ok; });
    return table.rows_.empty() ? Table() : table;
}

void Details::add_lines(const std::string &name, std::string_view lines) {
    for (std::string shown = name; !lines.empty(); shown = "") {
        const std::size_t end = std::min(lines.find('\n'), lines.size());
        const std::string line = printable(lines.substr(0, end));
        if (!trimmed(line).empty())
            add(shown, line);
        lines.remove_prefix(std::min(end + 1, lines.size()));
    }
}

std::string Details::text(const Style &style) const {
    std::size_t width = 0;
    for (const Line &line : lines_)
        width = std::max(width, columns(line.name));
    std::string out;
    for (const Line &line : lines_) {
        const auto lines = wrapped(line.value, room(style, indent + width + gap));
        out += " " + coloured(mark(line.severity), line.severity, style) + "  " +
               padded(line.name, columns(line.name), width + gap);
        for (std::size_t i = 0; i < lines.size(); ++i) {
            out += i == 0 ? "" : std::string(indent + width + gap, ' ');
            out +=
                line.severity == Severity::ok ? lines[i] : coloured(lines[i], line.severity, style);
            strip_line_end(out);
        }
    }
    return out;
}

} // namespace zavctl
