// The screen of `zavctl watch`.
#pragma once

#include "answer.h"

#include <cstddef>
#include <string>
#include <vector>

namespace zavctl {

struct WatchView {
    Answer answer;
    std::string time; // of the round, "12:03:41"
    int round = 0;
    int interval = 0;                // seconds between two rounds
    std::vector<std::string> recent; // what was last, the newest first
};

// Stars the rows that differ from those of the round before.
void star_changes(Answer &answer, const Answer &before);

// The lines of the screen, which fit the style's width and `height` (0: any). When not all fits,
// the rows that are well are left out, then what is at the end of them.
std::vector<std::string> watch_lines(const WatchView &view, const Style &style, std::size_t height);

// What puts the lines in the place of those that the screen holds.
std::string drawing(const std::vector<std::string> &lines);

} // namespace zavctl
