#include "record.h"

#include <algorithm>

namespace zavctl {

std::string text_in(const Json &record, const char *field) {
    const auto found = record.find(field);
    return found != record.end() && found->is_string() ? found->get<std::string>() : "";
}

std::string number_in(const Json &record, const char *field) {
    const auto found = record.find(field);
    return found != record.end() && found->is_number() ? found->dump() : "";
}

Severity severity_in(const Json &record) {
    const std::string said = text_in(record, "severity");
    for (const Severity one : {Severity::ok, Severity::warning, Severity::critical})
        if (said == word(one))
            return one;
    return Severity::unknown;
}

std::optional<double> real_in(const Json &record, const char *field) {
    const auto found = record.find(field);
    return found != record.end() && found->is_number() ? std::optional(found->get<double>())
                                                       : std::nullopt;
}

const Section *section_named(const Answer &answer, const std::string &key) {
    const auto found = std::find_if(answer.sections.begin(), answer.sections.end(),
                                    [&key](const Section &section) { return section.key == key; });
    return found == answer.sections.end() ? nullptr : &*found;
}

} // namespace zavctl
