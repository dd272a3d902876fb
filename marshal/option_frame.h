// The frame of a matched method and of a switch method, one template driven by a declaration:
//  1 wrapped object; 2-3 matcher set-up and matching pass (matched methods only); 4 count test;
//  5-6 positional fetch and tail; 7 default load; 8 option walk; 9-11 operation call and result
//  store inside the catch-all; 12 releases on every way out.
#pragma once

#include <tcl.h>

#include <array>
#include <utility>
#include <variant>

#include "Script/TclWrapSupport.h"
#include "marshal/declare.h"
#include "marshal/default_line.h"
#include "marshal/fetch_value.h"
#include "marshal/options.h"
#include "marshal/property.h"
#include "package/report.h"

namespace TcltaskI {

// Gives back what a storage holds: properties drop their reference, lists their elements last first.
inline void ReleaseValue(UtilI::MITclProperty& value) { value.Release(); }
inline void ReleaseValue(UtilI::TclPropertyList& list) {
    while (!list.empty()) list.pop_back();
}
template <class T>
void ReleaseValue(T&) {}

template <class Tuple>
void ReleaseBackwards(Tuple& values) {
    [&]<size_t... K>(std::index_sequence<K...>) {
        constexpr size_t n = sizeof...(K);
        (ReleaseValue(std::get<n - 1 - K>(values)), ...);
    }(std::make_index_sequence<std::tuple_size_v<Tuple>>{});
}

// What one call holds from the fetches to the end. Its releases come in the order an outside
// component may see: options last declared first, the out property, positionals last first.
template <class Positionals, class Options>
struct CallValues {
    Positionals positionals{};
    Options options{};
    std::array<bool, std::tuple_size_v<Options>> listHoldsDefault{};
    UtilI::MITclProperty out;
    Port_String message;

    CallValues() = default;
    CallValues(const CallValues&) = delete;
    CallValues& operator=(const CallValues&) = delete;
    ~CallValues() {
        ReleaseBackwards(options);
        out.Release();
        ReleaseBackwards(positionals);
    }
};

template <class W, const auto& D>
struct OptionFrame {
    using Decl = std::remove_cvref_t<decltype(D)>;
    using Traits = OperationTraits<decltype(D.op)>;
    using I = typename Traits::Interface;
    static constexpr size_t N = Decl::optionCount;
    static constexpr size_t R = Traits::arity - 2 - N;
    using Positionals = StorageSlice<typename Traits::Params, 0, R>;
    using Options = StorageSlice<typename Traits::Params, R, N>;
    using Values = CallValues<Positionals, Options>;
    static constexpr bool kMatched = Decl::kind == FrameKind::Matched;
    static constexpr bool kTail = [] {
        if constexpr (R == 0) return false;
        else return std::is_same_v<std::tuple_element_t<R - 1, Positionals>, UtilI::TclPropertyList>;
    }();
    static constexpr int kFirstOption = 2 + static_cast<int>(R);
    static_assert(static_cast<size_t>(D.required) == R, "the row's required count must match the operation");

    static constexpr const char* kInterface = I::NAME;

    static int Run(W& self, int argc, Script::Handle* const* argv, Tcl_Interp* interp) {
        I* object = nullptr;
        if (self.Object(&object) != 0) return ReportNoObject(interp, W::kClassName, kInterface, D.word);

        [[maybe_unused]] std::conditional_t<kMatched, MatchSession, std::monostate> session;
        Script::Handle* const* words = argv;
        if constexpr (kMatched) {
            if (session.SetUp(interp, D.options.data(), N) != 0)
                return SetFailureCode(interp, Failure::Loader, kInterface, D.word);
            if (session.Pass(interp, argc, argv, kFirstOption) != 0)
                return session.SetPassFailureCode(interp, kInterface, D.word);
            words = session.Vector();
        }

        Values values;
        int end = argc;
        if constexpr (N > 0) end = PositionalScan(argc, words, D.options.data(), N);
        const bool countOk = N > 0 ? (kTail ? end >= kFirstOption : end == kFirstOption) : (kTail || argc == kFirstOption);
        if (!countOk) {
            ErrorReportWithHelp(interp, kWrongCountText, object, D.word);
            return SetFailureCode(interp, Failure::Count, kInterface, D.word);
        }

        if (FetchPositionals(values.positionals, interp, words, end) != 0) return 1;
        if constexpr (N > 0) {
            if (LoadDefaults(values, interp) != 0) return 1;
            if (Walk(values, interp, words, argc, end, object) != 0) return 1;
        }

        try {
            const CommonI::RESULT result = std::apply(
                [&](auto&... args) { return (object->*D.op)(args..., values.out, values.message); },
                std::tuple_cat(std::apply([](auto&... p) { return std::tie(p...); }, values.positionals),
                               std::apply([](auto&... o) { return std::tie(o...); }, values.options)));
            if (result != 1) return ReportOperationFailure(interp, values.message, kInterface, D.word);
            return StoreResultProperty(values.out, values.message, interp);
        } catch (...) {
            return ReportException(interp, W::kClassName, kInterface, D.word);
        }
    }

    // The kind of a fetch that failed: a property fails only when its component cannot be made; any
    // other type when the word is not a value of it.
    template <class T>
    static constexpr Failure kFetchFailure =
        std::is_same_v<T, UtilI::MITclProperty> || std::is_same_v<T, UtilI::TclPropertyList> ? Failure::Loader
                                                                                               : Failure::Value;

    // Positionals from word 2 on; a tail list takes the word at the last positional place and every
    // word up to `end`.
    static int FetchPositionals(Positionals& positionals, Tcl_Interp* interp, Script::Handle* const* words, int end) {
        // One allocation for the whole tail instead of one per doubling.
        if constexpr (kTail) std::get<R - 1>(positionals).reserve(static_cast<size_t>(end - kFirstOption + 1));
        return [&]<size_t... K>(std::index_sequence<K...>) {
            int failed = 0;
            ((failed = failed ? failed : FetchPositional<K>(positionals, interp, words[K + 2])), ...);
            if constexpr (kTail) {
                for (int i = kFirstOption; failed == 0 && i < end; ++i)
                    failed = FetchPositional<R - 1>(positionals, interp, words[i]);
            }
            return failed;
        }(std::make_index_sequence<R>{});
    }

    template <size_t K>
    static int FetchPositional(Positionals& positionals, Tcl_Interp* interp, Script::Handle* word) {
        using T = std::tuple_element_t<K, Positionals>;
        if (FetchValue(std::get<K>(positionals), interp, word, Script::IN) == 0) return 0;
        return SetFailureCode(interp, kFetchFailure<T>, kInterface, D.word);
    }

    static int LoadDefaults(Values& values, Tcl_Interp* interp) {
        return [&]<size_t... K>(std::index_sequence<K...>) {
            int failed = 0;
            ((failed = failed ? failed : LoadDefault<K>(values, interp)), ...);
            return failed;
        }(std::make_index_sequence<N>{});
    }

    template <size_t K>
    static int LoadDefault(Values& values, Tcl_Interp* interp) {
        using T = std::tuple_element_t<K, Options>;
        static thread_local DefaultLine line;
        if (line.line == nullptr) MakeDefaultLine(line, W::kClassName, D.word, D.options[K], kMatched);
        const Option& option = D.options[K];
        Script::TclObjRef set;
        if (SetDefault(interp, line, set) != TCL_OK)
            return ReportDefaultFailure(interp, option.name, TypeWord<T>(), kInterface, D.word);
        // The value itself when nothing watches the variable, else the variable read back.
        Script::TclObjHandleBase word(set ? set.get() : line.variable);
        T& value = std::get<K>(values.options);
        if (FetchValue(value, interp, &word, set ? Script::IN : Script::INOUT) != 0)
            return ReportDefaultFailure(interp, option.name, TypeWord<T>(), kInterface, D.word);
        if constexpr (std::is_same_v<T, UtilI::TclPropertyList>) values.listHoldsDefault[K] = true;
        return 0;
    }

    static int Walk(Values& values, Tcl_Interp* interp, Script::Handle* const* words, int argc, int start,
                    I* object) {
        for (int i = start; i < argc;) {
            const char* word = WordText(words[i]);
            if (word[0] != '-') return ReportNotASwitch(interp, word, object, D.signature, kInterface, D.word);
            const int k = FindOption(word + 1, D.options.data(), N);
            if (k < 0) return ReportUnrecognized(interp, word + 1, object, D.signature, kInterface, D.word);
            const int failed = [&]<size_t... K>(std::index_sequence<K...>) {
                int rc = 0;
                ((static_cast<size_t>(k) == K ? (rc = WalkOption<K>(values, interp, words, argc, i), 0) : 0), ...);
                return rc;
            }(std::make_index_sequence<N>{});
            if (failed != 0) return 1;
        }
        return 0;
    }

    // One option at position i: a bool alone negates, a bool with a word takes it; a value option
    // takes the next word whatever it is; a list option drops its default at its first value.
    template <size_t K>
    static int WalkOption(Values& values, Tcl_Interp* interp, Script::Handle* const* words, int argc, int& i) {
        using T = std::tuple_element_t<K, Options>;
        T& value = std::get<K>(values.options);
        const bool last = i == argc - 1;
        if constexpr (std::is_same_v<T, bool>) {
            if (last || WordText(words[i + 1])[0] == '-') {
                value = !value;
                i += 1;
                return 0;
            }
        } else {
            if (last) return ReportExpectsValue(interp, D.options[K].name, TypeWord<T>(), kInterface, D.word);
            if constexpr (std::is_same_v<T, UtilI::TclPropertyList>) {
                UtilI::MITclProperty element;
                if (FetchValue(element, interp, words[i + 1], Script::IN) != 0) return OptionValueFailure<T>(interp, K);
                if (values.listHoldsDefault[K]) {
                    ReleaseValue(value);
                    values.listHoldsDefault[K] = false;
                }
                value.push_back(std::move(element));
                i += 2;
                return 0;
            }
        }
        if (FetchValue(value, interp, words[i + 1], Script::IN) != 0) return OptionValueFailure<T>(interp, K);
        i += 2;
        return 0;
    }

    template <class T>
    static int OptionValueFailure(Tcl_Interp* interp, size_t k) {
        return SetFailureCode(interp, kFetchFailure<T>, kInterface, D.word,
                              Port_String("-", D.options[k].name).c_str());
    }
};

}  // namespace TcltaskI
