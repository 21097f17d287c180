// What the program that lets calls fail knows of a run: which calls the library made, which of them
// is to fail, and what was found afterwards. Shared between the process that runs and the one that
// plans.
#pragma once

#include "harness.h"

#include <cstddef>
#include <cstdint>

namespace faults {

// What becomes of the call.
enum class Fate : int {
    fails,
    is_short, // a read or a write does half of what it was asked for
    // The command that it runs answers wrongly:
    is_missing,
    is_not_executable,
    prints_nothing,
    ends_no_line,
    prints_long_lines,
    prints_nuls,
    prints_garbage,
    ends_with_an_error,
    is_killed,
    warns_first,
    speaks_another_language,
    ends_lines_twice, // with a carriage return, too
    repeats_itself,
    tells_huge_numbers,
    tells_negative_numbers,
    is_cut, // after the bytes that the board says
};
constexpr Fate kFirstWrongAnswer = Fate::is_missing;

// One call of the C library by the library.
struct Point {
    const char *call;      // "popen"
    std::uintptr_t caller; // where in the library
    int function;          // the exported function that was called, by its number
    int occurrence;        // of that place within that call, 2 from the third on
    bool may_be_short;
    std::size_t output; // bytes that the command has printed
};

constexpr std::size_t kMostPoints = 20000;
constexpr std::size_t kMostFunctions = 160;

struct Board {
    int target;        // the point that is to fail, -1: none
    Fate fate;         // how
    std::size_t cut;   // where, see Fate::is_cut
    bool tools;        // commands that answer are met, not calls that fail
    bool fired;        // it has
    bool finished;     // the call in which it has is over
    bool overlapping;  // several threads were in the library at once: points have no order
    std::size_t count; // of points
    bool called[kMostFunctions];
    char complaint[512]; // "" if nothing is wrong
    Point points[kMostPoints];
};

extern Board *board;

// Is the call to fail? Counts it, if it is one of the library's.
bool fails(const char *call, const void *caller);
// The same for a call that may also do half of its work.
bool fails(const char *call, const void *caller, bool &halved);

// The program's command: what it printed and how it ended.
void answer_wrongly(harness::Outcome &outcome, const void *caller);

const char *name_of(Fate fate);

// Heap blocks that the library has asked for.
void block_given(void *memory, const void *caller);
void block_returned(void *memory);

// Is the code at this address the library's?
bool in_library(const void *caller);

void complain(const char *format, ...) __attribute__((format(printf, 1, 2)));

} // namespace faults
