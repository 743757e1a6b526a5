// Whether GCC treats a function name as a built-in one.
#ifndef ZOA_EMIT_C_GCC_BUILTINS_H
#define ZOA_EMIT_C_GCC_BUILTINS_H

#include <string_view>

namespace ZOA::ctext {

// True for the library names GCC knows as built-in functions: it refuses a
// declaration of another signature under -Werror and may replace calls with
// its own meaning.
bool isGccBuiltinName(std::string_view name);

}  // namespace ZOA::ctext

#endif
