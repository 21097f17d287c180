// zavctl's own input and output, kept apart from what the library and its tools print and read.
#pragma once

#include "../core/doctor.h"
#include "../core/text.h"

#include <string>

namespace zavctl {

// To be made first of all: afterwards descriptor 1 is standard error, so that nothing but
// zavctl's answer reaches standard output, and descriptor 0 is /dev/null, so that no tool eats
// the caller's input.
class Streams {
  public:
    Streams();

    // Writes the whole text to the real standard output. 0, or errno of the failure.
    int write(const std::string &text) const;

    // Whether whoever reads standard output has gone: nothing written would be read.
    bool reader_gone() const;

    // The real standard output, whatever descriptor 1 has become meanwhile.
    int out() const { return out_; }

    // Lines of the terminal at standard output; 0 if it is none.
    std::size_t height() const;

    // A message for the person at the terminal, on standard error.
    void say(const std::string &text) const;

    // Asks on standard error, reads a line from the real standard input: true for y or yes.
    bool confirm(const std::string &question) const;

    // The real standard input, as far as a file is read.
    FileFact read_input() const;

    // The real standard error, whatever descriptor 2 has become meanwhile.
    int err() const { return err_; }

    bool can_ask() const; // standard input and error are terminals
    bool out_is_terminal() const;
    bool err_is_terminal() const;

    // Colours and width for the real standard output. `when` is auto, always or never.
    Style style(const std::string &when) const;
    Style message_style() const; // of standard error

  private:
    int out_ = -1;
    int in_ = -1;
    int err_ = -1;
};

} // namespace zavctl
