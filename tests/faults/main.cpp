// Lets every call that the library makes of the C library fail, one at a time. What the library is
// asked is what the unit tests ask it: each test runs once to count the calls, and then once for
// each of them, in a process of its own. A place in the library is let fail in at most so many
// tests.
#include "call.h"
#include "distortion.h"

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <map>
#include <sys/mman.h>
#include <sys/wait.h>
#include <tuple>

#include "harness.h"

namespace {

using namespace faults;

constexpr unsigned kPatience = 60; // seconds, for a run that takes a few hundredths

struct Tally {
    int points = 0; // calls of the C library that were met
    int runs = 0;
    int failures = 0;
};

struct Options {
    bool tools = false;         // commands answer wrongly, in place of calls that fail
    std::size_t every_cut = 80; // answers up to so many bytes are cut at each of them
    int per_place = 2;
    std::string filter = "*";
};

class Campaign {
  public:
    explicit Campaign(const Options &options) : options_(options) {
        board = static_cast<Board *>(mmap(nullptr, sizeof(Board), PROT_READ | PROT_WRITE,
                                          MAP_SHARED | MAP_ANONYMOUS, -1, 0));
        if (board == MAP_FAILED)
            std::abort();
        tallies_.resize(functions().size());
        called_.resize(functions().size());
    }

    void test(const std::string &name) {
        run(name, -1, {Fate::fails});
        if (board->complaint[0] != '\0') {
            ++unfit_;
            std::printf("FAILED %s, where nothing fails: %s\n", name.c_str(), board->complaint);
            return;
        }
        for (std::size_t i = 0; i < called_.size(); ++i)
            called_[i] = called_[i] || board->called[i];
        if (board->overlapping) {
            ++overlapping_;
            return;
        }
        ++tests_;
        const std::vector<Point> points(board->points, board->points + board->count);
        for (std::size_t i = 0; i < points.size(); ++i)
            point(name, points[i], static_cast<int>(i));
    }

    int report() const {
        Tally all;
        int missing = 0;
        std::printf("%-24s %7s %7s %9s\n", "function", "calls", "runs", "failures");
        for (std::size_t i = 0; i < tallies_.size(); ++i) {
            const Tally &tally = tallies_[i];
            std::printf("%-24s %7d %7d %9d%s\n", functions()[i].name, tally.points, tally.runs,
                        tally.failures, called_[i] ? "" : "  NOT CALLED BY ANY TEST");
            all.points += tally.points;
            all.runs += tally.runs;
            all.failures += tally.failures;
            missing += !called_[i];
        }
        std::printf("%-24s %7d %7d %9d\n", "all", all.points, all.runs, all.failures);
        std::printf(
            "%d tests; %d more have several threads in the library, whose calls have no order; "
            "%d functions not called\n",
            tests_, overlapping_, missing);
        return all.failures + unfit_ == 0 && (missing == 0 || options_.filter != "*") &&
                       all.runs > 0
                   ? 0
                   : 1;
    }

  private:
    void point(const std::string &name, const Point &point, int index) {
        Tally &tally = tallies_[static_cast<std::size_t>(point.function)];
        ++tally.points;
        const auto place =
            std::make_tuple(point.function, point.caller, std::min(point.occurrence, 1));
        if (++seen_[place] > options_.per_place)
            return;
        if (!options_.tools)
            attempt(name, point, index, {Fate::fails}, tally);
        if (point.may_be_short)
            attempt(name, point, index, {Fate::is_short}, tally);
        if (options_.tools)
            answers(name, point, index, tally);
    }

    void answers(const std::string &name, const Point &point, int index, Tally &tally) {
        for (const Fate fate : wrong_answers(point.output))
            attempt(name, point, index, {fate}, tally);
        const std::size_t cuts = point.output <= options_.every_cut ? point.output : 0;
        for (std::size_t cut = 1; cut < cuts; ++cut)
            attempt(name, point, index, {Fate::is_cut, cut}, tally);
    }

    struct Blow {
        Fate fate;
        std::size_t cut = 0;
    };

    void attempt(const std::string &name, const Point &point, int index, const Blow &blow,
                 Tally &tally) {
        run(name, index, blow);
        if (board->overlapping) // they met this time only
            return;
        ++tally.runs;
        if (board->complaint[0] == '\0' && !board->fired)
            complain("the call was not met again");
        if (board->complaint[0] == '\0')
            return;
        ++tally.failures;
        std::printf("FAILED %s: call %d, %s at 0x%zx %s (%zu): %s\n", name.c_str(), index,
                    point.call, static_cast<std::size_t>(point.caller), name_of(blow.fate),
                    blow.cut, board->complaint);
        std::fflush(stdout);
    }

    // One test in a process of its own.
    void run(const std::string &name, int target, const Blow &blow) const {
        std::memset(board, 0, offsetof(Board, points));
        board->target = target;
        board->fate = blow.fate;
        board->cut = blow.cut;
        board->tools = options_.tools;
        std::fflush(stdout);
        const pid_t child = fork();
        if (child == 0) {
            const int nowhere = open("/dev/null", O_RDWR);
            dup2(nowhere, STDOUT_FILENO);
            dup2(nowhere, STDERR_FILENO);
            alarm(kPatience);
            GTEST_FLAG_SET(filter, name);
            _exit(RUN_ALL_TESTS() == 0 ? 0 : 1);
        }
        int status = 0;
        if (child < 0 || waitpid(child, &status, 0) != child)
            std::abort();
        judge(status);
    }

    static void judge(int status) {
        const bool in_call = board->fired && !board->finished;
        if (WIFSIGNALED(status) && (in_call || board->target < 0))
            complain(WTERMSIG(status) == SIGALRM ? "it hangs" : "it ends by signal %d",
                     WTERMSIG(status));
        else if (in_call)
            complain("it ends with status %d", WEXITSTATUS(status));
    }

    Options options_;
    std::vector<Tally> tallies_;
    std::vector<bool> called_;
    std::map<std::tuple<int, std::uintptr_t, int>, int> seen_;
    int tests_ = 0;
    int overlapping_ = 0;
    int unfit_ = 0;
};

std::vector<std::string> test_names() {
    std::vector<std::string> names;
    const testing::UnitTest &all = *testing::UnitTest::GetInstance();
    for (int i = 0; i < all.total_test_suite_count(); ++i) {
        const testing::TestSuite &suite = *all.GetTestSuite(i);
        const std::string suite_name = suite.name();
        // These have processes and threads of their own in the library, or ask it thousands of
        // times.
        if (suite_name.ends_with("DeathTest") || suite_name == "Turns" || suite_name == "Caller" ||
            suite_name.starts_with("Random"))
            continue;
        for (int j = 0; j < suite.total_test_count(); ++j)
            names.push_back(suite_name + "." + suite.GetTestInfo(j)->name());
    }
    return names;
}

Options options_from(int argc, char **argv) {
    Options options;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "--all")
            options.per_place = 1 << 30;
        else if (word == "--tools") {
            options.tools = true;
            options.per_place = 1;
        } else if (word.starts_with("--filter="))
            options.filter = word.substr(9);
        else {
            std::fputs("usage: fault_tests [--tools] [--all] [--filter=TEST-OR-PREFIX*]\n", stderr);
            std::exit(64);
        }
    }
    return options;
}

bool fits(const std::string &name, const std::string &filter) {
    return filter.ends_with('*') ? name.starts_with(filter.substr(0, filter.size() - 1))
                                 : name == filter;
}

} // namespace

int main(int argc, char **argv) {
    const Options options = options_from(argc, argv);
    int none = 1;
    testing::InitGoogleTest(&none, argv);
    harness::call_fails = fails;
    harness::allocated = block_given;
    if (options.tools)
        harness::distort = answer_wrongly;
    Campaign campaign(options);
    for (const std::string &name : test_names())
        if (fits(name, options.filter))
            campaign.test(name);
    return campaign.report();
}
