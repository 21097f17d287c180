#include "name_report.h"

#include "suggest.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>

namespace zavctl {

namespace {

std::optional<int> number(const std::string &word) {
    int value = 0;
    const auto [end, error] = std::from_chars(word.data(), word.data() + word.size(), value);
    if (error != std::errc() || end != word.data() + word.size())
        return std::nullopt;
    return value;
}

// "2:5", unit and number of a SAS device, as the address packs them.
std::optional<int> packed_number(const std::string &word) {
    const std::size_t colon = word.find(':');
    const auto unit = number(word.substr(0, colon));
    const auto disk = number(word.substr(colon + 1));
    if (!unit || !disk || *unit < 0 || *unit > 255 || *disk < 0 || *disk > 255)
        return std::nullopt;
    return (*unit << 8) | *disk;
}

bool is_type_word(const std::string &word) {
    const std::vector<std::string> words = type_words();
    return std::find(words.begin(), words.end(), word) != words.end();
}

std::string did_you_mean(const std::string &typed, const std::vector<std::string> &words) {
    const std::string near = nearest_word(typed, words);
    return near.empty() ? "It is one of " + listed(words) + "."
                        : fmt::format("Did you mean '{}'?", near);
}

const MinorType &minor_type(const std::string &type, const std::vector<std::string> &words,
                            std::size_t at) {
    if (at >= words.size())
        throw BadWords(
            fmt::format("'{}' is to be followed by one of {}", type, listed(minor_words(type))));
    const MinorType *minor = find_minor_type(type, words[at]);
    if (minor == nullptr)
        throw BadWords(fmt::format("'{}' is no kind of '{}'. {}", words[at], type,
                                   did_you_mean(words[at], minor_words(type))));
    return *minor;
}

int disk_number(const MinorType &minor, const std::vector<std::string> &words, std::size_t at) {
    if (at >= words.size())
        throw BadWords(
            fmt::format("'{} {}' is to be followed by a number", minor.type_word, minor.word));
    const bool packs = std::string(minor.word) == "sas" && words[at].find(':') != std::string::npos;
    const std::optional<int> disk = packs ? packed_number(words[at]) : number(words[at]);
    if (!disk)
        throw BadWords(fmt::format("'{}' is no number of a {}", words[at], minor.meaning));
    return *disk;
}

// Takes TYPE MINOR DISK [PART] from `at` on and moves it behind them.
zavDevice take_address(const std::vector<std::string> &words, std::size_t &at) {
    const MinorType &minor = minor_type(words[at], words, at + 1);
    zavDevice device{minor.type, minor.code, disk_number(minor, words, at + 2), 0};
    at += 3;
    if (at < words.size())
        if (const std::optional<int> part = number(words[at])) {
            device.part = *part;
            ++at;
        }
    return device;
}

// A word without a slash is a path only if it begins like an interface; a mistyped type is not.
void refuse_mistyped_type(const std::string &word) {
    if (word.empty() || word.find('/') != std::string::npos ||
        word.find_first_of("0123456789") != std::string::npos)
        return;
    const std::string near = nearest_word(word, type_words());
    if (!near.empty())
        throw BadWords(fmt::format("'{}' is no type of device. Did you mean '{}'?", word, near));
}

Json name_json(const NameReport &name) {
    Json json;
    json["kind"] = "name";
    json["asked"] = name.asked;
    json["address"] =
        name.failure && name.address.device.type == 0 ? Json(nullptr) : to_json(name.address);
    json["type_code"] = name.address.device.type;
    json["minor_type_code"] = name.address.device.minor_type;
    json["meaning"] = name.failure ? Json(nullptr) : Json(in_words(name.address.device));
    json["severity"] = word(name.failure ? Severity::unknown : Severity::ok);
    json["error"] = to_json(name.failure);
    return json;
}

} // namespace

std::vector<NameQuery> name_queries(const std::vector<std::string> &words) {
    std::vector<NameQuery> queries;
    for (std::size_t at = 0; at < words.size();) {
        if (is_type_word(words[at])) {
            queries.emplace_back(take_address(words, at));
        } else {
            refuse_mistyped_type(words[at]);
            queries.emplace_back(words[at++]);
        }
    }
    return queries;
}

std::string as_words(const zavDevice &device) {
    const MinorType *minor = find_minor_type(device.minor_type);
    if (minor == nullptr)
        return "";
    return fmt::format("{} {} {} {}", minor->type_word, minor->word, device.disk, device.part);
}

Section name_section(const std::vector<NameReport> &names) {
    Section section;
    section.key = "names";
    section.table = Table({"PATH", "ADDRESS", "MEANING"}, 2);
    for (const NameReport &name : names) {
        const bool refused = name.failure.has_value();
        const std::string &path = name.address.path;
        const std::string address = as_words(name.address.device);
        section.table.add(refused ? Severity::unknown : Severity::ok,
                          {refused && path.empty() && address.empty() ? printable(name.asked)
                           : path.empty()                             ? "-"
                                                                      : printable(path),
                           address.empty() ? "-" : address,
                           refused ? in_words(*name.failure) : in_words(name.address.device)});
        section.records.push_back(name_json(name));
        if (refused)
            section.findings.push_back(
                {Severity::unknown, fmt::format("'{}' is no device", printable(name.asked))});
    }
    section.well = fmt::format("{} converted", names.size());
    return section;
}

} // namespace zavctl
