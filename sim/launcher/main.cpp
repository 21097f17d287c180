// zavsim is several programs in one file: the launcher, the init step inside the private root, and
// every simulated tool, told apart by the name it is called by.
#include "launcher/options.hpp"
#include "launcher/sandbox.hpp"
#include "root/init.hpp"
#include "tools/tools.hpp"

#include <cstring>
#include <fmt/format.h>
#include <string>

int main(int argc, char **argv) {
    using namespace zavsim;
    const std::string path = argc > 0 ? argv[0] : "zavsim";
    const std::string name = path.substr(path.rfind('/') + 1);
    try {
        if (const Tool *tool = find_tool(name))
            return run_tool(*tool, argc, argv);
        if (argc == 5 && strcmp(argv[1], inside_word) == 0)
            return run_inside(argv[2], argv[3], argv[4]);
        if (argc > 1 && is_inner_command(argv[1]))
            return run_inner_command(argc, argv);
        return run_in_private_root(parse_command_line(argc, argv));
    } catch (const std::exception &error) {
        fmt::print(stderr, "zavsim: {}\n", error.what());
        return exit_os_error;
    }
}
