// What the operations of kit objects hand back, by the type of the out argument or the value.
#include <stdexcept>

#include "CitP/Factory.h"
#include "kit_core.h"
#include "kit_kinds.h"

namespace TestKit {

namespace {

// A new property component holding `text`, the way the package makes one from a word.
UtilI::MITclProperty MakeProperty(const std::string& text) {
    UtilI::MITclProperty property(CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID));
    if (!property) throw std::runtime_error("no property component to hold \"" + text + "\"");
    TclRef value(Tcl_NewStringObj(text.data(), static_cast<int>(text.size())));
    Port_String ignored;
    property->FromTclObj(value.get(), ignored);
    return property;
}

Dpm::IProjectHelper* HelperOf(const Outcome* outcome) {
    return outcome && !outcome->helper.empty() ? HelperNamed(outcome->helper) : nullptr;
}

}  // namespace

void KitCore::Deliver(Port_String& text, bool last, const Outcome* outcome) {
    if (last && outcome && outcome->message)
        text = Port_String(outcome->message->data(), static_cast<int32_t>(outcome->message->size()));
}

void KitCore::Deliver(UtilI::MITclProperty& property, bool, const Outcome* outcome) {
    if (outcome && outcome->value) property = MakeProperty(*outcome->value);
}

void KitCore::Deliver(CommonI::RefCountPtr<TcltaskI::ITclProject>& project, bool, const Outcome* outcome) {
    if (outcome)
        project = CommonI::RefCountPtr<TcltaskI::ITclProject>(Provide(ObjectKind::TclProject, outcome->object));
}

void KitCore::Deliver(HdcI::MIHDProject& project, bool, const Outcome* outcome) {
    if (outcome) project = HdcI::MIHDProject(Provide(ObjectKind::HDProject, outcome->object));
}

// The interface demands a written pointer on every path, so here "untouched" means null.
void KitCore::Deliver(Dpm::IProjectHelper*& helper, bool, const Outcome* outcome) { helper = HelperOf(outcome); }

int64_t KitCore::Give(std::type_identity<int64_t>, const Outcome* outcome) { return outcome ? outcome->code : 1; }

Port_String KitCore::Give(std::type_identity<Port_String>, const Outcome* outcome) {
    if (!outcome) return Port_String();
    return Port_String(outcome->string.data(), static_cast<int32_t>(outcome->string.size()));
}

HdcI::MIHDProject KitCore::Give(std::type_identity<HdcI::MIHDProject>, const Outcome* outcome) {
    if (!outcome) return nullptr;
    return HdcI::MIHDProject(Provide(ObjectKind::HDProject, outcome->object));
}

CitI::MIInterface KitCore::Give(std::type_identity<CitI::MIInterface>, const Outcome* outcome) {
    if (!outcome) return nullptr;
    return Provide(ObjectKind::Component, outcome->object);
}

Dpm::IProjectHelper* KitCore::Give(std::type_identity<Dpm::IProjectHelper*>, const Outcome* outcome) {
    return HelperOf(outcome);
}

}  // namespace TestKit
