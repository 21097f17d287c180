// Runs on the simulated appliance: eight threads ask the library, and change what may be changed,
// all at once; then discs are burned and blanked while others ask for the progress and cancel. No
// answer may be another than the one that a thread alone was given. Built with the thread sanitizer
// it tells of races too. usage: threads SECONDS
#include "questions.h"
#include "zav_api.h"

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <string>
#include <thread>
#include <unistd.h>

namespace {

using concurrency::Question;
using Clock = std::chrono::steady_clock;

constexpr unsigned kThreads = 8;

std::atomic<bool> stop;

struct Told {
    long answers = 0;
    std::vector<std::string> different; // each with what it was
};

std::string difference(const Question &question, const std::string &answer) {
    std::string text = question.name;
    for (std::size_t i = 0; i < answer.size() && i < question.right.size(); ++i)
        if (answer[i] != question.right[i])
            text += " [" + std::to_string(i) + "] " + std::to_string(question.right[i]) + " > " +
                    std::to_string(answer[i]);
    return text;
}

// At least every question once, from another one on than the other threads. Nothing is shared with
// these that would bring their accesses into an order, and so hide a race from the sanitizer.
void ask_and_change(const std::vector<Question> &all, unsigned number, Told &told) {
    for (std::size_t i = number; i < number + all.size() || !stop; ++i) {
        const Question &question = all[i % all.size()];
        if (const std::string answer = question.ask(); answer != question.right)
            told.different.push_back(difference(question, answer));
        ++told.answers;
        concurrency::change(static_cast<unsigned>(i));
    }
}

Told ask_together(std::chrono::seconds length) {
    const std::vector<Question> all = concurrency::questions();
    const auto end = Clock::now() + length;
    std::vector<Told> told(kThreads);
    std::vector<std::thread> threads;
    for (unsigned number = 0; number < kThreads; ++number)
        threads.emplace_back(ask_and_change, std::cref(all), number, std::ref(told[number]));
    while (Clock::now() < end)
        std::this_thread::sleep_for(std::chrono::seconds(1)); // of the appliance, which are shorter
    stop = true;
    Told sum;
    for (unsigned number = 0; number < kThreads; ++number) {
        threads[number].join();
        sum.answers += told[number].answers;
        std::move(told[number].different.begin(), told[number].different.end(),
                  std::back_inserter(sum.different));
    }
    return sum;
}

struct Job {
    const char *disc; // a sentence of the simulator
    int (*run)();
    int failure; // what it answers when it was cancelled
};

int burn_cd() {
    return zavCDBurn(const_cast<char *>("/tmp/burn"), 0);
}

constexpr Job kJobs[] = {
    {"blank DVD+R", burn_cd, ZAV_RC_ERR_BURNER},
    {"blank CD-R", burn_cd, ZAV_RC_ERR_CDTOOL},
    {"complete CD-RW", zavCDBlank, ZAV_RC_ERR_BLANK},
};

bool is_progress(int value) {
    return value >= 0 && value <= 100;
}

struct Burns {
    long finished = 0;
    long cancelled = 0;
    long progress = 0;
    std::vector<std::string> wrong;
};

// Nothing of an earlier job may look like the progress of the next: the library's own simulation of
// an erase's progress goes on for 24 seconds of the appliance.
void forget_progress() {
    std::this_thread::sleep_for(std::chrono::seconds(25));
    unlink("/tmp/progress.outfile");
}

// Another thread asks for the progress meanwhile, and cancels half way.
void run_beside(const Job &job, bool cancel, Burns &burns) {
    forget_progress();
    const std::string disc =
        std::string("zavsim act drive loses its disc; zavsim act drive gets ") + job.disc +
        " && zavsim act drive writes at 4000";
    if (std::system(disc.c_str()) != 0)
        burns.wrong.push_back(disc);
    std::atomic<bool> done = false;
    std::thread observer([&] {
        for (bool sent = false; !done; std::this_thread::sleep_for(std::chrono::milliseconds(50))) {
            const int value = zavCDProgress();
            if (!is_progress(value))
                burns.wrong.push_back("progress of " + std::to_string(value));
            ++burns.progress;
            if (cancel && !sent && value >= 50)
                sent = zavCDBurnCancel() == 0;
        }
    });
    const int rc = job.run();
    done = true;
    observer.join();
    burns.finished += rc == 0;
    burns.cancelled += rc == job.failure;
    if (rc != 0 && (rc != job.failure || !cancel))
        burns.wrong.push_back(std::string(job.disc) + ": code " + std::to_string(rc));
}

Burns burn_and_cancel(std::chrono::seconds length) {
    const auto end = Clock::now() + length;
    Burns burns;
    std::system("mkdir -p /tmp/burn; head -c 40000000 /dev/zero > /tmp/burn/big");
    for (unsigned i = 0; i < 2 * std::size(kJobs) || Clock::now() < end; ++i)
        run_beside(kJobs[i % std::size(kJobs)], i % 2 != 0, burns);
    return burns;
}

} // namespace

int main(int argc, char **argv) {
    const std::chrono::seconds length(argc > 1 ? std::atoi(argv[1]) : 20);
    std::FILE *report = fdopen(dup(STDOUT_FILENO), "w"); // the rest of what is printed are traces
    std::freopen("/dev/null", "w", stdout);
    std::freopen("/dev/null", "w", stderr);
    const Told told = ask_together(length / 2);
    std::fprintf(report, "%u threads: %ld answers, %zu of them different\n", kThreads, told.answers,
                 told.different.size());
    for (const std::string &different : told.different)
        std::fprintf(report, "  %s\n", different.c_str());
    const Burns burns = burn_and_cancel(length / 2);
    std::fprintf(report,
                 "beside the burner: %ld jobs finished, %ld cancelled; %ld progress; %zu wrong\n",
                 burns.finished, burns.cancelled, burns.progress, burns.wrong.size());
    for (const std::string &wrong : burns.wrong)
        std::fprintf(report, "  %s\n", wrong.c_str());
    return told.different.empty() && burns.wrong.empty() && burns.finished > 0 ? 0 : 1;
}
