// mknod: no user may make a device node in a private root, so that a small file stands for it,
// which the other simulated tools understand.
#include "root/files.hpp"
#include "tools/command.hpp"
#include "tools/device_argument.hpp"

#include <charconv>
#include <filesystem>
#include <fmt/format.h>

namespace zavsim {

namespace {

bool read_number(const std::string &word, int &number) {
    const auto end = word.data() + word.size();
    return std::from_chars(word.data(), end, number).ptr == end && !word.empty();
}

} // namespace

int run_mknod(const std::vector<std::string> &words) {
    int major = 0;
    int minor = 0;
    if (words.size() != 4 || words[1].size() != 1 || !read_number(words[2], major) ||
        !read_number(words[3], minor)) {
        fmt::print(stderr, "mknod: missing or wrong operand\n");
        return 1;
    }
    if (std::filesystem::exists(words[0])) {
        fmt::print(stderr, "mknod: {}: File exists\n", words[0]);
        return 1;
    }
    write_text(words[0], node_text(words[1].front(), major, minor));
    return 0;
}

} // namespace zavsim
