// The answer to one command line, and its three forms: text, JSON, JSON lines.
#pragma once

#include "address.h"
#include "severity.h"
#include "text.h"

#include "zav_event.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

// A call of the library that gave no answer.
struct Failure {
    int code = 0;        // what the library returned; -1: it did not answer in time
    std::string name;    // the name of the code, "" if it has none
    std::string meaning; // in words
};

// {"code", "name", "meaning"}, or null without a failure.
Json to_json(const std::optional<Failure> &failure);

// "no answer from the library: ZAV_RC_ERR_EINVAL (22), argument refused"
std::string in_words(const Failure &failure);

// One kind of thing on the screen: the disks, the arrays, the checks.
struct Section {
    std::string title; // heading on the screen, "" for none
    std::string key;   // member of the JSON object that holds `records`
    Table table;
    std::vector<Details> details;
    std::vector<std::string> lines; // said as they stand, below the table
    Json records = Json::array();   // one per thing, or one object
    std::vector<Finding> findings;  // what is not well
    std::string well;               // what to say when nothing is wrong: "4 disks found"

    // The library's own records of the things, as it answered them; none of what gave no answer.
    // `watch --push` hands them to the event driver.
    std::vector<zavSystemEvent> events{};
};

struct Answer {
    std::string command; // "disk list"
    std::string heading; // first line of the screen, "" for none
    std::vector<Section> sections;
};

Severity severity(const Answer &answer);

// "Critical: disk 3 is absent; array 2 is degraded", "OK: 4 disks found, 3 arrays normal". The
// worst come first.
std::string summary(const Answer &answer);

std::string section_text(const Section &section, const Style &style);
std::string to_text(const Answer &answer, const Style &style);
std::string to_json(const Answer &answer);  // one object, indented
std::string to_jsonl(const Answer &answer); // one record per line

} // namespace zavctl
