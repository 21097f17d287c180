// Addresses and paths, turned into each other.
#pragma once

#include "answer.h"

#include <optional>
#include <stdexcept>
#include <string>
#include <variant>
#include <vector>

namespace zavctl {

// One thing to convert: a path, or an address.
using NameQuery = std::variant<std::string, zavDevice>;

// Words that are neither paths nor addresses.
class BadWords : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// Splits the words of the command line: paths stand alone, an address is TYPE MINOR DISK [PART].
// DISK of a SAS device may be UNIT:NUMBER. Throws BadWords.
std::vector<NameQuery> name_queries(const std::vector<std::string> &words);

struct NameReport {
    std::string asked; // as the caller wrote it: "/dev/sata/disk3p2", "hdd sata 3 2"
    Address address;
    std::optional<Failure> failure;
};

// How an address is written in words: "hdd sata 3 2".
std::string as_words(const zavDevice &device);

Section name_section(const std::vector<NameReport> &names);

} // namespace zavctl
