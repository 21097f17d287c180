#include "watching.h"

#include "../core/times.h"
#include "../core/watch_screen.h"
#include "../system/interrupt.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstring>

namespace zavctl {

namespace {

// The terminal's other screen, without a cursor; and back.
constexpr const char *enter_screen = "\033[?1049h\033[?25l\033[H\033[J";
constexpr const char *leave_screen = "\033[?25h\033[?1049l";

// Standard output with its failures: told once, but for a reader that has gone.
class Output {
  public:
    explicit Output(const Streams &streams) : streams_(streams) {}

    void write(const std::string &text) {
        if (failed_)
            return;
        const int error = streams_.write(text);
        failed_ = error != 0;
        if (failed_ && error != EPIPE)
            streams_.say(
                fmt::format("zavctl: cannot write the changes: {}\n", std::strerror(error)));
    }
    bool failed() const { return failed_ || streams_.reader_gone(); }

  private:
    const Streams &streams_;
    bool failed_ = false;
};

class Screen : public WatchOutput {
  public:
    explicit Screen(const Session &session)
        : session_(session), output_(session.streams),
          until_stopped_(session.streams.out(), leave_screen) {}
    ~Screen() override {
        if (entered_)
            output_.write(leave_screen);
    }
    Screen(const Screen &) = delete;
    Screen &operator=(const Screen &) = delete;

    void begin() override {
        entered_ = true;
        output_.write(enter_screen);
        output_.write("zavctl asks the appliance; with an empty slot that takes about 20 s ...");
    }

    void show(const Round &round, Answer answer) override {
        const Answer unstarred = answer;
        if (round.number > 1)
            star_changes(answer, last_);
        last_ = unstarred;
        view_.answer = std::move(answer);
        view_.time = time_of_day(round.time);
        view_.round = round.number;
        view_.interval = round.interval;
        for (const Change &change : round.changes)
            add(change.severity, view_.time, change_text(change));
        draw();
    }

    void note(const std::string &trouble) override {
        add(Severity::warning, time_of_day(std::time(nullptr)), trouble);
        draw();
    }

    void refresh() override {
        const Style style = current_style();
        if (view_.round > 0 &&
            (style.width != drawn_.width || session_.streams.height() != drawn_height_))
            draw();
    }

    bool failed() const override { return output_.failed(); }

  private:
    Style current_style() const { return session_.streams.style(session_.options.colour); }

    void add(Severity severity, const std::string &time, const std::string &text) {
        constexpr std::size_t kept = 50;
        const Style style = current_style();
        view_.recent.insert(view_.recent.begin(),
                            fmt::format("{}  {}", time, coloured(text, severity, style)));
        if (view_.recent.size() > kept)
            view_.recent.resize(kept);
    }

    void draw() {
        drawn_ = current_style();
        drawn_height_ = session_.streams.height();
        output_.write(drawing(watch_lines(view_, drawn_, drawn_height_)));
    }

    const Session &session_;
    Output output_;
    StopGuard until_stopped_;
    WatchView view_;
    Answer last_;
    Style drawn_;
    std::size_t drawn_height_ = 0;
    bool entered_ = false;
};

class Lines : public WatchOutput {
  public:
    explicit Lines(const Session &session) : session_(session), output_(session.streams) {}

    void show(const Round &round, Answer answer) override {
        const std::string time = rfc3339(round.time);
        if (round.number == 1 && !json())
            line(time, severity(answer), summary(answer));
        for (const Change &change : round.changes)
            if (json())
                output_.write(
                    change_json(change, time).dump(-1, ' ', false, Json::error_handler_t::replace) +
                    "\n");
            else
                line(time, change.severity, change_text(change));
    }

    void note(const std::string &trouble) override {
        session_.streams.say("zavctl: " + trouble + "\n");
    }

    bool failed() const override { return output_.failed(); }

  private:
    bool json() const { return session_.options.json || session_.options.jsonl; }

    void line(const std::string &time, Severity severity, const std::string &text) {
        const Style style = session_.streams.style(session_.options.colour);
        output_.write(
            fmt::format("{}  {}  {}\n", time, coloured(mark(severity), severity, style),
                        severity == Severity::ok ? text : coloured(text, severity, style)));
    }

    const Session &session_;
    Output output_;
    StopGuard until_stopped_;
};

} // namespace

std::unique_ptr<WatchOutput> make_watch_output(const Session &session) {
    const bool json = session.options.json || session.options.jsonl;
    if (session.streams.out_is_terminal() && !json)
        return std::make_unique<Screen>(session);
    return std::make_unique<Lines>(session);
}

} // namespace zavctl
