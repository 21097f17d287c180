#include "board.h"

#include "call.h"
#include "distortion.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <link.h>

namespace faults {

Board *board = nullptr;

namespace {

struct Range {
    std::uintptr_t begin = 0;
    std::uintptr_t end = 0;
};

int find_library(dl_phdr_info *info, size_t, void *found) {
    if (std::strstr(info->dlpi_name, "libzav.so") == nullptr)
        return 0;
    auto &range = *static_cast<Range *>(found);
    range.begin = info->dlpi_addr;
    for (int i = 0; i < info->dlpi_phnum; ++i)
        if (info->dlpi_phdr[i].p_type == PT_LOAD)
            range.end = info->dlpi_addr + info->dlpi_phdr[i].p_vaddr + info->dlpi_phdr[i].p_memsz;
    return 1;
}

const Range &library() {
    static const Range range = [] {
        Range found;
        dl_iterate_phdr(find_library, &found);
        return found;
    }();
    return range;
}

// Blocks the library holds. A plain table: memory cannot be asked for where memory is given out.
std::atomic<void *> blocks[4096];
std::atomic<int> points_before_this_call;

// 0, 1, or 2 for all that follow.
int occurrence_of(const Point &point, std::size_t count) {
    int seen = 0;
    for (auto i = count; seen < 2 && i > static_cast<std::size_t>(points_before_this_call); --i)
        seen += board->points[i - 1].caller == point.caller;
    return seen;
}

bool reached(const char *call, const void *caller, bool may_be_short, std::size_t output) {
    const int function = running_function();
    if (board == nullptr || function < 0 || board->finished || !in_library(caller))
        return false;
    const std::size_t index = board->count;
    if (index >= kMostPoints)
        return false;
    ++board->count;
    Point point = {call,         reinterpret_cast<std::uintptr_t>(caller) - library().begin,
                   function,     0,
                   may_be_short, output};
    point.occurrence = occurrence_of(point, index);
    board->points[index] = point;
    if (board->target < 0 || index != static_cast<std::size_t>(board->target))
        return false;
    board->fired = true;
    return true;
}

} // namespace

bool in_library(const void *caller) {
    const auto address = reinterpret_cast<std::uintptr_t>(caller);
    return address >= library().begin && address < library().end;
}

bool fails(const char *call, const void *caller) {
    return board != nullptr && !board->tools && reached(call, caller, false, 0);
}

bool fails(const char *call, const void *caller, bool &halved) {
    halved = false;
    if (board == nullptr || board->tools || !reached(call, caller, true, 0))
        return false;
    halved = board->fate == Fate::is_short;
    return !halved;
}

void answer_wrongly(harness::Outcome &outcome, const void *caller) {
    if (board != nullptr && board->tools &&
        reached("a command", caller, false, outcome.output.size()))
        distort_answer(outcome, board->fate, board->cut);
}

// Not where the sanitizer has the heap: nothing is told of what is given back there.
void block_given(void *memory, const void *caller) {
#ifdef __SANITIZE_ADDRESS__
    memory = nullptr;
#endif
    if (memory == nullptr || running_function() < 0 || !in_library(caller))
        return;
    for (auto &block : blocks) {
        void *none = nullptr;
        if (block.compare_exchange_strong(none, memory))
            return;
    }
    complain("more blocks than the table holds");
}

void block_returned(void *memory) {
    if (memory == nullptr || running_function() < 0)
        return;
    for (auto &block : blocks) {
        void *expected = memory;
        if (block.compare_exchange_strong(expected, nullptr))
            return;
    }
}

int blocks_held() {
    int held = 0;
    for (const auto &block : blocks)
        held += block.load() != nullptr;
    return held;
}

void begin_call() {
    points_before_this_call = static_cast<int>(board->count);
    for (auto &block : blocks)
        block = nullptr;
}

void complain(const char *format, ...) {
    if (board == nullptr || board->complaint[0] != '\0')
        return; // the first one counts
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(board->complaint, sizeof board->complaint, format, arguments);
    va_end(arguments);
}

} // namespace faults
