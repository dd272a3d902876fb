// ICommandHelp: usage texts an implementation of a task interface may offer for its command words.
#pragma once

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"

inline constexpr Port::XUIDLiteral ICommandHelpID{0x322ee09f0c9d4c98ull, 0xa0cf19abf1e3bfdfull};

class ICommandHelp : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ICommandHelpID;
    static constexpr const char* NAME = "ICommandHelp";

    // A one-line description of the object the help is about.
    virtual Port_String GetSummary() = 0;
    // The command words that have help, separated by blanks.
    virtual Port_String GetTopics() = 0;
    // The usage text of one word (a command word or an operation name such as "new_").
    virtual Port_String GetHelp(const Port_String& word) = 0;
};
