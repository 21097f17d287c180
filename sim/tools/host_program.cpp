#include "tools/host_program.hpp"

#include "launcher/sandbox.hpp"

#include <fmt/format.h>
#include <unistd.h>

namespace zavsim {

int exec_host_program(const std::string &name, const std::vector<std::string> &words) {
    std::vector<std::string> copy = {name};
    copy.insert(copy.end(), words.begin(), words.end());
    std::vector<char *> pointers;
    pointers.reserve(copy.size() + 1);
    for (std::string &word : copy)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    for (const std::string &directory : {place::host_usr + "/bin/", std::string("/run/host/bin/")})
        execv((directory + name).c_str(), pointers.data());
    fmt::print(stderr, "{}: this machine has no {} of its own\n", name, name);
    return 1;
}

} // namespace zavsim
