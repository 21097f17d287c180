// The scenario language: a sentence says what happens, a line of a scenario also when.
#pragma once

#include "model/action.hpp"
#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

struct Sentence {
    Action action;
    std::string error; // empty when the sentence was understood
};

struct Scenario {
    std::vector<Event> events;       // by time
    std::vector<std::string> errors; // "file:line: message"
};

Sentence parse_sentence(const std::string &text);
Scenario parse_scenario(const std::string &text, const std::string &file);

// Tools whose faults a sentence can name.
const std::vector<std::string> &known_tools();

// Puts a sentence together from words of a command line, quoting those that need it.
std::string join_words(const std::vector<std::string> &words);

} // namespace zavsim
