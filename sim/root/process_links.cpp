#include "root/process_links.hpp"

#include "launcher/sandbox.hpp"

#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>

namespace zavsim {

namespace {

// The kernel hands out numbers in ascending order; the last one stands in loadavg.
int last_process_number() {
    std::ifstream in(place::real_proc + "/loadavg");
    std::string word;
    int last = 0;
    in >> word >> word >> word >> word >> last;
    return last;
}

} // namespace

void ProcessLinks::extend() {
    const int wanted = last_process_number() + ahead;
    if (wanted < linked_up_to_ + ahead / 2)
        return;
    for (; linked_up_to_ < wanted; ++linked_up_to_) {
        const std::string number = "/" + std::to_string(linked_up_to_ + 1);
        std::error_code taken; // a test may have put its own process there
        std::filesystem::create_symlink(place::real_proc + number, "/proc" + number, taken);
    }
}

} // namespace zavsim
