// Tcl values in and out of the tool, through the property component of the support library.
#include "property.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <functional>
#include <string>
#include <utility>

#include "CitP/Factory.h"

namespace kelmartool {

Tcl_Obj* NewText(std::string_view text) { return Tcl_NewStringObj(text.data(), static_cast<int>(text.size())); }

Tcl_Obj* NewInt(long long value) { return Tcl_NewWideIntObj(static_cast<Tcl_WideInt>(value)); }

namespace {

// The count of significant digits of the shortest text that reads back as `value`; 0 when there is
// none (not finite).
int ShortestDigits(double value) {
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

}  // namespace

Tcl_Obj* NewDouble(double value) {
    // Whole numbers read as integers; others with the fewest digits that read back the same.
    if (std::isfinite(value) && value == std::round(value) && std::fabs(value) < 1e15)
        return NewInt(static_cast<long long>(std::llround(value)));
    // The fewest digits that read back the same are those of the shortest form std::to_chars
    // gives; printed with %g at that precision, the text is the one the search over 1 to 17
    // digits below finds, at the price of one formatting instead of up to seventeen.
    char buffer[40];
    if (const int digits = ShortestDigits(value); digits > 0) {
        // Formatted as printf's %g would, without its locale and argument list.
        const auto [end, error] = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general, digits);
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

Tcl_Obj* NewBool(bool value) { return Tcl_NewIntObj(value ? 1 : 0); }

Tcl_Obj* NewList(const std::vector<std::string>& words) { return ListOf(words, NewText); }

Tcl_Obj* NewList(std::initializer_list<Tcl_Obj*> items) { return ListOf(items, std::identity{}); }

DictBuilder::DictBuilder() : m_dict(Tcl_NewListObj(0, nullptr)) {}

DictBuilder::~DictBuilder() {
    if (m_dict != nullptr) {
        Tcl_IncrRefCount(m_dict);
        Tcl_DecrRefCount(m_dict);
    }
}

// A dict's text is the list of its pairs; building it as a list keeps the order of the calls and
// stays a proper dict as long as keys are not repeated.
DictBuilder& DictBuilder::Add(std::string_view key, Tcl_Obj* value) {
    Tcl_ListObjAppendElement(nullptr, m_dict, NewText(key));
    Tcl_ListObjAppendElement(nullptr, m_dict, value);
    return *this;
}

Tcl_Obj* DictBuilder::Take() noexcept { return std::exchange(m_dict, Tcl_NewListObj(0, nullptr)); }

UtilI::MITclProperty MakeProperty(Tcl_Obj* value, Port_String& message) {
    TclValue hold(value);  // frees a value without references on every way out
    static const Port_String kSupport("libTcltask_Support");
    if (!CitP::Factory::LoadLibraryFactory(kSupport)) {
        message = "the property component library libTcltask_Support cannot be loaded";
        return {};
    }
    CitI::MIInterface component = CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID);
    UtilI::MITclProperty property(component);
    if (!property) {
        message = "the property component cannot be made";
        return {};
    }
    Port_String ignored;
    property->FromTclObj(value, ignored);
    return property;
}

CommonI::RESULT Answer(Tcl_Obj* value, UtilI::MITclProperty& result, Port_String& message) {
    result = MakeProperty(value, message);
    return result ? 1 : 0;
}

CommonI::RESULT Fail(Port_String& message, const std::string& text) {
    message = text.c_str();
    return 0;
}

std::string Join(const std::vector<std::string>& words, const char* separator) {
    std::string out;
    for (const std::string& w : words) out += (out.empty() ? "" : separator) + w;
    return out;
}

TclValue ValueOf(const UtilI::MITclProperty& property) {
    if (!property) return {};
    Tcl_Obj* out = nullptr;
    Port_String message;
    if (property->ToTclObj(out, message) != 1 || out == nullptr) return {};
    return TclValue(out);
}

std::string TextOf(const UtilI::MITclProperty& property) { return ValueOf(property).Text(); }

bool WordsOf(const UtilI::MITclProperty& property, std::vector<std::string>& words) {
    TclValue value = ValueOf(property);
    if (!value) return true;
    int count = 0;
    Tcl_Obj** items = nullptr;
    if (Tcl_ListObjGetElements(nullptr, value.get(), &count, &items) != TCL_OK) return false;
    for (int i = 0; i < count; ++i) words.emplace_back(Tcl_GetString(items[i]));
    return true;
}

bool WordsOf(const UtilI::TclPropertyList& list, std::vector<std::string>& words) {
    for (const auto& property : list)
        if (!WordsOf(property, words)) return false;
    return true;
}

bool IsNil(std::string_view text) noexcept { return text == "(nil)" || text == "nil"; }

}  // namespace kelmartool
