// The frame of a plain method, the methods of the project and project manager classes: exactly the
// required words, IN values fetched outside the guard, then inside the catch-all the operation, the
// OUT values stored in argument order and the result stored last. Each parameter's direction follows
// from its C++ type:
//   const Port_String&  IN  FetchString        Port_String&           OUT  StoreString
//   const Port::XUID&   IN  FetchGuid          RefCountPtr<T>&        OUT  Store_InterfaceType<T>
//   IProjectHelper*     IN  Fetch_Type         IProjectHelper*&       OUT  Store_Type
//   CitI::MIInterface&  INOUT Fetch_InterfaceType<CitI::IInterface>, never written back
#pragma once

#include <tcl.h>

#include <type_traits>

#include "Dpm/IProjectHelper.h"
#include "Script/TclWrapSupport.h"
#include "marshal/declare.h"
#include "marshal/fetch_store.h"
#include "marshal/fetch_value.h"
#include "package/report.h"

namespace TcltaskI {

namespace plain {

template <class T>
struct IsCounted : std::false_type {};
template <class T>
struct IsCounted<CommonI::RefCountPtr<T>> : std::true_type {};

// The storage of a parameter: what the operation writes into or reads from.
template <class P>
using Local = std::remove_cvref_t<P>;

template <class P>
constexpr bool kIsIn = std::is_const_v<std::remove_reference_t<P>> || std::is_pointer_v<P> ||
                       std::is_same_v<P, CitI::MIInterface&>;

template <class P>
int Fetch(Local<P>& value, Tcl_Interp* interp, Script::Handle* word) {
    using T = Local<P>;
    if constexpr (std::is_pointer_v<T>) return Fetch_Type(value, interp, word, Script::IN);
    else if constexpr (std::is_same_v<T, CitI::MIInterface>) return Fetch_InterfaceType(value, interp, word, Script::INOUT);
    else return FetchValue(value, interp, word, Script::IN);
}

template <class P>
int StoreOut(Local<P>& value, Tcl_Interp* interp, Script::Handle* word) {
    using T = Local<P>;
    if constexpr (std::is_same_v<T, Port_String>) return Script::TclWrapSupport::StoreString(value, interp, word, Script::OUT);
    else if constexpr (std::is_pointer_v<T>) return Store_Type(value, interp, word, Script::OUT);
    else return Store_InterfaceType(value, interp, word, Script::OUT);
}

template <class R>
int StoreResult(const R& value, Tcl_Interp* interp) {
    if constexpr (std::is_same_v<R, CommonI::RESULT>) return Script::TclWrapSupport::StoreInt64(value, interp, nullptr, Script::RESULT);
    else if constexpr (std::is_same_v<R, Port_String>) return Script::TclWrapSupport::StoreString(value, interp, nullptr, Script::RESULT);
    else if constexpr (std::is_pointer_v<R>) return Store_Type(value, interp, nullptr, Script::RESULT);
    else return Store_InterfaceType(value, interp, nullptr, Script::RESULT);
}

}  // namespace plain

template <class W, const auto& D>
struct PlainFrame {
    using Traits = OperationTraits<decltype(D.op)>;
    using I = typename Traits::Interface;
    using Params = typename Traits::Params;
    static constexpr size_t R = Traits::arity;
    static_assert(static_cast<size_t>(D.required) == R, "the row's required count must match the operation");

    static constexpr const char* kInterface = I::NAME;

    static int Run(W& self, int argc, Script::Handle* const* argv, Tcl_Interp* interp) {
        I* object = nullptr;
        if (self.Object(&object) != 0) return ReportNoObject(interp, W::kClassName, kInterface, D.word);
        return [&]<size_t... K>(std::index_sequence<K...>) {
            // Out pointers start null, so that an operation that forgets one stores 0, not garbage.
            std::tuple<plain::Local<std::tuple_element_t<K, Params>>...> locals{};
            if (argc != static_cast<int>(R) + 2) {
                ErrorReport(interp, kWrongCountText);
                return SetFailureCode(interp, Failure::Count, kInterface, D.word);
            }
            int failed = 0;
            ((failed = failed ? failed : FetchIn<K>(std::get<K>(locals), interp, argv[K + 2])), ...);
            if (failed != 0) return SetFailureCode(interp, Failure::Value, kInterface, D.word);
            try {
                const auto result = (object->*D.op)(std::get<K>(locals)...);
                ((failed = failed ? failed : StoreOutArg<K>(std::get<K>(locals), interp, argv[K + 2])), ...);
                if (failed == 0 && plain::StoreResult(result, interp) == 0) return 0;
                return SetFailureCode(interp, Failure::Store, kInterface, D.word);
            } catch (...) {
                return ReportException(interp, W::kClassName, kInterface, D.word);
            }
        }(std::make_index_sequence<R>{});
    }

    template <size_t K>
    static int FetchIn(plain::Local<std::tuple_element_t<K, Params>>& value, Tcl_Interp* interp, Script::Handle* word) {
        using P = std::tuple_element_t<K, Params>;
        if constexpr (plain::kIsIn<P>) return plain::Fetch<P>(value, interp, word);
        else return 0;
    }

    template <size_t K>
    static int StoreOutArg(plain::Local<std::tuple_element_t<K, Params>>& value, Tcl_Interp* interp, Script::Handle* word) {
        using P = std::tuple_element_t<K, Params>;
        if constexpr (plain::kIsIn<P>) return 0;
        else return plain::StoreOut<P>(value, interp, word);
    }
};

}  // namespace TcltaskI
