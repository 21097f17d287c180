#include "array_table.h"

#include "text.h"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <sstream>

namespace zavctl {

namespace {

using Hold = ArrayMember::Hold;

constexpr std::string_view node_directory = "/dev/";
constexpr std::size_t longest_array_name = 31; // the library leaves out what is longer

// The levels that the library takes members out of or tears down.
constexpr const char *known_levels[] = {"raid0", "raid1", "raid5", "raid10", "linear"};

int number_in(const std::string &word) {
    int value = -1;
    const auto [end, error] = std::from_chars(word.data(), word.data() + word.size(), value);
    return error == std::errc() && end == word.data() + word.size() ? value : -1;
}

std::vector<std::string> fields_of(const std::string &line) {
    std::istringstream stream(line);
    return {std::istream_iterator<std::string>(stream), {}};
}

bool is_row(const std::vector<std::string> &fields) {
    return fields.size() >= 5 && number_in(fields[1]) >= 0 && number_in(fields[2]) >= 0 &&
           (number_in(fields[0]) >= 0 || fields[0] == "-");
}

bool holds(const std::vector<std::string> &fields, const char *word) {
    return std::find(fields.begin(), fields.end(), word) != fields.end();
}

Hold hold_in(const std::vector<std::string> &fields) {
    if (holds(fields, "faulty"))
        return Hold::faulty;
    if (holds(fields, "rebuilding"))
        return Hold::rebuilding;
    return holds(fields, "active") ? Hold::active : Hold::spare;
}

ArrayMember member_in(const std::vector<std::string> &fields) {
    ArrayMember member;
    member.hold = hold_in(fields);
    member.number = number_in(fields[0]);
    member.place = number_in(fields[3]);
    if (fields.back().starts_with(node_directory))
        member.node = fields.back().substr(node_directory.size());
    return member;
}

std::vector<ArrayMember> members_in(std::string_view detail) {
    std::vector<ArrayMember> members;
    std::istringstream lines{std::string(detail)};
    for (std::string line; std::getline(lines, line);) {
        const std::vector<std::string> fields = fields_of(line);
        if (is_row(fields) && !holds(fields, "removed"))
            members.push_back(member_in(fields));
    }
    return members;
}

// What stands behind the name, up to the end of the line.
std::string value_in(std::string_view detail, std::string_view name) {
    const std::size_t at = detail.find(name);
    if (at == std::string_view::npos)
        return "";
    const std::size_t begin = at + name.size();
    return trimmed(detail.substr(begin, std::min(detail.find('\n', begin), detail.size()) - begin));
}

bool active_beside(const ArrayMember &member, int slot) {
    return member.hold == Hold::active && (member.slot != slot || slot == 0);
}

int active_without(const ArrayTable &table, int slot) {
    return static_cast<int>(
        std::count_if(table.members.begin(), table.members.end(),
                      [slot](const ArrayMember &member) { return active_beside(member, slot); }));
}

// Disks 1 and 2 of the layout hold the same, and so on.
int active_in_pair(const ArrayTable &table, int pair, int slot) {
    return static_cast<int>(std::count_if(
        table.members.begin(), table.members.end(), [pair, slot](const ArrayMember &member) {
            return member.place / 2 == pair && member.place >= 0 && active_beside(member, slot);
        }));
}

bool every_pair_has(int wanted, const ArrayTable &table, int slot) {
    for (int pair = 0; pair < table.places / 2; ++pair)
        if (active_in_pair(table, pair, slot) < wanted)
            return false;
    return table.places % 2 == 0 && table.places > 0;
}

bool enough(const ArrayTable &table, int slot, int spare) {
    const int active = active_without(table, slot);
    if (table.level == "raid1")
        return active >= 1 + spare;
    if (table.level == "raid5")
        return table.places > 0 && active >= table.places - 1 + spare;
    return table.level == "raid10" && every_pair_has(1 + spare, table, slot);
}

} // namespace

ArrayTable table_in_detail(std::string_view detail) {
    return {value_in(detail, "Raid Level :"),
            std::max(0, number_in(value_in(detail, "Raid Devices :"))), members_in(detail)};
}

void add_nodes(ArrayTable &table, std::string_view mdstat_block) {
    for (ArrayMember &member : table.members) {
        const std::size_t end = mdstat_block.find("[" + std::to_string(member.number) + "]");
        if (!member.node.empty() || member.number < 0 || end == std::string_view::npos)
            continue;
        const std::size_t begin = mdstat_block.find_last_of(" \n", end);
        member.node = mdstat_block.substr(begin + 1, end - begin - 1);
    }
}

std::string word(Hold hold) {
    switch (hold) {
    case Hold::active:
        return "active";
    case Hold::rebuilding:
        return "rebuilding";
    case Hold::spare:
        return "spare";
    case Hold::faulty:
        break;
    }
    return "faulty";
}

const ArrayMember *member_of_slot(const ArrayTable &table, int slot) {
    for (const ArrayMember &member : table.members)
        if (member.slot == slot)
            return &member;
    return nullptr;
}

bool survives_without(const ArrayTable &table, int slot) {
    return enough(table, slot, 0);
}

bool redundant_without(const ArrayTable &table, int slot) {
    return enough(table, slot, 1);
}

ScanWords words_of_scan(std::string_view scan) {
    std::string text(scan);
    std::replace(text.begin(), text.end(), '=', ' ');
    ScanWords words;
    for (const std::string &word : fields_of(text)) {
        if (words.array.empty() && word.starts_with("/dev/md")) {
            if (word.size() > longest_array_name)
                return {};
            words.array = word;
        } else if (!words.array.empty() && words.level.empty() &&
                   std::find(std::begin(known_levels), std::end(known_levels), word) !=
                       std::end(known_levels)) {
            words.level = word;
        }
    }
    return words;
}

} // namespace zavctl
