// Work in a process of its own: for calls of the library that may end the process they are made in.
#pragma once

#include "../core/disc_outcome.h"

#include <sys/types.h>

#include <chrono>
#include <functional>
#include <string>

namespace zavctl {

// The process leads a group of its own. An interrupt at the terminal, which goes to every process
// of zavctl's group, reaches neither it nor its tools: zavctl alone decides what is ended, and in
// what order.
class Job {
  public:
    // What `work` returns is handed back as it is. It begins at once.
    explicit Job(const std::function<std::string()> &work);
    ~Job(); // ends the process with its tools, if it still runs
    Job(const Job &) = delete;
    Job &operator=(const Job &) = delete;

    // True once the process has ended, with or without a result.
    bool wait(std::chrono::milliseconds limit);

    // Asks it and its tools to end.
    void terminate() const;

    // Once it has ended, or else as one that did not answer in time.
    ChildEnd end() const;
    const std::string &result() const { return result_; }

  private:
    void read_result();
    void reap();

    pid_t process_ = -1;
    int pipe_ = -1;   // its result
    int prints_ = -1; // what it and its tools print
    bool ended_ = false;
    int status_ = 0;
    std::string result_;
};

} // namespace zavctl
