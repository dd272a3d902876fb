#include "tcl_property.h"

#include "CitP/InstanceTable.h"

namespace TcltaskSupport {

TclProperty::TclProperty() noexcept { CitP::InstanceTable::Born(UtilI::TclPropertyID); }

TclProperty::~TclProperty() {
    // The text is read before the reference goes, as it may be the last one.
    CitP::InstanceTable::Died(UtilI::TclPropertyID, m_value ? Tcl_GetString(m_value) : "");
    if (m_value) Tcl_DecrRefCount(m_value);
}

CitI::IInterface* TclProperty::GetInterface(const Port::XUID& id) {
    // The counter first: every counted pointer asks for it on each copy and release.
    if (id == CommonI::IRefCountID) return &m_counter;
    if (id == UtilI::ITclPropertyID || id == CitI::IInterfaceID) return this;
    return nullptr;
}

CommonI::RESULT TclProperty::ToTclObj(Tcl_Obj*& out, Port_String& /*message*/) {
    if (!m_value) {
        m_value = Tcl_NewObj();
        Tcl_IncrRefCount(m_value);
    }
    out = m_value;
    return 1;
}

CommonI::RESULT TclProperty::FromTclObj(Tcl_Obj* value, Port_String& message) {
    if (!value) {
        message = "No Tcl value was given to take the property's value from.";
        return 0;
    }
    // The new reference first: the value may be the one already held.
    Tcl_IncrRefCount(value);
    if (m_value) Tcl_DecrRefCount(m_value);
    m_value = value;
    return 1;
}

}  // namespace TcltaskSupport
