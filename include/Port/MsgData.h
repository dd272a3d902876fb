// Port::MsgData: a message group and kind, and the formatting of messages of that group.
#pragma once

#include "Port/StringBase.h"

namespace Port {

class MsgData {
public:
    MsgData(const char* group, const char* kind);
    ~MsgData();
    MsgData(const MsgData&) = delete;
    MsgData& operator=(const MsgData&) = delete;

    const char* Group() const noexcept { return m_group.c_str(); }
    const char* Kind() const noexcept { return m_kind.c_str(); }

    // The message of the printf-style format with the arguments filled in.
    StringBase<char> TranslateMsg(const char* format, ...) const;

private:
    StringBase<char> m_group;
    StringBase<char> m_kind;
};

}  // namespace Port
