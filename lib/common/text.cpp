#include "text.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <clocale>
#include <cmath>
#include <cstdlib>
#include <cstring>

namespace zav {

char *Fields::next(const char *separators) {
    if (rest_ == nullptr)
        return nullptr;
    char *field = rest_ + strspn(rest_, separators);
    if (*field == '\0') {
        rest_ = nullptr;
        return nullptr;
    }
    char *end = field + strcspn(field, separators);
    rest_ = *end == '\0' ? nullptr : end + 1;
    *end = '\0';
    return field;
}

int32_t to_int(const char *text) {
    const long long number = strtoll(text, nullptr, 10);
    return static_cast<int32_t>(std::clamp<long long>(number, INT32_MIN, INT32_MAX));
}

int64_t to_int64(const char *text) {
    return strtoll(text, nullptr, 10);
}

// strtoul negates what follows a minus sign within its width and saturates by magnitude.
uint32_t to_unsigned(const char *text) {
    const char *digits = text + strspn(text, " \t\n\v\f\r");
    const bool negative = *digits == '-';
    if (*digits == '-' || *digits == '+')
        ++digits;
    if (*digits < '0' || *digits > '9')
        return 0;
    const unsigned long long magnitude = strtoull(digits, nullptr, 10);
    if (magnitude > UINT32_MAX)
        return UINT32_MAX;
    const auto number = static_cast<uint32_t>(magnitude);
    return negative ? 0U - number : number;
}

double to_double(const char *text) {
    // The C library keeps the "C" locale ready; nothing is allocated.
    const locale_t plain = newlocale(LC_ALL_MASK, "C", nullptr);
    if (plain == nullptr)
        return strtod(text, nullptr);
    const double number = strtod_l(text, nullptr, plain);
    freelocale(plain);
    return number;
}

int32_t whole_part(double number) {
    if (!(number > -2147483649.0 && number < 2147483648.0))
        return INT32_MIN;
    return static_cast<int32_t>(number);
}

void copy_text(char *to, size_t size, const char *from) {
    const size_t length = strnlen(from, size - 1);
    memcpy(to, from, length);
    to[length] = '\0';
}

bool number_after(const char *text, const char *prefix, int32_t &number) {
    if (!starts_with(text, prefix))
        return false;
    const char *start = text + strlen(prefix);
    const char *digits = start + strspn(start, " \t\n\v\f\r");
    if (*digits == '-' || *digits == '+')
        ++digits;
    if (*digits < '0' || *digits > '9')
        return false;
    number = to_int(start);
    return true;
}

bool contains(const char *text, const char *part) {
    return strstr(text, part) != nullptr;
}

bool starts_with(const char *text, const char *prefix) {
    return strncmp(text, prefix, strlen(prefix)) == 0;
}

} // namespace zav
