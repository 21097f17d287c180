#include "model/health_actions.hpp"

#include "model/driver_events.hpp"
#include "model/load.hpp"
#include "model/network.hpp"
#include "model/sensors.hpp"
#include "model/ups.hpp"

namespace zavsim {

bool is_about_health(Action::Kind kind) {
    return kind >= Action::Kind::temperature_is;
}

std::string act_on_health(State &state, const Action &action) {
    if (action.kind <= Action::Kind::input_is)
        return act_on_sensors(state, action);
    if (action.kind <= Action::Kind::swap_use_is)
        return act_on_load(state, action);
    if (action.kind <= Action::Kind::ups_works)
        return act_on_ups(state, action);
    if (action.kind <= Action::Kind::bond_fails_over)
        return act_on_network(state, action);
    return put_event(state, action);
}

} // namespace zavsim
