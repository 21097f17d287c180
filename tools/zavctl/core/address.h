// Device addresses in words.
#pragma once

#include "zav.h"

#include <nlohmann/json.hpp>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace zavctl {

using Json = nlohmann::ordered_json;

// A device address with the path that the library gives it ("" if it has none).
struct Address {
    zavDevice device{};
    std::string path;
};

struct MinorType {
    int type;
    int code;
    const char *type_word;
    const char *word;
    const char *meaning; // "SATA disk"
};

// Every minor type, in the order of the codes.
const std::vector<MinorType> &minor_types();

// The entry of a pair of words, or of a code; null if there is none.
const MinorType *find_minor_type(const std::string &type_word, const std::string &word);
const MinorType *find_minor_type(int code);

std::vector<std::string> type_words();
std::vector<std::string> minor_words(const std::string &type_word);

// "PrimaryOSVG", "DataVG3".
std::string group_name(int number);

// The number of a group's name; none for another name.
std::optional<int> group_number(std::string_view name);

// "partition 2 of SATA disk 3", "volume 3 of group DataVG2", "Ethernet port eth0".
std::string in_words(const zavDevice &device);

// {"type", "minor_type", "disk", "part", "path"}; words are null for types without a name, the
// path is null if the address has none.
Json to_json(const Address &address);

} // namespace zavctl
