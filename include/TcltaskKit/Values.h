// Tcl values for answers: texts, numbers, lists and dicts built in a fixed order. Every builder
// gives a new Tcl_Obj without references, ready to be handed to TcltaskKit::Answer (Property.h) or
// put into a list or dict, which then owns it.
#pragma once

#include <tcl.h>

#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <initializer_list>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "Script/TclObjRef.h"

namespace TcltaskKit {

// A counted Tcl value: holds one reference of its own for as long as it lives.
using TclValue = Script::TclObjRef;

inline Tcl_Obj* NewText(std::string_view text) {
    return Tcl_NewStringObj(text.data(), static_cast<int>(text.size()));
}

inline Tcl_Obj* NewInt(long long value) { return Tcl_NewWideIntObj(static_cast<Tcl_WideInt>(value)); }

// 1 or 0, the way Tcl's own commands answer a truth.
inline Tcl_Obj* NewBool(bool value) { return Tcl_NewIntObj(value ? 1 : 0); }

namespace detail {

// The count of significant digits of the shortest text that reads back as `value`; 0 when there is
// none (not finite).
inline int ShortestDigits(double value) {
    char text[64];
    const auto [end, error] = std::to_chars(text, text + sizeof text, value);
    if (error != std::errc()) return 0;
    int digits = 0;
    int zeros = 0;  // zeros seen since the last other digit: trailing ones do not count
    bool leading = true;
    for (const char* c = text; c != end && *c != 'e'; ++c) {
        if (*c < '0' || *c > '9') continue;
        if (*c == '0') {
            if (!leading) ++zeros;
            continue;
        }
        leading = false;
        digits += zeros + 1;
        zeros = 0;
    }
    return digits;
}

}  // namespace detail

// The shortest text that reads back as `value`: 2.5, 0.1, and a whole number as an integer (10).
inline Tcl_Obj* NewDouble(double value) {
    if (std::isfinite(value) && value == std::round(value) && std::fabs(value) < 1e15)
        return NewInt(static_cast<long long>(std::llround(value)));
    // The fewest digits that read back the same are those of the shortest form std::to_chars
    // gives; printed with %g at that precision, the text is the one the search over 1 to 17
    // digits below finds, at the price of one formatting instead of up to seventeen.
    char buffer[40];
    if (const int digits = detail::ShortestDigits(value); digits > 0) {
        // Formatted as printf's %g would, without its locale and argument list.
        const auto [end, error] =
            std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general, digits);
        double back = 0;
        if (error == std::errc() && std::from_chars(buffer, end, back).ptr == end && back == value)
            return Tcl_NewStringObj(buffer, static_cast<int>(end - buffer));
    }
    for (int d = 1; d <= 17; ++d) {
        std::snprintf(buffer, sizeof buffer, "%.*g", d, value);
        if (std::strtod(buffer, nullptr) == value) break;
    }
    return Tcl_NewStringObj(buffer, -1);
}

// The list of what `value` makes of each of `items`, in their order: the one way a list of texts,
// numbers or dicts is built. `value` gives each element without references.
template <class Items, class Value>
Tcl_Obj* ListOf(const Items& items, Value value) {
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const auto& item : items) Tcl_ListObjAppendElement(nullptr, list, value(item));
    return list;
}

inline Tcl_Obj* NewList(const std::vector<std::string>& words) { return ListOf(words, NewText); }

// A list of values made by the other builders; the list takes them as they are.
inline Tcl_Obj* NewList(std::initializer_list<Tcl_Obj*> items) { return ListOf(items, std::identity{}); }

// A dict built in insertion order, so that an answer reads in a fixed, meaningful order. A dict's
// text is the list of its pairs: built as a list, it keeps the order of the calls and stays a proper
// dict as long as no key is added twice.
class DictBuilder {
public:
    DictBuilder() : m_dict(Tcl_NewListObj(0, nullptr)) {}
    // A dict never taken is freed here.
    ~DictBuilder() {
        Tcl_IncrRefCount(m_dict);
        Tcl_DecrRefCount(m_dict);
    }
    DictBuilder(const DictBuilder&) = delete;
    DictBuilder& operator=(const DictBuilder&) = delete;

    // Takes `value` as it is (without references).
    DictBuilder& Add(std::string_view key, Tcl_Obj* value) {
        Tcl_ListObjAppendElement(nullptr, m_dict, NewText(key));
        Tcl_ListObjAppendElement(nullptr, m_dict, value);
        return *this;
    }
    DictBuilder& Add(std::string_view key, std::string_view text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, const char* text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, const std::string& text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, int value) { return Add(key, NewInt(value)); }
    DictBuilder& Add(std::string_view key, long long value) { return Add(key, NewInt(value)); }
    DictBuilder& Add(std::string_view key, std::size_t value) {
        return Add(key, NewInt(static_cast<long long>(value)));
    }
    DictBuilder& Add(std::string_view key, double value) { return Add(key, NewDouble(value)); }
    DictBuilder& Add(std::string_view key, bool value) { return Add(key, NewBool(value)); }

    // The dict, without a reference; the builder starts a new, empty one.
    Tcl_Obj* Take() noexcept { return std::exchange(m_dict, Tcl_NewListObj(0, nullptr)); }

private:
    Tcl_Obj* m_dict;  // no references while it is built: it stays unshared
};

}  // namespace TcltaskKit
