// Sentences about the optical drive.
#include "model/optical.hpp"
#include "model/sentence_parts.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <map>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr const char *allowed =
    "drive gets STATE MEDIUM, gets STATE MEDIUM with N MB used, loses its disc, is a combo, is a "
    "burner, writes at N, writes at full speed, vanishes or appears";

const std::map<std::string, DiscState> disc_states = {{"blank", DiscState::blank},
                                                      {"appendable", DiscState::appendable},
                                                      {"complete", DiscState::complete},
                                                      {"unknown", DiscState::unknown}};

// "with 200 MB used" at the end is taken off; -1 if it is not there, nothing if it is wrong.
std::optional<double> take_used(std::vector<Word> &words) {
    const auto with = std::find_if(words.begin(), words.end(),
                                   [](const Word &word) { return word.text == "with"; });
    if (with == words.end())
        return -1;
    const std::vector<Word> rest(with, words.end());
    words.erase(with, words.end());
    if (rest.size() != 4 || rest[2].text != "MB" || rest[3].text != "used")
        return std::nullopt;
    return decimal_number(rest[1].text, 3);
}

std::string joined(const std::vector<Word> &words) {
    std::vector<std::string> texts;
    texts.reserve(words.size());
    for (const Word &word : words)
        texts.push_back(word.text);
    return fmt::format("{}", fmt::join(texts, " "));
}

// Behind "drive gets".
Sentence about_disc(std::vector<Word> words) {
    const auto used = take_used(words);
    if (!used)
        return wrong("what is used of a disc reads: with 200 MB used");
    const auto state = words.empty() ? disc_states.end() : disc_states.find(words.front().text);
    if (state == disc_states.end())
        return wrong("a disc is blank, appendable, complete or unknown");
    const MediumKind *kind = kind_named(joined(without_first(words, 1)));
    if (kind == nullptr)
        return wrong(fmt::format("a disc is one of: {}", fmt::join(medium_names(), ", ")));
    const std::string problem = medium_problem(*kind, state->second, *used);
    if (!problem.empty())
        return wrong(problem);
    Sentence sentence = of_kind(Kind::drive_gets_disc);
    sentence.action.text = kind->name;
    sentence.action.status = static_cast<int>(state->second);
    sentence.action.value = *used;
    return sentence;
}

Sentence about_speed(const std::string &text) {
    const auto speed = whole_number(text, 1, 9999);
    if (!speed)
        return wrong("drive writes at N (1 to 9999 KiB a second) or at full speed");
    Sentence sentence = of_kind(Kind::drive_writes);
    sentence.action.number = *speed;
    return sentence;
}

} // namespace

Sentence about_drive(const std::vector<Word> &words) {
    static const std::map<std::string, Kind> phrases = {
        {"loses its disc", Kind::drive_loses_disc}, {"is a combo", Kind::drive_is_combo},
        {"is a burner", Kind::drive_is_burner},     {"vanishes", Kind::drive_vanishes},
        {"appears", Kind::drive_appears},           {"writes at full speed", Kind::drive_writes}};
    const std::vector<Word> rest = without_first(words, 1);
    if (const auto phrase = phrases.find(joined(rest)); phrase != phrases.end())
        return of_kind(phrase->second);
    if (!rest.empty() && rest[0].text == "gets")
        return about_disc(without_first(rest, 1));
    if (rest.size() == 3 && rest[0].text == "writes" && rest[1].text == "at")
        return about_speed(rest[2].text);
    return wrong(allowed);
}

} // namespace zavsim
