// A job of the burner while it runs: its progress in percent and time, its tools.
#pragma once

#include "action_report.h"

#include <chrono>
#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct RunningTool {
    std::string name; // "growisofs"
    unsigned long pid = 0;
};

// "growisofs (812) and mkisofs (815)".
std::string tools_words(const std::vector<RunningTool> &tools);

// What a running job told when it was asked.
struct ProgressReport {
    std::optional<int> percent; // none: no job has left a progress
    std::vector<RunningTool> running;
};
Section progress_section(const ProgressReport &report);

// The tools before a job was cancelled, and those of them that still ran afterwards.
struct CancelReport {
    bool waited = false;
    std::vector<RunningTool> before;
    std::vector<RunningTool> after;
    std::optional<Failure> failure;
};
Section cancel_section(const CancelReport &report);

ActionReport eject_report(const std::optional<Failure> &failure);

enum class JobPhase { start, writing, closing };

// The course of one job. Percentages are what the tool has read of the source, so that the last
// ones come before the disc is closed. A job without any is told by its time alone.
class JobCourse {
  public:
    // `writing` names the phase in which the percentage grows: "writing", "erasing".
    explicit JobCourse(std::string writing, bool has_progress = true)
        : writing_(std::move(writing)), has_progress_(has_progress) {}

    // What is new since the last call, for a screen without a terminal: the phase that begins, and
    // each 10 %. "" for nothing.
    std::string news(int percent);

    // The line that is written over at a terminal.
    std::string line(int percent, std::chrono::seconds elapsed) const;

  private:
    JobPhase phase_of(int percent) const;
    std::string phase_words(JobPhase phase) const;

    std::string writing_;
    bool has_progress_ = true;
    std::optional<JobPhase> told_phase_;
    int told_percent_ = 0;
};

// By what has passed; none where nothing can be said yet, or nothing more.
std::optional<std::chrono::seconds> remaining_time(int percent, std::chrono::seconds elapsed);

// "0:07", "12:40", "1:02:03".
std::string clock_words(std::chrono::seconds time);

} // namespace zavctl
