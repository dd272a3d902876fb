// A JSON value as a refusal's message shows it: its text, cut short when it is long. Shared by the
// readers of design files and of netlists.
#pragma once

#include <cstddef>
#include <string>

#include <nlohmann/json.hpp>

namespace kelmartool {

inline std::string Shown(const nlohmann::ordered_json& value) {
    std::string text = value.dump(-1, ' ', false, nlohmann::ordered_json::error_handler_t::replace);
    constexpr std::size_t kLongest = 60;
    if (text.size() > kLongest) text = text.substr(0, kLongest) + "...";
    return text;
}

}  // namespace kelmartool
