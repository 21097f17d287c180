#include "event_report.h"

#include "text.h"
#include "verdict.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

std::string marked(const zavSystemEvent &event) {
    return fmt::format(" {}  {}", mark(event_severity(event)), printable(event_text(event)));
}

} // namespace

Section taken_section(const std::vector<ReceivedEvent> &events, const PathOf &path_of) {
    Section section;
    section.key = "events";
    for (const ReceivedEvent &one : events) {
        section.records.push_back(event_json(one.event, one.received, path_of));
        section.lines.push_back(marked(one.event));
    }
    section.well =
        events.empty() ? "no event is pending" : counted(events.size(), "event", "taken");
    return section;
}

Section pushed_section(const std::vector<PushedEvent> &events, const PathOf &path_of) {
    Section section;
    section.key = "events";
    for (const PushedEvent &one : events) {
        Json record = event_json(one.event, "", path_of);
        record["pushed"] = one.failure.empty();
        section.records.push_back(record);
        section.lines.push_back(marked(one.event));
        if (!one.failure.empty())
            section.findings.push_back(
                {Severity::critical,
                 fmt::format("{} was not pushed: {}", printable(event_subject(one.event)),
                             one.failure)});
    }
    section.well = events.empty() ? "nothing to push" : counted(events.size(), "event", "pushed");
    return section;
}

std::string event_line(const ReceivedEvent &event, const Style &style) {
    const Severity bad = event_severity(event.event);
    const std::string text = printable(event_text(event.event));
    return fmt::format("{}  {}  {}\n", event.received, coloured(mark(bad), bad, style),
                       bad == Severity::ok ? text : coloured(text, bad, style));
}

std::string event_json_line(const ReceivedEvent &event, const PathOf &path_of) {
    return event_json(event.event, event.received, path_of)
               .dump(-1, ' ', false, Json::error_handler_t::replace) +
           "\n";
}

} // namespace zavctl
