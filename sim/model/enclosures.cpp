#include "model/enclosures.hpp"

#include <algorithm>
#include <limits>

namespace zavsim {

namespace {

bool is_stale(const RaidVolume &volume, int bay) {
    return std::count(volume.stale.begin(), volume.stale.end(), bay) != 0;
}

// Disks 1 and 2 mirror each other, as do 3 and 4.
bool lost_a_pair(const RaidVolume &volume) {
    return (is_stale(volume, 1) && is_stale(volume, 2)) ||
           (is_stale(volume, 3) && is_stale(volume, 4));
}

bool is_beyond_redundancy(const RaidVolume &volume) {
    if (volume.level == "raid5")
        return volume.stale.size() > 1;
    if (volume.level == "raid10")
        return lost_a_pair(volume);
    return !volume.stale.empty();
}

void start_rebuild(RaidVolume &volume, int bay) {
    if (volume.state == RaidVolumeState::rebuilding && volume.rebuilt_bay == bay)
        return;
    volume.state = RaidVolumeState::rebuilding;
    volume.rebuilt_bay = bay;
    volume.rebuild_left = raid_rebuild_seconds;
}

void end_rebuild(RaidVolume &volume, RaidVolumeState state) {
    volume.state = state;
    volume.rebuilt_bay = 0;
    volume.rebuild_left = 0;
}

// The first stale bay with a disk to restore it on, and the one under way before all others; 0 for
// none.
int bay_to_rebuild(const Enclosure &enclosure, const RaidVolume &volume) {
    int first = 0;
    for (const Bay &bay : enclosure.bays) {
        if (bay.state != BayState::found || !is_stale(volume, bay.number))
            continue;
        if (bay.number == volume.rebuilt_bay)
            return bay.number;
        first = first == 0 ? bay.number : first;
    }
    return first;
}

// What the disks make of a volume. One that has failed does not come back by itself.
void follow_disks(const Enclosure &enclosure, RaidVolume &volume) {
    if (volume.state == RaidVolumeState::failed)
        return;
    if (is_beyond_redundancy(volume))
        end_rebuild(volume, RaidVolumeState::failed);
    else if (volume.stale.empty())
        end_rebuild(volume, RaidVolumeState::normal);
    else if (const int bay = bay_to_rebuild(enclosure, volume); bay != 0)
        start_rebuild(volume, bay);
    else
        end_rebuild(volume, RaidVolumeState::degraded);
}

void finish_rebuild(const Enclosure &enclosure, RaidVolume &volume) {
    auto &stale = volume.stale;
    stale.erase(std::remove(stale.begin(), stale.end(), volume.rebuilt_bay), stale.end());
    end_rebuild(volume, RaidVolumeState::normal);
    follow_disks(enclosure, volume);
}

template <typename List>
auto *numbered(List &list, int number) {
    const auto found = std::find_if(list.begin(), list.end(),
                                    [number](const auto &each) { return each.number == number; });
    return found == list.end() ? nullptr : &*found;
}

} // namespace

bool is_reached(const Controller &controller, int number) {
    for (; number > 0; number = parent_of(number))
        if (!controller.enclosures.at(static_cast<std::size_t>(number)).present)
            return false;
    return true;
}

std::vector<const Enclosure *> reached_enclosures(const State &state) {
    std::vector<const Enclosure *> list;
    if (!state.controller)
        return list;
    for (const Enclosure &enclosure : state.controller->enclosures)
        if (is_reached(*state.controller, enclosure.number))
            list.push_back(&enclosure);
    return list;
}

Bay *find_bay(Enclosure &enclosure, int number) {
    return numbered(enclosure.bays, number);
}

RaidVolume *find_raid_volume(Enclosure &enclosure, int number) {
    return numbered(enclosure.volumes, number);
}

void lose_disk(Enclosure &enclosure, Bay &bay, BayState state) {
    bay.state = state;
    for (RaidVolume &volume : enclosure.volumes) {
        if (!is_stale(volume, bay.number))
            volume.stale.push_back(bay.number);
        follow_disks(enclosure, volume);
    }
}

void insert_disk(Enclosure &enclosure, Bay &bay, int serial) {
    bay.state = BayState::found;
    bay.serial = serial;
    for (RaidVolume &volume : enclosure.volumes)
        follow_disks(enclosure, volume);
}

void set_volume(Enclosure &enclosure, RaidVolume &volume, RaidVolumeState state) {
    end_rebuild(volume, state);
    if (state == RaidVolumeState::rebuilding) {
        volume.rebuilt_bay = bay_to_rebuild(enclosure, volume);
        volume.rebuild_left = raid_rebuild_seconds;
    }
    if (state == RaidVolumeState::normal)
        for (const Bay &bay : enclosure.bays)
            if (bay.state == BayState::found)
                volume.stale.erase(
                    std::remove(volume.stale.begin(), volume.stale.end(), bay.number),
                    volume.stale.end());
}

int rebuild_percent(const RaidVolume &volume) {
    if (volume.state != RaidVolumeState::rebuilding)
        return 0;
    // A sum of many small times may fall short of a whole percent by a hair.
    const double done = 1 - volume.rebuild_left / raid_rebuild_seconds;
    return static_cast<int>(done * 100 + 1e-6);
}

double next_rebuild_end(const State &state) {
    double end = std::numeric_limits<double>::infinity();
    for (const Enclosure *enclosure : reached_enclosures(state))
        for (const RaidVolume &volume : enclosure->volumes)
            if (volume.state == RaidVolumeState::rebuilding)
                end = std::min(end, state.now + volume.rebuild_left);
    return end;
}

void rebuild_volumes(State &state, double seconds) {
    if (!state.controller)
        return;
    for (Enclosure &enclosure : state.controller->enclosures) {
        if (!is_reached(*state.controller, enclosure.number))
            continue;
        for (RaidVolume &volume : enclosure.volumes) {
            if (volume.state != RaidVolumeState::rebuilding)
                continue;
            volume.rebuild_left -= seconds;
            // A rest that no clock can tell apart from the end is the end.
            if (volume.rebuild_left < 1e-6)
                finish_rebuild(enclosure, volume);
        }
    }
}

} // namespace zavsim
