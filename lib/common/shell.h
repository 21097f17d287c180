// Commands: made from their templates, run for their exit status or for their output.
#pragma once

#include <climits>
#include <cstddef>
#include <cstdio>
#include <initializer_list>

namespace zav {

// A command line made from its template, every %s replaced with a word. Words may come from
// outside: one that a shell would not take as it stands is quoted, also inside backquotes. One that
// begins with '-' would be an option; such a command, and one that grows too long, is never run.
class Command {
  public:
    static constexpr size_t kSize = 2 * PATH_MAX + 1024; // room for two of the longest paths

    Command(const char *form, std::initializer_list<const char *> words);

    const char *text() const { return text_; }

    // The raw status as system() gives it; -1, with errno EINVAL, if it cannot be run.
    int run() const;

    // A pipe on its output; null if it cannot be run.
    FILE *open() const;

  private:
    void add(char character);
    bool begins_a_word() const;
    void add_word(const char *word, bool in_backquotes);
    void add_quoted(char character, bool in_backquotes);

    char text_[kSize] = {}; // terminated wherever it ends
    size_t length_ = 0;
    bool valid_ = true;
};

// A command's output, read like a file. The child is waited for when the reader ends.
class CommandOutput {
  public:
    explicit CommandOutput(const char *command) : pipe_(popen(command, "re")) {}
    explicit CommandOutput(const Command &command) : pipe_(command.open()) {}
    CommandOutput(const CommandOutput &) = delete;
    CommandOutput &operator=(const CommandOutput &) = delete;
    ~CommandOutput() { close(); }

    explicit operator bool() const { return pipe_ != nullptr; }

    // One line of at most `size` - 1 characters, line feed included; false at the end.
    bool line(char *buffer, int size) { return fgets(buffer, size, pipe_) != nullptr; }

    // The same, but for what stands at the end of the output without a line feed.
    bool finished_line(char *buffer, int size) { return line(buffer, size) && feof(pipe_) == 0; }

    // At most `size` bytes of all the output.
    size_t read(char *buffer, size_t size) { return fread(buffer, 1, size, pipe_); }

    // The beginning of the output as a text in a buffer of `size` bytes, and its length.
    size_t text(char *buffer, size_t size) {
        const size_t length = read(buffer, size - 1);
        buffer[length] = '\0';
        return length;
    }

    void close();

    // Closes the stream like a plain file's.
    void close_plain();

  private:
    FILE *pipe_;
};

} // namespace zav
