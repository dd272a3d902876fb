// The command argument matcher and the option name list components (libArgMatchKit).
#pragma once

#include <cstdint>

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"

// Component classes.
inline constexpr Port::XUIDLiteral CmdArgMatcherID{0x89c0656fe41740d1ull, 0x9ed78056016165fcull};
inline constexpr Port::XUIDLiteral OptionNameListID{0x28710473d8d448c6ull, 0xb908d5855e4b6a00ull};
// Interfaces.
inline constexpr Port::XUIDLiteral ICmdArgMatcherID{0xbff393703cfc4b96ull, 0xb71fae444b69ed8bull};
inline constexpr Port::XUIDLiteral IOptionNameListID{0x4a051b34f0f44b80ull, 0xbc1e05e8974ac7bcull};
inline constexpr Port::XUIDLiteral IOptionNameSourceID{0x3dfd052eedd24c1full, 0x9b4dd9ef290e110eull};
// The iterator has no identifier of its own in the system's table; it is reached by GetIterator.
inline constexpr Port::XUIDLiteral IOptionNameIteratorID{0x6f1c2a0e3b7d4e59ull, 0x9a4d2c8e1f0b7a36ull};

// Walks the names of a list. Current is valid while !IsDone().
class IOptionNameIterator : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IOptionNameIteratorID;
    static constexpr const char* NAME = "IOptionNameIterator";

    virtual Port_String Current() = 0;
    virtual void First() = 0;
    virtual void Next() = 0;
    virtual bool IsDone() = 0;
};

// The candidates a matcher takes: the face of an iterator under which Match reads the names.
class IOptionNameSource : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IOptionNameSourceID;
    static constexpr const char* NAME = "IOptionNameSource";
};

class IOptionNameList : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IOptionNameListID;
    static constexpr const char* NAME = "IOptionNameList";

    virtual CommonI::RESULT Add(const Port_String& name) = 0;
    virtual CommonI::RESULT Clear() = 0;
    // A new iterator over the names, in the order they were added. 1 is success.
    virtual CommonI::RESULT GetIterator(CommonI::RefCountPtr<IOptionNameIterator>& out) = 0;
    virtual int32_t Size() = 0;
};

class ICmdArgMatcher : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ICmdArgMatcherID;
    static constexpr const char* NAME = "ICmdArgMatcher";

    // Fills `matches` with exactly the candidates that `typed` matches (its earlier content goes).
    // A candidate matches when `typed` is a prefix of it; a candidate equal to `typed` is the only
    // match. 1 is success.
    virtual CommonI::RESULT Match(const Port_String& typed,
                                  CommonI::RefCountPtr<IOptionNameSource>& candidates,
                                  CommonI::RefCountPtr<IOptionNameList>& matches) = 0;
};
