#include "suggest.h"

#include <algorithm>
#include <cctype>

namespace zavctl {

namespace {

std::string lower(std::string_view text) {
    std::string result(text);
    for (char &c : result)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return result;
}

using Rows = std::vector<std::vector<std::size_t>>;

Rows first_row_and_column(std::size_t height, std::size_t width) {
    Rows rows(height + 1, std::vector<std::size_t>(width + 1));
    for (std::size_t i = 0; i <= height; ++i)
        rows[i][0] = i;
    for (std::size_t j = 0; j <= width; ++j)
        rows[0][j] = j;
    return rows;
}

bool swapped(std::string_view a, std::string_view b, std::size_t i, std::size_t j) {
    return i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1];
}

std::size_t edits_allowed(std::string_view typed) {
    return std::max<std::size_t>(2, typed.size() / 3);
}

} // namespace

std::size_t edit_distance(std::string_view first, std::string_view second) {
    const std::string a = lower(first);
    const std::string b = lower(second);
    Rows d = first_row_and_column(a.size(), b.size());
    for (std::size_t i = 1; i <= a.size(); ++i) {
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t replace = d[i - 1][j - 1] + (a[i - 1] == b[j - 1] ? 0U : 1U);
            d[i][j] = std::min({d[i - 1][j] + 1, d[i][j - 1] + 1, replace});
            if (swapped(a, b, i, j))
                d[i][j] = std::min(d[i][j], d[i - 2][j - 2] + 1);
        }
    }
    return d[a.size()][b.size()];
}

std::string nearest_word(std::string_view typed, const std::vector<std::string> &words) {
    std::string best;
    std::size_t best_distance = edits_allowed(typed) + 1;
    for (const std::string &candidate : words) {
        const bool begins = typed.size() >= 2 && lower(candidate).starts_with(lower(typed));
        const std::size_t distance = begins ? 0 : edit_distance(typed, candidate);
        // A word with no letter in common is no suggestion, however short both are.
        if (distance < best_distance && distance < std::max(typed.size(), candidate.size())) {
            best = candidate;
            best_distance = distance;
        }
    }
    return best;
}

} // namespace zavctl
