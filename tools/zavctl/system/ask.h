// Asking several things of the library side by side.
#pragma once

#include <chrono>
#include <functional>
#include <string>
#include <vector>

namespace zavctl {

class Streams;

struct Question {
    std::string about; // "disk 3", for the line that says what is being waited for

    // Runs in a thread of its own and returns what hands the answer over, which the asking thread
    // then calls. It must hold all it needs by value: an answer that does not come in time is
    // never handed over, and the thread is left behind.
    std::function<std::function<void()>()> ask;
};

struct Patience {
    std::chrono::seconds limit{60}; // for all questions together
    std::chrono::seconds usual{20}; // the library's own wait for a device that may still appear

    // Asked again and again: nothing is told while waiting, and what still waits for an answer from
    // before, by its `about`, is not asked another time. Threads that hang are thus no more than
    // there are things to ask about.
    bool repeated = false;
};

// True if all have answered. Otherwise, also after an interrupt that is noted, the tools that still
// run have been ended.
bool ask_all(const std::vector<Question> &all, const Patience &patience, const Streams &streams);

// "waiting for disk 3 and array 4, at most 12 s more": the line on the terminal.
std::string waiting_line(const std::vector<std::string> &about, std::chrono::seconds waited,
                         const Patience &patience);

} // namespace zavctl
