// Where `zavctl watch` shows what it sees.
#pragma once

#include "session.h"

#include "../core/thing.h"

#include <ctime>
#include <memory>
#include <string>
#include <vector>

namespace zavctl {

struct Round {
    std::time_t time;
    int number; // from 1
    int interval;
    std::vector<Change> changes;
};

class WatchOutput {
  public:
    WatchOutput() = default;
    virtual ~WatchOutput() = default;
    WatchOutput(const WatchOutput &) = delete;
    WatchOutput &operator=(const WatchOutput &) = delete;

    virtual void begin() {} // before the first round
    virtual void show(const Round &round, Answer answer) = 0;
    virtual void note(const std::string &trouble) = 0;
    virtual void refresh() {}        // several times a second
    virtual bool failed() const = 0; // nothing can be shown any more
};

// A screen on a terminal, lines elsewhere. While it lives, an interrupt is noted alone.
std::unique_ptr<WatchOutput> make_watch_output(const Session &session);

} // namespace zavctl
