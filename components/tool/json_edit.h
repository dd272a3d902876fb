// A JSON text changed in place: the values that differ are replaced, added or removed in the text
// itself, and everything else (indentation, line breaks, key order, names the writer does not know)
// stays byte for byte as it was. A saved design thus differs from the file it came from by the lines
// of the values that changed, not by a new layout.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include <nlohmann/json.hpp>

namespace kelmartool {

// Makes `text` the JSON text `source` changed so that it holds `wanted` where `before` differs
// from `wanted`. `before` is the caller's own form of what `source` holds (values it fills in by
// default or writes in a form of its own may differ from the text; they are only touched when
// `wanted` changes them). `source` must be valid JSON (the caller has read it), and every text in
// `wanted` valid UTF-8. Answers the number of values replaced, added or removed.
//
// What comes where: a changed value takes the place of the old one; a member that is new goes
// behind the members that come before it in `wanted`, an element where `wanted` has it; both get
// the line break and indentation of their siblings (of the file's first indented line in an empty
// object or array). Elements of an array are matched to the old ones by being equal, then by their
// "name", then by order, so that one removed or changed element is one removed or changed entry.
std::size_t EditJson(std::string_view source, const nlohmann::ordered_json& before,
                     const nlohmann::ordered_json& wanted, std::string& text);

}  // namespace kelmartool
