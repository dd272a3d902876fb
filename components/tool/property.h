// Tcl values in and out of the tool: every operation answers with a UtilI::MITclProperty whose Tcl
// value is a proper list or dict, and reads its property arguments back as Tcl values.
#pragma once

#include <tcl.h>

#include <initializer_list>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "Port/StringBase.h"
#include "Script/TclObjRef.h"
#include "UtilI/ITclProperty.h"

namespace kelmartool {

// A counted Tcl value: holds one reference of its own for as long as it lives.
using TclValue = Script::TclObjRef;

// Builders of plain values. Every one gives a new object without references.
Tcl_Obj* NewText(std::string_view text);
Tcl_Obj* NewInt(long long value);
Tcl_Obj* NewDouble(double value);  // shortest text that reads back, e.g. 2.5, 10
Tcl_Obj* NewBool(bool value);      // 1 or 0
Tcl_Obj* NewList(const std::vector<std::string>& words);
Tcl_Obj* NewList(std::initializer_list<Tcl_Obj*> items);  // takes the items as they are

// The list of what `value` makes of each of `items`, in their order: the one way a list of dicts
// (findings, paths, descriptors) is built. `value` gives each element without references.
template <class Items, class Value>
Tcl_Obj* ListOf(const Items& items, Value value) {
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const auto& item : items) Tcl_ListObjAppendElement(nullptr, list, value(item));
    return list;
}

// A dict built in insertion order, so that answers read in a fixed, meaningful order.
class DictBuilder {
public:
    DictBuilder();
    ~DictBuilder();
    DictBuilder(const DictBuilder&) = delete;
    DictBuilder& operator=(const DictBuilder&) = delete;
    DictBuilder& Add(std::string_view key, Tcl_Obj* value);
    DictBuilder& Add(std::string_view key, std::string_view text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, const char* text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, const std::string& text) { return Add(key, NewText(text)); }
    DictBuilder& Add(std::string_view key, int value) { return Add(key, NewInt(value)); }
    DictBuilder& Add(std::string_view key, long long value) { return Add(key, NewInt(value)); }
    DictBuilder& Add(std::string_view key, std::size_t value) { return Add(key, NewInt(static_cast<long long>(value))); }
    DictBuilder& Add(std::string_view key, double value) { return Add(key, NewDouble(value)); }
    DictBuilder& Add(std::string_view key, bool value) { return Add(key, NewBool(value)); }
    Tcl_Obj* Take() noexcept;  // the dict, without a reference; the builder is empty afterwards

private:
    Tcl_Obj* m_dict;  // no references while it is built: it stays unshared
};

// A new property component holding `value` (which may have no references yet). Null, with
// `message` set, when the property component cannot be made.
UtilI::MITclProperty MakeProperty(Tcl_Obj* value, Port_String& message);

// Sets `result` to a property holding `value` and gives 1; on failure 0 with `message` set. The
// one way every operation of the tool answers.
CommonI::RESULT Answer(Tcl_Obj* value, UtilI::MITclProperty& result, Port_String& message);
// Gives 0 with `text` as the failure text.
CommonI::RESULT Fail(Port_String& message, const std::string& text);
// The words one after the other, for a failure text that lists the choices.
std::string Join(const std::vector<std::string>& words, const char* separator = ", ");

// The Tcl value a property holds (counted), or an empty value for a null property.
TclValue ValueOf(const UtilI::MITclProperty& property);
std::string TextOf(const UtilI::MITclProperty& property);
// The words of a property's value read as a list; false when it is no proper list.
bool WordsOf(const UtilI::MITclProperty& property, std::vector<std::string>& words);
// The words of every property of a list, each read as a list, joined in order.
bool WordsOf(const UtilI::TclPropertyList& list, std::vector<std::string>& words);

// The texts `(nil)` and `nil` stand for "not given" in view options.
bool IsNil(std::string_view text) noexcept;

}  // namespace kelmartool
