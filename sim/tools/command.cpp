#include "tools/command.hpp"

#include "launcher/options.hpp"
#include "model/actions.hpp"
#include "model/advance.hpp"
#include "model/json.hpp"
#include "model/sentences.hpp"
#include "root/clock.hpp"
#include "root/report.hpp"
#include "root/store.hpp"

#include <fmt/format.h>

namespace zavsim {

namespace {

struct Shown {
    bool everything;
    int slow_rewrites;
};

Shown act(const std::string &sentence, std::string &problem) {
    Turn turn;
    State &state = turn.state();
    problem = perform_sentence(state, sentence);
    advance(state, state.now);
    const int rewrites = state.controller ? state.controller->slow_rewrites : 0;
    return {turn.commit(), rewrites};
}

// Who looks next is to find what was acted. A reader of the report may hold its writer up, but not
// the caller for long.
void wait_until_shown(Shown shown) {
    const double end = machine_seconds() + 2;
    while (!(shown.everything && slow_rewrite_has_begun(shown.slow_rewrites)) &&
           machine_seconds() < end) {
        sleep_unscaled(0.02);
        if (!shown.everything)
            shown.everything = Turn().commit();
    }
}

} // namespace

int run_act(const std::vector<std::string> &words) {
    const std::string sentence = join_words(words);
    const Sentence parsed = parse_sentence(sentence);
    if (!parsed.error.empty()) {
        fmt::print(stderr, "zavsim: {}\n", parsed.error);
        return exit_usage;
    }
    std::string problem;
    wait_until_shown(act(sentence, problem));
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
