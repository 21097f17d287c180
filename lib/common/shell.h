// Commands that are run for their output.
#pragma once

#include <cstdio>

namespace zav {

// A command's output, read like a file. The child is waited for when the reader ends.
class CommandOutput {
  public:
    explicit CommandOutput(const char *command) : pipe_(popen(command, "re")) {}
    CommandOutput(const CommandOutput &) = delete;
    CommandOutput &operator=(const CommandOutput &) = delete;
    ~CommandOutput() { close(); }

    explicit operator bool() const { return pipe_ != nullptr; }

    // One line of at most `size` - 1 characters, line feed included; false at the end.
    bool line(char *buffer, int size) { return fgets(buffer, size, pipe_) != nullptr; }

    // At most `size` bytes of all the output.
    size_t read(char *buffer, size_t size) { return fread(buffer, 1, size, pipe_); }

    void close();

    // Closes the stream like a plain file's.
    void close_plain();

  private:
    FILE *pipe_;
};

} // namespace zav
