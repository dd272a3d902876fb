#include "marshal/property.h"

#include "CitP/Factory.h"
#include "marshal/fetch_store.h"

namespace TcltaskI {

namespace {

int MakeProperty(UtilI::MITclProperty& value, Tcl_Interp* interp, Tcl_Obj* from) {
    UtilI::MITclProperty made(CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID));
    if (!made)
        return ReportWithoutReset(interp, "Unable to create an comopoent that implements UtilI::ITclProperty interface");
    Port_String message;
    made->FromTclObj(from, message);
    value = std::move(made);
    return 0;
}

}  // namespace

template <>
int Fetch_InterfaceType<UtilI::ITclProperty>(UtilI::MITclProperty& value, Tcl_Interp* interp,
                                             Script::Handle* handle, int direction) {
    switch (direction) {
    case Script::IN:
        return MakeProperty(value, interp, handle->GetTclObj());
    case Script::OUT:
        return ReportWithoutReset(interp, "Fetch_InterfaceType<UtilI::ITclProperty> was called for an OUT parameter, which indicates a failure.");
    case Script::INOUT: {
        Tcl_Obj* variable = detail::VariableOf(interp, handle);
        if (variable == nullptr) {
            value = nullptr;
            return 0;
        }
        return MakeProperty(value, interp, variable);
    }
    default:
        return ReportWithoutReset(interp, "Fetch_InterfaceType was called for a RESULT, which indicates a failure");
    }
}

int StoreResultProperty(const UtilI::MITclProperty& result, Port_String& message, Tcl_Interp* interp) {
    if (!result) {
        Tcl_ResetResult(interp);
        return TCL_OK;
    }
    Tcl_Obj* value = nullptr;
    if (result->ToTclObj(value, message) == 1) {
        Tcl_SetObjResult(interp, value);
        return TCL_OK;
    }
    Port_String text("ERROR occurred when converting UtilI::ITclProperty interface object to Tcl_Obj: ", message.c_str());
    Tcl_SetResult(interp, const_cast<char*>(text.c_str()), TCL_VOLATILE);
    return TCL_OK;
}

}  // namespace TcltaskI
