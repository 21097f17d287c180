#include "tools/device_argument.hpp"

#include "root/files.hpp"

#include <cstdio>
#include <filesystem>
#include <fmt/format.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

constexpr const char *node_format = "simulated node %c %d %d";

std::string letter_of_minor(int minor) {
    const int index = minor / 16;
    const auto letter = [](int i) { return static_cast<char>('a' + i); };
    return index < 26 ? std::string(1, letter(index))
                      : std::string{letter(index / 26 - 1), letter(index % 26)};
}

std::optional<DevicePlace> made_node(const fs::path &path) {
    if (fs::file_size(path) > 64)
        return std::nullopt;
    char kind = 0;
    int major = 0;
    int minor = 0;
    if (sscanf(read_text(path)->c_str(), node_format, &kind, &major, &minor) != 3)
        return std::nullopt;
    if (kind != 'b' || major != 8 || minor < 0)
        return std::nullopt;
    return DevicePlace{letter_of_minor(minor), minor % 16};
}

} // namespace

std::optional<DevicePlace> device_behind(const std::string &path) {
    std::error_code error;
    const fs::path node = fs::canonical(path, error);
    if (error || !fs::is_regular_file(node))
        return std::nullopt;
    if (node.parent_path() == "/dev")
        if (const auto place = parse_kernel_name(node.filename()))
            return place;
    return made_node(node);
}

std::optional<int> array_behind(const std::string &path) {
    std::error_code error;
    const std::string node = fs::canonical(path, error);
    int minor = 0;
    int end = 0;
    if (error || sscanf(node.c_str(), "/dev/md%d%n", &minor, &end) != 1 ||
        static_cast<std::size_t>(end) != node.size())
        return std::nullopt;
    return minor;
}

std::string node_text(char kind, int major, int minor) {
    return fmt::format("simulated node {} {} {}\n", kind, major, minor);
}

} // namespace zavsim
