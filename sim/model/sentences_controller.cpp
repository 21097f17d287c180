#include "model/enclosures.hpp"
#include "model/sentence_parts.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

const std::vector<Verb> volume_verbs = {{"degrades", Action::Kind::raid_volume_degrades},
                                        {"fails", Action::Kind::raid_volume_fails},
                                        {"rebuilds", Action::Kind::raid_volume_rebuilds},
                                        {"recovers", Action::Kind::raid_volume_recovers}};
constexpr const char *volume_words = "degrades, fails, rebuilds or recovers";

Sentence in_unit(Sentence sentence, int unit) {
    sentence.action.unit = unit;
    if (!sentence.error.empty() && unit != 0)
        sentence.error = fmt::format("unit {} {}", unit, sentence.error);
    return sentence;
}

struct Quantity {
    const char *noun;
    Action::Kind kind;
    std::size_t places; // that the report shows
    double most;
    const char *wanted;
};

// "temperature 88", "voltage 1.15"
Sentence reading(const std::vector<Word> &words, const Quantity &quantity) {
    const auto value =
        words.size() == 2 ? decimal_number(words[1].text, quantity.places) : std::nullopt;
    if (!value || *value > quantity.most)
        return wrong(quantity.wanted);
    Action action;
    action.kind = quantity.kind;
    action.value = *value;
    return {action, {}};
}

constexpr Quantity temperature = {"temperature", Action::Kind::temperature_changes, 1, 200,
                                  "temperature wants degrees from 0 to 200, such as 88 or 61.5"};
constexpr Quantity voltage = {"voltage", Action::Kind::voltage_changes, 2, 20,
                              "voltage wants volts from 0 to 20, such as 1.1"};

Sentence unit_volume(const std::vector<Word> &words) {
    for (const Verb &verb : volume_verbs)
        if (are(words, {"volume", verb.word})) {
            Sentence sentence = of_kind(verb.kind);
            sentence.action.number = 1;
            return sentence;
        }
    return wrong(fmt::format("volume {}", volume_words));
}

Sentence unit_itself(const std::vector<Word> &words) {
    if (are(words, {"vanishes"}))
        return of_kind(Action::Kind::unit_vanishes);
    if (are(words, {"appears"}))
        return of_kind(Action::Kind::unit_appears);
    if (are(words, {"loses", "its", "link"}))
        return of_kind(Action::Kind::unit_loses_link);
    if (are(words, {"finds", "its", "link"}))
        return of_kind(Action::Kind::unit_finds_link);
    return wrong("vanishes, appears, loses its link, finds its link, temperature T, voltage V, "
                 "disk N fails, vanishes or appears, volume degrades, fails, rebuilds or recovers");
}

Sentence about_part(const std::vector<Word> &words) {
    static const std::vector<Verb> disk_verbs = {{"fails", Action::Kind::disk_fails},
                                                 {"vanishes", Action::Kind::disk_vanishes},
                                                 {"appears", Action::Kind::disk_appears}};
    const std::string noun = words.empty() ? "" : words.front().text;
    if (noun == temperature.noun)
        return reading(words, temperature);
    if (noun == voltage.noun)
        return reading(words, voltage);
    if (noun == "disk")
        return numbered_noun(words, 4, disk_verbs, "fails, vanishes or appears");
    if (noun == "volume")
        return unit_volume(words);
    return unit_itself(words);
}

} // namespace

Sentence about_unit(const std::vector<Word> &words) {
    const auto unit = words.size() < 2 ? std::nullopt : whole_number(words[1].text, 1, most_units);
    if (!unit)
        return wrong(fmt::format("unit wants a number from 1 to {}", most_units));
    return in_unit(about_part(without_first(words, 2)), *unit);
}

Sentence about_controller(const std::vector<Word> &words) {
    const std::vector<Word> rest = without_first(words, 1);
    const std::string noun = rest.empty() ? "" : rest.front().text;
    Sentence sentence = noun == "volume" ? numbered_noun(rest, 2, volume_verbs, volume_words)
                        : noun == temperature.noun
                            ? reading(rest, temperature)
                            : wrong("temperature T, volume N degrades, fails, rebuilds or "
                                    "recovers");
    if (!sentence.error.empty())
        sentence.error = "controller " + sentence.error;
    return sentence;
}

Sentence about_report(const std::vector<Word> &words) {
    const std::vector<Word> rest = without_first(words, 1);
    if (are(rest, {"is", "missing"}))
        return of_kind(Action::Kind::report_is_missing);
    if (are(rest, {"is", "truncated"}))
        return of_kind(Action::Kind::report_is_truncated);
    if (are(rest, {"is", "garbled"}))
        return of_kind(Action::Kind::report_is_garbled);
    if (are(rest, {"works", "again"}))
        return of_kind(Action::Kind::report_works);
    const auto seconds =
        rest.size() == 2 && rest[0].text == "rewrites" ? duration(rest[1].text) : std::nullopt;
    if (!seconds)
        return wrong("report is missing, is truncated, is garbled, rewrites 5s or works again");
    Sentence sentence = of_kind(Action::Kind::report_rewrites);
    sentence.action.seconds = *seconds;
    return sentence;
}

} // namespace zavsim
