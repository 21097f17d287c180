#include "watch.h"

#include "text.h"

#include <fmt/format.h>

#include <algorithm>
#include <sstream>

namespace zavctl {

namespace {

// "sdc2[2](F)": the partition's name, and what the kernel says about it.
Sight member_sight(const std::string &word, const std::string &array, const NodeNames &names) {
    const std::string node = word.substr(0, word.find('['));
    const auto known = names.find(node);
    const std::string name = known == names.end() ? printable(node) : known->second;
    std::string state = "is in";
    if (word.find("(F)") != std::string::npos)
        state = "is faulty in";
    else if (word.find("(S)") != std::string::npos)
        state = "is a spare of";
    return {fmt::format("{} {}", array, node), fmt::format("{} {} {}", name, state, array),
            fmt::format("{} is out of {}", name, array)};
}

void add_line(const std::string &line, const NodeNames &names, std::vector<Sight> &sights) {
    std::istringstream words(line);
    std::string array;
    words >> array;
    if (!array.starts_with("md") || line.starts_with(" "))
        return;
    array = printable(array);
    sights.push_back({array, array + " runs", array + " does not run any more"});
    for (std::string word; words >> word;)
        if (word.find('[') != std::string::npos)
            sights.push_back(member_sight(word, array, names));
}

const Sight *find(const std::vector<Sight> &sights, const std::string &what) {
    const auto it = std::find_if(sights.begin(), sights.end(),
                                 [&what](const Sight &sight) { return sight.what == what; });
    return it == sights.end() ? nullptr : &*it;
}

} // namespace

std::vector<Sight> sights_in_mdstat(std::string_view mdstat, const NodeNames &names) {
    std::vector<Sight> sights;
    std::istringstream lines{std::string(mdstat)};
    for (std::string line; std::getline(lines, line);)
        add_line(line, names, sights);
    return sights;
}

std::vector<std::string> differences(const std::vector<Sight> &before,
                                     const std::vector<Sight> &after) {
    std::vector<std::string> texts;
    for (const Sight &sight : before)
        if (find(after, sight.what) == nullptr)
            texts.push_back(sight.gone);
    for (const Sight &sight : after) {
        const Sight *old = find(before, sight.what);
        if (old == nullptr || old->state != sight.state)
            texts.push_back(sight.state);
    }
    return texts;
}

std::string seen_line(std::chrono::seconds elapsed, const std::string &text) {
    return fmt::format("  {:4} s  {}\n", elapsed.count(), text);
}

std::string tool_lines(std::string_view output) {
    std::string text;
    while (!output.empty()) {
        const std::size_t end = std::min(output.find('\n'), output.size());
        const std::string line = trimmed(output.substr(0, end));
        if (!line.empty())
            text += "          | " + printable(line) + "\n";
        output.remove_prefix(std::min(end + 1, output.size()));
    }
    return text;
}

} // namespace zavctl
