// Enclosures behind the RAID controller: the cascade of expansion units, and what befalls disks and
// volumes.
#pragma once

#include "model/state.hpp"

#include <string>
#include <vector>

namespace zavsim {

constexpr int most_units = 7;
constexpr double raid_rebuild_seconds = 240;

// A controller with its own disks, units 1 to `units`, and the places of those that may come.
Controller new_controller(State &state, int units);

// The unit that one hangs on; 0 is the controller. Two hang on each: the upper one has the even
// number.
constexpr int parent_of(int unit) {
    return unit / 2;
}

// A unit is reached while it and all between it and the controller are there.
bool is_reached(const Controller &controller, int number);
std::vector<const Enclosure *> reached_enclosures(const State &state);

Bay *find_bay(Enclosure &enclosure, int number);
RaidVolume *find_raid_volume(Enclosure &enclosure, int number);

// The disk in a bay is lost (failed or absent), or another stands there. Volumes follow.
void lose_disk(Enclosure &enclosure, Bay &bay, BayState state);
void insert_disk(Enclosure &enclosure, Bay &bay, int serial);

// Puts a volume into a state, whatever its disks say; the next happening to one of them decides
// anew.
void set_volume(Enclosure &enclosure, RaidVolume &volume, RaidVolumeState state);

// Of a volume that is rebuilt, in whole percent; else 0.
int rebuild_percent(const RaidVolume &volume);

// When the first rebuild ends, and the rebuilds of that many seconds.
double next_rebuild_end(const State &state);
void rebuild_volumes(State &state, double seconds);

} // namespace zavsim
