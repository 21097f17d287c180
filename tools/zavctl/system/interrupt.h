// Ctrl-C while a tool runs.
#pragma once

#include <chrono>

namespace zavctl {

// From here on an interrupt or a request to end ends this process with the tools that it has
// started. Without this the library's calls ignore an interrupt while their tool runs, the tool
// alone dies of it, and its end would be taken for an answer. Call before any thread is started.
void end_on_interrupt();

// Does not return once the end has begun: what the tools say that are being ended is no answer.
// Call before telling anything.
void stay_if_ending();

// While one of these lives, the machine is being changed: an interrupt is told of on the
// descriptor and does no more, since tools that are ended halfway would leave things behind that
// nobody knows.
class ChangeGuard {
  public:
    explicit ChangeGuard(int tell);
    ~ChangeGuard();
    ChangeGuard(const ChangeGuard &) = delete;
    ChangeGuard &operator=(const ChangeGuard &) = delete;
};

// While one of these lives, the program runs until it is asked to stop: the first interrupt is
// noted, so that what has begun is written, and a second one ends the process as ever, with
// `farewell` written to the descriptor before (what leaves the screen as it was). A second one that
// comes within `patience` after the first only has `reminder` written: what the first one began is
// under way, and cut short it would leave behind what it is to prevent.
class StopGuard {
  public:
    explicit StopGuard(int descriptor = -1, const char *farewell = "",
                       std::chrono::seconds patience = std::chrono::seconds(0),
                       const char *reminder = "");
    ~StopGuard();
    StopGuard(const StopGuard &) = delete;
    StopGuard &operator=(const StopGuard &) = delete;
};

// Whether an interrupt was noted.
bool stop_asked();

// Waits for so long, or until an interrupt is noted: true then.
bool stop_within(std::chrono::milliseconds time);

} // namespace zavctl
