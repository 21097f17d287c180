#include "model/sensors.hpp"
#include "model/sentence_parts.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr int least_speed = 1; // of a fan that turns at all
constexpr int most_speed = 9999;

struct Quantity {
    Kind kind;
    int probes;
    std::size_t places; // that the driver shows
    double most;
    const char *allowed;
};

constexpr Quantity temperature = {Kind::temperature_is, thermal_probes, 1, 200,
                                  "is T (0 to 200), latches, faults or recovers"};
constexpr Quantity voltage = {Kind::voltage_is, voltage_probes, 2, 20,
                              "is V (0 to 20), latches, faults or recovers"};

// "temperature 1 is 78", "voltage 3 latches"
Sentence about_probe(const std::vector<Word> &words, const Quantity &quantity,
                     const std::vector<Verb> &verbs) {
    const bool is_reading = words.size() == 4 && words[2].text == "is";
    if (!is_reading)
        return numbered_noun(words, quantity.probes, verbs, quantity.allowed);
    const auto number = whole_number(words[1].text, 1, quantity.probes);
    const auto value = decimal_number(words[3].text, quantity.places);
    if (!number || !value || *value > quantity.most)
        return numbered_noun(words, quantity.probes, {}, quantity.allowed);
    Sentence sentence = of_kind(quantity.kind);
    sentence.action.number = *number;
    sentence.action.value = *value;
    return sentence;
}

int hexadecimal_byte(const std::string &text) {
    const bool is_byte = !text.empty() && text.size() <= 2 &&
                         text.find_first_not_of("0123456789ABCDEFabcdef") == std::string::npos;
    return is_byte ? std::stoi(text, nullptr, 16) : -1;
}

} // namespace

Sentence about_temperature(const std::vector<Word> &words) {
    static const std::vector<Verb> verbs = {{"latches", Kind::temperature_latches},
                                            {"faults", Kind::temperature_faults},
                                            {"recovers", Kind::temperature_recovers}};
    return about_probe(words, temperature, verbs);
}

Sentence about_voltage(const std::vector<Word> &words) {
    static const std::vector<Verb> verbs = {{"latches", Kind::voltage_latches},
                                            {"faults", Kind::voltage_faults},
                                            {"recovers", Kind::voltage_recovers}};
    return about_probe(words, voltage, verbs);
}

// The files of a thermal probe, which a driver that does not find its chip does not make.
Sentence about_sensor(const std::vector<Word> &words) {
    const auto number =
        words.size() < 2 ? std::nullopt : whole_number(words[1].text, 1, thermal_probes);
    if (!number)
        return wrong(fmt::format("sensor wants a number from 1 to {}", thermal_probes));
    const std::vector<Word> rest = without_first(words, 2);
    Sentence sentence = are(rest, {"is", "missing"}) ? of_kind(Kind::sensor_is_missing)
                        : are(rest, {"works", "again"})
                            ? of_kind(Kind::sensor_works)
                            : wrong(fmt::format("sensor {} is missing or works again", *number));
    sentence.action.number = *number;
    return sentence;
}

Sentence about_fan(const std::vector<Word> &words) {
    static const std::vector<Verb> verbs = {{"stops", Kind::fan_stops},
                                            {"recovers", Kind::fan_recovers}};
    const bool slows = words.size() == 4 && words[2].text == "slows";
    const auto speed = slows ? whole_number(words[3].text, least_speed, most_speed) : std::nullopt;
    if (!speed || !whole_number(words[1].text, 1, fans))
        return numbered_noun(words, fans, verbs, "slows R (1 to 9999), stops or recovers");
    Sentence sentence = of_kind(Kind::fan_slows);
    sentence.action.number = *whole_number(words[1].text, 1, fans);
    sentence.action.value = *speed;
    return sentence;
}

Sentence about_input(const std::vector<Word> &words) {
    const int byte =
        words.size() == 3 && words[1].text == "is" ? hexadecimal_byte(words[2].text) : -1;
    if (byte < 0)
        return wrong("input is HH, a byte in hexadecimal digits");
    Sentence sentence = of_kind(Kind::input_is);
    sentence.action.number = byte;
    return sentence;
}

} // namespace zavsim
