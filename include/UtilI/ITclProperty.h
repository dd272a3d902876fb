// UtilI::ITclProperty: the value type of every command that gives a property; it turns itself into a
// Tcl_Obj and takes its value from one.
#pragma once

#include <tcl.h>

#include <vector>

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"

namespace UtilI {

inline constexpr Port::XUIDLiteral ITclPropertyID{0xbca27424504c4adaull, 0xb2a94825c6dc2b97ull};
// The component class that implements ITclProperty (libTcltask_Support).
inline constexpr Port::XUIDLiteral TclPropertyID{0xb11df61f8709474full, 0x888e1bf685b73570ull};

class ITclProperty : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ITclPropertyID;
    static constexpr const char* NAME = "ITclProperty";

    // The value as a Tcl object, ready for Tcl_SetObjResult. 1 is success; else `message` says why.
    virtual CommonI::RESULT ToTclObj(Tcl_Obj*& out, Port_String& message) = 0;
    // Takes the value from `value`.
    virtual CommonI::RESULT FromTclObj(Tcl_Obj* value, Port_String& message) = 0;
};

using MITclProperty = CommonI::RefCountPtr<ITclProperty>;
// A property list: one counted reference per element, never empty when an operation gets it.
using TclPropertyList = std::vector<MITclProperty>;

}  // namespace UtilI
