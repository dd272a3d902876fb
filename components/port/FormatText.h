// printf-style formatting into a Port string, shared by StringBase::doFormat and MsgData.
#pragma once

#include <cstdarg>

#include "Port/StringBase.h"

namespace Port {

// The text of `format` with `args` filled in; no limit on its length. A null format gives "".
StringBase<char> FormatText(const char* format, va_list args);

}  // namespace Port
