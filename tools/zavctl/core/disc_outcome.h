// What came of a job of the burner: what the library answered, and what the disc shows then.
#pragma once

#include "disc_report.h"
#include "plan.h"

#include <optional>
#include <string>

namespace zavctl {

enum class DiscJob { burn, blank, format };

// How the process ended in which the library worked: it may end that process instead of answering.
struct ChildEnd {
    enum class How { answered, exited, signalled, not_started, timed_out };
    How how = How::not_started;
    int status = 0;      // exit status, or the signal
    std::string printed; // by the library and its tools
};

// "the library ended its process (exit status 1): open: No such file or directory".
std::string child_end_words(const ChildEnd &end);

struct JobFacts {
    DiscJob job = DiscJob::burn;
    SessionType session = SessionType::open; // of a burn
    DiscReport before;
    DiscReport after;
    ChildEnd end;
    std::optional<Failure> failure; // what the library returned, if it answered
    bool cancelled = false;         // by an interrupt
    std::optional<int> image_kib;   // how large the burned file system was to be, if that is known
};

// Kilobytes that an open session has put on a CD, by the room that is left: without the lead-in and
// lead-out, which cost room as well. None for other discs and sessions.
std::optional<int> written_to_cd(const JobFacts &facts);

// What a code means that a job returned.
std::string job_failure_meaning(int code);

Outcome job_outcome(const JobFacts &facts);

} // namespace zavctl
