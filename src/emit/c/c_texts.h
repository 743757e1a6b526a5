// Fixed C texts: type names, operators and casts, indexed by the enumerations.
#ifndef ZOA_EMIT_C_C_TEXTS_H
#define ZOA_EMIT_C_C_TEXTS_H

#include <zoa/enums.h>

#include <string_view>

namespace ZOA::ctext {

// The text for the value, or "" for a value the table does not cover. Views,
// so that writing one needs no strlen.
std::string_view typeName(DataType t);
std::string_view binopText(BinopKind op);
std::string_view unopText(UnopKind op);

}  // namespace ZOA::ctext

#endif
