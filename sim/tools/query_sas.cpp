// query_sas.sh: the expanders and what they are connected to.
#include "model/texts_controller.hpp"
#include "root/store.hpp"
#include "tools/arguments.hpp"
#include "tools/command.hpp"

#include <fmt/format.h>

namespace zavsim {

int run_query_sas(const std::vector<std::string> &words) {
    if (!words.empty())
        return not_simulated("query_sas.sh", words.front(), 1);
    Turn turn;
    fmt::print("{}", topology_text(turn.state()));
    return 0;
}

} // namespace zavsim
