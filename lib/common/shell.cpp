#include "shell.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <utility>

namespace zav {

namespace {

// The shell takes words of these as they stand.
bool is_plain(const char *word) {
    constexpr const char *kPlain = "abcdefghijklmnopqrstuvwxyz"
                                   "ABCDEFGHIJKLMNOPQRSTUVWXYZ"
                                   "0123456789_./:=,+@%-";
    return *word != '\0' && word[strspn(word, kPlain)] == '\0';
}

} // namespace

Command::Command(const char *form, std::initializer_list<const char *> words) {
    const char *const *word = words.begin();
    bool in_backquotes = false;
    for (const char *c = form; *c != '\0'; ++c) {
        if (c[0] == '%' && c[1] == 's' && word != words.end()) {
            add_word(*word++, in_backquotes);
            ++c;
            continue;
        }
        if (*c == '`')
            in_backquotes = !in_backquotes;
        add(*c);
    }
}

int Command::run() const {
    if (valid_)
        return system(text_);
    errno = EINVAL;
    return -1;
}

FILE *Command::open() const {
    if (valid_)
        return popen(text_, "re");
    errno = EINVAL;
    return nullptr;
}

void Command::add(char character) {
    if (length_ + 1 == sizeof text_) {
        valid_ = false;
        return;
    }
    text_[length_++] = character;
}

// Behind these a word goes on: "/tmp/burnDir/-x" is no option.
bool Command::begins_a_word() const {
    return length_ == 0 || strchr("/=", text_[length_ - 1]) == nullptr;
}

void Command::add_word(const char *word, bool in_backquotes) {
    if (*word == '-' && begins_a_word())
        valid_ = false;
    if (is_plain(word)) {
        while (*word != '\0')
            add(*word++);
        return;
    }
    add('\'');
    while (*word != '\0')
        add_quoted(*word++, in_backquotes);
    add('\'');
}

// Between backquotes the shell takes one backslash away from each backslash and backquote before it
// looks at quotation marks.
void Command::add_quoted(char character, bool in_backquotes) {
    if (character == '\'') { // ends the quotation, adds one, begins another
        add('\'');
        add('\\');
        add('\'');
    } else if (in_backquotes && (character == '\\' || character == '`')) {
        add('\\');
    }
    add(character);
}

void CommandOutput::close() {
    if (pipe_ != nullptr)
        pclose(std::exchange(pipe_, nullptr));
}

// The C library waits for the child here too, so that no zombie is left.
void CommandOutput::close_plain() {
    if (pipe_ != nullptr)
        fclose(std::exchange(pipe_, nullptr));
}

} // namespace zav
