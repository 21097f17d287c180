// The library's functions about the optical drive. Those that query the disc may end their process,
// so that they are called in one of their own.
#pragma once

#include "../core/disc_checks.h"
#include "../core/disc_plan.h"
#include "job.h"

#include <chrono>
#include <optional>
#include <string>
#include <vector>

namespace zavctl {

DriveFacts read_drive();

// What is in the drive; no answer after the limit.
DiscReport query_disc(std::chrono::seconds limit);

// What a job needs to know before it begins.
BurnerFacts read_burner(const DiscReport &disc);
BurnerPlatform read_burner_platform();

// How large a source is, as the library measures it.
void measure(SourceFact &source, std::chrono::seconds limit);

// How large the file system is that would be burned; none if mkisofs does not tell.
std::optional<int> image_size(const SourceFact &source, std::chrono::seconds limit);

// The tools that zavCDBurnCancel ends, and those that no query starts, as far as they run.
std::vector<RunningTool> running_tools();

namespace library {

// Jobs, for the work of a process of its own: the codes as text, for `code_in`.
std::string burn(const BurnRequest &request, SessionType session);
std::string blank_disc();
std::string format_disc();
int code_in(const std::string &result);

std::optional<int> disc_progress(); // none: no job has begun
void cancel_job();
void cancel_job_and_wait();
void eject_disc();

} // namespace library

} // namespace zavctl
