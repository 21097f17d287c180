#include "verdict.h"

#include <fmt/format.h>

namespace zavctl {

void add_verdict(Json &json, Severity severity, const std::string &note, const std::string &doubt,
                 const std::optional<Failure> &failure) {
    json["severity"] = word(severity);
    json["note"] = note;
    json["doubt"] = doubt.empty() ? Json(nullptr) : Json(doubt);
    json["error"] = to_json(failure);
}

void add_verdict(Details &details, const std::string &note, const std::string &doubt) {
    if (!note.empty())
        details.add("Note", note);
    if (!doubt.empty())
        details.add("Doubt", doubt, Severity::unknown);
}

std::string counted(std::size_t count, const std::string &noun, const std::string &is) {
    return fmt::format("{} {}{} {}", count, noun, count == 1 ? "" : "s", is);
}

} // namespace zavctl
