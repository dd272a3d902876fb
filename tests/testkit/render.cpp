#include "render.h"

#include <string>

#include "kit_core.h"

namespace TestKit {

namespace {

constexpr const char* kNull = "<null>";

void Append(Tcl_Obj* call, const char* text, int length = -1) {
    Tcl_ListObjAppendElement(nullptr, call, Tcl_NewStringObj(text, length));
}

// The text of the Tcl value behind a property; a property that cannot give one shows its reason, so
// that a test sees it instead of a silent blank.
Tcl_Obj* PropertyText(UtilI::ITclProperty* property) {
    if (!property) return Tcl_NewStringObj(kNull, -1);
    Tcl_Obj* value = nullptr;
    Port_String message;
    if (property->ToTclObj(value, message) != 1 || !value)
        return Tcl_NewStringObj((std::string("<unreadable: ") + message.c_str() + ">").c_str(), -1);
    // The record shares the value: with the record's reference it is shared, and Tcl never changes
    // a shared value in place.
    return value;
}

}  // namespace

void Render(Tcl_Obj* call, const Port_String& text) { Append(call, text.c_str(), text.Length()); }

void Render(Tcl_Obj* call, bool flag) { Append(call, flag ? "1" : "0"); }

void Render(Tcl_Obj* call, int32_t number) { Tcl_ListObjAppendElement(nullptr, call, Tcl_NewIntObj(number)); }

void Render(Tcl_Obj* call, const UtilI::MITclProperty& property) {
    Tcl_ListObjAppendElement(nullptr, call, PropertyText(property.get()));
}

void Render(Tcl_Obj* call, const UtilI::TclPropertyList& properties) {
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const UtilI::MITclProperty& property : properties)
        Tcl_ListObjAppendElement(nullptr, list, PropertyText(property.get()));
    Tcl_ListObjAppendElement(nullptr, call, list);
}

void Render(Tcl_Obj* call, const Port::XUID& id) {
    const Port_String text = id.ToString();
    Append(call, text.c_str(), text.Length());
}

void Render(Tcl_Obj* call, Dpm::IProjectHelper* helper) {
    if (!helper) return Append(call, kNull);
    const Port_String name = helper->GetName();
    Append(call, name.c_str(), name.Length());
}

// A kit component shows its name; any other kit object the name of the interface it was made for.
void Render(Tcl_Obj* call, const CitI::MIInterface& component) {
    if (!component) return Append(call, kNull);
    const KitCore* kit = KitCore::Find(component.get());
    Append(call, kit ? kit->Name().c_str() : "<foreign>");
}

}  // namespace TestKit
