#include "session.h"

#include <fmt/format.h>

namespace zavctl {

void Session::ask(const std::vector<Question> &questions) {
    Patience patience;
    patience.limit = std::chrono::seconds(options.timeout);
    patience.repeated = repeated;
    if (!ask_all(questions, patience, streams))
        abandoned = true;
}

Failure no_answer(const Session &session) {
    return {-1, "", fmt::format("no answer within {} s", session.options.timeout)};
}

} // namespace zavctl
