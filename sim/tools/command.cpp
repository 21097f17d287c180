#include "tools/command.hpp"

#include "launcher/options.hpp"
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/json.hpp"
#include "model/sentences.hpp"
#include "root/store.hpp"

#include <fmt/format.h>

namespace zavsim {

int run_act(const std::vector<std::string> &words) {
    const std::string sentence = join_words(words);
    const Sentence parsed = parse_sentence(sentence);
    if (!parsed.error.empty()) {
        fmt::print(stderr, "zavsim: {}\n", parsed.error);
        return exit_usage;
    }
    Turn turn;
    const std::string problem = perform_sentence(turn.state(), sentence);
    advance(turn.state(), turn.state().now);
    turn.commit();
    if (!problem.empty())
        fmt::print(stderr, "zavsim: {}\n", problem);
    return problem.empty() ? 0 : 1;
}

int run_state(const std::vector<std::string> &words) {
    if (!words.empty()) {
        fmt::print(stderr, "zavsim: state takes no arguments\n");
        return exit_usage;
    }
    Turn turn;
    fmt::print("{}", to_text(turn.state()));
    return 0;
}

} // namespace zavsim
