// Port::StringBase<char>: the string type of every interface of the system.
//
// The object is one pointer to nul-terminated text; the byte length is kept as a 32-bit integer
// directly in front of the text, so that a caller can hand the pointer to Tcl and read the length
// without scanning. Short texts live in an inline block, so that a string that crosses the border
// on every call costs no allocation.
#pragma once

#include <cstdint>
#include <cstddef>

namespace Port {

// How Compare and Replace match: 0 byte for byte, 1 ignoring ASCII case.
enum CompareType : int { CompareExact = 0, CompareNoCase = 1 };

// How Trim works: 0 removes one leading instance of the given text.
enum TrimType : int { TrimLeadingOnce = 0 };

template <class Ch>
class StringBase;

template <>
class StringBase<char> {
public:
    StringBase() noexcept;
    StringBase(const char* text);  // NOLINT: implicit by design, as the interfaces take literals
    StringBase(const char* text, int32_t length);
    // Joins the texts up to the first null pointer.
    StringBase(const char* t1, const char* t2, const char* t3 = nullptr, const char* t4 = nullptr,
               const char* t5 = nullptr, const char* t6 = nullptr, const char* t7 = nullptr,
               const char* t8 = nullptr, const char* t9 = nullptr);
    StringBase(const StringBase& other);
    StringBase(StringBase&& other) noexcept;
    ~StringBase();

    StringBase& operator=(const char* text);
    StringBase& operator=(const StringBase& other);
    StringBase& operator=(StringBase&& other) noexcept;
    StringBase& operator+=(const char* text);
    StringBase& operator+=(const StringBase& other);
    StringBase& Append(const char* text, int32_t length);

    // The text, never null.
    const char* c_str() const noexcept { return m_text; }
    operator const char*() const noexcept { return m_text; }  // NOLINT
    int32_t Length() const noexcept { return reinterpret_cast<const int32_t*>(m_text)[-1]; }
    bool IsEmpty() const noexcept { return Length() == 0; }
    void Clear() noexcept;

    // 0 when equal; otherwise the sign of the first difference.
    int Compare(const char* other, CompareType type) const noexcept;
    // Replaces every occurrence of `from` by `to`; gives the count of replacements.
    int Replace(const char* from, const char* to, CompareType type);
    // Removes one leading instance of `text` (TrimLeadingOnce); gives true when something went.
    bool Trim(const char* text, TrimType type);

    // A string of the printf-style format.
    static StringBase doFormat(const char* format, ...)
#if defined(__GNUC__)
        __attribute__((format(printf, 1, 2)))
#endif
        ;

    friend bool operator==(const StringBase& a, const StringBase& b) noexcept;
    friend bool operator==(const StringBase& a, const char* b) noexcept;

private:
    static constexpr int32_t kInline = 28;  // text bytes held without allocation, nul included

    void Assign(const char* text, int32_t length);
    void Reserve(int32_t length);  // room for `length` text bytes, keeps the content
    bool IsInline() const noexcept { return m_text == m_inline + sizeof(int32_t); }
    void SetLength(int32_t length) noexcept { reinterpret_cast<int32_t*>(m_text)[-1] = length; }

    char* m_text;           // points behind the length word
    int32_t m_capacity;     // text bytes available, nul excluded
    alignas(int32_t) char m_inline[sizeof(int32_t) + kInline];
};

}  // namespace Port

using Port_String = Port::StringBase<char>;
