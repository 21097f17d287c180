// A job on the disc as its tool lives through it: it lasts, and may be broken off.
#pragma once

#include "model/optical.hpp"

#include <functional>
#include <optional>
#include <string>

namespace zavsim {

enum class JobEnd { done, failed, full, cut_short, signalled, drive_gone };

// From here on a signal that would end the process is only noted.
void note_signals();
bool is_signalled();
// Ends as the noted signal would have ended it.
[[noreturn]] void end_by_signal();

// At which percentage of its work a tool is to fail.
std::optional<int> fails_at(const std::string &tool);

// A job with the drive to itself: made, it is in the model. Unless it is finished it ends broken.
class JobRun {
  public:
    explicit JobRun(DiscJob job);
    ~JobRun();
    JobRun(const JobRun &) = delete;
    JobRun &operator=(const JobRun &) = delete;

    // Waits for that moment of the job, in appliance seconds since its beginning; says what came
    // between.
    JobEnd wait_until(double seconds);
    // With what was written, where that is only known now.
    void finish(const std::optional<DiscSession> &session = std::nullopt);

  private:
    double begun_ = 0; // by the machine's clock
    double time_scale_ = 1;
    bool ended_ = false;
};

// A job of a fixed length, with a sign of life at each twentieth of it.
JobEnd run_fixed_job(const DiscJob &job, const std::function<void(int percent)> &show);

} // namespace zavsim
