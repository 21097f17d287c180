// Sentences about load, UPS, network and events.
#include "model/load.hpp"
#include "model/network.hpp"
#include "model/sentence_parts.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

using Kind = Action::Kind;

// "load 97%" behind a noun that has a single quantity.
Sentence quantity(const std::vector<Word> &words, const char *name, Kind kind) {
    const auto percent =
        words.size() == 3 && words[1].text == name ? percentage(words[2].text) : std::nullopt;
    if (!percent)
        return wrong(fmt::format("{} {} N% (0 to 100)", words[0].text, name));
    Sentence sentence = of_kind(kind);
    sentence.action.percent = *percent;
    return sentence;
}

struct Phrase {
    std::vector<std::string> words;
    Kind kind;
};

Sentence one_of(const std::vector<Word> &words, const std::vector<Phrase> &phrases,
                const std::string &allowed) {
    for (const Phrase &phrase : phrases)
        if (are(words, phrase.words))
            return of_kind(phrase.kind);
    return wrong(allowed);
}

} // namespace

Sentence about_file_system(const std::vector<Word> &words) {
    const auto &known = own_file_systems();
    const bool is_known = words.size() > 2 && words[1].text == "system" &&
                          std::find(known.begin(), known.end(), words[2].text) != known.end();
    if (!is_known)
        return wrong(fmt::format("file system wants one of: {}", fmt::join(known, ", ")));
    const auto percent =
        words.size() == 5 && words[3].text == "fills" ? percentage(words[4].text) : std::nullopt;
    if (!percent)
        return wrong(fmt::format("file system {} fills N% (0 to 100)", words[2].text));
    Sentence sentence = of_kind(Kind::file_system_fills);
    sentence.action.text = words[2].text;
    sentence.action.percent = *percent;
    return sentence;
}

Sentence about_processor(const std::vector<Word> &words) {
    return quantity(words, "load", Kind::processor_load_is);
}

Sentence about_swap(const std::vector<Word> &words) {
    return quantity(words, "use", Kind::swap_use_is);
}

Sentence about_power(const std::vector<Word> &words) {
    return one_of(
        words,
        {{{"power", "fails"}, Kind::power_fails}, {{"power", "returns"}, Kind::power_returns}},
        "power fails or returns");
}

Sentence about_ups(const std::vector<Word> &words) {
    return one_of(words,
                  {{{"ups", "is", "silent"}, Kind::ups_is_silent},
                   {{"ups", "works", "again"}, Kind::ups_works}},
                  "ups is silent or works again");
}

Sentence about_port(const std::vector<Word> &words) {
    const auto number =
        words.size() < 2 ? std::nullopt : whole_number(words[1].text, 1, most_ports);
    if (!number)
        return wrong(fmt::format("port wants a number from 1 to {}", most_ports));
    const std::vector<Word> rest = without_first(words, 2);
    const bool runs = rest.size() == 3 && rest[0].text == "runs" && rest[1].text == "at";
    const int speed = runs ? port_speed(rest[2].text) : 0;
    Sentence sentence =
        speed != 0 ? of_kind(Kind::port_runs)
                   : one_of(rest,
                            {{{"loses", "its", "link"}, Kind::port_loses_link},
                             {{"gets", "its", "link"}, Kind::port_gets_link}},
                            fmt::format("port {} loses its link, gets its link or runs at 10, 100, "
                                        "1000, 2500 or 10000",
                                        *number));
    sentence.action.number = *number;
    sentence.action.value = speed;
    return sentence;
}

Sentence about_bond(const std::vector<Word> &words) {
    return one_of(words, {{{"bond", "fails", "over"}, Kind::bond_fails_over}}, "bond fails over");
}

// "event fan 1"; quoted or not
Sentence about_event(const std::vector<Word> &words) {
    static const std::vector<std::string> kinds = {"fan",  "thermal", "voltage", "ups",
                                                   "disk", "array",   "port"};
    const std::vector<Word> rest =
        words.size() == 2 && words[1].quoted ? split(words[1].text).list : without_first(words, 1);
    const bool is_kind =
        !rest.empty() && std::find(kinds.begin(), kinds.end(), rest[0].text) != kinds.end();
    const bool is_ups = is_kind && rest[0].text == "ups";
    const auto number = rest.size() == 2 ? whole_number(rest[1].text, 1, 99) : std::nullopt;
    if (!is_kind || (is_ups ? rest.size() != 1 : !number))
        return wrong("event wants fan N, thermal N, voltage N, ups, disk N, array N or port N");
    Sentence sentence = of_kind(Kind::event_is_put);
    sentence.action.text = rest[0].text;
    sentence.action.number = number.value_or(0);
    return sentence;
}

} // namespace zavsim
