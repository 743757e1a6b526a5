// copyShort: memcpy for the short pieces output paths append, without a library call.
#ifndef ZOA_SUPPORT_SHORT_COPY_H
#define ZOA_SUPPORT_SHORT_COPY_H

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace ZOA {

// Names, operators and numbers are copied inline with two overlapping loads and
// stores (fixed-size memcpy compiles to one move); longer pieces use memcpy.
inline void copyShort(char* d, const char* s, std::size_t n) {
    if (n >= 8 && n <= 16) {
        std::uint64_t a, b;
        std::memcpy(&a, s, 8);
        std::memcpy(&b, s + n - 8, 8);
        std::memcpy(d, &a, 8);
        std::memcpy(d + n - 8, &b, 8);
    } else if (n >= 4 && n < 8) {
        std::uint32_t a, b;
        std::memcpy(&a, s, 4);
        std::memcpy(&b, s + n - 4, 4);
        std::memcpy(d, &a, 4);
        std::memcpy(d + n - 4, &b, 4);
    } else if (n < 4) {
        for (std::size_t i = 0; i < n; ++i) d[i] = s[i];
    } else {
        std::memcpy(d, s, n);
    }
}

}  // namespace ZOA

#endif
