#include "mdstat.h"

#include "text.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr std::size_t line_limit = 79; // what the library reads of a line at once
constexpr std::size_t progress_column = 29;
constexpr std::string_view idle_line = "      \n";

// The next line with its line feed, taken off the front of `text`.
std::string_view take_line(std::string_view &text) {
    const std::size_t end = std::min(text.find('\n'), text.size() - 1);
    const std::string_view line = text.substr(0, end + 1);
    text.remove_prefix(end + 1);
    return line;
}

std::string_view take_piece(std::string_view &text) {
    std::string_view rest = text;
    const std::string_view piece = text.empty() ? text : take_line(rest).substr(0, line_limit);
    text.remove_prefix(piece.size());
    return piece;
}

bool holds(std::string_view line, std::string_view word) {
    return line.find(word) != std::string_view::npos;
}

bool has_percentage(std::string_view line) {
    return line.size() > progress_column && holds(line.substr(progress_column), "=") &&
           holds(line.substr(progress_column), "%");
}

bool taken_as_third_line(std::string_view line) {
    if (holds(line, "resync=DELAYED\n") || line == idle_line)
        return true;
    return (holds(line, "recovery") || holds(line, "resync")) && has_percentage(line);
}

bool is_line_of(std::string_view line, std::string_view kernel_name) {
    return line.starts_with(std::string(kernel_name) + " ");
}

// The text from the first line on that holds the name: the one that the library takes.
std::string_view from_line_with(std::string_view mdstat, std::string_view name) {
    while (!mdstat.empty()) {
        std::string_view rest = mdstat;
        if (holds(take_piece(rest), name))
            return mdstat;
        mdstat = rest;
    }
    return mdstat;
}

std::string third_line_refusal(std::string_view block) {
    std::string_view whole = block;
    take_piece(block);
    take_piece(block);
    if (taken_as_third_line(take_piece(block)))
        return "";
    take_line(whole);
    const std::string_view status = whole.empty() ? whole : take_line(whole);
    if (status.size() > line_limit)
        return fmt::format("its status line in /proc/mdstat has {} characters, more than the {} "
                           "that the library reads",
                           status.size() - 1, line_limit - 1);
    const std::string third = whole.empty() ? "" : trimmed(take_line(whole));
    return third.empty() ? "its block in /proc/mdstat does not end as that of a running array"
                         : fmt::format("its third line in /proc/mdstat is '{}', which is none "
                                       "that the library takes",
                                       printable(third));
}

} // namespace

std::string mdstat_block(std::string_view mdstat, std::string_view kernel_name) {
    std::string block;
    while (!mdstat.empty()) {
        const std::string_view line = take_line(mdstat);
        const bool continues = !block.empty() && line.starts_with(" ");
        if (!block.empty() && !continues)
            break;
        if (continues || is_line_of(line, kernel_name))
            block += line;
    }
    return block;
}

std::string mdstat_mixup(std::string_view mdstat, std::string_view kernel_name) {
    const std::string_view block = from_line_with(mdstat, kernel_name);
    if (block.empty() || is_line_of(block, kernel_name))
        return "";
    const std::string_view other = block.substr(0, block.find_first_of(" \n"));
    return fmt::format("the library finds an array by its name and takes the line of {} in "
                       "/proc/mdstat for that of {}",
                       printable(other), kernel_name);
}

std::string mdstat_refusal(std::string_view mdstat, std::string_view kernel_name) {
    const std::string mixup = mdstat_mixup(mdstat, kernel_name);
    const std::string_view block = from_line_with(mdstat, kernel_name);
    return block.empty() || !mixup.empty() ? mixup : third_line_refusal(block);
}

std::string member_state(std::string_view block, std::string_view node) {
    if (block.empty() || node.empty())
        return "unknown";
    const std::string_view line = take_line(block);
    const std::size_t at = line.find(fmt::format(" {}[", node));
    if (at == std::string_view::npos)
        return "out";
    const std::string_view entry = line.substr(at + 1, line.find_first_of(" \n", at + 1) - at - 1);
    if (holds(entry, "(F)"))
        return "faulty";
    return holds(entry, "(S)") ? "spare" : "active";
}

std::string array_of_member(std::string_view mdstat, std::string_view node) {
    const std::string entry = fmt::format(" {}[", node);
    while (!node.empty() && !mdstat.empty()) {
        const std::string_view line = take_line(mdstat);
        if (!line.starts_with(" ") && holds(line, entry))
            return std::string(line.substr(0, line.find(' ')));
    }
    return "";
}

std::vector<MdstatProblem> mdstat_problems(std::string_view mdstat) {
    std::vector<MdstatProblem> problems;
    for (const char *name : {"md0", "md1", "md2", "md3"}) {
        std::string reason = mdstat_refusal(mdstat, name);
        if (!reason.empty())
            problems.push_back({name, std::move(reason)});
    }
    return problems;
}

} // namespace zavctl
