#include "model/advance.hpp"

#include "model/actions.hpp"
#include "model/arrays.hpp"
#include "model/driver_events.hpp"
#include "model/enclosures.hpp"
#include "model/ups.hpp"

#include <algorithm>
#include <limits>
#include <set>

namespace zavsim {

namespace {

constexpr double never = std::numeric_limits<double>::infinity();

bool wants_to_run(const Array &array) {
    return array.sync.kind != SyncKind::none && !array.sync.pending;
}

std::set<std::string> letters_of(const Array &array) {
    std::set<std::string> letters;
    for (const Member &member : array.members)
        if (member.role != Role::faulty)
            letters.insert(member.letter);
    return letters;
}

bool share_disks(const Array &one, const Array &other) {
    const auto letters = letters_of(one);
    for (const std::string &letter : letters_of(other))
        if (letters.count(letter) != 0)
            return true;
    return false;
}

// One rebuild at a time per disk: whoever asked later waits.
bool has_to_wait(const State &state, const Array &array) {
    return std::any_of(state.arrays.begin(), state.arrays.end(), [&array](const Array &other) {
        return wants_to_run(other) && other.sync.order < array.sync.order &&
               share_disks(array, other);
    });
}

void start_and_stop_syncs(State &state) {
    for (Array &array : state.arrays) {
        if (!wants_to_run(array))
            continue;
        const bool runs = !has_to_wait(state, array);
        if (runs && !array.sync.running)
            array.sync.started = state.now;
        array.sync.running = runs;
    }
}

double end_of_sync(const State &state, const Array &array) {
    if (!array.sync.running)
        return never;
    const double left = static_cast<double>(array.component_kib) - array.sync.done_kib;
    return state.now + left / state.rebuild_kib_per_second;
}

double next_turn(const State &state, double now) {
    double turn = std::min(now, next_rebuild_end(state));
    turn = std::min(turn, next_status(state));
    for (const Array &array : state.arrays)
        turn = std::min(turn, end_of_sync(state, array));
    if (!state.scenario.empty())
        turn = std::min(turn, std::max(state.now, state.scenario.front().at));
    return turn;
}

void finish_sync(const State &state, Array &array) {
    if (array.sync.kind == SyncKind::recovery)
        for (Member &member : array.members)
            if (member.role == Role::rebuilding)
                member.role = Role::in_sync;
    array.sync = Sync{};
    array.updated = state.now;
    array.events += 17;
}

void copy_data(State &state, double until) {
    const double kib = (until - state.now) * state.rebuild_kib_per_second;
    rebuild_volumes(state, until - state.now);
    state.now = until;
    for (Array &array : state.arrays) {
        if (!array.sync.running)
            continue;
        array.sync.done_kib += kib;
        // A rest that no clock can tell apart from the end is the end.
        if (array.sync.done_kib >= static_cast<double>(array.component_kib) - 1e-3)
            finish_sync(state, array);
    }
}

void play_due_events(State &state) {
    while (!state.scenario.empty() && state.scenario.front().at <= state.now) {
        const std::string sentence = state.scenario.front().sentence;
        state.scenario.erase(state.scenario.begin());
        perform_sentence(state, sentence);
    }
}

} // namespace

void advance(State &state, double now) {
    play_due_events(state);
    start_and_stop_syncs(state);
    while (state.now < now) {
        copy_data(state, next_turn(state, now));
        play_due_events(state);
        write_due_status(state);
        start_and_stop_syncs(state);
        look_for_changes(state);
    }
}

} // namespace zavsim
