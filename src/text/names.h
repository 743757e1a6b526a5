// Spellings shared by the reader and the writer of the text form.
#ifndef ZOA_TEXT_NAMES_H
#define ZOA_TEXT_NAMES_H

#include <zoa/enums.h>

#include <string>

namespace ZOA::text {

// Looks an enumerator up by its printed name ("INT_S", "PLUS", ...); false if
// there is none. A plain decimal number is accepted too, for values outside
// the enumeration (which the writer prints as numbers).
bool lookupDataType(const std::string& s, DataType& out);
bool lookupBinop(const std::string& s, BinopKind& out);
bool lookupUnop(const std::string& s, UnopKind& out);
bool lookupNameKind(const std::string& s, NameKind& out);
bool lookupLabelKind(const std::string& s, LabelKind& out);
bool lookupTempState(const std::string& s, TempState& out);

// The printed name of an enumerator, or its number when it has none.
template <class E> std::string spell(E v) {
    const char* s = toString(v);
    return s[0] == '?' ? std::to_string(static_cast<int>(v)) : std::string(s);
}

}  // namespace ZOA::text

#endif
