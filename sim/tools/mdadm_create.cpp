// mdadm --create ARRAY [--force] [--run] --level=L --raid-devices=N [--metadata=1.2]
// [--name=NAME] DEVICE...
#include "model/advance.hpp"
#include "model/arrays.hpp"
#include "model/disks.hpp"
#include "model/texts.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"
#include "tools/volume_arguments.hpp"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <iostream>
#include <map>
#include <set>

namespace zavsim {

namespace {

int complain(const std::string &message) {
    fmt::print(stderr, "mdadm: {}\n", message);
    return 1;
}

struct Wanted {
    std::string path; // of the array
    std::map<std::string, std::string> values;
    bool forced = false;
    bool asks = true; // before it writes over what belonged to an array
    std::vector<std::string> devices;
    std::string unknown;

    std::string value(const std::string &option, const std::string &usual = "") const {
        const auto found = values.find(option);
        return found == values.end() ? usual : found->second;
    }
};

void take_option(Wanted &wanted, const std::string &word) {
    static const std::set<std::string> with_value = {"--level", "--raid-devices", "--metadata",
                                                     "--name"};
    const std::size_t sign = std::min(word.find('='), word.size());
    const std::string option = word.substr(0, sign);
    if (word == "--force" || word == "-f")
        wanted.forced = true;
    else if (word == "--run" || word == "-R")
        wanted.asks = false;
    else if (with_value.count(option) != 0 && sign < word.size())
        wanted.values[option] = word.substr(sign + 1);
    else if (word != "--create" && word != "-C")
        wanted.unknown = word;
}

Wanted wanted_by(const std::vector<std::string> &words) {
    Wanted wanted;
    for (const std::string &word : words)
        if (word.rfind('-', 0) == 0)
            take_option(wanted, word);
        else if (wanted.path.empty())
            wanted.path = word;
        else
            wanted.devices.push_back(word);
    return wanted;
}

// Why it cannot be made here; the least number of members is the kernel's.
std::string request_problem(const Wanted &wanted) {
    static const std::map<std::string, std::size_t> least = {
        {"raid0", 2}, {"raid1", 2}, {"linear", 2}, {"raid5", 2}, {"raid10", 2}};
    const auto level = least.find(wanted.value("--level"));
    if (!wanted.unknown.empty())
        return wanted.unknown + " is not simulated";
    if (level == least.end())
        return fmt::format("level {} is not simulated", wanted.value("--level", "of no name"));
    if (wanted.value("--metadata", "1.2") != "1.2")
        return fmt::format("metadata {} is not simulated", wanted.value("--metadata"));
    if (wanted.value("--raid-devices") != std::to_string(wanted.devices.size()))
        return fmt::format("You haven't given enough devices (real or missing) to create this "
                           "array");
    if (wanted.devices.size() < level->second || wanted.devices.size() > 4)
        return fmt::format("an array of {} devices is not simulated", wanted.devices.size());
    return {};
}

int number_at_end(const std::string &name) {
    const std::size_t last = name.find_last_not_of("0123456789");
    const std::string digits = last == std::string::npos ? name : name.substr(last + 1);
    return digits.empty() || digits.size() > 3 ? -1 : std::stoi(digits);
}

// By its name an array gets the number in it; from the current tools the highest that is free.
int minor_for(const State &state, const std::string &path) {
    const std::string kernel_path = "/dev/md";
    const bool by_name = path.rfind("/dev/md/", 0) == 0;
    if (!by_name && path.rfind(kernel_path, 0) != 0)
        return -1;
    if (!by_name || !state.current_tools)
        return number_at_end(path);
    int minor = 127;
    while (find_array(state, minor) != nullptr)
        --minor;
    return minor;
}

NewArray new_array(const State &state, const Wanted &wanted) {
    NewArray array;
    array.minor = minor_for(state, wanted.path);
    const std::string last = std::filesystem::path(wanted.path).filename();
    array.name = wanted.value(
        "--name", wanted.path.rfind("/dev/md/", 0) == 0 ? last : std::to_string(array.minor));
    array.level = wanted.value("--level");
    array.forced = wanted.forced;
    return array;
}

// Puts the devices in; answers what is wrong with one of them.
std::string take_devices(const State &state, const Wanted &wanted, NewArray &array) {
    for (const std::string &path : wanted.devices) {
        const auto place = device_behind(path);
        const Disk *disk = place ? attached_disk(state, place->letter) : nullptr;
        if (disk == nullptr)
            return fmt::format("cannot open {}: No such file or directory", path);
        if (place->partition != 0 && find_partition(*disk, place->partition) == nullptr)
            return fmt::format("cannot open {}: No such device or address", path);
        if (place->partition == 0)
            return fmt::format("a whole disk ({}) in an array is not simulated", path);
        const std::pair<int, int> device = {disk->slot, place->partition};
        if (std::find(array.devices.begin(), array.devices.end(), device) != array.devices.end())
            return fmt::format("{} is given twice", path);
        array.devices.push_back(device);
    }
    return {};
}

// What tells of older arrays on the devices.
std::string older_arrays(const State &state, const Wanted &wanted, const NewArray &array) {
    std::string text;
    for (std::size_t i = 0; i < array.devices.size(); ++i) {
        const auto &[slot, number] = array.devices[i];
        const Partition &partition = *find_partition(*find_disk(state, slot), number);
        const Array *old =
            partition.superblock ? array_of_uuid(state, partition.superblock->uuid) : nullptr;
        if (old != nullptr)
            text += fmt::format("mdadm: {} appears to be part of a raid array:\n"
                                "       level={} devices={} ctime={}\n",
                                wanted.devices[i], old->level, old->raid_devices,
                                date_text(old->created));
    }
    return text;
}

// Asked once for all devices, and not at all where nothing would be lost.
bool may_write_over(const std::string &older) {
    fmt::print(stderr, "{}", older);
    fmt::print("Continue creating array? ");
    std::fflush(stdout);
    std::string answer;
    std::getline(std::cin, answer);
    return !answer.empty() && (answer.front() == 'y' || answer.front() == 'Y');
}

std::string check_and_prepare(const State &state, const Wanted &wanted, NewArray &array) {
    array = new_array(state, wanted);
    if (array.minor < 0 || !is_valid_name(array.name))
        return fmt::format("an array called {} is not simulated", wanted.path);
    return take_devices(state, wanted, array);
}

} // namespace

int run_mdadm_create(const std::vector<std::string> &words) {
    const Wanted wanted = wanted_by(words);
    const std::string problem = request_problem(wanted);
    if (!problem.empty())
        return complain(problem);
    NewArray array;
    std::string older;
    {
        Turn turn;
        const std::string wrong = check_and_prepare(turn.state(), wanted, array);
        if (!wrong.empty())
            return complain(wrong);
        older = older_arrays(turn.state(), wanted, array);
    }
    // The answer may take its time, while others go on.
    if (!older.empty() && wanted.asks && !may_write_over(older))
        return complain("create aborted.");
    Turn turn;
    const std::string wrong = check_and_prepare(turn.state(), wanted, array);
    if (!wrong.empty())
        return complain(wrong);
    if (create_array(turn.state(), array) != Refusal::none)
        return complain(fmt::format("cannot create {}: Device or resource busy\n"
                                    "mdadm: create aborted",
                                    wanted.path));
    advance(turn.state(), turn.state().now);
    turn.commit();
    fmt::print(stderr, "mdadm: array {} started.\n", wanted.path);
    return 0;
}

} // namespace zavsim
