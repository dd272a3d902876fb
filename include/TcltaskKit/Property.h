// Property answers and property arguments. Every operation of a task interface answers through an
// out parameter of type UtilI::MITclProperty: a component of libTcltask_Support that holds a Tcl
// value. The package turns the property into the command's result, or, when the operation gives 0,
// makes the failure text the command's error. Arguments of type Prop or List arrive as properties
// too; ValueOf, TextOf and WordsOf read them back.
//
//     CommonI::RESULT get(const Str& name, Out& result, Msg& message) override {
//         auto it = m_lists.find(name.c_str());
//         if (it == m_lists.end()) return TcltaskKit::Fail(message, "no list is named '" + ... + "'");
//         return TcltaskKit::Answer(TcltaskKit::NewList(it->second), result, message);
//     }
#pragma once

#include <tcl.h>

#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "Port/StringBase.h"
#include "TcltaskKit/Values.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskKit {

// What an operation gives: 1 on success, 0 on failure with the failure text set.
using RESULT = CommonI::RESULT;

// A new property holding `value`, which may have no references yet (it is freed on every way out
// when nothing took it). Null, with `message` set, when the property component cannot be made: its
// library is loaded through the component factory on first use and answered from a cache after.
inline UtilI::MITclProperty MakeProperty(Tcl_Obj* value, Port_String& message) {
    TclValue hold(value);
    static const Port_String kSupport("libTcltask_Support");
    if (!CitP::Factory::LoadLibraryFactory(kSupport)) {
        message = "the property component library libTcltask_Support cannot be loaded";
        return {};
    }
    UtilI::MITclProperty property(CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID));
    if (!property) {
        message = "the property component cannot be made";
        return {};
    }
    Port_String ignored;  // the support's property takes every value
    property->FromTclObj(value, ignored);
    return property;
}

// Sets `result` to a property holding `value` and gives 1; 0 with `message` set when the property
// cannot be made. The last statement of an operation that succeeds:
// `return Answer(NewList(words), result, message);`
inline RESULT Answer(Tcl_Obj* value, UtilI::MITclProperty& result, Port_String& message) {
    result = MakeProperty(value, message);
    return result ? 1 : 0;
}

// Gives 0 with `text` as the failure text: the command fails with exactly this text as its error.
inline RESULT Fail(Port_String& message, const std::string& text) {
    message = text.c_str();
    return 0;
}

// The Tcl value a property holds (counted), or no value for a null property or one that cannot
// give its value.
inline TclValue ValueOf(const UtilI::MITclProperty& property) {
    if (!property) return {};
    Tcl_Obj* out = nullptr;
    Port_String message;
    if (property->ToTclObj(out, message) != 1 || out == nullptr) return {};
    return TclValue(out);
}

// The text of a property's value, every byte of it; empty for a null property.
inline std::string TextOf(const UtilI::MITclProperty& property) { return ValueOf(property).Text(); }

// Appends the words of a property's value read as a Tcl list; false when it is no proper list. A
// null property adds nothing.
inline bool WordsOf(const UtilI::MITclProperty& property, std::vector<std::string>& words) {
    TclValue value = ValueOf(property);
    if (!value) return true;
    int count = 0;
    Tcl_Obj** items = nullptr;
    if (Tcl_ListObjGetElements(nullptr, value.get(), &count, &items) != TCL_OK) return false;
    for (int i = 0; i < count; ++i) {
        int length = 0;
        const char* text = Tcl_GetStringFromObj(items[i], &length);
        words.emplace_back(text, static_cast<std::size_t>(length));
    }
    return true;
}

// The same for an argument that must be a list: when it is none, false with a failure text that
// quotes it, ready for `if (!WordsOf(list, words, message)) return 0;`.
inline bool WordsOf(const UtilI::MITclProperty& property, std::vector<std::string>& words, Port_String& message) {
    return WordsOf(property, words) || Fail(message, "not a proper Tcl list: \"" + TextOf(property) + "\"");
}

// The words of every property of a list (the tail of a command such as `add A B C`), each read as
// a Tcl list, joined in order; false when one is no proper list.
inline bool WordsOf(const UtilI::TclPropertyList& list, std::vector<std::string>& words) {
    for (const auto& property : list)
        if (!WordsOf(property, words)) return false;
    return true;
}

}  // namespace TcltaskKit
