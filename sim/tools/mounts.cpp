// df, mount, umount and mkfs.ext4.
#include "model/devices.hpp"
#include "model/texts_volumes.hpp"
#include "root/store.hpp"
#include "tools/command.hpp"
#include "tools/volume_arguments.hpp"

#include <filesystem>
#include <fmt/format.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

constexpr int mount_failed = 32;

int mount_problem(const std::string &tool, const std::string &text) {
    fmt::print(stderr, "{}: {}\n", tool, text);
    return mount_failed;
}

// As the table of mounts has it; what does not exist stays as it was given.
std::string whole_path(const std::string &path) {
    std::error_code error;
    const std::string whole = fs::canonical(path, error);
    return error ? path : whole;
}

// By its mount point or by its device.
VolumePlace mounted_as(State &state, const std::string &name) {
    const VolumePlace there = volume_mounted_at(state, whole_path(name));
    return there.volume != nullptr ? there : volume_behind(state, name);
}

std::string mount_volume(State &state, const std::string &device, const std::string &directory) {
    const VolumePlace found = volume_behind(state, device);
    if (!fs::is_directory(directory))
        return fmt::format("{}: mount point does not exist.", directory);
    if (!fs::exists(device))
        return fmt::format("{}: special device {} does not exist.", directory, device);
    if (found.volume == nullptr || !found.volume->file_system)
        return fmt::format("{}: wrong fs type, bad option, bad superblock on {}, missing codepage "
                           "or helper program, or other error.",
                           directory, device);
    if (!found.volume->mount_point.empty())
        return fmt::format("{}: {} already mounted on {}.", directory,
                           mapper_path(*found.group, *found.volume), found.volume->mount_point);
    if (directory.find_first_of(" \t\n\\") != std::string::npos)
        return fmt::format("{}: blanks in a mount point are not simulated", directory);
    if (volume_mounted_at(state, directory).volume != nullptr)
        return fmt::format("{}: a second file system over another is not simulated", directory);
    found.volume->mount_point = directory;
    return {};
}

} // namespace

int run_df(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-k"});
    if (!arguments.unknown.empty() || !arguments.names.empty())
        return not_simulated("df", arguments.unknown.empty() ? "a path" : arguments.unknown, 1);
    Turn turn;
    fmt::print("{}", df_text(turn.state()));
    return 0;
}

int run_mount(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {}, {"-t"});
    const auto type = arguments.values.find("-t");
    Turn turn;
    if (words.empty()) {
        fmt::print("{}", mtab_text(turn.state()));
        return 0;
    }
    if (!arguments.unknown.empty() || arguments.names.size() != 2 ||
        (type != arguments.values.end() && type->second != "ext4"))
        return not_simulated(
            "mount",
            arguments.unknown.empty() ? "anything but VOLUME DIRECTORY" : arguments.unknown, 1);
    const std::string problem =
        mount_volume(turn.state(), arguments.names[0], whole_path(arguments.names[1]));
    if (!problem.empty())
        return mount_problem("mount", problem);
    turn.commit();
    return 0;
}

int run_umount(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "umount", arguments.unknown.empty() ? "anything but one name" : arguments.unknown, 1);
    const std::string name = arguments.names.front();
    Turn turn;
    const VolumePlace found = mounted_as(turn.state(), name);
    if (found.volume == nullptr || found.volume->mount_point.empty())
        return mount_problem("umount", fs::exists(name) ? name + ": not mounted."
                                                        : name + ": no mount point specified.");
    if (found.volume->busy)
        return mount_problem("umount", found.volume->mount_point + ": target is busy.");
    found.volume->mount_point.clear();
    turn.commit();
    return 0;
}

int run_mkfs(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-q", "-F"});
    if (!arguments.unknown.empty() || arguments.names.size() != 1)
        return not_simulated(
            "mkfs.ext4", arguments.unknown.empty() ? "anything but one volume" : arguments.unknown,
            1);
    const std::string device = arguments.names.front();
    Turn turn;
    const VolumePlace found = volume_behind(turn.state(), device);
    if (!fs::exists(device))
        fmt::print(stderr, "The file {} does not exist and no size was specified.\n", device);
    else if (found.volume == nullptr)
        return not_simulated("mkfs.ext4", "a device that is no volume", 1);
    else if (!found.volume->mount_point.empty())
        fmt::print(stderr, "{} is mounted; will not make a filesystem here!\n", device);
    if (found.volume == nullptr || !found.volume->mount_point.empty())
        return 1;
    make_file_system(*found.volume);
    turn.commit();
    return 0;
}

} // namespace zavsim
