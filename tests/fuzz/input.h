// Bytes as the library meets them: lines read by fgets, texts, fields.
#pragma once

#include "targets.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

namespace fuzz {

inline void require(bool holds, const char *what) {
    if (holds)
        return;
    std::fprintf(stderr, "fuzz: %s\n", what);
    std::abort();
}

// The bytes as a text of its own, NUL-terminated, with nothing readable behind it.
class Text {
  public:
    explicit Text(Bytes bytes) : characters_(bytes.begin(), bytes.end()) {
        characters_.push_back('\0');
    }
    char *get() { return characters_.data(); }
    std::size_t room() const { return characters_.size(); }

  private:
    std::vector<char> characters_;
};

// Pieces as fgets cuts them with a buffer of `size` bytes; each in memory of exactly that size.
class Pieces {
  public:
    Pieces(Bytes bytes, std::size_t size) : rest_(bytes), size_(size) {}

    // The next piece in `buffer`, which has `size` bytes; false at the end.
    bool next(char *buffer) {
        if (rest_.empty())
            return false;
        std::size_t length = std::min(rest_.size(), size_ - 1);
        const auto *end =
            static_cast<const std::uint8_t *>(std::memchr(rest_.data(), '\n', length));
        if (end != nullptr)
            length = static_cast<std::size_t>(end - rest_.data()) + 1;
        std::memcpy(buffer, rest_.data(), length);
        buffer[length] = '\0';
        rest_ = rest_.subspan(length);
        return true;
    }

    // Each piece, in a buffer that ends where it ends.
    template <class Reader>
    void each(const Reader &reader) {
        std::vector<char> buffer(size_);
        while (next(buffer.data()))
            reader(buffer.data());
    }

  private:
    Bytes rest_;
    std::size_t size_;
};

// Cuts the first `size` bytes off; zeros where there are not as many.
template <class Value>
Value taken(Bytes &bytes) {
    Value value = {};
    const std::size_t size = std::min(sizeof value, bytes.size());
    if (size > 0)
        std::memcpy(&value, bytes.data(), size);
    bytes = bytes.subspan(size);
    return value;
}

} // namespace fuzz
