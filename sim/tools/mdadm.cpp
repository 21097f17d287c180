// mdadm: --detail ARRAY, --query --examine --scan DEVICE, --misc --query DEVICE, and manage mode
// ARRAY -f|-r|-a DEVICE..., --stop ARRAY, --zero-superblock DEVICE; --create is in
// mdadm_create.cpp.
#include "model/advance.hpp"
#include "model/arrays.hpp"
#include "model/contents.hpp"
#include "model/disks.hpp"
#include "model/texts.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <set>

namespace zavsim {

namespace {

// mdadm's own exit statuses: 1 for what it finds itself, 2 when the kernel refuses.
constexpr int own_complaint = 1;
constexpr int kernel_refusal = 2;

int complain(const std::string &message) {
    fmt::print(stderr, "mdadm: {}\n", message);
    return own_complaint;
}

bool has(const std::vector<std::string> &words, std::initializer_list<const char *> options) {
    return std::any_of(words.begin(), words.end(), [&options](const std::string &word) {
        return std::find(options.begin(), options.end(), word) != options.end();
    });
}

std::vector<std::string> devices_of(const std::vector<std::string> &words) {
    std::vector<std::string> devices;
    for (const std::string &word : words)
        if (word.rfind('-', 0) != 0)
            devices.push_back(word);
    return devices;
}

std::string open_problem(const std::string &path) {
    return fmt::format("cannot open {}: No such file or directory", path);
}

Array *array_named(State &state, const std::string &path) {
    const auto minor = array_behind(path);
    return minor ? find_array(state, *minor) : nullptr;
}

int show_detail(State &state, const std::vector<std::string> &paths) {
    for (const std::string &path : paths) {
        const Array *array = array_named(state, path);
        if (array == nullptr)
            return complain(std::filesystem::exists(path)
                                ? path + " does not appear to be an md device"
                                : open_problem(path));
        fmt::print("{}", detail_text(state, *array, path));
    }
    return 0;
}

// What a device argument of a query names; no disk when there is none.
struct Asked {
    const Disk *disk = nullptr;
    const Partition *partition = nullptr;
};

Asked asked_for(const State &state, const std::string &path) {
    const auto place = device_behind(path);
    const Disk *disk = place ? attached_disk(state, place->letter) : nullptr;
    return {disk, disk == nullptr ? nullptr : find_partition(*disk, place->partition)};
}

int examine_scan(const State &state, const std::vector<std::string> &paths) {
    for (const std::string &path : paths) {
        const Asked asked = asked_for(state, path);
        if (asked.partition != nullptr)
            fmt::print("{}", examine_scan_text(state, *asked.partition));
    }
    return 0;
}

int query(const State &state, const std::vector<std::string> &paths) {
    for (const std::string &path : paths) {
        const Asked asked = asked_for(state, path);
        if (asked.disk == nullptr)
            return complain(open_problem(path));
        fmt::print("{}", query_text(state, *asked.disk, asked.partition, path));
    }
    return 0;
}

enum class Change { fail, remove, add, ignored };

Change change_of(const std::string &option, const State &state) {
    static const std::set<std::string> fails = {"-f", "--fail", "--set-faulty"};
    static const std::set<std::string> adds = {"-a", "--add"};
    if (fails.count(option) != 0)
        return Change::fail;
    if (adds.count(option) != 0)
        return Change::add;
    // The current mdadm takes a lone -r for another option and does nothing.
    if (option == "--remove" || (option == "-r" && !state.current_tools))
        return Change::remove;
    return Change::ignored;
}

Refusal apply(State &state, Array &array, Change change, const DevicePlace &place) {
    switch (change) {
    case Change::fail:
        return fail_member(state, array, place.letter, place.partition);
    case Change::remove:
        return remove_member(state, array, place.letter, place.partition);
    case Change::add:
        return add_member(state, array, place.letter, place.partition);
    default:
        return Refusal::none;
    }
}

std::string success_text(const State &state, Change change, const std::string &device,
                         const std::string &array) {
    if (change == Change::fail)
        return fmt::format("set {} faulty in {}", device, array);
    if (change == Change::add)
        return fmt::format("added {}", device);
    return state.current_tools ? fmt::format("hot removed {} from {}", device, array)
                               : fmt::format("hot removed {}", device);
}

int refuse(Change change, const std::string &device, Refusal refusal) {
    const char *reason =
        refusal == Refusal::busy ? "Device or resource busy" : "No such device or address";
    if (change == Change::fail)
        complain(fmt::format("set device faulty failed for {}:  {}", device, reason));
    else if (change == Change::remove)
        complain(fmt::format("hot remove failed for {}: {}", device, reason));
    else
        return complain(fmt::format("Cannot open {}: {}", device, reason));
    return kernel_refusal;
}

std::string missing_text(const State &state, const std::string &device) {
    return fmt::format("{} {}: No such file or directory",
                       state.current_tools ? "stat failed for" : "cannot find", device);
}

int manage_device(State &state, Array &array, const std::string &array_path, Change change,
                  const std::string &device) {
    const auto place = device_behind(device);
    if (!place)
        return complain(missing_text(state, device));
    const Refusal refusal = apply(state, array, change, *place);
    if (refusal != Refusal::none)
        return refuse(change, device, refusal);
    fmt::print(stderr, "mdadm: {}\n", success_text(state, change, device, array_path));
    return 0;
}

// "detached": every faulty member whose disk is gone; "faulty" or "failed": every faulty one.
std::vector<Member> members_called(const State &state, const Array &array,
                                   const std::string &word) {
    std::vector<Member> members;
    for (const Member &member : array.members) {
        const Disk *disk = attached_disk(state, member.letter);
        const bool gone = disk == nullptr || disk->serial != member.serial;
        if (member.role == Role::faulty && (word != "detached" || gone))
            members.push_back(member);
    }
    return members;
}

int remove_called(State &state, Array &array, const std::string &array_path,
                  const std::string &word) {
    for (const Member &member : members_called(state, array, word)) {
        const DeviceNumber number = device_number(member.letter, member.partition);
        const std::string name = fmt::format("{}:{}", number.major, number.minor);
        remove_member(state, array, member.letter, member.partition);
        fmt::print(stderr, "mdadm: {}\n", success_text(state, Change::remove, name, array_path));
    }
    return 0;
}

bool is_keyword(Change change, const std::string &word) {
    return change == Change::remove && (word == "detached" || word == "failed" || word == "faulty");
}

int manage(State &state, const std::vector<std::string> &words) {
    Array *array = array_named(state, words.front());
    if (array == nullptr)
        return complain(fmt::format("error opening {}: No such file or directory", words.front()));
    Change change = Change::ignored;
    int status = 0;
    for (auto word = words.begin() + 1; word != words.end() && status == 0; ++word) {
        if (word->rfind('-', 0) == 0)
            change = change_of(*word, state);
        else if (is_keyword(change, *word))
            status = remove_called(state, *array, words.front(), *word);
        else if (change != Change::ignored)
            status = manage_device(state, *array, words.front(), change, *word);
    }
    return status;
}

int stop(Turn &turn, const std::vector<std::string> &paths) {
    for (const std::string &path : paths) {
        const auto minor = array_behind(path);
        const Refusal refusal = minor ? stop_array(turn.state(), *minor) : Refusal::no_such_device;
        if (refusal == Refusal::no_such_device)
            return complain(fmt::format("error opening {}: No such file or directory", path));
        if (refusal == Refusal::busy)
            return complain(fmt::format("Cannot get exclusive access to {}:Perhaps a running "
                                        "process, mounted filesystem or active volume group?",
                                        path));
        advance(turn.state(), turn.state().now);
        turn.commit();
        fmt::print(stderr, "mdadm: stopped {}\n", path);
    }
    return 0;
}

// A device that an array holds cannot be opened for it.
int zero_superblock(State &state, const std::string &path) {
    const auto place = device_behind(path);
    Disk *disk = place ? attached_disk(state, place->letter) : nullptr;
    const bool held =
        std::any_of(state.arrays.begin(), state.arrays.end(), [&place](const Array &array) {
            return place && find_member(array, place->letter, place->partition) != nullptr;
        });
    if (disk == nullptr || held) {
        complain(fmt::format("Couldn't open {} for write - not zeroing", path));
        return kernel_refusal;
    }
    Partition *partition = find_partition(*disk, place->partition);
    if (partition != nullptr && partition->superblock)
        partition->superblock.reset();
    else
        complain(fmt::format("Unrecognised md component device - {}", path));
    forget_lost(state);
    return 0;
}

int zero_superblocks(Turn &turn, const std::vector<std::string> &paths) {
    int status = 0;
    for (const std::string &path : paths)
        status = std::max(status, zero_superblock(turn.state(), path));
    turn.commit();
    return status;
}

} // namespace

int run_mdadm(const std::vector<std::string> &words) {
    const std::vector<std::string> devices = devices_of(words);
    if (devices.empty())
        return complain("An md device must be given in this mode");
    if (has(words, {"--create", "-C"}))
        return run_mdadm_create(words);
    Turn turn;
    State &state = turn.state();
    if (has(words, {"--detail", "-D"}))
        return show_detail(state, devices);
    if (has(words, {"--examine", "-E"}))
        return examine_scan(state, devices);
    if (has(words, {"--query", "-Q"}))
        return query(state, devices);
    if (has(words, {"--zero-superblock"}))
        return zero_superblocks(turn, devices);
    if (has(words, {"--stop", "-S"}))
        return stop(turn, devices);
    if (words.front().rfind('-', 0) == 0)
        return complain(fmt::format("{} is not simulated", words.front()));
    const int status = manage(state, words);
    advance(state, state.now);
    turn.commit();
    return status;
}

} // namespace zavsim
