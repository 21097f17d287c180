#include "model/sentences.hpp"

#include "model/sentence_parts.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>
#include <optional>
#include <set>
#include <sstream>

namespace zavsim {

namespace {

Sentence about_disk(const std::vector<Word> &words) {
    static const std::vector<Verb> verbs = {
        {"fails", Action::Kind::disk_fails},       {"vanishes", Action::Kind::disk_vanishes},
        {"appears", Action::Kind::disk_appears},   {"joins", Action::Kind::disk_joins},
        {"detaches", Action::Kind::disk_detaches}, {"attaches", Action::Kind::disk_attaches}};
    return numbered_noun(words, 4, verbs, "fails, vanishes, appears, joins, detaches or attaches");
}

Sentence about_array(const std::vector<Word> &words) {
    static const std::vector<Verb> verbs = {{"checks", Action::Kind::array_checks},
                                            {"repairs", Action::Kind::array_repairs},
                                            {"stops", Action::Kind::array_stops}};
    return numbered_noun(words, 4, verbs, "checks, repairs or stops");
}

// "1-2": the second volume of the first data group; group 0 is the system's.
bool read_volume_number(const std::string &text, Action &action) {
    const std::size_t hyphen = std::min(text.find('-'), text.size());
    const auto group = whole_number(text.substr(0, hyphen), 0, 99);
    const auto number = whole_number(hyphen == text.size() ? "" : text.substr(hyphen + 1), 1, 99);
    action.group = group.value_or(0);
    action.number = number.value_or(0);
    return group && number;
}

Sentence volume_state(Action action, const std::string &verb, const std::string &object) {
    static constexpr std::array<Verb, 4> states = {{{"active", Action::Kind::volume_is_active},
                                                    {"inactive", Action::Kind::volume_is_inactive},
                                                    {"busy", Action::Kind::volume_is_busy},
                                                    {"idle", Action::Kind::volume_is_idle}}};
    for (const Verb &each : states)
        if (verb == "is" && object == each.word) {
            action.kind = each.kind;
            return {action, {}};
        }
    if (verb != "fills" || !percentage(object))
        return wrong(fmt::format("volume {}-{} fills N% (0 to 100), is active, is inactive, "
                                 "is busy or is idle",
                                 action.group, action.number));
    action.kind = Action::Kind::volume_fills;
    action.percent = *percentage(object);
    return {action, {}};
}

Sentence about_volume(const std::vector<Word> &words) {
    Action action;
    if (words.size() < 2 || !read_volume_number(words[1].text, action))
        return wrong("volume wants group and volume, such as 1-2 (group 0 is the system's)");
    return words.size() == 4 ? volume_state(action, words[2].text, words[3].text)
                             : volume_state(action, {}, {});
}

bool known(const std::string &tool) {
    const auto &tools = known_tools();
    return std::find(tools.begin(), tools.end(), tool) != tools.end();
}

Sentence tool_state(Action action, const Word &verb_word, const Word &object_word) {
    const std::string &verb = verb_word.text;
    const std::string &object = object_word.text;
    if (verb == "is" && object == "missing") {
        action.kind = Action::Kind::tool_is_missing;
    } else if (verb == "works" && object == "again") {
        action.kind = Action::Kind::tool_works;
    } else if (verb == "hangs" && duration(object)) {
        action.kind = Action::Kind::tool_hangs;
        action.seconds = *duration(object);
    } else if (verb == "prints" && object_word.quoted) {
        action.kind = Action::Kind::tool_prints;
        action.text = object;
    } else if (verb == "exits" && whole_number(object, 0, 255)) {
        action.kind = Action::Kind::tool_exits;
        action.status = *whole_number(object, 0, 255);
    } else {
        return wrong(fmt::format(
            "tool {} hangs 30s, prints \"text\", exits N (0 to 255), is missing or works again; a "
            "disc tool also fails at N%",
            action.tool));
    }
    return {action, {}};
}

// Of tools that work on for a while.
Sentence failing_tool(Action action, const std::string &how_far) {
    static const std::set<std::string> lengthy = {
        "growisofs", "mkisofs", "cdrecord", "dvd+rw-format", "mkudffs", "cdrwtool", "pktsetup"};
    const auto percent = percentage(how_far);
    if (!percent || lengthy.count(action.tool) == 0)
        return wrong(fmt::format("only {} fail at N% (0 to 100)", fmt::join(lengthy, ", ")));
    action.kind = Action::Kind::tool_fails;
    action.percent = *percent;
    return {action, {}};
}

Sentence about_tool(const std::vector<Word> &words) {
    if (words.size() < 2 || !known(words[1].text))
        return wrong(fmt::format("tool wants one of: {}", fmt::join(known_tools(), ", ")));
    Action action;
    action.tool = words[1].text;
    if (words.size() == 5 && words[2].text == "fails" && words[3].text == "at")
        return failing_tool(action, words[4].text);
    return words.size() == 4 ? tool_state(action, words[2], words[3]) : tool_state(action, {}, {});
}

struct Noun {
    const char *word;
    Sentence (*read)(const std::vector<Word> &words);
};

constexpr std::array<Noun, 21> nouns = {{{"disk", about_disk},
                                         {"array", about_array},
                                         {"volume", about_volume},
                                         {"controller", about_controller},
                                         {"unit", about_unit},
                                         {"report", about_report},
                                         {"temperature", about_temperature},
                                         {"sensor", about_sensor},
                                         {"voltage", about_voltage},
                                         {"fan", about_fan},
                                         {"input", about_input},
                                         {"file", about_file_system},
                                         {"processor", about_processor},
                                         {"swap", about_swap},
                                         {"power", about_power},
                                         {"ups", about_ups},
                                         {"port", about_port},
                                         {"bond", about_bond},
                                         {"event", about_event},
                                         {"drive", about_drive},
                                         {"tool", about_tool}}};

std::string list_of_nouns() {
    std::string list;
    for (const Noun &noun : nouns)
        list += fmt::format("{}{}",
                            list.empty()             ? ""
                            : &noun == &nouns.back() ? " or "
                                                     : ", ",
                            noun.word);
    return list;
}

Sentence from_words(const std::vector<Word> &words) {
    const std::string first = words.empty() ? "" : words.front().text;
    for (const Noun &noun : nouns)
        if (first == noun.word)
            return noun.read(words);
    return wrong("a sentence begins with " + list_of_nouns());
}

// One line of a scenario: nothing, or "at TIME SENTENCE".
std::string read_line(const std::string &line, std::vector<Event> &events) {
    const Words words = split(line);
    if (!words.error.empty() || words.list.empty())
        return words.error;
    const auto at = words.list.size() < 2 ? std::nullopt : duration(words.list[1].text);
    if (words.list[0].text != "at" || !at)
        return "a line reads: at 10s SENTENCE (times in s, m or ms)";
    const Sentence sentence = from_words({words.list.begin() + 2, words.list.end()});
    if (!sentence.error.empty())
        return sentence.error;
    std::vector<std::string> texts;
    for (auto word = words.list.begin() + 2; word != words.list.end(); ++word)
        texts.push_back(word->text);
    events.push_back({*at, join_words(texts)});
    return {};
}

std::string quoted(const std::string &word) {
    std::string text = "\"";
    for (char c : word)
        text += c == '\n'               ? std::string("\\n")
                : c == '\t'             ? std::string("\\t")
                : c == '"' || c == '\\' ? std::string("\\") + c
                                        : std::string(1, c);
    return text + '"';
}

} // namespace

const std::vector<std::string> &known_tools() {
    static const std::vector<std::string> tools = {"mdadm",       "smartctl",
                                                   "mknod",       "vgs",
                                                   "lvs",         "pvs",
                                                   "vgdisplay",   "lvdisplay",
                                                   "pvdisplay",   "vgcreate",
                                                   "vgextend",    "vgremove",
                                                   "vgcfgbackup", "vgchange",
                                                   "lvcreate",    "lvremove",
                                                   "lvchange",    "pvcreate",
                                                   "pvremove",    "udevinfo",
                                                   "sfdisk",      "dd",
                                                   "df",          "mount",
                                                   "umount",      "mkfs.ext4",
                                                   "hbqSetup.sh", "query_sas.sh",
                                                   "ethtool",     "dvd+rw-mediainfo",
                                                   "cdrecord",    "mkisofs",
                                                   "growisofs",   "dvd+rw-format",
                                                   "cdrwtool",    "pktsetup",
                                                   "mkudffs",     "killall",
                                                   "du"};
    return tools;
}

std::string join_words(const std::vector<std::string> &words) {
    std::string sentence;
    for (std::size_t i = 0; i < words.size(); ++i) {
        const bool is_text = i > 0 && words[i - 1] == "prints";
        sentence += (i == 0 ? "" : " ") + (is_text ? quoted(words[i]) : words[i]);
    }
    return sentence;
}

Sentence parse_sentence(const std::string &text) {
    const Words words = split(text);
    return words.error.empty() ? from_words(words.list) : wrong(words.error);
}

Scenario parse_scenario(const std::string &text, const std::string &file) {
    Scenario scenario;
    std::istringstream in(text);
    std::string line;
    for (int number = 1; std::getline(in, line); ++number) {
        const std::string error = read_line(line, scenario.events);
        if (!error.empty())
            scenario.errors.push_back(fmt::format("{}:{}: {}", file, number, error));
    }
    std::stable_sort(scenario.events.begin(), scenario.events.end(),
                     [](const Event &a, const Event &b) { return a.at < b.at; });
    return scenario;
}

} // namespace zavsim
