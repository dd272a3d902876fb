// UT_STR: plain C string helpers of the portability layer.
#pragma once

class UT_STR {
public:
    // 0 when the two texts are equal byte for byte; else the sign of the first difference.
    // A null pointer sorts before every text and equals only another null pointer.
    static int _Compare(const char* a, const char* b) noexcept;
};
