// Fixed C texts: type names, operators and casts, indexed by the enumerations.
#ifndef ZOA_EMIT_C_C_TEXTS_H
#define ZOA_EMIT_C_C_TEXTS_H

#include <zoa/enums.h>

namespace ZOA::ctext {

// The text for the value, or "" for a value the table does not cover.
const char* typeName(DataType t);
const char* binopText(BinopKind op);
const char* unopText(UnopKind op);

}  // namespace ZOA::ctext

#endif
