#include "Port/UT_STR.h"

#include <cstring>

int UT_STR::_Compare(const char* a, const char* b) noexcept {
    if (a == b) return 0;
    if (!a) return -1;
    if (!b) return 1;
    const int order = std::strcmp(a, b);  // compares the bytes as unsigned char
    return (order > 0) - (order < 0);
}
