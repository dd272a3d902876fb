// Help texts of an object's command words, offered through ICommandHelp. The package asks an object
// for ICommandHelp when a call is wrong (a wrong count, an unknown option, a word where an option was
// due) and appends the usage text of the command to its own message:
//
//     Wrong number of required arguments specified.
//     Usage: mapcoll get NAME: returns the items of the collection NAME
//
// A table holds one text per command word. The package asks by the command's word (`sizeof`) for a
// wrong count and by the operation's C++ name (`sizeof_`) for a wrong option; a table that names an
// operation differently from its word gives it a row of each. A word that ends in `_` is such an
// operation name: it has help but is not among the topics.
#pragma once

#include <cstring>
#include <span>
#include <string>
#include <string_view>

#include "ICommandHelp.h"

namespace TcltaskKit {

struct Usage {
    const char* word;
    const char* text;  // the call, a colon, and what it does and returns
};

struct HelpTable {
    const char* summary;  // one line: what the object is
    std::span<const Usage> usages;
};

// ICommandHelp over a table that outlives it (a constant, as a rule).
class CommandHelp final : public ICommandHelp {
public:
    explicit CommandHelp(const HelpTable& table) noexcept : m_counter(this), m_table(table) {}

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == ICommandHelpID || id == CitI::IInterfaceID) return this;
        if (id == CommonI::IRefCountID) return &m_counter;
        return nullptr;
    }
    Port_String GetSummary() override { return m_table.summary; }
    Port_String GetTopics() override {
        std::string topics;
        for (const Usage& usage : m_table.usages) {
            if (std::string_view(usage.word).ends_with('_')) continue;
            if (!topics.empty()) topics += ' ';
            topics += usage.word;
        }
        return topics.c_str();
    }
    Port_String GetHelp(const Port_String& word) override {
        for (const Usage& usage : m_table.usages)
            if (std::strcmp(usage.word, word.c_str()) == 0) return Port_String("Usage: ", usage.text);
        return Port_String("No help for '", word.c_str(), "'");
    }

private:
    CommonI::RefCounter m_counter;
    const HelpTable& m_table;
};

// A new help object over `table`, counted once.
inline CommonI::RefCountPtr<ICommandHelp> NewCommandHelp(const HelpTable& table) {
    return CommonI::RefCountPtr<ICommandHelp>(new CommandHelp(table));
}

}  // namespace TcltaskKit
