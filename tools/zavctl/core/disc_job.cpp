#include "disc_job.h"

#include "verdict.h"

#include <fmt/format.h>

#include <algorithm>

namespace zavctl {

namespace {

constexpr int all_read = 99; // the tools' own percentages often end there
constexpr int step = 10;

Json tools_json(const std::vector<RunningTool> &tools) {
    Json json = Json::array();
    for (const RunningTool &tool : tools)
        json.push_back({{"tool", tool.name}, {"pid", tool.pid}});
    return json;
}

std::string progress_text(const ProgressReport &report) {
    if (!report.running.empty())
        return fmt::format("{} %, running: {}", report.percent.value_or(0),
                           tools_words(report.running));
    const std::string none = "no tool of the burner runs";
    return report.percent ? fmt::format("{}; the last job left {} %", none, *report.percent) : none;
}

std::string cancel_text(const CancelReport &report) {
    if (report.failure)
        return "nothing was cancelled: " + in_words(*report.failure);
    if (report.before.empty())
        return "nothing to cancel: no tool of the burner ran";
    if (report.after.empty())
        return "stopped: " + tools_words(report.before);
    return fmt::format("told to end: {}; still running: {}", tools_words(report.before),
                       tools_words(report.after));
}

} // namespace

std::string tools_words(const std::vector<RunningTool> &tools) {
    std::vector<std::string> words;
    words.reserve(tools.size());
    for (const RunningTool &tool : tools)
        words.push_back(fmt::format("{} ({})", tool.name, tool.pid));
    return listed(words);
}

Section progress_section(const ProgressReport &report) {
    const bool runs = !report.running.empty();
    const Json percent = report.percent ? Json(*report.percent) : Json(nullptr);
    Json json;
    json["kind"] = "progress";
    json["running"] = runs;
    json["percent"] = runs ? percent : Json(nullptr);
    json["left_percent"] = runs ? Json(nullptr) : percent;
    json["tools"] = tools_json(report.running);
    Section section;
    section.key = "progress";
    section.well = progress_text(report);
    add_verdict(json, Severity::ok, section.well, "", std::nullopt);
    section.records = json;
    return section;
}

Section cancel_section(const CancelReport &report) {
    const Severity severity = report.failure ? Severity::critical : Severity::ok;
    const std::string text = cancel_text(report);
    Json json;
    json["kind"] = "cancel";
    json["waited"] = report.waited;
    json["tools"] = tools_json(report.before);
    json["still_running"] = tools_json(report.after);
    add_verdict(json, severity, text, "", report.failure);
    Section section;
    section.key = "cancel";
    section.records = json;
    section.well = text;
    if (report.failure)
        section.findings = {{severity, text}};
    return section;
}

ActionReport eject_report(const std::optional<Failure> &failure) {
    ActionReport report;
    report.key = report.kind = "eject";
    report.done = "the drive was told to open its tray; nothing tells whether it did";
    report.what = "the drive was not told to open its tray";
    report.facts = Json::object();
    report.failure = failure;
    return report;
}

JobPhase JobCourse::phase_of(int percent) const {
    if (!has_progress_)
        return JobPhase::writing;
    if (percent <= 0)
        return JobPhase::start;
    return percent < all_read ? JobPhase::writing : JobPhase::closing;
}

std::string JobCourse::phase_words(JobPhase phase) const {
    if (phase == JobPhase::start)
        return "starting";
    return phase == JobPhase::closing ? "closing" : writing_;
}

// Neither a percentage that falls is told nor a phase that was left: a simulated progress goes its
// own way, and the file may still be an earlier job's.
std::string JobCourse::news(int percent) {
    const bool stale = !told_phase_ && percent >= all_read;
    const JobPhase phase = phase_of(stale ? 0 : percent);
    if (told_phase_ && phase < *told_phase_)
        return "";
    const int tens = stale ? 0 : percent / step * step;
    const bool grew = phase == JobPhase::writing && has_progress_ && tens > told_percent_;
    if (told_phase_ == phase && !grew)
        return "";
    told_phase_ = phase;
    told_percent_ = std::max(told_percent_, tens);
    if (phase != JobPhase::writing || !has_progress_)
        return phase_words(phase);
    return fmt::format("{}, {} %", phase_words(phase), grew ? tens : percent);
}

std::string JobCourse::line(int percent, std::chrono::seconds elapsed) const {
    const JobPhase phase = phase_of(percent);
    if (!has_progress_)
        return fmt::format("{}, {}; no progress is told", phase_words(phase), clock_words(elapsed));
    const std::optional<std::chrono::seconds> left = remaining_time(percent, elapsed);
    const std::string rest = left ? fmt::format(", about {} left", clock_words(*left)) : "";
    return fmt::format("{} {:3} %  {}, {}{}", progress_bar(percent), percent, phase_words(phase),
                       clock_words(elapsed), rest);
}

std::optional<std::chrono::seconds> remaining_time(int percent, std::chrono::seconds elapsed) {
    if (percent <= 0 || percent >= all_read)
        return std::nullopt;
    return elapsed * (100 - percent) / percent;
}

std::string clock_words(std::chrono::seconds time) {
    constexpr long per_unit = 60;
    const long seconds = time.count();
    const long minutes = seconds / per_unit;
    if (minutes < per_unit)
        return fmt::format("{}:{:02}", minutes, seconds % per_unit);
    return fmt::format("{}:{:02}:{:02}", minutes / per_unit, minutes % per_unit,
                       seconds % per_unit);
}

} // namespace zavctl
