// Reading the JSON records of an answer back.
#pragma once

#include "answer.h"

#include <optional>
#include <string>

namespace zavctl {

// "" if there is no such text.
std::string text_in(const Json &record, const char *field);

// The number as it is written, "" if there is none.
std::string number_in(const Json &record, const char *field);
std::optional<double> real_in(const Json &record, const char *field);

// The record's own; unknown if it has none.
Severity severity_in(const Json &record);

// The section whose records have that key, null if the answer has none.
const Section *section_named(const Answer &answer, const std::string &key);

// One record, or each of several.
template <class Use>
void for_each_record(const Section &section, const Use &use) {
    if (section.records.is_object())
        use(section.records);
    if (section.records.is_array())
        for (const Json &record : section.records)
            use(record);
}

} // namespace zavctl
