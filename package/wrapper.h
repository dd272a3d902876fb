// The wrapper classes: one per task interface, each a handle of its interface with a command table.
// TclWrap<W, I> holds everything the eleven share: the four constructors, the counting of the
// wrapped object, the helper that component code sees, dispatch of a command word and the
// GetInterface command. A wrapper class itself only names its class and brings its table.
#pragma once

#include <tcl.h>

#include <cstdint>
#include <cstring>
#include <array>
#include <span>
#include <type_traits>

#include "CommonI/RefCountPtr.h"
#include "Port/UT_STR.h"
#include "Script/Handle.h"
#include "Script/TScriptHandleHelper.h"
#include "Script/TclWrapSupport.h"
#include "marshal/option_frame.h"
#include "marshal/plain_frame.h"
#include "package/report.h"

namespace TcltaskI {

// One row of a command table.
template <class W>
struct TclWrapMethodEntry {
    const char* name;
    int (W::*handler)(int argc, Script::Handle* const* argv, Tcl_Interp* interp);
    int32_t required;
    int32_t optional;  // the count of option switches; read by nothing at run time
    const char* signature;
};

// How a wrapper class words its message for too few arguments.
enum class CountMessage { Signature, Help };
// How a wrapper class compares a command word with its table.
enum class WordCompare { Bytes, UtStr };

// Texts of the dispatch that depend on nothing but the call; shared by the eleven classes.
// The error codes name the interface by its NAME and the command word.
int ReportUnknownWord(Tcl_Interp* interp, const char* word, const char* className, const char* interfaceName,
                      const Port_String& listing, const char* typed);
int ReportTooFew(Tcl_Interp* interp, CountMessage form, const char* signature, Script::Handle* const* argv,
                 const char* interfaceName, const char* word);

template <class W, class I, CountMessage Form, WordCompare Compare>
class TclWrap : public Script::PtrHandle<I> {
    using Base = Script::PtrHandle<I>;

public:
    using Interface = I;
    using Entry = TclWrapMethodEntry<W>;
    using Table = std::span<const Entry>;

    TclWrap() : Base() { m_helper.SetHandle(this); }
    explicit TclWrap(Tcl_Interp* interp) : Base(interp) { m_helper.SetHandle(this); }
    TclWrap(I* object, Tcl_Interp* interp) : Base(object, interp) {
        m_helper.SetHandle(this);
        TclWrap::AddRefValue();
    }
    TclWrap(const TclWrap& other) : Base(other) {
        m_helper.SetHandle(this);
        TclWrap::AddRefValue();
    }
    // The helper keeps its back pointer to this wrapper.
    TclWrap& operator=(const TclWrap& other) {
        if (this != &other) {
            this->ReleaseValue();
            Script::PtrHandleBase::operator=(other);
            this->AddRefValue();
        }
        return *this;
    }
    // Gives no reference back: whoever ends a wrapper calls ReleaseValue first.
    ~TclWrap() override = default;

    void AddRefValue() override {
        if (CommonI::IRefCount* counter = Script::CounterOf<I>(*this)) counter->AddRef();
    }
    void ReleaseValue() override {
        if (CommonI::IRefCount* counter = Script::CounterOf<I>(*this)) counter->Release();
    }

    // The helper, for the identifiers it answers to.
    virtual CitI::IInterface* GetScriptHandle(const Port::XUID& id) {
        if (id == CitI::IScriptHandleID || id == CitI::IInterfaceID) return &m_helper;
        return nullptr;
    }

    int Execute(int argc, Script::Handle* const* argv, Tcl_Interp* interp) override {
        const char* word = "no command";
        const char* typed = nullptr;
        if (argc >= 2) {
            typed = argv[1]->GetString();
            word = typed != nullptr ? typed : "NULL";
            if (typed != nullptr) {
                for (const Entry& row : W::table) {
                    if (!Matches(typed, row.name)) continue;
                    if (row.required + 2 > argc)
                        return ReportTooFew(interp, Form, row.signature, argv, I::NAME, row.name);
                    return (static_cast<W*>(this)->*row.handler)(argc, argv, interp);
                }
            }
        }
        Port_String listing;
        for (const Entry& row : W::table) listing += Port_String("    ", row.name, "\n");
        // The code holds the word as typed, and an empty word when there was none.
        return ReportUnknownWord(interp, word, W::kClassName, I::NAME, listing, typed != nullptr ? typed : "");
    }

    // The GetInterface command: the object's interface of the given identifier, wrapped anew.
    int GetInterface(int, Script::Handle* const* argv, Tcl_Interp* interp) {
        const Port::XUID id(argv[2]->GetString());
        I* object = nullptr;
        if (Object(&object) != 0) {
            ReportWithoutReset(interp, Port_String("Failed to get TcltaskI::", I::NAME, " in ", W::kClassName,
                                                   "::GetInterface."));
            return SetFailureCode(interp, Failure::Object, I::NAME, "GetInterface");
        }
        try {
            CitI::IInterface* face = object->GetInterface(id);
            if (Script::TclWrapSupport::TclWrapResolver(id, face, interp) == TCL_OK) return TCL_OK;
            return SetFailureCode(interp, Failure::Store, I::NAME, "GetInterface");
        } catch (...) {
            ReportWithoutReset(interp, Port_String(kExceptionText, W::kClassName, "::GetInterface."));
            return SetFailureCode(interp, Failure::Exception, I::NAME, "GetInterface");
        }
    }

    // The wrapped object: 0 and the pointer, or 1 when the wrapper holds none.
    int Object(I** out) const {
        void* value = nullptr;
        const int rc = this->GetValue(&value);
        *out = static_cast<I*>(value);
        return rc;
    }

    // The method of a declared command, run by the frame its declaration names.
    template <const auto& D>
    int Method(int argc, Script::Handle* const* argv, Tcl_Interp* interp) {
        W& self = static_cast<W&>(*this);
        if constexpr (std::remove_cvref_t<decltype(D)>::kind == FrameKind::Plain)
            return PlainFrame<W, D>::Run(self, argc, argv, interp);
        else
            return OptionFrame<W, D>::Run(self, argc, argv, interp);
    }

    // The table row of a declared command.
    template <const auto& D>
    static constexpr Entry Row() {
        return {D.word, &TclWrap::template Method<D>, D.required, static_cast<int32_t>(D.options.size()), D.signature};
    }

    // A command table: the declared commands in the interface's order, then GetInterface.
    template <const auto&... D>
    static constexpr std::array<Entry, sizeof...(D) + 1> Rows() {
        return {Row<D>()..., Entry{"GetInterface", &TclWrap::GetInterface, 1, 0, "CitI::IInterface * GetInterface in "}};
    }

private:
    static bool Matches(const char* typed, const char* name) {
        if constexpr (Compare == WordCompare::UtStr) return UT_STR::_Compare(typed, name) == 0;
        // The first byte settles most rows without a call.
        else return typed[0] == name[0] && std::strcmp(typed, name) == 0;
    }

    Script::TScriptHandleHelper<W> m_helper;
};

}  // namespace TcltaskI
