#include "kit_object.h"

namespace TestKit {

Port_String HelpText::GetSummary() { return Port_String("test kit object of TcltaskI::", m_faceName.c_str()); }

// The template answers every word alike, so there is no list of words to give.
Port_String HelpText::GetTopics() { return Port_String(); }

Port_String HelpText::GetHelp(const Port_String& word) {
    std::string text;
    for (std::size_t at = 0; at < m_pattern.size(); ++at) {
        if (m_pattern.compare(at, 2, "%W") == 0) {
            text.append(word.c_str(), static_cast<std::size_t>(word.Length()));
            ++at;
        } else {
            text += m_pattern[at];
        }
    }
    return Port_String(text.data(), static_cast<int32_t>(text.size()));
}

}  // namespace TestKit
