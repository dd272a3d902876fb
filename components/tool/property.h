// Tcl values in and out of the tool: every operation answers with a property whose Tcl value is a
// proper list or dict, through the implementer's kit, and reads its property arguments back with it.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "TcltaskKit/Property.h"
#include "TcltaskKit/Values.h"

namespace kelmartool {

using TcltaskKit::Answer;
using TcltaskKit::DictBuilder;
using TcltaskKit::Fail;
using TcltaskKit::ListOf;
using TcltaskKit::NewBool;
using TcltaskKit::NewDouble;
using TcltaskKit::NewInt;
using TcltaskKit::NewList;
using TcltaskKit::NewText;
using TcltaskKit::TclValue;
using TcltaskKit::TextOf;
using TcltaskKit::ValueOf;
using TcltaskKit::WordsOf;

// The words one after the other, for a failure text that lists the choices.
inline std::string Join(const std::vector<std::string>& words, const char* separator = ", ") {
    std::string out;
    for (const std::string& w : words) out += (out.empty() ? "" : separator) + w;
    return out;
}

// The texts `(nil)` and `nil` stand for "not given" in view options.
inline bool IsNil(std::string_view text) noexcept { return text == "(nil)" || text == "nil"; }

}  // namespace kelmartool
