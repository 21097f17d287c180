#include "model/sentence_parts.hpp"

#include <algorithm>
#include <fmt/format.h>

namespace zavsim {

namespace {

char unescaped(char c) {
    return c == 'n' ? '\n' : c == 't' ? '\t' : c;
}

// Reads a quoted word from behind its opening quote; answers where it ended, or nothing.
std::optional<std::size_t> read_quoted(const std::string &text, std::size_t at, Word &word) {
    word.quoted = true;
    for (; at < text.size() && text[at] != '"'; ++at)
        if (text[at] == '\\' && at + 1 < text.size())
            word.text += unescaped(text[++at]);
        else
            word.text += text[at];
    if (at == text.size())
        return std::nullopt;
    return at + 1;
}

} // namespace

Words split(const std::string &text) {
    Words words;
    for (std::size_t at = 0; at < text.size();) {
        if (isspace(static_cast<unsigned char>(text[at])) != 0) {
            ++at;
            continue;
        }
        if (text[at] == '#')
            break;
        Word word;
        if (text[at] == '"') {
            const auto end = read_quoted(text, at + 1, word);
            if (!end)
                return {{}, "a quoted text has no end"};
            at = *end;
        } else {
            const std::size_t end = std::min(text.find_first_of(" \t\r", at), text.size());
            word.text = text.substr(at, end - at);
            at = end;
        }
        words.list.push_back(word);
    }
    return words;
}

std::optional<int> whole_number(const std::string &text, int least, int most) {
    if (text.empty() || text.size() > 4 ||
        text.find_first_not_of("0123456789") != std::string::npos)
        return std::nullopt;
    const int number = std::stoi(text);
    return number < least || number > most ? std::nullopt : std::optional(number);
}

std::optional<int> percentage(const std::string &text) {
    return text.empty() || text.back() != '%'
               ? std::nullopt
               : whole_number(text.substr(0, text.size() - 1), 0, 100);
}

std::optional<double> duration(const std::string &text) {
    const std::size_t end = std::min(text.find_first_not_of("0123456789."), text.size());
    const std::string digits = text.substr(0, end);
    const std::string unit = text.substr(end);
    const double factor = unit == "s" ? 1 : unit == "m" ? 60 : unit == "ms" ? 0.001 : 0;
    if (factor == 0 || digits.empty() || digits.size() > 9 || digits.front() == '.' ||
        std::count(digits.begin(), digits.end(), '.') > 1)
        return std::nullopt;
    return std::stod(digits) * factor;
}

std::optional<double> decimal_number(const std::string &text, std::size_t places) {
    const std::size_t point = std::min(text.find('.'), text.size());
    const std::string whole = text.substr(0, point);
    const std::string fraction = point == text.size() ? "0" : text.substr(point + 1);
    const auto is_digits = [](const std::string &part) {
        return !part.empty() && part.find_first_not_of("0123456789") == std::string::npos;
    };
    if (!is_digits(whole) || !is_digits(fraction) || whole.size() > 4 || fraction.size() > places)
        return std::nullopt;
    return std::stod(text);
}

Sentence wrong(const std::string &error) {
    return {{}, error};
}

std::vector<Word> without_first(const std::vector<Word> &words, std::ptrdiff_t count) {
    return {words.begin() + count, words.end()};
}

bool are(const std::vector<Word> &words, const std::vector<std::string> &texts) {
    if (words.size() != texts.size())
        return false;
    for (std::size_t i = 0; i < words.size(); ++i)
        if (words[i].text != texts[i])
            return false;
    return true;
}

Sentence of_kind(Action::Kind kind) {
    Action action;
    action.kind = kind;
    return {action, {}};
}

Sentence numbered_noun(const std::vector<Word> &words, int most, const std::vector<Verb> &verbs,
                       const std::string &allowed) {
    const std::string &noun = words[0].text;
    const auto number = words.size() < 2 ? std::nullopt : whole_number(words[1].text, 1, most);
    if (!number)
        return wrong(fmt::format("{} wants a number from 1 to {}", noun, most));
    for (const Verb &verb : verbs)
        if (words.size() == 3 && words[2].text == verb.word) {
            Sentence sentence = of_kind(verb.kind);
            sentence.action.number = *number;
            return sentence;
        }
    return wrong(fmt::format("{} {} {}", noun, *number, allowed));
}

} // namespace zavsim
