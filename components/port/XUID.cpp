// Port::XUID: the text form is the usual lower-case UUID text, the first half giving the first
// sixteen hex digits and the second half the last sixteen.
#include "Port/XUID.h"

#include <cstring>

namespace Port {

namespace {

constexpr size_t kTextLength = 36;

constexpr bool IsDashPosition(size_t i) noexcept { return i == 8 || i == 13 || i == 18 || i == 23; }

int HexValue(char c) noexcept {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

}  // namespace

XUID::XUID(const char* text) noexcept : m_first(0), m_second(0), m_flag(0) {
    if (!text) return;
    size_t length = strnlen(text, kTextLength + 3);
    if (length == kTextLength + 2 && text[0] == '{' && text[kTextLength + 1] == '}') {
        ++text;
        length = kTextLength;
    }
    if (length != kTextLength) return;

    uint64_t halves[2] = {0, 0};
    int digit = 0;
    for (size_t i = 0; i < kTextLength; ++i) {
        if (IsDashPosition(i)) {
            if (text[i] != '-') return;
            continue;
        }
        const int value = HexValue(text[i]);
        if (value < 0) return;
        uint64_t& half = halves[digit / 16];
        half = (half << 4) | static_cast<uint64_t>(value);
        ++digit;
    }
    m_first = halves[0];
    m_second = halves[1];
}

StringBase<char> XUID::ToString() const {
    static constexpr char kDigits[] = "0123456789abcdef";
    char text[kTextLength];
    size_t at = 0;
    for (int digit = 0; digit < 32; ++digit) {
        if (IsDashPosition(at)) text[at++] = '-';
        const uint64_t half = digit < 16 ? m_first : m_second;
        const int shift = (15 - digit % 16) * 4;
        text[at++] = kDigits[(half >> shift) & 0xf];
    }
    return StringBase<char>(text, static_cast<int32_t>(kTextLength));
}

}  // namespace Port
