// The word that somebody probably meant.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

// Number of letters to insert, drop, replace or swap with their neighbour to turn one word into
// the other; upper and lower case count as equal.
std::size_t edit_distance(std::string_view a, std::string_view b);

// The nearest of `words`, or "" if none is near: at most one edit per three letters (two for a
// short word), or a word that begins with what was typed.
std::string nearest_word(std::string_view typed, const std::vector<std::string> &words);

} // namespace zavctl
