// Port::StringBase<char>: a length word, then the text and its nul, either in the object's own
// inline block or in one heap block laid out the same way.
#include "Port/StringBase.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <functional>
#include <limits>
#include <memory>
#include <stdexcept>

#include "FormatText.h"

namespace Port {

namespace {

constexpr int32_t kHeader = sizeof(int32_t);
// The largest text whose block (length word, text, nul) still has an int32_t size.
constexpr int32_t kMaxLength = std::numeric_limits<int32_t>::max() - kHeader - 1;

[[noreturn]] void TooLong() {
    throw std::length_error("Port::StringBase: text longer than a 32-bit length allows");
}

int32_t CheckedLength(size_t length) {
    if (length > static_cast<size_t>(kMaxLength)) TooLong();
    return static_cast<int32_t>(length);
}

int32_t MeasureText(const char* text) { return text ? CheckedLength(std::strlen(text)) : 0; }

// A heap block of room for `capacity` text bytes; gives the text pointer behind the length word.
char* NewBlock(int32_t capacity) {
    char* block = new char[static_cast<size_t>(capacity) + kHeader + 1];
    return block + kHeader;
}

void FreeBlock(char* text) noexcept { delete[] (text - kHeader); }

unsigned char FoldCase(unsigned char c) noexcept {
    return (c >= 'A' && c <= 'Z') ? static_cast<unsigned char>(c - 'A' + 'a') : c;
}

bool SameBytes(const char* a, const char* b, size_t length, CompareType type) noexcept {
    if (type != CompareNoCase) return std::memcmp(a, b, length) == 0;
    for (size_t i = 0; i < length; ++i) {
        if (FoldCase(static_cast<unsigned char>(a[i])) != FoldCase(static_cast<unsigned char>(b[i])))
            return false;
    }
    return true;
}

}  // namespace

StringBase<char>::StringBase() noexcept : m_text(m_inline + sizeof(int32_t)), m_capacity(kInline - 1) {
    SetLength(0);
    m_text[0] = '\0';
}

StringBase<char>::StringBase(const char* text) : StringBase() { Assign(text, MeasureText(text)); }

StringBase<char>::StringBase(const char* text, int32_t length) : StringBase() {
    // A negative length means "up to the nul", as Tcl reads it.
    Assign(text, length < 0 ? MeasureText(text) : (text ? length : 0));
}

StringBase<char>::StringBase(const char* t1, const char* t2, const char* t3, const char* t4,
                             const char* t5, const char* t6, const char* t7, const char* t8,
                             const char* t9)
    : StringBase() {
    const char* const parts[] = {t1, t2, t3, t4, t5, t6, t7, t8, t9};
    int32_t lengths[9];
    int count = 0;
    size_t total = 0;
    for (const char* part : parts) {
        if (!part) break;
        lengths[count] = MeasureText(part);
        total += static_cast<size_t>(lengths[count]);
        ++count;
    }
    Reserve(CheckedLength(total));
    for (int i = 0; i < count; ++i) Append(parts[i], lengths[i]);
}

StringBase<char>::StringBase(const StringBase& other) : StringBase() { Assign(other.m_text, other.Length()); }

StringBase<char>::StringBase(StringBase&& other) noexcept : StringBase() { *this = std::move(other); }

StringBase<char>::~StringBase() {
    if (!IsInline()) FreeBlock(m_text);
}

StringBase<char>& StringBase<char>::operator=(const char* text) {
    Assign(text, MeasureText(text));
    return *this;
}

StringBase<char>& StringBase<char>::operator=(const StringBase& other) {
    Assign(other.m_text, other.Length());
    return *this;
}

StringBase<char>& StringBase<char>::operator=(StringBase&& other) noexcept {
    if (this == &other) return *this;
    Clear();
    if (other.IsInline()) {
        std::memcpy(m_inline, other.m_inline, sizeof(int32_t) + static_cast<size_t>(other.Length()) + 1);
    } else {
        m_text = other.m_text;
        m_capacity = other.m_capacity;
        other.m_text = other.m_inline + sizeof(int32_t);
        other.m_capacity = kInline - 1;
    }
    other.SetLength(0);
    other.m_text[0] = '\0';
    return *this;
}

StringBase<char>& StringBase<char>::operator+=(const char* text) { return Append(text, MeasureText(text)); }

StringBase<char>& StringBase<char>::operator+=(const StringBase& other) {
    return Append(other.m_text, other.Length());
}

StringBase<char>& StringBase<char>::Append(const char* text, int32_t length) {
    if (length < 0) length = MeasureText(text);
    if (!text || length == 0) return *this;
    const int32_t old = Length();
    if (length > kMaxLength - old) TooLong();
    const int32_t total = old + length;
    if (total > m_capacity) {
        // The text may be a part of this very string, whose block Reserve replaces.
        const bool own = std::less_equal<const char*>()(m_text, text) &&
                         std::less_equal<const char*>()(text, m_text + old);
        const ptrdiff_t offset = own ? text - m_text : 0;
        Reserve(total);
        if (own) text = m_text + offset;
    }
    std::memmove(m_text + old, text, static_cast<size_t>(length));
    m_text[total] = '\0';
    SetLength(total);
    return *this;
}

void StringBase<char>::Clear() noexcept {
    if (!IsInline()) {
        FreeBlock(m_text);
        m_text = m_inline + sizeof(int32_t);
        m_capacity = kInline - 1;
    }
    SetLength(0);
    m_text[0] = '\0';
}

int StringBase<char>::Compare(const char* other, CompareType type) const noexcept {
    const char* b = other ? other : "";
    const size_t lengthA = static_cast<size_t>(Length());
    const size_t lengthB = std::strlen(b);
    const size_t common = lengthA < lengthB ? lengthA : lengthB;
    for (size_t i = 0; i < common; ++i) {
        unsigned char ca = static_cast<unsigned char>(m_text[i]);
        unsigned char cb = static_cast<unsigned char>(b[i]);
        if (type == CompareNoCase) {
            ca = FoldCase(ca);
            cb = FoldCase(cb);
        }
        if (ca != cb) return ca < cb ? -1 : 1;
    }
    if (lengthA == lengthB) return 0;
    return lengthA < lengthB ? -1 : 1;
}

int StringBase<char>::Replace(const char* from, const char* to, CompareType type) {
    if (!from || !*from) return 0;
    const size_t fromLength = std::strlen(from);
    const char* replacement = to ? to : "";
    const int32_t toLength = MeasureText(replacement);
    const size_t length = static_cast<size_t>(Length());
    if (fromLength > length) return 0;

    // First count, so that the new text is allocated once.
    int count = 0;
    for (size_t i = 0; i + fromLength <= length;) {
        if (SameBytes(m_text + i, from, fromLength, type)) {
            ++count;
            i += fromLength;
        } else {
            ++i;
        }
    }
    if (count == 0) return 0;

    const size_t total = length - static_cast<size_t>(count) * fromLength +
                         static_cast<size_t>(count) * static_cast<size_t>(toLength);
    StringBase result;
    result.Reserve(CheckedLength(total));
    size_t kept = 0;
    for (size_t i = 0; i + fromLength <= length;) {
        if (SameBytes(m_text + i, from, fromLength, type)) {
            result.Append(m_text + kept, static_cast<int32_t>(i - kept));
            result.Append(replacement, toLength);
            i += fromLength;
            kept = i;
        } else {
            ++i;
        }
    }
    result.Append(m_text + kept, static_cast<int32_t>(length - kept));
    *this = std::move(result);
    return count;
}

bool StringBase<char>::Trim(const char* text, TrimType type) {
    if (type != TrimLeadingOnce || !text) return false;
    const size_t cut = std::strlen(text);
    const size_t length = static_cast<size_t>(Length());
    if (cut == 0 || cut > length || std::memcmp(m_text, text, cut) != 0) return false;
    std::memmove(m_text, m_text + cut, length - cut + 1);
    SetLength(static_cast<int32_t>(length - cut));
    return true;
}

StringBase<char> StringBase<char>::doFormat(const char* format, ...) {
    va_list args;
    va_start(args, format);
    try {
        StringBase result = FormatText(format, args);
        va_end(args);
        return result;
    } catch (...) {
        va_end(args);
        throw;
    }
}

void StringBase<char>::Assign(const char* text, int32_t length) {
    if (length > m_capacity) {
        // Copy before letting go of the old block: the text may lie inside it.
        char* fresh = NewBlock(length);
        std::memcpy(fresh, text, static_cast<size_t>(length));
        if (!IsInline()) FreeBlock(m_text);
        m_text = fresh;
        m_capacity = length;
    } else if (length > 0) {
        std::memmove(m_text, text, static_cast<size_t>(length));
    }
    m_text[length] = '\0';
    SetLength(length);
}

void StringBase<char>::Reserve(int32_t length) {
    if (length <= m_capacity) return;
    // Grow geometrically so that a string built by many appends copies its text only a few times.
    int32_t capacity = m_capacity > kMaxLength / 2 ? kMaxLength : m_capacity * 2;
    if (capacity < length) capacity = length;
    char* fresh = NewBlock(capacity);
    const int32_t length0 = Length();
    std::memcpy(fresh - kHeader, m_text - kHeader, kHeader + static_cast<size_t>(length0) + 1);
    if (!IsInline()) FreeBlock(m_text);
    m_text = fresh;
    m_capacity = capacity;
}

bool operator==(const StringBase<char>& a, const StringBase<char>& b) noexcept {
    return a.Length() == b.Length() && std::memcmp(a.m_text, b.m_text, static_cast<size_t>(a.Length())) == 0;
}

bool operator==(const StringBase<char>& a, const char* b) noexcept {
    if (!b) return a.IsEmpty();
    const size_t length = std::strlen(b);
    return length == static_cast<size_t>(a.Length()) && std::memcmp(a.m_text, b, length) == 0;
}

StringBase<char> FormatText(const char* format, va_list args) {
    if (!format) return StringBase<char>();
    va_list measure;
    va_copy(measure, args);
    const int length = std::vsnprintf(nullptr, 0, format, measure);
    va_end(measure);
    if (length <= 0) return StringBase<char>();

    // Most messages fit on the stack; a longer one gets a buffer of its measured size.
    char local[256];
    std::unique_ptr<char[]> large;
    char* buffer = local;
    const size_t size = static_cast<size_t>(length) + 1;
    if (size > sizeof(local)) {
        large.reset(new char[size]);
        buffer = large.get();
    }
    std::vsnprintf(buffer, size, format, args);
    return StringBase<char>(buffer, CheckedLength(static_cast<size_t>(length)));
}

}  // namespace Port
