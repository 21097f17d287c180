#include "ask.h"

#include "../core/text.h"
#include "run.h"
#include "streams.h"

#include <fmt/format.h>

#include <algorithm>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <optional>
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
};

void answer(const std::shared_ptr<Board> &board, std::size_t index, const Question &question) {
    Delivery delivery = question.ask();
    const std::lock_guard lock(board->mutex);
    board->answers[index] = std::move(delivery);
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
    explicit Notice(const Streams &streams)
        : streams_(streams), enabled_(streams.err_is_terminal()) {}
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
        if (waited >= patience.limit)
            return false;
        if (waited >= silence)
            notice.show(waiting_line(
                about, std::chrono::duration_cast<std::chrono::seconds>(waited), patience));
        board.changed.wait_for(lock, refresh);
    }
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

bool ask_all(const std::vector<Question> &questions, const Patience &patience,
             const Streams &streams) {
    const auto board = std::make_shared<Board>();
    board->answers.resize(questions.size());
    for (std::size_t i = 0; i < questions.size(); ++i)
        start(board, i, questions[i]);
    bool complete = false;
    {
        Notice notice(streams);
        complete = wait_for_answers(*board, questions, patience, notice);
    }
    const std::lock_guard lock(board->mutex);
    for (const std::optional<Delivery> &delivery : board->answers)
        if (delivery)
            (*delivery)();
    if (!complete)
        kill_descendants();
    return complete;
}

} // namespace zavctl
