#include "answer.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr int format_version = 1; // grows when a field changes its meaning or goes

// Valid JSON whatever bytes the texts hold.
std::string dumped(const Json &json, int indent) {
    return json.dump(indent, ' ', false, Json::error_handler_t::replace) + "\n";
}

std::vector<Finding> findings(const Answer &answer) {
    std::vector<Finding> all;
    for (const Section &section : answer.sections)
        all.insert(all.end(), section.findings.begin(), section.findings.end());
    std::stable_sort(all.begin(), all.end(),
                     [](const Finding &a, const Finding &b) { return a.severity > b.severity; });
    return all;
}

std::string verdict(Severity severity) {
    switch (severity) {
    case Severity::ok:
        return "OK";
    case Severity::warning:
        return "WARNING";
    case Severity::unknown:
        return "COULD NOT TELL";
    case Severity::critical:
        break;
    }
    return "CRITICAL";
}

std::string joined(const std::vector<std::string> &words, const char *separator) {
    return fmt::format("{}", fmt::join(words, separator));
}

std::string what_is_well(const Answer &answer) {
    std::vector<std::string> texts;
    for (const Section &section : answer.sections)
        if (!section.well.empty())
            texts.push_back(section.well);
    return joined(texts, ", ");
}

std::string what_is_wrong(const Answer &answer) {
    return joined(told_together(findings(answer)), "; ");
}

// A line keeps its mark and indentation when it is wrapped.
std::string line_text(const std::string &line, const Style &style) {
    constexpr std::size_t indent = 4;
    if (style.width <= indent || line.size() <= indent)
        return line + "\n";
    std::string out;
    for (const std::string &part : wrapped(line.substr(indent), style.width - indent))
        out += (out.empty() ? line.substr(0, indent) : std::string(indent, ' ')) + part + "\n";
    return out;
}

std::string summary_text(const Answer &answer, const Style &style) {
    const Severity worst = severity(answer);
    std::string out;
    const std::string line = summary(answer);
    for (const std::string &part : wrapped(line, style.width))
        out += (out.empty() ? "" : "    ") + part + "\n";
    const std::string word = verdict(worst);
    return coloured(word, worst, style) + out.substr(word.size());
}

Json findings_json(const Answer &answer) {
    Json list = Json::array();
    for (const Finding &finding : findings(answer))
        list.push_back({{"severity", word(finding.severity)}, {"text", finding.text}});
    return list;
}

} // namespace

Json to_json(const std::optional<Failure> &failure) {
    if (!failure)
        return nullptr;
    Json json;
    json["code"] = failure->code;
    json["name"] = failure->name.empty() ? Json(nullptr) : Json(failure->name);
    json["meaning"] = failure->meaning;
    return json;
}

std::string in_words(const Failure &failure) {
    if (failure.code < 0)
        return failure.meaning;
    const std::string number = failure.code < 0x1000 ? fmt::format("{}", failure.code)
                                                     : fmt::format("0x{:x}", failure.code);
    if (failure.name.empty())
        return fmt::format("{} (code {})", failure.meaning, number);
    return fmt::format("{} ({}, code {})", failure.meaning, failure.name, number);
}

std::string section_text(const Section &section, const Style &style) {
    std::string out;
    if (!section.title.empty())
        out += bold(section.title, style) + "\n";
    if (!section.table.empty())
        out += section.table.text(style);
    for (std::size_t i = 0; i < section.details.size(); ++i)
        out += (i > 0 ? "\n" : "") + section.details[i].text(style);
    for (const std::string &line : section.lines)
        out += line_text(line, style);
    return out;
}

Severity severity(const Answer &answer) {
    Severity worst = Severity::ok;
    for (const Section &section : answer.sections)
        for (const Finding &finding : section.findings)
            worst = worse(worst, finding.severity);
    return worst;
}

std::string summary(const Answer &answer) {
    const std::string wrong = what_is_wrong(answer);
    const std::string text = wrong.empty() ? what_is_well(answer) : wrong;
    const std::string word = verdict(severity(answer));
    return text.empty() ? word : word + ": " + text;
}

std::string to_text(const Answer &answer, const Style &style) {
    std::string out;
    if (!answer.heading.empty())
        out += bold(answer.heading, style) + "\n\n";
    for (const Section &section : answer.sections) {
        const std::string text = section_text(section, style);
        out += text.empty() ? "" : text + "\n";
    }
    return out + summary_text(answer, style);
}

std::string to_json(const Answer &answer) {
    Json json;
    json["format"] = format_version;
    json["command"] = answer.command;
    json["severity"] = word(severity(answer));
    json["exit_status"] = exit_status(severity(answer));
    json["summary"] = summary(answer);
    json["findings"] = findings_json(answer);
    for (const Section &section : answer.sections)
        if (!section.key.empty())
            json[section.key] = section.records;
    return dumped(json, 2);
}

std::string to_jsonl(const Answer &answer) {
    std::string out;
    for (const Section &section : answer.sections) {
        if (!section.records.is_array())
            out += dumped(section.records, -1);
        else
            for (const Json &record : section.records)
                out += dumped(record, -1);
    }
    return out;
}

} // namespace zavctl
