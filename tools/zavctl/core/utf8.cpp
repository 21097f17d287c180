#include "utf8.h"

namespace zavctl {

namespace {

std::size_t length_by_first_byte(unsigned char byte) {
    if (byte < 0x80)
        return 1;
    if (byte >= 0xC2 && byte <= 0xDF)
        return 2;
    if (byte >= 0xE0 && byte <= 0xEF)
        return 3;
    return byte >= 0xF0 && byte <= 0xF4 ? 4 : 0;
}

// Longer than needed, half of a surrogate pair, or beyond the last code point.
bool encodes_badly(std::size_t length, std::uint32_t code) {
    return (length == 3 && code < 0x800) || (length == 4 && code < 0x10000) || code > 0x10FFFF ||
           (code >= 0xD800 && code <= 0xDFFF);
}

} // namespace

Utf8Char first_char(std::string_view text) {
    const auto byte = static_cast<unsigned char>(text[0]);
    const std::size_t length = length_by_first_byte(byte);
    if (length == 1)
        return {true, 1, byte};
    if (length == 0 || text.size() < length)
        return {};
    std::uint32_t code = byte & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i) {
        const auto next = static_cast<unsigned char>(text[i]);
        if ((next & 0xC0U) != 0x80U)
            return {};
        code = (code << 6U) | (next & 0x3FU);
    }
    if (encodes_badly(length, code))
        return {};
    return {true, length, code};
}

bool disturbs_terminal(std::uint32_t code) {
    return code < 0x20 || (code >= 0x7F && code < 0xA0) || code == 0x200E || code == 0x200F ||
           (code >= 0x2028 && code <= 0x202E) || (code >= 0x2066 && code <= 0x2069);
}

} // namespace zavctl
