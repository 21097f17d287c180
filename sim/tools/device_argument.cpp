#include "tools/device_argument.hpp"

#include "root/files.hpp"

#include <charconv>
#include <filesystem>
#include <fmt/format.h>
#include <sstream>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

std::string letter_of_minor(int minor) {
    const int index = minor / 16;
    const auto letter = [](int i) { return static_cast<char>('a' + i); };
    return index < 26 ? std::string(1, letter(index))
                      : std::string{letter(index / 26 - 1), letter(index % 26)};
}

std::optional<DevicePlace> made_node(const fs::path &path) {
    if (fs::file_size(path) > 64)
        return std::nullopt;
    std::istringstream in(read_text(path).value_or(""));
    std::string simulated;
    std::string node;
    char kind = 0;
    int major = 0;
    int minor = 0;
    if (!(in >> simulated >> node >> kind >> major >> minor) || simulated + node != "simulatednode")
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
        if (auto place = parse_kernel_name(node.filename()))
            return place;
    return made_node(node);
}

std::optional<int> array_behind(const std::string &path) {
    std::error_code error;
    const std::string node = fs::canonical(path, error);
    const std::string beginning = "/dev/md";
    int minor = 0;
    if (error || node.rfind(beginning, 0) != 0 || node.size() == beginning.size())
        return std::nullopt;
    const char *end = node.data() + node.size();
    if (std::from_chars(node.data() + beginning.size(), end, minor).ptr != end)
        return std::nullopt;
    return minor;
}

std::string node_text(char kind, int major, int minor) {
    return fmt::format("simulated node {} {} {}\n", kind, major, minor);
}

} // namespace zavsim
