#include "distortion.h"

#include <algorithm>
#include <csignal>
#include <cstring>
#include <functional>
#include <string>

namespace faults {

namespace {

constexpr std::size_t kLongLine = 10000;

std::string each_character(const std::string &text,
                           const std::function<std::string(std::size_t)> &changed) {
    std::string made;
    for (std::size_t i = 0; i < text.size(); ++i)
        made += changed(i);
    return made;
}

std::string each_line(const std::string &text,
                      const std::function<std::string(const std::string &)> &changed) {
    std::string made;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const std::size_t end = std::min(text.find('\n', begin), text.size());
        made += changed(text.substr(begin, end - begin));
        begin = end + 1;
    }
    return made;
}

bool is_digit(char character) {
    return character >= '0' && character <= '9';
}

std::string each_number(const std::string &text, const std::string &before,
                        const std::string &behind) {
    return each_character(text, [&](std::size_t i) {
        if (!is_digit(text[i]))
            return std::string(1, text[i]);
        const bool first = i == 0 || !is_digit(text[i - 1]);
        const bool last = i + 1 == text.size() || !is_digit(text[i + 1]);
        return (first ? before : "") + text[i] + (last ? behind : "");
    });
}

// Words that the library looks for, and the decimal point, as a tool of another locale has them.
std::string translated(std::string text) {
    const std::pair<const char *, const char *> words[] = {
        {"active", "aktiv"}, {"Level", "Stufe"},         {"State", "Zustand"}, {"yes", "ja"},
        {"Speed", "Tempo"},  {"device", "Ger\xc3\xa4t"}, {"blank", "leer"},    {"done", "fertig"},
        {"PASSED", "gut"},   {"Device", "Ger\xc3\xa4t"}};
    for (const auto &[word, other] : words)
        for (std::size_t at = 0; (at = text.find(word, at)) != std::string::npos;)
            text.replace(at, std::strlen(word), other);
    for (std::size_t i = 1; i + 1 < text.size(); ++i)
        if (text[i] == '.' && is_digit(text[i - 1]) && is_digit(text[i + 1]))
            text[i] = ',';
    return text;
}

std::string garbage() {
    std::string bytes;
    std::uint32_t state = 12345;
    for (int i = 0; i < 4096; ++i) {
        state = state * 1664525 + 1013904223;
        bytes += static_cast<char>(state >> 24);
    }
    return bytes;
}

constexpr const char *kWarning =
    "File descriptor 4 (/dev/zavevent0) leaked on vgs invocation. Parent PID 4711: sh\n"
    "  WARNING: Device for PV IYbX2k-l0Hc not found or rejected by a filter.\n";

void ends(harness::Outcome &outcome, int exit_status, const std::string &output) {
    outcome = {output, exit_status << 8};
}

} // namespace

std::vector<Fate> wrong_answers(std::size_t output) {
    if (output == 0)
        return {Fate::is_missing, Fate::is_not_executable, Fate::ends_with_an_error,
                Fate::is_killed,  Fate::prints_garbage,    Fate::warns_first};
    std::vector<Fate> all;
    for (int fate = static_cast<int>(kFirstWrongAnswer); fate < static_cast<int>(Fate::is_cut);
         ++fate)
        all.push_back(static_cast<Fate>(fate));
    return all;
}

void distort_answer(harness::Outcome &outcome, Fate fate, std::size_t cut) {
    std::string &text = outcome.output;
    switch (fate) {
    case Fate::fails:
    case Fate::is_short:
        break;
    case Fate::is_missing:
        return ends(outcome, 127, "");
    case Fate::is_not_executable:
        return ends(outcome, 126, "");
    case Fate::prints_nothing:
        return text.clear();
    case Fate::ends_no_line:
        text = each_line(text, [](const std::string &line) { return line; });
        break;
    case Fate::prints_long_lines:
        text = each_line(text, [](const std::string &line) {
            return line + std::string(kLongLine, 'x') + "\n";
        });
        break;
    case Fate::prints_nuls:
        text = each_character(
            text, [&](std::size_t i) { return std::string(1, i % 7 == 3 ? '\0' : text[i]); });
        break;
    case Fate::prints_garbage:
        text = garbage();
        break;
    case Fate::ends_with_an_error:
        outcome.status = outcome.status == 0 ? 1 << 8 : 0;
        break;
    case Fate::is_killed:
        outcome = {text.substr(0, text.size() / 2), SIGKILL};
        break;
    case Fate::warns_first:
        text.insert(0, kWarning);
        break;
    case Fate::speaks_another_language:
        text = translated(text);
        break;
    case Fate::ends_lines_twice:
        text = each_line(text, [](const std::string &line) { return line + "\r\n"; });
        break;
    case Fate::repeats_itself: {
        std::string once = text;
        for (int i = 0; i < 300; ++i)
            text += once;
        break;
    }
    case Fate::tells_huge_numbers:
        text = each_number(text, "", "99999999999999999999");
        break;
    case Fate::tells_negative_numbers:
        text = each_number(text, "-", "");
        break;
    case Fate::is_cut:
        text.resize(std::min(cut, text.size()));
        break;
    }
}

const char *name_of(Fate fate) {
    constexpr const char *names[] = {
        "fails",
        "is short",
        "is missing",
        "is not executable",
        "prints nothing",
        "ends no line",
        "prints long lines",
        "prints NULs",
        "prints garbage",
        "ends with an error",
        "is killed",
        "warns first",
        "speaks another language",
        "ends lines twice",
        "repeats itself",
        "tells huge numbers",
        "tells negative numbers",
        "is cut",
    };
    return names[static_cast<int>(fate)];
}

} // namespace faults
