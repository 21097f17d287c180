// Text from files and tools: fields, numbers, bounded copies.
#pragma once

#include <cstddef>
#include <cstdint>

namespace zav {

// Splits a text in place with strtok's rules: separators before a field are skipped, the field ends
// at the next separator. Each call may use other separators.
class Fields {
  public:
    explicit Fields(char *text) : rest_(text) {}

    // The next field, or null.
    char *next(const char *separators);

  private:
    char *rest_;
};

// Numbers as the 32-bit target reads them, on every build and in every locale: leading white space
// and a sign are taken, reading stops at the first other character, a number out of range
// saturates, no number is 0.
int32_t to_int(const char *text);
uint32_t to_unsigned(const char *text);
int64_t to_int64(const char *text);
double to_double(const char *text);

// The whole part of a number. What does not fit, or is no number, becomes the smallest int, as the
// target's conversion instruction makes it.
int32_t whole_part(double number);

// Copies at most `size` - 1 characters and terminates.
void copy_text(char *to, size_t size, const char *from);

// The number that follows `prefix` at the start of the text, as scanf reads it: untouched, and
// false, if there is none.
bool number_after(const char *text, const char *prefix, int32_t &number);

bool contains(const char *text, const char *part);
bool starts_with(const char *text, const char *prefix);

} // namespace zav
