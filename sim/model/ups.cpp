#include "model/ups.hpp"

#include "model/texts.hpp"

#include <algorithm>
#include <fmt/format.h>
#include <limits>

namespace zavsim {

namespace {

using Kind = Action::Kind;

constexpr double seconds_between_statuses = 60;
constexpr double discharge_seconds = 10; // for a percent
constexpr double recharge_seconds = 30;
constexpr double minutes_per_percent = 0.42; // that the battery lasts

// Numbers of the hook's states.
constexpr int on_battery = 5;
constexpr int online = 7;

// Readers go by their own clock, which may be the faster one.
double interval(const State &state) {
    return seconds_between_statuses * std::min(1.0, state.time_scale);
}

void write_status(State &state) {
    Ups &ups = state.ups;
    ups.status_at = state.now;
    ups.status_on_battery = ups.on_battery;
    ups.status_charge = charge_of(state);
    ++ups.statuses;
}

void write_event(State &state) {
    Ups &ups = state.ups;
    ups.event_at = state.now;
    ups.event_charge = ups.charge;
    ups.event_state = ups.on_battery ? on_battery : online;
    ++ups.events;
}

std::string switch_power(State &state, bool fails) {
    Ups &ups = state.ups;
    if (ups.on_battery == fails)
        return fails ? "the power has failed already" : "the power is there";
    ups.charge = charge_of(state);
    ups.since = state.now;
    ups.on_battery = fails;
    write_event(state);
    return {};
}

} // namespace

Ups new_ups() {
    Ups ups;
    ups.statuses = 1;
    return ups;
}

double charge_of(const State &state) {
    const Ups &ups = state.ups;
    const double seconds = state.now - ups.since;
    return ups.on_battery ? std::max(0.0, ups.charge - seconds / discharge_seconds)
                          : std::min(100.0, ups.charge + seconds / recharge_seconds);
}

std::string act_on_ups(State &state, const Action &action) {
    Ups &ups = state.ups;
    switch (action.kind) {
    case Kind::ups_is_silent:
        ups.silent = true;
        return {};
    case Kind::ups_works:
        if (ups.silent) {
            ups.silent = false;
            write_status(state);
        }
        return {};
    default:
        return switch_power(state, action.kind == Kind::power_fails);
    }
}

double next_status(const State &state) {
    return state.ups.silent ? std::numeric_limits<double>::infinity()
                            : std::max(state.now, state.ups.status_at + interval(state));
}

void write_due_status(State &state) {
    if (!state.ups.silent && state.ups.status_at + interval(state) <= state.now)
        write_status(state);
}

std::string ups_status_text(const State &state) {
    const Ups &ups = state.ups;
    const std::string rest =
        fmt::format("DATE     : {}\n"
                    "HOSTNAME : appliance\n"
                    "VERSION  : 3.14.4\n"
                    "UPSNAME  : appliance\n"
                    "CABLE    : USB Cable\n"
                    "UPSMODE  : Stand Alone\n"
                    "STATUS   : {} \n"
                    "LINEV    : {} Volts\n"
                    "LOADPCT  :  12.0 Percent\n"
                    "BCHARGE  : {:05.1f} Percent\n"
                    "TIMELEFT : {:5.1f} Minutes\n"
                    "MBATTCHG : 5 Percent\n"
                    "MINTIMEL : 3 Minutes\n",
                    date_text(ups.status_at), ups.status_on_battery ? "ONBATT" : "ONLINE",
                    ups.status_on_battery ? "000.0" : "230.0", ups.status_charge,
                    ups.status_charge * minutes_per_percent);
    const std::string end = fmt::format("END APC  : {}\n", date_text(ups.status_at));
    const auto lines = std::count(rest.begin(), rest.end(), '\n') + 2;
    const auto head = [&lines](std::size_t bytes) {
        return fmt::format("APC      : 001,{:03},{:04}\n", lines, bytes);
    };
    return head(head(0).size() + rest.size() + end.size()) + rest + end;
}

std::string ups_event_text(const State &state) {
    return state.ups.events == 0
               ? ""
               : fmt::format("{} {:.1f}\n", state.ups.event_state, state.ups.event_charge);
}

} // namespace zavsim
