// What sentences are made of: words, numbers, verbs.
#pragma once

#include "model/sentences.hpp"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace zavsim {

struct Word {
    std::string text;
    bool quoted = false;
};

struct Words {
    std::vector<Word> list;
    std::string error;
};

// Splits at blanks; "..." is one word; # starts a comment.
Words split(const std::string &text);

std::optional<int> whole_number(const std::string &text, int least, int most);

// 0% to 100%
std::optional<int> percentage(const std::string &text);

// 12, 12.5, with so many places behind the point at most.
std::optional<double> decimal_number(const std::string &text, std::size_t places);

// 10s, 2m, 500ms, 1.5s
std::optional<double> duration(const std::string &text);

Sentence wrong(const std::string &error);
Sentence of_kind(Action::Kind kind);

std::vector<Word> without_first(const std::vector<Word> &words, std::ptrdiff_t count);
bool are(const std::vector<Word> &words, const std::vector<std::string> &texts);

struct Verb {
    const char *word;
    Action::Kind kind;
};

// "NOUN N VERB", with N from 1.
Sentence numbered_noun(const std::vector<Word> &words, int most, const std::vector<Verb> &verbs,
                       const std::string &allowed);

// Sentences about the hardware-RAID model.
Sentence about_controller(const std::vector<Word> &words);
Sentence about_unit(const std::vector<Word> &words);
Sentence about_report(const std::vector<Word> &words);

// Sentences about the sensors of the main board.
Sentence about_temperature(const std::vector<Word> &words);
Sentence about_sensor(const std::vector<Word> &words);
Sentence about_voltage(const std::vector<Word> &words);
Sentence about_fan(const std::vector<Word> &words);
Sentence about_input(const std::vector<Word> &words);

// Sentences about load, UPS, network and events.
Sentence about_file_system(const std::vector<Word> &words);
Sentence about_processor(const std::vector<Word> &words);
Sentence about_swap(const std::vector<Word> &words);
Sentence about_power(const std::vector<Word> &words);
Sentence about_ups(const std::vector<Word> &words);
Sentence about_port(const std::vector<Word> &words);
Sentence about_bond(const std::vector<Word> &words);
Sentence about_event(const std::vector<Word> &words);

Sentence about_drive(const std::vector<Word> &words);

} // namespace zavsim
