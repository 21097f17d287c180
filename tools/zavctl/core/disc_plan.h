// Burning, erasing and formatting a disc: what it would do to this one, or why it is not begun.
// Facts in, a plan out, and afterwards what came of it. Nothing here touches the system.
#pragma once

#include "disc_job.h"
#include "disc_report.h"
#include "plan.h"

#include <optional>
#include <string>
#include <vector>

namespace zavctl {

struct SourceFact {
    std::string path; // absolute
    bool is_file = false;
    std::optional<int> kib; // by the same tool as the library's; none: not told
    std::string trouble;    // what could not be read of it, "" if all could
};

struct BurnRequest {
    SourceFact source;
    std::string name;                   // of the directory on the disc, "" for its root
    std::optional<SessionType> session; // none: what loses least
};

// What every job needs to know besides the disc.
struct BurnerFacts {
    DiscReport disc;
    bool tools_complete = true;             // as the library counts them
    std::vector<std::string> missing_tools; // of those
    std::vector<RunningTool> running;
};

// What counts for the session, and whether the library finds the source small enough.
struct BurnRoom {
    std::optional<int> source;
    std::optional<int> total;
    std::optional<int> free;
    bool free_counts = false; // else the total
    bool fits = false;
};

// A file is always an open session. Otherwise what was asked for, or open where the disc takes
// that, so that nothing is lost; else the first that it takes.
SessionType chosen_session(const BurnRequest &request, const DiscReport &disc);
BurnRoom burn_room(const BurnRequest &request, const DiscReport &disc);

Plan burn_plan(const BurnRequest &request, const BurnerFacts &facts);
Plan blank_plan(const BurnerFacts &facts);
Plan format_plan(const BurnerFacts &facts);

// A member "room" of the answer, without a text of its own.
Section room_section(const BurnRoom &room, SessionType session);

} // namespace zavctl
