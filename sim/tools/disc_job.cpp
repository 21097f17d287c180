#include "tools/disc_job.hpp"

#include "root/clock.hpp"
#include "root/store.hpp"

#include <algorithm>
#include <csignal>
#include <unistd.h>

namespace zavsim {

namespace {

volatile std::sig_atomic_t noted_signal = 0;

void note(int number) {
    noted_signal = number;
}

} // namespace

void note_signals() {
    struct sigaction action {};
    action.sa_handler = note; // without SA_RESTART: a read that waits is to end
    for (const int number : {SIGTERM, SIGINT, SIGHUP})
        sigaction(number, &action, nullptr);
}

bool is_signalled() {
    return noted_signal != 0;
}

void end_by_signal() {
    signal(noted_signal, SIG_DFL);
    raise(noted_signal);
    _exit(128 + noted_signal);
}

std::optional<int> fails_at(const std::string &tool) {
    Turn turn;
    for (const ToolFault &fault : turn.state().faults)
        if (fault.tool == tool)
            return fault.fails_at;
    return std::nullopt;
}

JobRun::JobRun(DiscJob job) {
    Turn turn;
    State &state = turn.state();
    job.process = getpid();
    job.started = state.now;
    time_scale_ = state.time_scale;
    begun_ = machine_seconds();
    state.drive.job = job;
    turn.commit();
}

JobRun::~JobRun() {
    if (ended_)
        return;
    Turn turn;
    break_job(turn.state());
    turn.commit();
}

JobEnd JobRun::wait_until(double seconds) {
    constexpr double slice = 0.02;
    const double end = begun_ + seconds / time_scale_;
    for (;;) {
        const double left = end - machine_seconds();
        if (is_signalled())
            return JobEnd::signalled;
        if (access("/dev/sr0", F_OK) != 0)
            return JobEnd::drive_gone;
        if (left <= 0)
            return JobEnd::done;
        sleep_unscaled(std::min(left, slice));
    }
}

void JobRun::finish(const std::optional<DiscSession> &session) {
    Turn turn;
    OpticalDrive &drive = turn.state().drive;
    if (drive.job && session)
        drive.job->session = *session;
    finish_job(drive);
    turn.commit();
    ended_ = true;
}

JobEnd run_fixed_job(const DiscJob &job, const std::function<void(int percent)> &show) {
    const auto fault = fails_at(job.tool);
    if (fault == 0)
        return JobEnd::failed;
    JobRun run(job);
    for (int percent = 5; percent <= 100; percent += 5) {
        const int reached = std::min(percent, fault.value_or(100));
        const JobEnd end = run.wait_until(job.seconds * reached / 100);
        if (end != JobEnd::done)
            return end;
        if (fault && *fault <= percent)
            return JobEnd::failed;
        show(percent);
    }
    run.finish();
    return JobEnd::done;
}

} // namespace zavsim
