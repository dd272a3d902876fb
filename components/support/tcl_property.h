// The property component: the value of a property argument or result, held as a Tcl value.
#pragma once

#include <tcl.h>

#include "Port/Recycle.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskSupport {

// Holds one Tcl value with a reference taken on it, so the value passes from a command's word to
// the operation and back to the interpreter's result without a copy or a conversion. A value that
// was never set is the empty string; "(nil)" and "nil" are ordinary texts here. A property belongs
// to the thread of the interpreter whose values it holds.
class TclProperty final : public UtilI::ITclProperty, public Port::Recycled<TclProperty> {
public:
    TclProperty() noexcept;
    ~TclProperty() override;
    TclProperty(const TclProperty&) = delete;
    TclProperty& operator=(const TclProperty&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override;

    CommonI::RESULT ToTclObj(Tcl_Obj*& out, Port_String& message) override;
    CommonI::RESULT FromTclObj(Tcl_Obj* value, Port_String& message) override;

private:
    CommonI::RefCounter m_counter{this};
    // Null stands for the empty string until a value is needed: most properties are given a value
    // right after they are made, and that value then costs no Tcl object of our own.
    Tcl_Obj* m_value = nullptr;
};

}  // namespace TcltaskSupport
