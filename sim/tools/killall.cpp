// killall NAME...: the appliance's processes by the names that the kernel has for them.
#include "launcher/sandbox.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"

#include <csignal>
#include <filesystem>
#include <fmt/format.h>
#include <fstream>
#include <unistd.h>

namespace fs = std::filesystem;

namespace zavsim {

namespace {

constexpr std::size_t kept_of_name = 15; // bytes that the kernel keeps

std::string first_argument(const fs::path &process) {
    std::ifstream in(process / "cmdline");
    std::string word;
    std::getline(in, word, '\0');
    return fs::path(word).filename();
}

// A name longer than the kernel's is looked for on the command line as well.
bool has_name(const fs::path &process, const std::string &name) {
    std::ifstream in(process / "comm");
    std::string own;
    std::getline(in, own);
    if (own != name.substr(0, kept_of_name))
        return false;
    return name.size() <= kept_of_name || first_argument(process) == name;
}

bool is_number(const std::string &name) {
    return !name.empty() && name.find_first_not_of("0123456789") == std::string::npos;
}

bool signal_all(const std::string &name) {
    bool found = false;
    for (const auto &entry : fs::directory_iterator(place::real_proc)) {
        const std::string number = entry.path().filename();
        if (is_number(number) && number.size() < 9 && has_name(entry.path(), name) &&
            std::stoi(number) != getpid() && kill(std::stoi(number), SIGTERM) == 0)
            found = true;
    }
    return found;
}

} // namespace

int run_killall(const std::vector<std::string> &words) {
    const Arguments arguments = sort_words(words, {"-q"});
    if (!arguments.unknown.empty() || arguments.names.empty())
        return not_simulated("killall", arguments.unknown, 1);
    int status = 0;
    for (const std::string &name : arguments.names) {
        if (signal_all(name))
            continue;
        status = 1;
        if (!arguments.has("-q"))
            fmt::print(stderr, "{}: no process found\n", name);
    }
    return status;
}

} // namespace zavsim
