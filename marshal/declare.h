// Commands as data. A command is one declaration: its row (word, required count, signature
// literal), its operation as a member pointer, and its options (name and default text). The
// positionals and their fetches, the options' types and the argument order of the call all follow
// from the operation's C++ signature: positionals first, options next, then the out property and
// the message (or, for the plain methods of the project classes, the operation's own parameters).
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <tuple>
#include <type_traits>

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

// An option switch: its name without the dash and its default as Tcl source.
struct Option {
    const char* name;
    const char* defaultText;
};

// The three frames a declaration can run in.
enum class FrameKind {
    Plain,    // the project classes: exactly the required words, typed parameters by direction
    Matched,  // options through the argument matcher, abbreviations allowed
    Switch,   // options spelled in full, no matcher
};

template <FrameKind K, class Op, size_t N>
struct Command {
    static constexpr FrameKind kind = K;
    static constexpr size_t optionCount = N;

    const char* word;
    int32_t required;
    const char* signature;
    Op op;
    std::array<Option, N> options;
};

template <class Op>
constexpr Command<FrameKind::Plain, Op, 0> Plain(const char* word, int32_t required, const char* signature, Op op) {
    return {word, required, signature, op, {}};
}

template <class Op, class... O>
constexpr Command<FrameKind::Matched, Op, sizeof...(O)> Matched(const char* word, int32_t required,
                                                                const char* signature, Op op, O... options) {
    return {word, required, signature, op, {Option(options)...}};
}

template <class Op, class... O>
constexpr Command<FrameKind::Switch, Op, sizeof...(O)> Switch(const char* word, int32_t required,
                                                              const char* signature, Op op, O... options) {
    return {word, required, signature, op, {Option(options)...}};
}

// What an operation's member pointer says about it.
template <class Op>
struct OperationTraits;

template <class R, class C, class... P>
struct OperationTraits<R (C::*)(P...)> {
    using Result = R;
    using Interface = C;
    using Params = std::tuple<P...>;
    static constexpr size_t arity = sizeof...(P);
};

// The storage a parameter is fetched into: the parameter's type without const and reference.
template <class P>
using Storage = std::remove_cvref_t<P>;

template <class Tuple, size_t Offset, class Seq>
struct SliceImpl;
template <class Tuple, size_t Offset, size_t... I>
struct SliceImpl<Tuple, Offset, std::index_sequence<I...>> {
    using type = std::tuple<Storage<std::tuple_element_t<Offset + I, Tuple>>...>;
};
// The storage types of parameters [Offset, Offset + Count) of a parameter tuple.
template <class Tuple, size_t Offset, size_t Count>
using StorageSlice = typename SliceImpl<Tuple, Offset, std::make_index_sequence<Count>>::type;

// The type word of an option in messages.
template <class T>
constexpr const char* TypeWord() {
    if constexpr (std::is_same_v<T, bool>) return "bool";
    else if constexpr (std::is_same_v<T, int32_t>) return "int32";
    else if constexpr (std::is_same_v<T, Port_String>) return "string";
    else return "UtilI::ITclProperty";
}

}  // namespace TcltaskI
