// The state file of the private root and the turn-taking on it.
#pragma once

#include "launcher/options.hpp"
#include "model/state.hpp"
#include "root/files.hpp"
#include "root/publish.hpp"

namespace zavsim {

// Writes the first state and everything that shows it.
void start_model(const Options &options);

// Holds the state for one actor: locked and brought up to now when made; saved and shown by
// commit(). Without commit() nothing has happened.
class Turn {
  public:
    Turn();
    State &state() { return state_; }
    // False when something could not be shown yet; a later turn will.
    bool commit();

  private:
    Descriptor lock_;
    State state_;
    Taken taken_;
};

} // namespace zavsim
