// hbqSetup.sh, the appliance's setup script: createraid makes the data array where there is none,
// lvmrestore its group and volumes with empty file systems.
#include "model/advance.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/volumes.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace zavsim {

namespace {

constexpr const char *data_array = "MD1";
constexpr const char *data_group = "DataVG1";
constexpr int data_partition = 2;
constexpr std::array<int, 2> volume_extents = {32, 16};

int tell(const std::string &text, int status) {
    fmt::print("hbqSetup: {}\n", text);
    return status;
}

Array *find_data_array(State &state) {
    for (Array &array : state.arrays)
        if (array.name == data_array)
            return &array;
    return nullptr;
}

bool is_stopped(const State &state) {
    return std::any_of(state.stopped.begin(), state.stopped.end(),
                       [](const Array &array) { return array.name == data_array; });
}

std::size_t least_disks(const std::string &level) {
    return level == "raid5" ? 3 : level == "raid6" || level == "raid10" ? 4 : 2;
}

NewArray planned_array(const State &state) {
    NewArray array;
    array.minor = 1;
    array.name = data_array;
    array.level = state.data_level;
    array.forced = true;
    for (int slot = 1; slot <= 4; ++slot) {
        const Disk *disk = find_disk(state, slot);
        if (disk != nullptr && disk->attached && find_partition(*disk, data_partition) != nullptr)
            array.devices.emplace_back(slot, data_partition);
    }
    return array;
}

int create_data_array(Turn &turn) {
    State &state = turn.state();
    if (find_data_array(state) != nullptr)
        return tell("the data array is there", 0);
    if (is_stopped(state))
        return tell("the data array is stopped, its disks still tell of it", 1);
    const NewArray plan = planned_array(state);
    if (plan.devices.size() < least_disks(plan.level))
        return tell(fmt::format("{} disks with a partition {} are too few for {}",
                                plan.devices.size(), data_partition, plan.level),
                    1);
    if (create_array(state, plan) != Refusal::none)
        return tell("the data partitions are in use", 1);
    advance(state, state.now);
    turn.commit();
    return tell(
        fmt::format("made the data array: {} over {} disks", plan.level, plan.devices.size()), 0);
}

// Why not; empty when group, volumes and file systems are there.
std::string make_volumes(State &state, const Place &place) {
    if (find_pv(state, place.ground) == nullptr)
        if (std::string problem = create_pv(state, place, place.node); !problem.empty())
            return problem;
    PhysicalVolume &pv = *find_pv(state, place.ground);
    if (std::string problem = create_group(state, data_group, pv, place.node); !problem.empty())
        return problem;
    Group &group = *find_group(state, data_group);
    for (const int extents : volume_extents) {
        const std::string name = fmt::format("LogVol{}", group.volumes.size() + 1);
        if (std::string problem = create_volume(state, group, name, extents); !problem.empty())
            return problem;
        make_file_system(group.volumes.back());
        group.volumes.back().mount_point = usual_mount_point(data_group, name);
    }
    return {};
}

int restore_volumes(Turn &turn) {
    State &state = turn.state();
    const Array *array = find_data_array(state);
    if (array == nullptr || is_failed(state, *array))
        return tell(array == nullptr ? "there is no data array" : "the data array has failed", 1);
    const Place place = place_of_array(*array);
    const PhysicalVolume *pv = find_pv(state, place.ground);
    if (pv != nullptr && !pv->group.empty())
        return tell(fmt::format("the data array carries {}", pv->group), 0);
    const std::string problem = make_volumes(state, place);
    if (!problem.empty())
        return tell("cannot make the volumes:\n" + problem, 1);
    turn.commit();
    return tell(
        fmt::format("made {} on {} with {} volumes", data_group, place.node, volume_extents.size()),
        0);
}

} // namespace

int run_setup_script(const std::vector<std::string> &words) {
    if (words != std::vector<std::string>{"createraid"} &&
        words != std::vector<std::string>{"lvmrestore"})
        return not_simulated("hbqSetup.sh", words.empty() ? "" : words.front(), 1);
    Turn turn;
    return words.front() == "createraid" ? create_data_array(turn) : restore_volumes(turn);
}

} // namespace zavsim
