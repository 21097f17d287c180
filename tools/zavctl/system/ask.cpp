#include "ask.h"

#include "../core/text.h"
#include "interrupt.h"
#include "run.h"
#include "streams.h"

#include <fmt/format.h>

#include <algorithm>
#include <condition_variable>
#include <iterator>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <system_error>
#include <thread>

namespace zavctl {

namespace {

using Clock = std::chrono::steady_clock;
using Delivery = std::function<void()>;

constexpr std::chrono::milliseconds silence{700}; // a quick answer needs no line
constexpr std::chrono::milliseconds refresh{250};

// Where the threads lay down their answers; it lives as long as the last of them.
struct Board {
    std::mutex mutex;
    std::condition_variable changed;
    std::vector<std::optional<Delivery>> answers;
    bool closed = false; // nobody waits any more
};

// What the threads that were left behind ask about. Never destroyed: they may outlive main.
class LeftBehind {
  public:
    void add(const std::string &about) {
        const std::lock_guard lock(mutex_);
        about_.insert(about);
    }
    void remove(const std::string &about) {
        const std::lock_guard lock(mutex_);
        about_.erase(about);
    }
    bool has(const std::string &about) {
        const std::lock_guard lock(mutex_);
        return about_.count(about) > 0;
    }

  private:
    std::mutex mutex_;
    std::set<std::string> about_;
};

LeftBehind &left_behind() {
    static LeftBehind *const one = new LeftBehind;
    return *one;
}

void answer(const std::shared_ptr<Board> &board, std::size_t index, const Question &question) {
    Delivery delivery = question.ask();
    const std::lock_guard lock(board->mutex);
    board->answers[index] = std::move(delivery);
    if (board->closed)
        left_behind().remove(question.about);
    board->changed.notify_all();
}

void start(const std::shared_ptr<Board> &board, std::size_t index, const Question &question) {
    try {
        std::thread([board, index, question] { answer(board, index, question); }).detach();
    } catch (const std::system_error &) {
        answer(board, index, question); // no thread to be had: one after the other
    }
}

std::vector<std::string> unanswered(const Board &board, const std::vector<Question> &questions) {
    std::vector<std::string> about;
    for (std::size_t i = 0; i < questions.size(); ++i)
        if (!board.answers[i])
            about.push_back(questions[i].about);
    return about;
}

// A line on the terminal that replaces itself and leaves nothing behind.
class Notice {
  public:
    Notice(const Streams &streams, bool enabled)
        : streams_(streams), enabled_(enabled && streams.err_is_terminal()) {}
    ~Notice() {
        if (shown_)
            streams_.say("\r\033[K");
    }
    Notice(const Notice &) = delete;
    Notice &operator=(const Notice &) = delete;

    void show(const std::string &line) {
        if (!enabled_)
            return;
        streams_.say("\r\033[K" + line);
        shown_ = true;
    }

  private:
    const Streams &streams_;
    bool enabled_;
    bool shown_ = false;
};

bool wait_for_answers(Board &board, const std::vector<Question> &questions,
                      const Patience &patience, Notice &notice) {
    const Clock::time_point begin = Clock::now();
    std::unique_lock lock(board.mutex);
    while (true) {
        const std::vector<std::string> about = unanswered(board, questions);
        const auto waited = Clock::now() - begin;
        if (about.empty())
            return true;
        if (waited >= patience.limit || stop_asked())
            return false;
        if (waited >= silence)
            notice.show(waiting_line(
                about, std::chrono::duration_cast<std::chrono::seconds>(waited), patience));
        board.changed.wait_for(lock, refresh);
    }
}

std::vector<Question> to_be_asked(const std::vector<Question> &all, const Patience &patience) {
    std::vector<Question> questions;
    std::copy_if(all.begin(), all.end(), std::back_inserter(questions),
                 [&patience](const Question &question) {
                     return !patience.repeated || !left_behind().has(question.about);
                 });
    return questions;
}

} // namespace

std::string waiting_line(const std::vector<std::string> &about, std::chrono::seconds waited,
                         const Patience &patience) {
    constexpr std::size_t named = 4; // more would not fit a line
    std::vector<std::string> names(
        about.begin(), about.begin() + static_cast<std::ptrdiff_t>(std::min(named, about.size())));
    if (about.size() > named)
        names.push_back(fmt::format("{} more", about.size() - named));
    if (waited < patience.usual)
        return fmt::format("Waiting for {}: {} s of {} s", listed(names), waited.count(),
                           patience.usual.count());
    return fmt::format("Waiting for {}: {} s, a tool is slow; at most {} s", listed(names),
                       waited.count(), patience.limit.count());
}

bool ask_all(const std::vector<Question> &all, const Patience &patience, const Streams &streams) {
    const std::vector<Question> questions = to_be_asked(all, patience);
    const auto board = std::make_shared<Board>();
    board->answers.resize(questions.size());
    for (std::size_t i = 0; i < questions.size(); ++i)
        start(board, i, questions[i]);
    bool complete = false;
    {
        Notice notice(streams, !patience.repeated);
        complete = wait_for_answers(*board, questions, patience, notice);
    }
    const std::lock_guard lock(board->mutex);
    board->closed = true;
    for (const std::string &about : unanswered(*board, questions))
        left_behind().add(about);
    for (const std::optional<Delivery> &delivery : board->answers)
        if (delivery)
            (*delivery)();
    complete = complete && questions.size() == all.size();
    if (!complete)
        kill_descendants();
    return complete;
}

} // namespace zavctl
