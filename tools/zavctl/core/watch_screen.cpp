#include "watch_screen.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

using Lines = std::vector<std::string>;

void append(Lines &lines, const Lines &more) {
    lines.insert(lines.end(), more.begin(), more.end());
}

Lines lines_of(std::string_view text) {
    Lines lines;
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size());
        lines.emplace_back(text.substr(0, end));
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return lines;
}

Lines top(const WatchView &view, const Style &style) {
    const std::string when =
        fmt::format("{}  round {}, every {} s; Ctrl-C ends", view.time, view.round, view.interval);
    Lines lines = {bold(view.answer.heading, style), when};
    for (const std::string &line : wrapped(summary(view.answer), style.width))
        lines.push_back(coloured(line, severity(view.answer), style));
    return lines;
}

Lines section_lines(const std::vector<Section> &sections, const Style &style) {
    Lines lines;
    for (const Section &section : sections) {
        const Lines text = lines_of(section_text(section, style));
        if (text.empty())
            continue;
        lines.emplace_back();
        append(lines, text);
    }
    return lines;
}

// A section of which all is well is none.
Section unwell(Section section) {
    section.table = section.table.unwell();
    if (section.table.empty() && section.details.empty() && section.lines.empty())
        section.title.clear();
    return section;
}

Lines unwell_lines(const std::vector<Section> &sections, const Style &style) {
    std::vector<Section> bad;
    bad.reserve(sections.size());
    std::transform(sections.begin(), sections.end(), std::back_inserter(bad), unwell);
    Lines lines = section_lines(bad, style);
    lines.emplace_back();
    lines.emplace_back("The window is too small for what is well.");
    return lines;
}

Lines cut_off(Lines lines, std::size_t room) {
    if (lines.size() <= room)
        return lines;
    const std::size_t kept = room == 0 ? 0 : room - 1;
    const std::size_t more = lines.size() - kept;
    lines.resize(kept);
    if (room > 0)
        lines.push_back(fmt::format("... {} more lines", more));
    return lines;
}

Lines bottom(const WatchView &view, const Style &style, std::size_t height) {
    constexpr std::size_t fewest = 3;
    constexpr std::size_t most = 10;
    if (view.recent.empty())
        return {};
    const std::size_t shown =
        std::min(view.recent.size(), height == 0 ? most : std::clamp(height / 6, fewest, most));
    Lines lines = {"", bold("Last changes", style)};
    lines.insert(lines.end(), view.recent.begin(),
                 view.recent.begin() + static_cast<std::ptrdiff_t>(shown));
    return lines;
}

Lines middle(const std::vector<Section> &sections, const Style &style, std::size_t height,
             std::size_t used) {
    Lines all = section_lines(sections, style);
    if (height == 0 || all.size() + used <= height)
        return all;
    return cut_off(unwell_lines(sections, style), height > used ? height - used : 0);
}

} // namespace

void star_changes(Answer &answer, const Answer &before) {
    for (Section &section : answer.sections)
        for (const Section &old : before.sections)
            if (!section.table.empty() && !old.table.empty() && old.key == section.key)
                section.table.star_changes(old.table);
}

std::vector<std::string> watch_lines(const WatchView &view, const Style &style,
                                     std::size_t height) {
    Lines lines = top(view, style);
    const Lines last = bottom(view, style, height);
    append(lines, middle(view.answer.sections, style, height, lines.size() + last.size()));
    append(lines, last);
    if (height != 0 && lines.size() > height)
        lines.resize(height);
    for (std::string &line : lines)
        line = cut(line, style.width);
    return lines;
}

std::string drawing(const std::vector<std::string> &lines) {
    constexpr const char *home = "\033[H";
    constexpr const char *clear_to_line_end = "\033[K";
    constexpr const char *clear_below = "\033[J";
    std::string text = home;
    for (std::size_t i = 0; i < lines.size(); ++i)
        text += (i > 0 ? "\r\n" : "") + lines[i] + clear_to_line_end;
    return text + clear_below;
}

} // namespace zavctl
