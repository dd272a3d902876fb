// Port::MsgData: messages are formatted as given; the layer holds no catalogue to translate from.
#include "Port/MsgData.h"

#include <cstdarg>

#include "FormatText.h"

namespace Port {

MsgData::MsgData(const char* group, const char* kind) : m_group(group), m_kind(kind) {}

MsgData::~MsgData() = default;

StringBase<char> MsgData::TranslateMsg(const char* format, ...) const {
    va_list args;
    va_start(args, format);
    try {
        StringBase<char> message = FormatText(format, args);
        va_end(args);
        return message;
    } catch (...) {
        va_end(args);
        throw;
    }
}

}  // namespace Port
