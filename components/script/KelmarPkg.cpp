#include "Script/KelmarPkg.h"

#include <cstring>
#include <exception>

#include "CommonI/IRefCount.h"
#include "HandleRegistry.h"
#include "HdcI/IHDProject.h"
#include "Script/TScriptHandleHelper.h"
#include "Script/TTclWrapFactory.h"
#include "Script/TclWrapFactory.h"
#include "Script/TclWrapSupport.h"

namespace Script {
namespace {

// The support's own wrapper of an object of interface I. It holds a counted reference on the object
// and answers only GetInterface, so that an object given back as a bare IInterface or IHDProject has
// a word that a script can ask for its other faces.
template <class I>
class GetInterfaceWrapper final : public CountedPtrHandle<I> {
public:
    GetInterfaceWrapper(I* object, Tcl_Interp* interp) : CountedPtrHandle<I>(object, interp) { m_helper.SetHandle(this); }

    CitI::IInterface* GetScriptHandle(const Port::XUID& id) {
        if (id == CitI::IScriptHandleID || id == CitI::IInterfaceID) return &m_helper;
        return nullptr;
    }

    int Execute(int argc, Handle* const* argv, Tcl_Interp* interp) override {
        const char* self = argc > 0 ? argv[0]->GetString() : nullptr;
        if (self == nullptr) self = "";
        const char* word = argc > 1 ? argv[1]->GetString() : nullptr;
        if (word != nullptr && std::strcmp(word, "GetInterface") != 0) {
            Tcl_SetObjResult(interp, Tcl_ObjPrintf("unknown command \"%s\" for %s: valid commands are GetInterface",
                                                   word, self));
            return TCL_ERROR;
        }
        const char* idText = argc > 2 ? argv[2]->GetString() : nullptr;
        if (word == nullptr || idText == nullptr) {
            Tcl_SetObjResult(interp, Tcl_ObjPrintf("wrong # args: should be \"%s GetInterface ID\"", self));
            return TCL_ERROR;
        }
        void* value = nullptr;
        if (this->GetValue(&value) != 0) {
            Tcl_SetObjResult(interp, Tcl_ObjPrintf("%s holds no %s object", self, I::NAME));
            return TCL_ERROR;
        }
        const Port::XUID id(idText);
        try {
            CitI::IInterface* face = static_cast<I*>(value)->GetInterface(id);
            return TclWrapSupport::TclWrapResolver(id, face, interp);
        } catch (const std::exception& e) {
            Tcl_SetObjResult(interp, Tcl_ObjPrintf("%s GetInterface: %s", self, e.what()));
        } catch (...) {
            Tcl_SetObjResult(interp, Tcl_ObjPrintf("%s GetInterface: unexpected exception", self));
        }
        return TCL_ERROR;
    }

private:
    TScriptHandleHelper<GetInterfaceWrapper> m_helper;
};

template <class I>
void RegisterSupportFactory() {
    // Kept for good, like every registered factory.
    auto* factory = new TTclWrapFactory<GetInterfaceWrapper<I>, I>;
    TclWrapFactory::RegisterFactory(I::IID, factory);
}

}  // namespace
}  // namespace Script

extern "C" {

int Kelmarpkg_Init(Tcl_Interp* interp) {
    if (Tcl_InitStubs(interp, "8.6", 0) == nullptr) return TCL_ERROR;
    static const bool registered = [] {
        Script::RegisterSupportFactory<CitI::IInterface>();
        Script::RegisterSupportFactory<HdcI::IHDProject>();
        return true;
    }();
    static_cast<void>(registered);
    Script::HandleRegistry::Attach(interp);
    return TCL_OK;
}

// A safe interpreter gets the same: the support creates no command that reaches outside Tcl.
int Kelmarpkg_SafeInit(Tcl_Interp* interp);
int Kelmarpkg_SafeInit(Tcl_Interp* interp) { return Kelmarpkg_Init(interp); }

}  // extern "C"
